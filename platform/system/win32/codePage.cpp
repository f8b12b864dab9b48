#include "platform/system/codePage.h"

#include <utf8.h>
#include <windows.h>

#include <iterator>
#include <limits>
#include <memory>
#include <new>

#include "platform/system/win32/wideText.h"

namespace platform {
namespace {

constexpr UINT kGb18030 = 54936;

// Decodes strictly, as MultiByteToWideChar does. Code page 54936 refuses the flag for precomposed characters, as 65001
// does on some systems; both have but one way to decode a character.
int decode(std::string_view text, wchar_t* wide, int capacity) {
  const auto decodeWith = [&](DWORD flags) {
    return MultiByteToWideChar(CP_ACP, flags, text.data(), static_cast<int>(text.size()), wide, capacity);
  };
  if (GetACP() == kGb18030) return decodeWith(MB_ERR_INVALID_CHARS);
  const int units = decodeWith(MB_PRECOMPOSED | MB_ERR_INVALID_CHARS);
  return units == 0 && GetLastError() == ERROR_INVALID_FLAGS ? decodeWith(MB_ERR_INVALID_CHARS) : units;
}

// The code pages that hold every character refuse the flag and to tell whether one was missing.
bool encode(const std::wstring& wide, std::string& text) {
  const UINT page = GetACP();
  const bool isComplete = page == CP_UTF8 || page == kGb18030;
  const DWORD flags = isComplete ? 0 : WC_NO_BEST_FIT_CHARS;
  BOOL isMissing = FALSE;
  const auto encodeTo = [&](char* bytes, int capacity) {
    return WideCharToMultiByte(page, flags, wide.data(), static_cast<int>(wide.size()), bytes, capacity, nullptr,
                               isComplete ? nullptr : &isMissing);
  };
  text.resize(static_cast<std::size_t>(encodeTo(nullptr, 0)));
  encodeTo(text.data(), static_cast<int>(text.size()));
  return isMissing == FALSE && (wide.empty() || !text.empty());
}

}  // namespace

CodePageResult decodeCodePage(std::string_view text, std::string& utf8) {
  if (text.size() > static_cast<std::size_t>(std::numeric_limits<int>::max())) return CodePageResult::kInvalid;
  const int units = decode(text, nullptr, 0);
  if (units <= 0) return CodePageResult::kInvalid;
  const std::unique_ptr<wchar_t[]> wide(new (std::nothrow) wchar_t[static_cast<std::size_t>(units)]);
  if (wide == nullptr) return CodePageResult::kNoMemory;
  if (decode(text, wide.get(), units) != units) return CodePageResult::kInvalid;
  std::string encoded;
  try {
    utf8::utf16to8(wide.get(), wide.get() + units, std::back_inserter(encoded));
  } catch (const utf8::exception&) {  // half a surrogate pair
    return CodePageResult::kInvalid;
  }
  utf8 = std::move(encoded);
  return CodePageResult::kDone;
}

std::optional<std::string> encodeCodePage(std::string_view utf8) {
  const std::wstring wide = toWide(utf8);
  if (toUtf8(wide) != utf8) return std::nullopt;
  std::string text;
  return encode(wide, text) ? std::optional(text) : std::nullopt;
}

std::string codePageName() { return GetACP() == CP_UTF8 ? "UTF-8" : "code page " + std::to_string(GetACP()); }

}  // namespace platform
