#include <gmock/gmock.h>

#include <cfloat>
#include <cmath>

#include "tools/text/durations.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

TEST(Quantities, ReadPrefixesAndUnits) {
  const std::pair<const char*, std::optional<double>> seconds[] = {{"20ms", 0.02},
                                                                   {"1.5us", 1.5e-6},
                                                                   {"1.5\u00b5s", 1.5e-6},
                                                                   {"3s", 3},
                                                                   {"+2k", 2000},
                                                                   {"-1e3", -1000},
                                                                   {"m", {}},
                                                                   {"", {}},
                                                                   {"20Hz", {}},
                                                                   {"1e999", {}},
                                                                   {"nan", {}},
                                                                   {"1 s", {}},
                                                                   {"1.005ks", 1005},
                                                                   {"4.35e1ks", 43500},
                                                                   {"1e-310ms", 1e-313},
                                                                   {"1e308ks", {}},
                                                                   {"0e99999999999ks", 0}};
  for (const auto& [text, expected] : seconds) EXPECT_EQ(parseQuantity(text, "s"), expected) << text;
  EXPECT_EQ(parseNumber("1k"), std::nullopt);
}

TEST(Quantities, CountSamplesExactly) {
  struct Case {
    const char* text;
    double rateHz;
    std::uint64_t samples;
    CountFault fault = CountFault::kNone;
  };
  const Case cases[] = {
      {"20ms", 44100, 882},
      {"1M", 1, 1'000'000},
      {"+1.5k", 1, 1500},
      {"9007199254740993", 1, 9'007'199'254'740'993},
      {"18446744073709551614", 1, UINT64_MAX - 1},
      {"18446744073709551615", 1, 0, CountFault::kTooLarge},
      {"1e999999999999", 1, 0, CountFault::kNoNumber},
      {"1e300", 1, 0, CountFault::kTooLarge},
      {"0e300", 1, 0},
      {"7036874.417766401s", 1.28e9, 9'007'199'254'740'993},
      {"14411518807.5855871984375s", 1.28e9, UINT64_MAX - 1},
      {"14411518807.6s", 1.28e9, 0, CountFault::kTooLarge},
      {"1us", 0.4e6, 0},
      {"1.25us", 0.4e6, 1},
      {"1e-300s", 1, 0},
      {"10000000000000000000000000000000000000000000000000000000000000000000000.1e-52", 1, 0, CountFault::kFraction},
      {"1.5", 1e6, 0, CountFault::kFraction},
      {"1e-300", 1, 0, CountFault::kFraction},
      {"-1", 1e6, 0, CountFault::kNegative},
      {"-2ms", 1e6, 0, CountFault::kNegative},
      {"20m", 1e6, 0, CountFault::kFraction},
      {"s", 1e6, 0, CountFault::kNoNumber},
      {"", 1e6, 0, CountFault::kNoNumber},
      {"1 ms", 1e6, 0, CountFault::kNoNumber},
  };
  for (const auto& [text, rateHz, samples, fault] : cases) {
    const SampleCount count = readSampleCount(text, rateHz);
    EXPECT_EQ(count.fault, fault) << text;
    EXPECT_EQ(count.samples, samples) << text;
  }
}

TEST(Quantities, AreWrittenForPeople) {
  EXPECT_EQ(formatQuantity(0.0123, "s"), "12.3 ms");
  EXPECT_EQ(formatQuantity(1e-3, "s"), "1 ms");
  EXPECT_EQ(formatQuantity(1.25e-6, "s"), "1.25 \u00b5s");
  EXPECT_EQ(formatQuantity(44100, "S/s"), "44.1 kS/s");
  EXPECT_EQ(formatQuantity(0, "s"), "0 s");
  EXPECT_EQ(formatQuantity(-0.5, "s"), "-500 ms");
  EXPECT_EQ(formatQuantity(1e300, "S/s"), "1e+300 S/s");
  EXPECT_EQ(formatQuantity(-HUGE_VAL, "s") + formatQuantity(NAN, "s"), "-inf snan s");
  EXPECT_EQ(formatCount(1234567), "1\u2009234\u2009567");
}

TEST(Durations, AreExactWhereADecimalNumberIs) {
  struct Case {
    std::uint64_t samples;
    double rateHz;
    const char* seconds;
    const char* shown;
  };
  const Case cases[] = {
      {0, 44100, "0", "0 s"},
      {1200, 1e6, "0.0012", "1.2 ms"},
      {441, 44100, "0.01", "10 ms"},
      {3, 0.001, "3000", "3\u2009000 s"},
      {1, 1.28e9, "0.00000000078125", "781.25 ps"},
      {1, 1e12, "0.000000000001", "1 ps"},
      {9'007'199'254'740'993, 1.28e9, "7036874.41776640078125", "7\u2009036\u2009874.41776640078125 s"},
      {UINT64_MAX, 1e-3, "18446744073709551615000", "18446744073709551615000 s"},
      {UINT64_MAX, 1.28e9, "14411518807.58558719921875", "14\u2009411\u2009518\u2009807.58558719921875 s"},
      {1000, 44100, "0.022675736961451", "about 22.67573696 ms"},
      {1, 3e12, "0.000000000000333", "about 333 fs"},
      {1, 3e16, "0", "about 0 fs"},
      {2, 3e15, "0.000000000000001", "about 1 fs"},
      {UINT64_MAX, 3, "6148914691236517205", "6\u2009148\u2009914\u2009691\u2009236\u2009517\u2009205 s"},
      {10'000'000'000, 3, "3333333333.333333333333333", "about 3\u2009333\u2009333\u2009333 s"},
  };
  for (const auto& [samples, rateHz, seconds, shown] : cases) {
    EXPECT_EQ(secondsOf(samples, rateHz), seconds);
    EXPECT_EQ(formatDuration(samples, rateHz), shown);
  }
}

TEST(Quantities, ReadBackToWithinTheirDigits) {
  for (double value = DBL_TRUE_MIN; value <= DBL_MAX; value *= 1.9) {
    for (const double each : {value, -value}) {
      std::string text = formatQuantity(each, "s");
      std::erase(text, ' ');
      const auto read = parseQuantity(text, "s");
      ASSERT_TRUE(read) << text;
      EXPECT_LE(std::abs(*read - each), 5.001e-4 * value) << text;
    }
  }
}

TEST(NearMiss, FindsMistypedNamesAndNothingElse) {
  const std::string words[] = {"generate", "wait", "repeat", "clear"};
  const std::pair<const char*, const char*> cases[] = {{"genrate", "generate"}, {"WIAT", "wait"}, {"claer", "clear"},
                                                       {"repeating", "repeat"}, {"x", ""},        {"play", ""}};
  for (const auto& [word, expected] : cases) EXPECT_EQ(findNearMiss(word, words), expected) << word;
  EXPECT_EQ(findNearMiss(std::string(1 << 20, 'a'), words), "");
}

}  // namespace
}  // namespace tools
