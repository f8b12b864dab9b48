// Texts between UTF-8, which this system uses, and UTF-16, which Windows does. What is invalid becomes U+FFFD. Internal
// to platform/system/win32/.
#pragma once

#include <string>
#include <string_view>

namespace platform {

std::wstring toWide(std::string_view utf8);
std::string toUtf8(std::wstring_view wide);

}  // namespace platform
