#include "kterr/JsonWriter.h"

#include "testing/Record.h"

namespace kterr {
namespace {

TEST(JsonWriter, InsertsAtOpeningClosingAndBetween) {
  for (const auto& [text, position, result] : {std::tuple{"{}", 1, R"({"k":1})"},
                                               {"{}", 0, R"({"k":1})"},
                                               {"{ \n}", 2, "{ \"k\":1\n}"},
                                               {R"({"a":[]})", 7, R"({"a":[],"k":1})"},
                                               {R"({"a":2})", 0, R"({"k":1,"a":2})"},
                                               {R"({"a":{}})", 5, R"({"a":{"k":1}})"}}) {
    Record record(text);
    const char* behind = addInt(record.json + position, "k", 1);
    EXPECT_EQ(record.text(), result);
    EXPECT_EQ(std::string(behind - 1, 1), "1");
    expectWellFormed(record);
  }
}

TEST(JsonWriter, WritesEachKindOfValue) {
  Record record("[]");
  JsonCursor cursor{record.json + 1, growJson, &record};
  cursor = put(put(cursor, nullptr, INT32_MIN), nullptr, UINT32_MAX);
  cursor = putArray(putObject(cursor, nullptr), nullptr);
  cursor = put(cursor, nullptr, "/\b\t\n\f\r\"\\\x01\x1F\x7F\xC3\xBC");
  EXPECT_EQ(record.text(), R"([-2147483648,4294967295,{},[],"/\b\t\n\f\r\"\\\u0001\u001f\u007f)"
                           "\xC3\xBC\"]");
  EXPECT_EQ(cursor.position, record.json + record.text().size() - 1);
  EXPECT_EQ(escapedLength("a\"\x01"), 9u);
}

TEST(JsonWriter, FillsAFixedBufferToItsLastByteAndNeverBeyond) {
  const std::string texts[] = {"{}", R"({"a":"b"})", R"({"a":"b","c\n":"0123456789"})",
                               R"({"a":"b","c\n":"0123456789","d":"e"})"};
  for (std::uint32_t capacity = 4; capacity < 45; ++capacity) {
    std::string buffer(capacity, '#');
    tStatus status{0, capacity, nullptr, buffer.data()};
    ASSERT_TRUE(copyJson(status.json, capacity, "{}"));
    put(put(put({status.json + 1, nullptr, &status}, "a", "b"), "c\n", "0123456789"), "d", "e");
    std::size_t fitting = 0;
    while (fitting < 3 && texts[fitting + 1].size() + 2 <= capacity) ++fitting;
    EXPECT_EQ(status.json, texts[fitting]);
    expectWellFormed(status);
  }
}

TEST(JsonWriter, StopsWhereGrowthFails) {
  decltype(tStatus::reallocJson) const callbacks[] = {
      nullptr, [](tStatus*, std::uint32_t) { return false; },
      [](tStatus*, std::uint32_t) { return true; },  // grants what it does not give
  };
  for (const auto callback : callbacks) {
    Record record("{}");
    record.reallocJson = callback;
    const JsonCursor stopped = put({record.json + 1, growJson, &record}, "k", std::string(600, 'x').c_str());
    EXPECT_EQ(put(stopped, "late", "never").position, nullptr);
    EXPECT_EQ(record.text(), "{}");
    record.reallocJson = defaultReallocJson;
  }

  Record damaged("{}", [](tStatus* status, std::uint32_t capacity) {
    const bool done = defaultReallocJson(status, capacity);
    if (capacity > 512) status->json[0] = '#';
    return done;
  });
  EXPECT_EQ(growJson(damaged.json + 1, damaged), nullptr);
}

}  // namespace
}  // namespace kterr
