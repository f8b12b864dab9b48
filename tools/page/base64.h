// Bytes as text of 64 characters. Pure; any thread may call.
#pragma once

#include <cstddef>
#include <span>
#include <string>

namespace tools {

// Padded with '=' to a multiple of four.
std::string encodeBase64(std::span<const std::byte> bytes);

}  // namespace tools
