// What comes of a source, as the tests of sources look at it.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "tools/sources/Source.h"

namespace tools {

inline constexpr SourceFormat k16 = {16, 1e6, 1u << 20};
inline constexpr SourceFormat k32 = {32, 1e6, 1u << 20};

std::vector<std::int32_t> load(const std::string& source, const SourceFormat& format = k16);

// The message and the help of the refusal, or "accepted".
std::string refusal(const std::string& source, const SourceFormat& format = k16);

// "\n", "\x93" and the like as the bytes that they stand for.
std::string unescape(std::string_view text);

// "v1 HEADER | BYTES" as an array file; anything else as it is.
std::string unescapeArray(const std::string& text);

// The notes and the first samples, or the refusal and its help, with "FILE" for the path.
std::string outcome(const std::string& source, const std::string& path);

}  // namespace tools
