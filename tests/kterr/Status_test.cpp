#include "kterr/Status.h"

#include <tuple>
#include <vector>

#include "testing/Record.h"

namespace kterr {
namespace {

TEST(Status, AnErrorWinsOverAWarningAndAWarningOverSuccess) {
  const std::tuple<std::int32_t, std::int32_t, std::int32_t> cases[] = {
      {0, 0, 0},           {0, 5, 5},           {0, -1, -1},
      {5, 0, 5},           {5, 7, 5},           {5, -52003, -52003},
      {-52005, 0, -52005}, {-52005, 5, -52005}, {-52005, -52003, -52005}};
  for (const auto& [old, next, result] : cases) {
    Record record(R"({"a":1})");
    record.code = old;
    tLocatedStatus located = makeLocatedStatus();
    located.code = old;
    EXPECT_EQ(setCode(record, next), old != result);
    EXPECT_EQ(setCode(located, next), old != result);
    EXPECT_EQ(record.code, result) << old << " then " << next;
    EXPECT_EQ(located.code, result);
    EXPECT_EQ(record.text(), old != result ? "{}" : R"({"a":1})");
    expectWellFormed(record);
  }
}

TEST(Status, BuffersGrowInPowersOfTwo) {
  Record record;
  for (const auto& [wanted, capacity] :
       {std::pair{4u, 512u}, {300u, 512u}, {512u, 512u}, {513u, 1024u}, {100u, 1024u}, {1025u, 2048u}}) {
    EXPECT_TRUE(defaultReallocJson(&record, wanted));
    EXPECT_EQ(record.capacity, capacity) << wanted;
    expectWellFormed(record);
    setJson(record, R"({"kept":1})");
  }
  EXPECT_FALSE(defaultReallocJson(&record, 0x80000000));
  EXPECT_EQ(record.text(), R"({"kept":1})");
  EXPECT_TRUE(defaultReallocJson(&record, 0));
  EXPECT_EQ(record.json, nullptr);
  EXPECT_EQ(record.capacity, 0u);

  Record lying(std::string(600, ' ').c_str());
  lying.capacity = 0;
  EXPECT_FALSE(defaultReallocJson(&lying, 512));
  EXPECT_EQ(lying.text(), std::string(600, ' '));
}

TEST(Status, CopyJsonNeedsRoomForTerminatorAndSentinel) {
  std::vector<char> buffer(9, '#');
  EXPECT_FALSE(copyJson(buffer.data(), 8, R"({"a":1})"));
  EXPECT_EQ(std::string(buffer.begin(), buffer.end()), "#########");
  EXPECT_TRUE(copyJson(buffer.data(), 9, R"({"a":1})"));
  EXPECT_EQ(std::string(buffer.begin(), buffer.end()), std::string("{\"a\":1}\0J", 9));
  buffer[2] = '\0';
  EXPECT_TRUE(copyJson(buffer.data(), 9, nullptr));
  EXPECT_EQ(std::string(buffer.begin(), buffer.end()), std::string("{\"\0\0\0\0\0\0J", 9));
}

TEST(Status, SetJsonKeepsTheOldTextWhereTheNewOneDoesNotFit) {
  Limited::callsLeft = 1;
  Record record(R"({"a":1})", Limited::reallocJson);
  EXPECT_FALSE(setJson(record, std::string(511, ' ').c_str()));
  EXPECT_EQ(record.text(), R"({"a":1})");
  EXPECT_TRUE(setJson(record, std::string(510, ' ').c_str()));
  EXPECT_TRUE(setJson(record, nullptr));
  EXPECT_EQ(record.text(), "{}");
}

TEST(Status, MergingTakesTheTextOverOrCopiesIt) {
  Record source(R"({"a":1})");
  source.code = -5;
  const char* text = source.json;
  Record same("{}");
  mergeStatus(same, source);
  EXPECT_EQ(same.json, text);
  EXPECT_EQ(source.json, nullptr);
  EXPECT_EQ(source.capacity, 0u);

  Limited::callsLeft = 1;
  Record other(nullptr, Limited::reallocJson);
  mergeStatus(other, same);
  EXPECT_EQ(other.code, -5);
  EXPECT_EQ(other.text(), R"({"a":1})");
  EXPECT_EQ(same.text(), R"({"a":1})");

  Record failed(R"({"b":2})");
  failed.code = -6;
  mergeStatus(failed, same);
  EXPECT_EQ(failed.text(), R"({"b":2})");
}

TEST(LocatedStatus, KeepsThePlaceOfTheFirstError) {
  tLocatedStatus status = makeLocatedStatus();
  EXPECT_EQ(status.structSize, 208u);
  const std::string path = std::string(49, 'a') + "xyz" + std::string(49, 'b');
  mergeCode(status, -5, "0123456789", path.c_str(), 7);
  mergeCode(status, -6, "late", "late", 8);
  EXPECT_EQ(status.code, -5);
  EXPECT_STREQ(status.component, "012345678");
  EXPECT_EQ(status.file, std::string(49, 'a') + ".." + std::string(49, 'b'));
  EXPECT_EQ(status.line, 7u);

  tLocatedStatus fits = makeLocatedStatus();
  mergeCode(fits, 1, "", path.substr(1).c_str(), 7);
  EXPECT_EQ(fits.file, path.substr(1));

  tLocatedStatus small = makeLocatedStatus();
  small.structSize = 207;
  mergeCode(small, -5, "component", "file", 7);
  EXPECT_EQ(small.code, -5);
  EXPECT_STREQ(small.file, "");
}

}  // namespace
}  // namespace kterr
