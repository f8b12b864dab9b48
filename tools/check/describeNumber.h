// Numbers as people write them elsewhere, and what a script has for them.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace tools {

struct NumberAdvice {
  std::string message;      // what is wrong with it
  std::string help;         // what to write
  std::string replacement;  // digits; empty where several would be right
  bool isCertain = false;   // that they are what was meant
};

// Nothing for what is like no number. `sampleRateHz` turns times into samples.
std::optional<NumberAdvice> describeNumber(std::string_view text, double sampleRateHz);

}  // namespace tools
