#include "ktcheckname/checkName.h"

#include <regex>

#include "testing/Record.h"

namespace ktcheckname {
namespace {

// What the record of a check says: its code and its elaboration, "none" where there is none.
std::string check(const char* name, std::int32_t codeBefore = 0) {
  Record record;
  record.code = codeBefore;
  checkName(name, record);
  return std::to_string(record.code) + " " + (record.json != nullptr ? record.json : "none");
}

TEST(CheckName, ReportsTheFirstFault) {
  const std::string tooLong(kMaxNameLength + 1, 'a');
  const struct {
    const char *name, *fault, *entries;
  } kCases[] = {
      {nullptr, R"(-1074098093 #NULLPtr","file":"ktcheckname\\checkName","line":48)", ""},
      {"", R"(-1074098043 #EmptyString","file":"ktcheckname\\checkName","line":55)", ""},
      {"_ b\x7F", R"(-1074098079 #InvalidCharInString","file":"ktcheckname\\checkName","line":70)",
       R"(@PositionOfInvalidCharacter","value":"3","value_type":"uint64_t"},)"
       R"(@InvalidString","value":"_ b\u007f","value_type":"string"})"},
      {"_b ", R"(-1074098079 #InvalidCharInString","file":"ktcheckname\\checkName","line":102)",
       R"(@PositionOfInvalidCharacter","value":"2","value_type":"uint64_t"},)"
       R"(@InvalidString","value":"_b ","value_type":"string"},)"
       R"({"type":"comment","comment":"whitespace is not allowed."})"},
      {"_x", R"(-1074098082 #LeadingUnderscoreInString","file":"ktcheckname\\checkName","line":111)",
       R"(@InvalidString","value":"_x","value_type":"string"})"},
      {tooLong.c_str(), R"(-1074097806 #NameTooLong","file":"ktcheckname\\checkName","line":119)",
       R"(@MaxLength","value":"511","value_type":"uint64_t"})"},
  };
  for (const auto& [name, fault, entries] : kCases) {
    std::string expected = fault +
                           std::string(R"(,"component":"ktorbau","translator":"mxlator_ktorba",)"
                                       R"("translator_info":{"is_debug":"0","version":1,"ordered_data":[)") +
                           entries + "]}}";
    expected = std::regex_replace(expected, std::regex("#"), R"({"error_constant":"ktmxl::kError)");
    EXPECT_EQ(check(name), std::regex_replace(expected, std::regex("@"), R"({"type":"usage","usage":"kUsageType)"));
  }
}

TEST(CheckName, LeavesTheRecordOfAGoodNameAlone) {
  for (const char* name : {"wave_1", "Wave-2", "9x", "-", "a_", "\u00FC", "\x80\xFF"}) {
    EXPECT_EQ(check(name), "0 none") << name;
  }
  EXPECT_EQ(check(std::string(kMaxNameLength, 'a').c_str(), 5), "5 none");
}

TEST(CheckName, TakesLettersDigitsAndBytesAboveAscii) {
  const std::string taken = "-0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ_abcdefghijklmnopqrstuvwxyz";
  for (int byte = 1; byte <= 0xFF; ++byte) {
    const bool isGood = byte >= 0x80 || taken.find(static_cast<char>(byte)) != std::string::npos;
    EXPECT_EQ(check(std::string{'x', static_cast<char>(byte)}.c_str()) == "0 none", isGood) << byte;
  }
}

TEST(CheckName, ReplacesAWarningAndKeepsAnError) {
  EXPECT_EQ(check("_x", 5), check("_x"));
  EXPECT_EQ(check("_x", -52005), "-52005 none");
}

}  // namespace
}  // namespace ktcheckname
