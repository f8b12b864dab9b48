// A typed DMA FIFO of the FPGA. Every operation takes the caller's located status last, does nothing when it already
// holds an error, and merges the platform's status into it; nothing throws, except that a missing platform library or
// function raises. Counts are in elements, time-outs in milliseconds. No lock: one thread at a time.
#pragma once

#include <cstdint>

#include "kterr/Status.h"

namespace ktisl {

template <typename Element>
class Fifo {
 public:
  using Status = kterr::tLocatedStatus;

  virtual ~Fifo() = default;

  // Move `count` elements, all within `timeoutMs`, and tell how many more could be moved without waiting.
  virtual void read(Element* buffer, std::uint64_t count, std::uint32_t timeoutMs, std::uint64_t& elementsRemaining,
                    Status& status) = 0;
  virtual void write(const Element* data, std::uint64_t count, std::uint32_t timeoutMs,
                     std::uint64_t& emptyElementsRemaining, Status& status) = 0;

  // Sets the depth of the host's side: at least what is requested, in fact `actualDepth`. The FIFO is stopped then.
  virtual void configure(std::uint64_t requestedDepth, std::uint64_t& actualDepth, Status& status) = 0;

  // Stops, then starts; the start only if the stop succeeded.
  virtual void restart(Status& status) = 0;

  virtual void start(Status& status) = 0;
  virtual void stop(Status& status) = 0;

  // Lend FIFO memory to be read or filled in place: `acquired` elements of the `count` asked for, until they are
  // released; `remaining` more could be had without waiting.
  virtual void acquireReadElements(Element*& elements, std::uint64_t count, std::uint32_t timeoutMs,
                                   std::uint64_t& acquired, std::uint64_t& remaining, Status& status) = 0;
  virtual void acquireWriteElements(Element*& elements, std::uint64_t count, std::uint32_t timeoutMs,
                                    std::uint64_t& acquired, std::uint64_t& remaining, Status& status) = 0;

  // Gives lent memory back, its first `count` elements as read or written.
  virtual void releaseElements(std::uint64_t count, Status& status) = 0;

  // Returns the number by which other devices reach the FIFO; 0 when the status already holds an error.
  virtual std::uint32_t getPeerToPeerEndpoint(Status& status) = 0;
};

}  // namespace ktisl
