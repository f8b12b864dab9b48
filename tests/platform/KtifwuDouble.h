// A double of the interface framework: a shared library of its name whose functions record their calls, over a tree
// of contexts that the test gives. Results that they return through pointers are 1, 2, 3 in the order of parameters.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "ktorba/ktorba.h"

struct KtifwuDouble {
  // The calls since the last take(): "GetInfo 1 7" is GetInfo(1, 7).
  std::vector<std::string> take() { return std::exchange(calls, {}); }

  std::vector<std::string> calls;
  bool recording = true;  // else calls take no memory and leave their results as they are
  std::function<std::vector<std::uint32_t>(std::uint32_t context)> children;
  std::function<void(tStatus& status)> report;  // run at the end of every call, when set
};

KtifwuDouble& ktifwuDouble();
