#include "kterr/JsonWriter.h"

#include <array>

#include "kterr/Record.h"

namespace kterr {
namespace {

TEST(JsonWriter, InsertsAtOpeningClosingAndBetween) {
  struct Case {
    const char* text;
    std::size_t position;
    const char* result;
  };
  for (const Case& c : {Case{"{}", 1, R"({"k":1})"},
                        {"{}", 0, R"({"k":1})"},
                        {"{ \n}", 2, "{ \"k\":1\n}"},
                        {R"({"a":[]})", 7, R"({"a":[],"k":1})"},
                        {R"({"a":2})", 0, R"({"k":1,"a":2})"},
                        {R"({"a":{}})", 5, R"({"a":{"k":1}})"}}) {
    Record record(c.text);
    const char* behind = addInt(record.json + c.position, "k", 1);
    EXPECT_EQ(record.text(), c.result);
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

// Writes members until one does not fit; every one of them is there whole or not at all.
TEST(JsonWriter, FillsAFixedBufferToItsLastByteAndNeverBeyond) {
  for (std::uint32_t capacity = 4; capacity < 60; ++capacity) {
    std::string buffer(capacity, '#');
    tStatus status{0, capacity, nullptr, buffer.data()};
    ASSERT_TRUE(copyJson(status.json, capacity, "{}"));
    JsonCursor cursor{status.json + 1, nullptr, &status};
    std::string expected = "{}";
    for (const auto& [key, value] : {std::pair("a", "b"), {"c\n", "d"}, {"e", "0123456789"}, {"f", "g"}}) {
      cursor = put(cursor, key, value);
      if (cursor.position == nullptr) break;
      const std::string escapedKey = key[1] == '\n' ? "c\\n" : key;
      expected.insert(expected.size() - 1,
                      std::string(expected.size() > 2 ? "," : "") + '"' + escapedKey + "\":\"" + value + '"');
    }
    EXPECT_EQ(status.json, expected);
    EXPECT_GE(capacity, expected.size() + 2);
    expectWellFormed(status);
  }
}

TEST(JsonWriter, FitsExactly) {
  for (const std::uint32_t capacity : {10u, 11u}) {  // {"a":"b"}, terminator, sentinel
    std::array<char, 11> buffer{};
    copyJson(buffer.data(), capacity, "{}");
    EXPECT_EQ(addString(buffer.data() + 1, "a", "b") != nullptr, capacity == 11);
    EXPECT_STREQ(buffer.data(), capacity == 11 ? R"({"a":"b"})" : "{}");
  }
}

TEST(JsonWriter, StopsWhereGrowthFails) {
  const auto grown = [](bool (*callback)(tStatus*, std::uint32_t)) {
    Record record("{}");
    record.reallocJson = callback;
    JsonCursor cursor = put({record.json + 1, growJson, &record}, "k", std::string(600, 'x').c_str());
    cursor = put(cursor, "late", "never");
    record.reallocJson = defaultReallocJson;
    EXPECT_EQ(record.text() == "{}", cursor.position == nullptr);
    return cursor.position != nullptr;
  };
  EXPECT_TRUE(grown(defaultReallocJson));
  EXPECT_FALSE(grown(nullptr));
  EXPECT_FALSE(grown([](tStatus*, std::uint32_t) { return false; }));
  EXPECT_FALSE(grown([](tStatus*, std::uint32_t) { return true; }));  // grants what it does not give

  Record damaged("{}", [](tStatus* status, std::uint32_t capacity) {
    const bool done = defaultReallocJson(status, capacity);
    if (capacity > 512) status->json[0] = '#';
    return done;
  });
  EXPECT_EQ(growJson(damaged.json + 1, damaged), nullptr);
  Record largest("{}");
  largest.reallocJson = [](tStatus*, std::uint32_t) {
    ADD_FAILURE();
    return false;
  };
  largest.capacity = 0x40000002;
  EXPECT_EQ(growJson(largest.json + 1, largest), nullptr);
  largest.reallocJson = defaultReallocJson;
}

}  // namespace
}  // namespace kterr
