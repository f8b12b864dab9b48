// What a play came to, for people or as JSON, on standard output.
#pragma once

#include "cli/commands/Play.h"

namespace tools::cli {

struct PlaySummary {
  const Play& play;
  const LoadedScript& loaded;
  const Program& program;
  const PlayOptions& options;
  std::uint64_t tookMs;
};

void printSummary(const PlaySummary& summary);
void printSummaryAsJson(const PlaySummary& summary);

}  // namespace tools::cli
