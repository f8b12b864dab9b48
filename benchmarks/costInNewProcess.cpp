#include "benchmarks/costInNewProcess.h"

#include <malloc.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

ProcessCost costOf(const std::function<void()>& work) {
  rusage before{};
  rusage after{};
  getrusage(RUSAGE_SELF, &before);
  work();
  getrusage(RUSAGE_SELF, &after);
  return {1024 * (after.ru_maxrss - before.ru_maxrss), secondsOf(after) - secondsOf(before)};
}

}  // namespace

double secondsOf(const rusage& usage) {
  const auto seconds = [](const timeval& time) {
    return static_cast<double>(time.tv_sec) + 1e-6 * static_cast<double>(time.tv_usec);
  };
  return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

ProcessCost costInNewProcess(const std::function<void()>& work) {
  int ends[2];
  if (pipe(ends) != 0) return {};
  malloc_trim(0);  // what was freed before must not serve now
  const pid_t child = fork();
  if (child == 0) {
    const ProcessCost cost = costOf(work);
    _exit(write(ends[1], &cost, sizeof cost) == sizeof cost ? 0 : 1);
  }
  close(ends[1]);
  ProcessCost cost;
  if (read(ends[0], &cost, sizeof cost) != sizeof cost) cost = {};
  close(ends[0]);
  waitpid(child, nullptr, 0);
  return cost;
}
