#include "ktcheckname/checkName.h"

#include <algorithm>
#include <string_view>

#include "kterr/Failure.h"

namespace ktcheckname {
namespace {

constexpr char kSource[] = R"(ktcheckname\checkName)";

bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool isAsciiLetter(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); }
bool isAscii(char c) { return static_cast<unsigned char>(c) < 0x80; }

// Control bytes and punctuation; a blank is refused for a reason of its own.
bool isForbidden(char c) { return isAscii(c) && !isAsciiLetter(c) && !isDigit(c) && c != '-' && c != '_' && c != ' '; }

// Opens the elaboration of a fault. Lines are frozen: hosts know each fault by its line.
kterr::ElaborationWriter fail(tStatus& status, const kterr::ErrorConstant& constant, std::uint32_t line) {
  kterr::setCode(status, constant.code);
  kterr::ElaborationWriter writer(status, constant.text);
  writer.place(kSource, line);
  writer.translator();
  return writer;
}

kterr::ElaborationWriter failAt(tStatus& status, std::string_view name, std::size_t position, std::uint32_t line) {
  kterr::ElaborationWriter writer = fail(status, ktmxl::kErrorInvalidCharInString, line);
  writer.usage(kterr::kUsageTypePositionOfInvalidCharacter, std::uint64_t{position});
  writer.usage(kterr::kUsageTypeInvalidString, name.data());
  return writer;
}

void checkText(std::string_view name, tStatus& status) {
  const auto forbidden = std::ranges::find_if(name, isForbidden);
  const std::size_t blank = name.find(' ');
  if (name.empty()) {
    fail(status, ktmxl::kErrorEmptyString, 55);
  } else if (forbidden != name.end()) {
    failAt(status, name, static_cast<std::size_t>(forbidden - name.begin()), 70);
  } else if (blank != std::string_view::npos) {
    failAt(status, name, blank, 102).comment("whitespace is not allowed.");
  } else if (name.front() == '_') {
    fail(status, ktmxl::kErrorLeadingUnderscoreInString, 111).usage(kterr::kUsageTypeInvalidString, name.data());
  } else if (name.size() > kMaxNameLength) {
    fail(status, ktmxl::kErrorNameTooLong, 119).usage(kterr::kUsageTypeMaxLength, std::uint64_t{kMaxNameLength});
  }
}

}  // namespace

void checkName(const char* name, tStatus& status) {
  if (status.code < 0) return;
  if (name == nullptr) {
    fail(status, ktmxl::kErrorNULLPtr, 48);
  } else {
    checkText(name, status);
  }
}

}  // namespace ktcheckname
