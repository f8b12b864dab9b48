#include "simulator/CallLog.h"

#include <utility>

namespace simulator {

CallLog::Failure CallLog::begin(const char* function) {
  ++callCount_;
  Failure due{{}, 0, 0};
  for (Failure& failure : failures_) {
    if (!failure.function.empty() && failure.function != function) continue;
    if (--failure.callsLeft == 0 && due.code == 0) due = std::move(failure);
  }
  std::erase_if(failures_, [](const Failure& failure) { return failure.callsLeft == 0; });
  return due;
}

void CallLog::setCapacity(std::uint64_t lines) {
  capacity_ = lines;
  clear();
}

void CallLog::write(const std::string& line, std::int32_t code) {
  text_ += line;
  if (code != 0) text_ += " = " + std::to_string(code);
  text_ += '\n';
  ++lines_;
}

void CallLog::clear() {
  text_.clear();
  lines_ = 0;
}

}  // namespace simulator
