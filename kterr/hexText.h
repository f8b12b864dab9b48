// Numbers in hexadecimal, for texts that people read. Any thread may call.
#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

namespace kterr {

// "0x0A": at least `digits` digits, 1 to 8.
inline std::string hexText(std::uint32_t value, int digits) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%0*X", digits, static_cast<unsigned>(value));
  return text;
}

}  // namespace kterr
