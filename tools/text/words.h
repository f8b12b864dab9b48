// Small steps of reading and writing texts that several rooms take.
#pragma once

#include <charconv>
#include <optional>
#include <string>
#include <string_view>

namespace tools {

// The whole of `text` as an integer of that base, or nothing: no blanks, no plus sign, nothing beyond the type.
template <typename Integer>
std::optional<Integer> parseInteger(std::string_view text, int base = 10) {
  Integer value{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value, base);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return value;
}

// The texts of a range one behind the other, with a separator between each two.
template <typename Texts>
std::string join(const Texts& texts, std::string_view separator = ", ") {
  std::string joined;
  bool isFirst = true;
  for (const auto& text : texts) {
    if (!isFirst) joined += separator;
    joined += text;
    isFirst = false;
  }
  return joined;
}

}  // namespace tools
