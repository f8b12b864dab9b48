// The system's encoding of the texts that hosts pass: UTF-8 on POSIX, the active code page on Windows. Any thread may
// call.
#pragma once

#include <string>
#include <string_view>

namespace platform {

enum class CodePageResult {
  kDone,
  kInvalid,   // the text is not valid in the encoding
  kNoMemory,  // for the conversion; not for the result, which throws std::bad_alloc
};

// Decodes `text` strictly and stores it in `utf8` as UTF-8; `utf8` is untouched unless the result is kDone.
CodePageResult decodeCodePage(std::string_view text, std::string& utf8);

}  // namespace platform
