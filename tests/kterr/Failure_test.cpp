#include "kterr/Failure.h"

#include <gmock/gmock.h>

#include "testing/Record.h"
#include "testing/caught.h"

namespace kterr {
namespace {

TEST(Failure, ReadsInTheOrderOfItsStatement) {
  const Exception exception = caught([] {
    Failure(ktorba_errors::kErrorSpecifiedWaveformNotFound)
        .at(R"(a\b)", 221)
        .usage(kUsageTypeWaveformName, std::string("wave1"))
        .message("f", "late \"text\"")
        .usage("n", std::uint64_t{7})
        .raise();
  });
  EXPECT_EQ(exception.code(), -1074101603);
  EXPECT_STREQ(exception.what(),
               R"({"error_constant":"ktorba_errors::kErrorSpecifiedWaveformNotFound","file":"a\\b","line":221,)"
               R"("component":"ktorbau","translator":"mxlator_ktorba","translator_info":{"is_debug":"0",)"
               R"("version":1,"ordered_data":[{"type":"usage","usage":"kUsageTypeWaveformName",)"
               R"("value":"wave1","value_type":"string"},{"type":"usage","usage":"n","value":"7",)"
               R"("value_type":"uint64_t"}]},"f":"late \"text\""})");
  EXPECT_EQ(exception.status().capacity, 512u);
  expectWellFormed(exception.status());
  EXPECT_THAT(
      caught([] { Failure(ktorba_codes::kNotAGenerator).at("a").raise(); }).what(),
      testing::AllOf(testing::StartsWith(R"({"file":"a","line":)"), testing::EndsWith(R"(,"component":"ktorbau"})")));
}

TEST(Failure, CopyingMovesTheText) {
  Exception original;
  setCode(original.status(), -5);
  EXPECT_EQ(original.what(), nullptr);
  setJson(original.status(), R"({"a":1})");
  const Exception copy(original);
  EXPECT_STREQ(copy.what(), R"({"a":1})");
  EXPECT_EQ(copy.code(), -5);
  EXPECT_EQ(original.getJson(), nullptr);
}

// A long elaboration with members, values and a comment.
void elaborate(tStatus& status) {
  setCode(status, -5);
  ElaborationWriter writer(status, "constant");
  writer.place("file", 1);
  writer.message("function", std::string(300, 'm').c_str());
  for (int i = 0; i < 8; ++i) writer.usage("value", i);
  writer.comment("line\nfeed");
  writer.usage("quoted\"", "\x01");
}

TEST(ElaborationWriter, CutsTheTextWhereGrowthFails) {
  Record whole;
  ASSERT_TRUE(ensureCapacity(whole, 4096));
  elaborate(whole);
  std::string longest;
  for (int granted = 0; granted <= 3; ++granted) {
    Limited::callsLeft = granted;
    Record record(nullptr, Limited::reallocJson);
    elaborate(record);
    EXPECT_EQ(record.code, -5);
    if (granted == 0) {
      EXPECT_EQ(record.json, nullptr);
      continue;
    }
    expectWellFormed(record);
    EXPECT_GT(record.text().size(), longest.size());
    longest = record.text();
    EXPECT_EQ(record.capacity, 256u << granted);
    // Cut, then closed: what stands before the closing characters is the start of the whole text.
    EXPECT_THAT(whole.text(), testing::StartsWith(longest.substr(0, longest.find_last_not_of("}]") + 1)));
  }
  EXPECT_EQ(longest, whole.text());
}

TEST(RaiseIfError, TakesTheRecordsTextOver) {
  Record record(R"({"a":1})");
  record.code = 5;
  raiseIfError(record);
  record.code = -5;
  const Exception exception = caught([&] { raiseIfError(record); });
  EXPECT_EQ(exception.code(), -5);
  EXPECT_STREQ(exception.what(), R"({"a":1})");
  EXPECT_EQ(record.json, nullptr);
}

TEST(RaiseLocated, WritesThePlaceAsFarAsItIsKnown) {
  const std::tuple<std::uint32_t, const char*, const char*, const char*> cases[] = {
      {208, "comp", R"(a\b)", R"({"file":"a\\b","line":7,"component":"comp"})"},
      {208, "", "a", R"({"file":"a","line":7})"},
      {208, "comp", "", R"({"component":"comp"})"},
      {208, "", "", nullptr},
      {207, "comp", "a", nullptr}};
  for (const auto& [structSize, component, file, text] : cases) {
    tLocatedStatus status = makeLocatedStatus();
    raiseLocated(status);
    mergeCode(status, -5, component, file, 7);
    status.structSize = structSize;
    const Exception exception = caught([&] { raiseLocated(status); });
    EXPECT_EQ(exception.code(), -5);
    EXPECT_STREQ(exception.what(), text);
  }
}

TEST(Raise, IsSilentWhileAnotherExceptionPropagates) {
  struct RaiseOnExit {
    ~RaiseOnExit() {
      Record record;
      record.code = -6;
      raiseIfError(record);
      tLocatedStatus located = makeLocatedStatus();
      located.code = -7;
      raiseLocated(located);
    }
  };
  const Exception exception = caught([] {
    RaiseOnExit guard;
    Failure(ktorba_errors::kErrorWaveformNameIsEmpty).at("a").raise();
  });
  EXPECT_EQ(exception.code(), ktorba_errors::kErrorWaveformNameIsEmpty.code);
}

}  // namespace
}  // namespace kterr
