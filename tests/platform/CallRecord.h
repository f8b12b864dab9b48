// What the doubles of the platform libraries keep of the calls made to them: "StartFifo 7 3" is StartFifo(7, 3).
// Results that they return through pointers are 1, 2, 3 in the order of the parameters.
#pragma once

#include <mutex>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

class CallRecord {
 public:
  template <typename... Parameters>
  void add(const char* function, Parameters... parameters) {
    int results = 0;
    std::ostringstream call;
    call << function;
    (pass(call, results, parameters), ...);
    const std::lock_guard guard(lock_);
    calls_.push_back(call.str());
  }

  // The calls since the last take().
  std::vector<std::string> take() { return std::exchange(calls_, {}); }

 private:
  template <typename Value>
  static void pass(std::ostream& call, int&, Value value) {
    call << ' ' << +value;
  }
  static void pass(std::ostream& call, int&, const char* text) { call << ' ' << text; }
  template <typename Result>
  static void pass(std::ostream&, int& results, Result* result) {
    *result = static_cast<Result>(++results);
  }

  std::mutex lock_;
  std::vector<std::string> calls_;
};
