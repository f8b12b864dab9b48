#include "ktcheckname/checkName.h"

#include <gtest/gtest.h>

#include <string>

#include "kterr/Exception.h"

namespace ktcheckname {
namespace {

class CheckName : public testing::Test {
 protected:
  ~CheckName() override { kterr::freeJson(status); }

  // The code and the elaboration of a record that held `code` before.
  std::int32_t check(const char* name, std::int32_t code = 0) {
    kterr::freeJson(status);
    status.code = code;
    checkName(name, status);
    return status.code;
  }

  tStatus status = kterr::makeStatus();
};

std::string elaboration(const std::string& constant, const std::string& line, const std::string& entries) {
  return R"({"error_constant":"ktmxl::)" + constant + R"(","file":"ktcheckname\\checkName","line":)" + line +
         R"(,"component":"ktorbau","translator":"mxlator_ktorba","translator_info":{"is_debug":"0","version":1,)" +
         R"("ordered_data":[)" + entries + "]}}";
}

std::string entry(const std::string& tag, const std::string& value, const std::string& type) {
  return R"({"type":"usage","usage":"kUsageType)" + tag + R"(","value":")" + value + R"(","value_type":")" + type +
         R"("})";
}

std::string positionAndName(const std::string& position, const std::string& name) {
  return entry("PositionOfInvalidCharacter", position, "uint64_t") + "," + entry("InvalidString", name, "string");
}

TEST_F(CheckName, ReportsTheFirstFault) {
  const std::string comment = R"(,{"type":"comment","comment":"whitespace is not allowed."})";
  struct Case {
    const char* name;
    std::int32_t code;
    std::string text;
  };
  const std::string tooLong(kMaxNameLength + 1, 'a');
  const Case cases[] = {
      {nullptr, -1074098093, elaboration("kErrorNULLPtr", "48", "")},
      {"", -1074098043, elaboration("kErrorEmptyString", "55", "")},
      {"a.b", -1074098079, elaboration("kErrorInvalidCharInString", "70", positionAndName("1", "a.b"))},
      {"_ b\x7F", -1074098079, elaboration("kErrorInvalidCharInString", "70", positionAndName("3", R"(_ b\u007f)"))},
      {"_b ", -1074098079, elaboration("kErrorInvalidCharInString", "102", positionAndName("2", "_b ") + comment)},
      {"_x", -1074098082,
       elaboration("kErrorLeadingUnderscoreInString", "111", entry("InvalidString", "_x", "string"))},
      {tooLong.c_str(), -1074097806, elaboration("kErrorNameTooLong", "119", entry("MaxLength", "511", "uint64_t"))},
  };
  for (const Case& c : cases) {
    EXPECT_EQ(check(c.name), c.code) << c.text;
    EXPECT_STREQ(status.json, c.text.c_str());
  }
}

TEST_F(CheckName, LeavesTheRecordOfAGoodNameAlone) {
  for (const char* name : {"wave_1", "Wave-2", "9x", "-", "a_", "\u00FC", "\x80\xFF"}) {
    EXPECT_EQ(check(name), 0) << name;
    EXPECT_EQ(status.json, nullptr) << name;
  }
  EXPECT_EQ(check(std::string(kMaxNameLength, 'a').c_str(), 5), 5);
}

TEST_F(CheckName, ForbidsSixtyTwoBytesAndTheBlank) {
  int forbidden = 0;
  for (int byte = 1; byte <= 0xFF; ++byte) forbidden += check(std::string{'x', static_cast<char>(byte)}.c_str()) != 0;
  EXPECT_EQ(forbidden, 62 + 1);
}

TEST_F(CheckName, ReplacesAWarningAndKeepsAnError) {
  EXPECT_EQ(check("_x", 5), -1074098082);
  EXPECT_EQ(check("_x", -52005), -52005);
  EXPECT_EQ(status.json, nullptr);
}

}  // namespace
}  // namespace ktcheckname
