// What a play came to, for people or as JSON, on standard output.
#pragma once

#include "cli/commands/ComputedPlay.h"

namespace tools::cli {

struct PlaySummary {
  const ComputedPlay& play;
  const LoadedScript& loaded;
  const Program& program;
  const PlayOptions& options;
  bool isComputed;  // rather than simulated
  std::uint64_t tookMs;
};

void printSummary(const PlaySummary& summary);
void printSummaryAsJson(const PlaySummary& summary);

}  // namespace tools::cli
