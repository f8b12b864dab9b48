// What the tools refuse: a file, an argument, a sample. The library's own failures are kterr::Exception.
#pragma once

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>

namespace tools {

// What a user can set to have it otherwise. How it is set is the business of whoever talks to the user.
enum class Setting : std::uint8_t {
  kNone,
  kSampleWidth,
  kSampleRate,
  kMemory,
  kMemoryWord,
  kMinFetch,
  kSequenceMemory,
  kMaxPriming,
  kWaveform,
  kScriptName,
  kOutputFormat,
  kPictureHeight,
};

// What a setting may be, in its own unit, both ends included.
struct Bounds {
  std::uint64_t least = 0;
  std::uint64_t greatest = 0;
};

// `what()` is a message for the user, naming the file or argument; `help` is one sentence on what to do, or empty.
class Refusal : public std::runtime_error {
 public:
  explicit Refusal(const std::string& message, std::string helpText = {}, Setting culprit = Setting::kNone,
                   std::optional<Bounds> allowed = {})
      : std::runtime_error(message), help(std::move(helpText)), setting(culprit), bounds(allowed) {}

  std::string help;
  Setting setting;
  std::optional<Bounds> bounds;  // of the setting, where it was out of them
};

}  // namespace tools
