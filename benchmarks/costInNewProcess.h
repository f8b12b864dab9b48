// What work costs in a process of its own, to which all memory is new. POSIX.
#pragma once

#include <sys/resource.h>

#include <cstdint>
#include <functional>

struct ProcessCost {
  std::int64_t bytes = -1;  // the most memory resident at a time, less what was resident before
  double seconds = 0;       // processor time
};

// Processor time.
double secondsOf(const rusage& usage);

// For programs of one thread. -1 bytes where no process could be had, or the work failed.
ProcessCost costInNewProcess(const std::function<void()>& work);
