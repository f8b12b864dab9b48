// Every call of a platform function on one FPGA: counted, written down when asked, and made to fail when asked.
// Guarded by its FPGA's lock.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace simulator {

class CallLog {
 public:
  struct Failure {
    std::string function;       // empty: any
    std::uint64_t callsLeft;    // 1: the next one
    std::int32_t code;          // never 0
    std::string elaboration{};  // JSON; empty for a plain one
  };

  void arm(Failure failure) { failures_.push_back(std::move(failure)); }
  void disarm() { failures_.clear(); }

  // Counts a call; takes the failure due in it, code 0 when there is none.
  Failure begin(const char* function);
  std::uint64_t callCount() const { return callCount_; }

  void setCapacity(std::uint64_t lines);
  bool isRecording() const { return lines_ < capacity_; }
  // Ends a call's line and begins the next.
  void write(const std::string& line, std::int32_t code);
  const std::string& text() const { return text_; }
  void clear();

 private:
  std::vector<Failure> failures_;
  std::uint64_t callCount_ = 0;
  std::uint64_t capacity_ = 0;
  std::uint64_t lines_ = 0;
  std::string text_;
};

}  // namespace simulator
