// How long a script plays. The four answers are kinds of their own, and only an exact one has a number: nobody can
// add to "for ever". A value; any thread may read it.
#pragma once

#include <cstdint>
#include <optional>

namespace tools {

class PlayLength {
 public:
  enum class Kind : std::uint8_t {
    kExact,    // it ends
    kTooLong,  // it ends, or goes on, beyond 2^64 - 2 samples
    kEndless,  // it repeats without end
    kWaiting,  // it waits, or loops, until a trigger that never comes
  };

  static PlayLength exact(std::uint64_t samples) { return {Kind::kExact, samples, 0, 0}; }
  static PlayLength tooLong() { return {Kind::kTooLong, 0, 0, 0}; }
  static PlayLength endless() { return {Kind::kEndless, 0, 0, 0}; }
  static PlayLength waiting(std::uint8_t trigger, std::uint32_t address, std::uint64_t since) {
    return {Kind::kWaiting, since, trigger, address};
  }

  Kind kind() const { return kind_; }
  // Of an exact one.
  std::optional<std::uint64_t> samples() const {
    return kind_ == Kind::kExact ? std::optional(samples_) : std::nullopt;
  }
  // Of a waiting one: the hardware trigger, the address of the wait or of the loop's start, and the sample at which it
  // is asked for the first time in vain.
  std::uint8_t trigger() const { return trigger_; }
  std::uint32_t address() const { return address_; }
  std::uint64_t waitingSince() const { return samples_; }

  bool operator==(const PlayLength&) const = default;

 private:
  PlayLength(Kind kind, std::uint64_t samples, std::uint8_t trigger, std::uint32_t address)
      : kind_(kind), trigger_(trigger), address_(address), samples_(samples) {}

  Kind kind_;
  std::uint8_t trigger_;
  std::uint32_t address_;
  std::uint64_t samples_;
};

}  // namespace tools
