#include "platform/system/codePage.h"

#include <utf8.h>
#include <windows.h>

#include <iterator>
#include <limits>
#include <memory>
#include <new>

namespace platform {
namespace {

constexpr UINT kGb18030 = 54936;

// This code page refuses every other flag.
DWORD strictFlags() { return GetACP() == kGb18030 ? MB_ERR_INVALID_CHARS : MB_PRECOMPOSED | MB_ERR_INVALID_CHARS; }

}  // namespace

CodePageResult decodeCodePage(std::string_view text, std::string& utf8) {
  if (text.size() > static_cast<std::size_t>(std::numeric_limits<int>::max())) return CodePageResult::kInvalid;
  const int bytes = static_cast<int>(text.size());
  const int units = MultiByteToWideChar(CP_ACP, strictFlags(), text.data(), bytes, nullptr, 0);
  if (units <= 0) return CodePageResult::kInvalid;
  const std::unique_ptr<wchar_t[]> wide(new (std::nothrow) wchar_t[static_cast<std::size_t>(units)]);
  if (wide == nullptr) return CodePageResult::kNoMemory;
  if (MultiByteToWideChar(CP_ACP, strictFlags(), text.data(), bytes, wide.get(), units) != units) {
    return CodePageResult::kInvalid;
  }
  std::string encoded;
  try {
    utf8::utf16to8(wide.get(), wide.get() + units, std::back_inserter(encoded));
  } catch (const utf8::exception&) {  // half a surrogate pair
    return CodePageResult::kInvalid;
  }
  utf8 = std::move(encoded);
  return CodePageResult::kDone;
}

}  // namespace platform
