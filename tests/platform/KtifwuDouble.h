// A double of the interface framework: a shared library of its name whose functions record their calls, over a tree
// of contexts that the test gives.
#pragma once

#include <cstdint>
#include <functional>

#include "ktorba/ktorba.h"
#include "platform/CallRecord.h"

struct KtifwuDouble {
  CallRecord record;
  bool recording = true;  // else calls allocate nothing and leave their results as they are
  std::function<std::vector<std::uint32_t>(std::uint32_t context)> children;
  std::function<void(tStatus& status)> report;  // run at the end of every call, when set
};

KtifwuDouble& ktifwuDouble();
