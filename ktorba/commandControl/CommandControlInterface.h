// The generator's control registers as operations. Every operation takes the caller's located status last but for
// flags, does nothing when that record already holds an error, and reports into it; nothing throws (except
// that a missing platform library or function raises), and calls of one register allocate nothing.
// A bus transfer takes up to a second. One thread at a time.
#pragma once

#include <cstdint>

#include "kterr/Status.h"
#include "ktorba/hwRecords/HWSettings.h"
#include "ktorba/hwRecords/HWTraits.h"
#include "ktorba/hwRecords/MemoryWriteRequest.h"

namespace ktorba {

class CommandControlInterface {
 public:
  using Status = kterr::tLocatedStatus;

  virtual ~CommandControlInterface() = default;

  // Reads the registers when `refresh` is set or no read has succeeded yet; else gives what the last read found.
  virtual void getHWTraits(HWTraits& out, Status& status, bool refresh) = 0;

  // Keeps `settings` for the next writeSettings().
  virtual void setSettings(const HWSettings& settings, Status& status) = 0;

  // Sends the kept settings, unless they are what was sent last and `force` is not set. After a failure the next call
  // sends them in any case.
  virtual void writeSettings(Status& status, bool force) = 0;

  // Send one command: begin the program in sequence memory; go back to the beginning, memory writes given up; stop.
  virtual void commandInitiate(Status& status) = 0;
  virtual void commandReset(Status& status) = 0;
  virtual void commandAbort(Status& status) = 0;

  // Read one bit of the generator's status: whether the script has come to its end, whether data has run out. A read
  // that fails gives false; `out` is left alone when the record already holds an error.
  virtual void readGenerationDone(bool& out, Status& status) = 0;
  virtual void readDataUnderflow(bool& out, Status& status) = 0;

  // Tells the generator what is about to come through its download FIFO, and where it goes.
  virtual void announceMemoryWrite(const MemoryWriteRequest& request, Status& status) = 0;

  // Reads, as above, whether all of the transfer announced last is in memory.
  virtual void readMemoryWriteComplete(bool& out, Status& status) = 0;

  // Puts the generator's streaming write pointer back to 0.
  virtual void resetStreamingWritePointer(Status& status) = 0;

  // Returns the memory words of the streaming waveform that may be written; 0 when the status already holds an error.
  virtual std::uint64_t readStreamingSpace(Status& status) = 0;
};

}  // namespace ktorba
