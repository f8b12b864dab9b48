// The system's encoding of the texts that hosts pass: UTF-8 on POSIX, the active code page on Windows. Any thread may
// call.
#pragma once

#include <optional>
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

// Encodes UTF-8 as the system has its texts. Nothing where the encoding lacks a character: a similar one is never
// taken.
std::optional<std::string> encodeCodePage(std::string_view utf8);

// What the encoding is called, for messages: "UTF-8", "code page 1252".
std::string codePageName();

}  // namespace platform
