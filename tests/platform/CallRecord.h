// What the doubles of the platform libraries keep of the calls made to them: "StartFifo 7 3" is StartFifo(7, 3).
#pragma once

#include <mutex>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

class CallRecord {
 public:
  template <typename... Arguments>
  void add(const char* function, Arguments... arguments) {
    if (!enabled) return;
    std::ostringstream call;
    ((call << function) << ... << (" " + std::to_string(arguments)));
    const std::lock_guard guard(lock_);
    calls_.push_back(call.str());
  }

  // The calls since the last take().
  std::vector<std::string> take() { return std::exchange(calls_, {}); }

  bool enabled = true;

 private:
  std::mutex lock_;
  std::vector<std::string> calls_;
};
