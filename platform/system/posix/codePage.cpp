#include "platform/system/codePage.h"

#include <utf8.h>

namespace platform {

// Strict UTF-8 is taken as it is: no overlong forms, no surrogates, nothing above U+10FFFF.
CodePageResult decodeCodePage(std::string_view text, std::string& utf8) {
  if (!utf8::is_valid(text.begin(), text.end())) return CodePageResult::kInvalid;
  utf8.assign(text);
  return CodePageResult::kDone;
}

std::optional<std::string> encodeCodePage(std::string_view utf8) { return std::string(utf8); }

std::string codePageName() { return "UTF-8"; }

}  // namespace platform
