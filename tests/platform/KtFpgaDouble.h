// A double of the FPGA interface library: a shared library of its name whose functions record their calls.
#pragma once

#include <cstdint>
#include <deque>

#include "platform/CallRecord.h"

struct KtFpgaDouble {
  CallRecord record;
  std::deque<std::int32_t> results;  // returned by the next calls, in order; then 0
};

KtFpgaDouble& ktFpgaDouble();
