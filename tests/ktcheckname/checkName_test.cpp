#include "ktcheckname/checkName.h"

#include <string>

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

std::string fault(const std::string& code, const std::string& constant, int line, const std::string& entries) {
  return code + R"( {"error_constant":"ktmxl::)" + constant + R"(","file":"ktcheckname\\checkName","line":)" +
         std::to_string(line) + R"(,"component":"ktorbau","translator":"mxlator_ktorba","translator_info":)" +
         R"({"is_debug":"0","version":1,"ordered_data":[)" + entries + "]}}";
}

std::string entry(const std::string& tag, const std::string& value, const std::string& type) {
  return R"({"type":"usage","usage":"kUsageType)" + tag + R"(","value":")" + value + R"(","value_type":")" + type +
         R"("})";
}

std::string badCharacter(int line, const std::string& position, const std::string& name, const std::string& comment) {
  return fault("-1074098079", "kErrorInvalidCharInString", line,
               entry("PositionOfInvalidCharacter", position, "uint64_t") + "," +
                   entry("InvalidString", name, "string") + comment);
}

TEST(CheckName, ReportsTheFirstFault) {
  EXPECT_EQ(check(nullptr), fault("-1074098093", "kErrorNULLPtr", 48, ""));
  EXPECT_EQ(check(""), fault("-1074098043", "kErrorEmptyString", 55, ""));
  EXPECT_EQ(check("_ b\x7F"), badCharacter(70, "3", R"(_ b\u007f)", ""));
  EXPECT_EQ(check("_b "),
            badCharacter(102, "2", "_b ", R"(,{"type":"comment","comment":"whitespace is not allowed."})"));
  EXPECT_EQ(check("_x"),
            fault("-1074098082", "kErrorLeadingUnderscoreInString", 111, entry("InvalidString", "_x", "string")));
  EXPECT_EQ(check(std::string(kMaxNameLength + 1, 'a').c_str()),
            fault("-1074097806", "kErrorNameTooLong", 119, entry("MaxLength", "511", "uint64_t")));
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
