// Numbers as people write them elsewhere, and what a script has for them.
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "tools/diagnostics/Diagnostic.h"

namespace tools {

struct NumberAdvice {
  std::string replacement = {};  // digits; empty where several would be right
  bool isCertain = false;        // that they are what was meant
};

// Says what is wrong with a number and what to write. Nothing, and the diagnostic as it was, for what is like no
// number. `sampleRateHz` turns times into samples.
std::optional<NumberAdvice> describeNumber(std::string_view text, double sampleRateHz, Diagnostic& diagnostic);

}  // namespace tools
