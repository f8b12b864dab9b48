#include "platform/system/paths.h"

#include <windows.h>

#include "platform/system/win32/wideText.h"

namespace platform {
namespace {

constexpr std::size_t kLongestPlain = 240;  // below MAX_PATH, with room for what is put behind a name
constexpr wchar_t kLongPrefix[] = L"\\\\?\\";
constexpr wchar_t kLongSharePrefix[] = L"\\\\?\\UNC\\";
constexpr wchar_t kSharePrefix[] = L"\\\\";

std::wstring toFullPath(const std::wstring& path) {
  std::wstring full(GetFullPathNameW(path.c_str(), 0, nullptr, nullptr), L'\0');
  full.resize(GetFullPathNameW(path.c_str(), static_cast<DWORD>(full.size()), full.data(), nullptr));
  return full;
}

// Systems take paths of 260 characters and more only so.
std::wstring lengthen(const std::wstring& path) {
  if (path.starts_with(kLongPrefix)) return path;
  const std::wstring full = toFullPath(path);
  if (full.size() < kLongestPlain) return path;
  const bool isShare = full.starts_with(kSharePrefix);
  return isShare ? kLongSharePrefix + full.substr(std::size(kSharePrefix) - 1) : kLongPrefix + full;
}

std::wstring shorten(const std::wstring& path) {
  if (path.starts_with(kLongSharePrefix)) return kSharePrefix + path.substr(std::size(kLongSharePrefix) - 1);
  return path.starts_with(kLongPrefix) ? path.substr(std::size(kLongPrefix) - 1) : path;
}

}  // namespace

std::filesystem::path toPath(const std::string& utf8) { return lengthen(toWide(utf8)); }

std::string toText(const std::filesystem::path& path) { return toUtf8(shorten(path.native())); }

}  // namespace platform
