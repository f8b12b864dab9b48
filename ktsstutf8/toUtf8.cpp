#include "ktsstutf8/toUtf8.h"

#include <algorithm>
#include <string_view>

#include "kterr/Failure.h"
#include "platform/system/codePage.h"

namespace ktsstutf8 {
namespace {

bool isAscii(std::string_view text) {
  return std::ranges::all_of(text, [](char byte) { return static_cast<unsigned char>(byte) < 0x80; });
}

// Both failures of the conversion carry one frozen place.
[[noreturn]] void raise(const kterr::ErrorConstant& constant) {
  kterr::Failure(constant).at("ktsstutf8/mbsToUtf8", 77).raise();
}

}  // namespace

std::string toUtf8(const char* text) {
  if (text == nullptr) return {};
  const std::string_view bytes(text);
  if (isAscii(bytes)) return std::string(bytes);
  std::string utf8;
  switch (platform::decodeCodePage(bytes, utf8)) {
    case platform::CodePageResult::kInvalid:
      raise(ktorba_codes::kTextNotConvertible);
    case platform::CodePageResult::kNoMemory:
      raise(ktorba_codes::kNoMemoryForConversion);
    case platform::CodePageResult::kDone:
      break;
  }
  return utf8;
}

}  // namespace ktsstutf8
