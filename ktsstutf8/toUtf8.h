// The boundary conversion of names and script text: from the host's encoding (platform/system/codePage.h) to the UTF-8
// that the whole library uses inside. Any thread may call.
#pragma once

#include <string>

namespace ktsstutf8 {

// Returns `text` as UTF-8; null gives the empty string, 7-bit text is taken as it is.
// Raises ktorba_codes::kTextNotConvertible, or ktorba_codes::kNoMemoryForConversion (Windows only).
std::string toUtf8(const char* text);

}  // namespace ktsstutf8
