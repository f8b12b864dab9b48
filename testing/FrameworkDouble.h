// A double of the interface framework: a shared library of its name, which the library under test finds loaded. It is
// one of another version, without ktIFW_Context_GetSubsystemAndOffset and ktIFW_Context_GetChildrenByUid. All of its
// generators are the same one, ready and done. A call returns at once and takes no memory, unless it is told to record.
// Not for several threads.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "ktorba/ktorba.h"

struct FrameworkDouble {
  FrameworkDouble();

  // The calls recorded since the last time: "Reset 4" is Reset(4).
  std::vector<std::string> take() { return std::exchange(calls, {}); }

  std::uint64_t callCount = 0;
  bool isRecording = false;
  std::vector<std::string> calls;
  std::uint64_t registers[32] = {};  // what a read gives, by the last bits of the offset
  std::uint32_t contexts = 2;        // in a tree with up to 10 children each; the second is the generator
  std::function<std::vector<std::uint32_t>(std::uint32_t context)> children;  // when set, of a tree of the test's own
  std::uint32_t announced = 0;  // how many children each context of that tree claims to have; 0: those that it has
  std::function<void(tStatus& status)> report;  // when set, run at the end of every call
};

// The one of this process. Assigning a new one makes it forget.
FrameworkDouble& frameworkDouble();
