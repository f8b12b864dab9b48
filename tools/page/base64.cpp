#include "tools/page/base64.h"

#include <cstdint>
#include <string_view>

namespace tools {

std::string encodeBase64(std::span<const std::byte> bytes) {
  constexpr std::string_view kDigits = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string text;
  text.reserve((bytes.size() + 2) / 3 * 4);
  for (std::size_t at = 0; at < bytes.size(); at += 3) {
    const auto byteAt = [&](std::size_t index) {
      return index < bytes.size() ? std::to_integer<std::uint32_t>(bytes[index]) : 0;
    };
    const std::uint32_t group = byteAt(at) << 16 | byteAt(at + 1) << 8 | byteAt(at + 2);
    for (const unsigned shift : {18u, 12u, 6u, 0u}) text += kDigits[group >> shift & 63];
  }
  const std::size_t missing = (3 - bytes.size() % 3) % 3;
  text.replace(text.size() - missing, missing, missing, '=');
  return text;
}

}  // namespace tools
