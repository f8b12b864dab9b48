// Names: their order against one that folds whole names first, and what makes a name good against the rule in words.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <compare>
#include <string>

#include "ktcheckname/caseFolding.h"
#include "ktcheckname/checkName.h"
#include "ktcheckname/compareNames.h"
#include "kterr/ErrorConstant.h"
#include "kterr/JsonReader.h"
#include "kterr/Status.h"
#include "testing/require.h"

namespace {

std::u32string fold(const std::string& name) {
  std::u32string folded;
  for (const char *position = name.data(), *end = position + name.size(); position < end;) {
    const auto letter = ktcheckname::foldCase(ktcheckname::decodeUtf8(position, end));
    folded.append(letter.codePoints.begin(), letter.codePoints.begin() + letter.count);
  }
  return folded;
}

int sign(int value) { return (value > 0) - (value < 0); }

// An order that equals that of folded texts is symmetric and transitive.
void checkOrder(const std::string& a, const std::string& b) {
  const std::u32string left = fold(a);
  const std::u32string right = fold(b);
  const int expected = left < right ? -1 : left == right ? 0 : 1;
  require(sign(ktcheckname::compareNames(a, b)) == expected, "order of two names");
}

bool isNameCharacter(char c) {
  const bool isLetter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
  return isLetter || (c >= '0' && c <= '9') || c == '-' || c == '_' || static_cast<unsigned char>(c) >= 0x80;
}

std::int32_t expectedCode(const std::string& name) {
  if (name.empty()) return ktmxl::kErrorEmptyString.code;
  if (!std::ranges::all_of(name, isNameCharacter)) return ktmxl::kErrorInvalidCharInString.code;
  if (name.front() == '_') return ktmxl::kErrorLeadingUnderscoreInString.code;
  return name.size() > 511 ? ktmxl::kErrorNameTooLong.code : 0;
}

void checkRule(const std::string& name) {
  tStatus status = kterr::makeStatus();
  ktcheckname::checkName(name.c_str(), status);
  require(status.code == expectedCode(name.c_str()), "code of a name");
  require(status.code == 0 || kterr::findEnd(status.json) != nullptr, "elaboration of a name");
  kterr::freeJson(status);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzedDataProvider input(data, size);
  const std::string first = input.ConsumeRandomLengthString();
  const std::string second = input.ConsumeRandomLengthString();
  checkOrder(first, second);
  checkOrder(second, first);
  checkRule(first);
  return 0;
}
