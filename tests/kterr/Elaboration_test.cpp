#include "kterr/Elaboration.h"

#include <cstdlib>
#include <limits>

#include "testing/Record.h"

namespace kterr {
namespace {

TEST(Elaboration, FormatsEngineeringTexts) {
  const std::pair<double, const char*> cases[] = {{1.0, "1.0"},     {0.5, "500.0e-3"}, {1234.5, "1.234500e3"},
                                                  {0.0, "0.0"},     {-0.0, "0.0"},     {-1500.25, "-1.500250e3"},
                                                  {2000, "2.0e3"},  {1000, "1.0e3"},   {999.5, "999.500000"},
                                                  {1e-3, "1.0e-3"}, {-7, "-7.0"},      {1e300, nullptr},
                                                  {5e-324, nullptr}};
  for (const auto& [value, text] : cases) {
    const std::string formatted = formatEngineering(value);
    if (text != nullptr) {
      EXPECT_EQ(formatted, text);
    }
    EXPECT_NEAR(std::strtod(formatted.c_str(), nullptr) / (value != 0 ? value : 1), value != 0, 1e-6) << formatted;
  }
}

TEST(Elaboration, WritesEachTypeOfValue) {
  Record record("{}");
  JsonCursor cursor = getOrderedData(record, kTranslator);
  cursor = addUsage(addUsage(cursor, "a", std::int32_t{-1}), "b", std::uint32_t{4000000000});
  cursor = addUsage(addUsage(cursor, "c", INT64_MIN), "d", UINT64_MAX);
  cursor = addUsage(addUsage(cursor, "e", 0.5f), "f", std::numeric_limits<float>::quiet_NaN());
  cursor = addUsage(addUsage(cursor, "g", -std::numeric_limits<float>::infinity()), "h\n", "i");
  addComment(cursor, "j\\");
  const auto entry = [](const std::string& tag, const std::string& value, const std::string& type) {
    return R"({"type":"usage","usage":")" + tag + R"(","value":)" + value + R"(,"value_type":")" + type + R"("},)";
  };
  EXPECT_EQ(record.text(),
            R"({"translator":"mxlator_ktorba","translator_info":{"is_debug":"0","version":1,"ordered_data":[)" +
                entry("a", "-1", "int32_t") + entry("b", "4000000000", "uint32_t") +
                entry("c", R"("-9223372036854775808")", "int64_t") +
                entry("d", R"("18446744073709551615")", "uint64_t") + entry("e", R"("500.0e-3")", "float") +
                entry("f", R"("NaN")", "float") + entry("g", R"("-Infinity")", "float") +
                entry(R"(h\n)", R"("i")", "string") + R"({"type":"comment","comment":"j\\"}]}})");
  expectWellFormed(record);
}

TEST(Elaboration, OpensTheBlockWhereverItIsMissing) {
  const std::string info = R"("is_debug":"0","version":1,"ordered_data":[#])";
  for (const auto& [before, after] :  // '#': where the cursor is to stand

       {std::pair<std::string, std::string>{"", R"({"translator":"mxlator_ktorba","translator_info":{)" + info + "}}"},
        {R"({"a":{"translator":"x"}})",
         R"({"a":{"translator":"x"},"translator":"mxlator_ktorba","translator_info":{)" + info + "}}"},
        {R"({"translator":"mxlator_ktorba"})", R"({"translator":"mxlator_ktorba","translator_info":{)" + info + "}}"},
        {R"({"translator":"mxlator_ktorba","translator_info":{"a":1},"b":2})",
         R"({"translator":"mxlator_ktorba","translator_info":{)" + info + R"(,"a":1},"b":2})"},
        {R"({"translator":"mxlator_ktorba","translator_info":{"ordered_data":[{}]}})",
         R"({"translator":"mxlator_ktorba","translator_info":{"ordered_data":[{}#]}})"}}) {
    Record record(before.empty() ? nullptr : before.c_str());
    const JsonCursor cursor = getOrderedData(record, kTranslator);
    ASSERT_NE(cursor.position, nullptr) << before;
    EXPECT_EQ(record.text().insert(static_cast<std::size_t>(cursor.position - record.json), "#"), after);
    expectWellFormed(record);
  }
  for (const char* text : {"[]", "{", R"({"translator":"mxlator_ktorbu"})", R"({"translator":1})",
                           R"({"translator":"mxlator_ktorba","translator_info":"x"})",
                           R"({"translator":"mxlator_ktorba","translator_info":{"ordered_data":{}}})"}) {
    Record record(text);
    EXPECT_EQ(addUsage(getOrderedData(record, kTranslator), "a", 1).position, nullptr) << text;
    EXPECT_EQ(record.text(), text);
  }
}

}  // namespace
}  // namespace kterr
