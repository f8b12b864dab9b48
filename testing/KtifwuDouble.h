// An interface framework of another version: a shared library of its name that has the bus's functions, which record
// their calls, and of the contexts' functions the one that lists children, over a tree that the test gives.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "ktorba/ktorba.h"

struct KtifwuDouble {
  // The calls since the last take(): "Reset 4" is Reset(4).
  std::vector<std::string> take() { return std::exchange(calls, {}); }

  std::vector<std::string> calls;
  bool recording = true;  // else calls take no memory
  std::function<std::vector<std::uint32_t>(std::uint32_t context)> children;
  std::uint32_t announced = 0;                  // children that every context claims to have; 0: those that it has
  std::function<void(tStatus& status)> report;  // run at the end of every call, when set
};

KtifwuDouble& ktifwuDouble();
