// The C interface of the tools: what it answers, and what it refuses.
#include "ktorba/script_tools.h"

#include <gmock/gmock.h>

#include <nlohmann/json.hpp>
#include <numeric>
#include <string>
#include <vector>

#include "testing/seeds.h"

namespace {

using nlohmann::json;

constexpr char kText[] = "// first\nscript s\n  repeat 2\n    generate w marker0(8)\n  end repeat\nend script rest";

struct Answer {
  std::int32_t code = 0;
  json document;
};

template <typename Call>
Answer ask(Call call) {
  ktTools_Document document;
  Answer answer;
  answer.code = call(&document);
  if (document.text != nullptr) answer.document = json::parse(document.text, document.text + document.length);
  ktTools_FreeDocument(&document);
  return answer;
}

Answer check(const std::string& text, const std::string& generator = "") {
  return ask([&](ktTools_Document* document) {
    return ktTools_Check(text.data(), text.size(), generator.data(), generator.size(), document);
  });
}

Answer fit(const std::string& text, const std::string& generator, const std::string& waveforms,
           const std::string& request = "") {
  return ask([&](ktTools_Document* document) {
    return ktTools_Fit(text.data(), text.size(), generator.data(), generator.size(), waveforms.data(), waveforms.size(),
                       request.data(), request.size(), document);
  });
}

std::string kindsOf(const std::string& text) {
  ktTools_Token* tokens = nullptr;
  std::uint64_t count = 0;
  EXPECT_EQ(ktTools_Tokenize(text.data(), text.size(), &tokens, &count), 0);
  std::string kinds;
  std::uint64_t end = 0;
  for (std::uint64_t i = 0; i < count; ++i) {
    EXPECT_GE(tokens[i].offset, end);
    end = tokens[i].offset + tokens[i].length;
    kinds += static_cast<char>('0' + tokens[i].kind);
  }
  EXPECT_LE(end, text.size());
  ktTools_FreeTokens(tokens);
  return kinds;
}

TEST(ScriptTools, CheckTellsRangesAndFixes) {
  const Answer answer = check("script s\n  \u00e4 wiat 64 end script");
  ASSERT_EQ(answer.code, 0);
  EXPECT_EQ(answer.document["schema"], 1);
  EXPECT_EQ(answer.document["diagnostics"][0]["range"]["start"],
            (json{{"offset", 11}, {"line", 2}, {"column", 3}, {"utf16", 2}}));
  EXPECT_EQ(check("script s wait until trigger1 wiat 64 end script").document["diagnostics"][0]["fixes"][0],
            json::parse(R"({"range":{"start":{"offset":29,"line":1,"column":30,"utf16":29},
                                     "end":{"offset":33,"line":1,"column":34,"utf16":33}},
                            "text":"wait","confidence":"certain"})"));
  EXPECT_EQ(check(kText).document["diagnostics"][0]["severity"], "warning");
  EXPECT_EQ(check("script s wait 64 end script").document["diagnostics"], json::array());
}

TEST(ScriptTools, TokensAreInOrderAndOfAKind) {
  EXPECT_EQ(kindsOf(kText), "7121312463611119");
  EXPECT_EQ(kindsOf("script s wait until trigger1 /* a */ 5ms // b"), "12115887");
  EXPECT_EQ(kindsOf(""), "");
}

ktTools_Program* compiled(const std::string& text) {
  const std::string waveforms = R"([{"name":"w","samples":1000}])";
  ktTools_Program* program = nullptr;
  const Answer answer = ask([&](ktTools_Document* document) {
    return ktTools_Compile(text.data(), text.size(), nullptr, 0, waveforms.data(), waveforms.size(), &program,
                           document);
  });
  EXPECT_EQ(answer.code, 0) << answer.document;
  return program;
}

TEST(ScriptTools, ProgramsHaveWordsAndListings) {
  ktTools_Program* const program = compiled(kText);
  EXPECT_EQ(ktTools_ScriptCount(program), 1u);
  const std::uint32_t* words = nullptr;
  std::uint64_t count = 0;
  ASSERT_EQ(ktTools_Words(program, 0, &words, &count), 0);
  const Answer list = ask([&](ktTools_Document* document) { return ktTools_List(program, 0, document); });
  EXPECT_EQ(list.document["instructions"].size(), count);
  EXPECT_EQ(words[3] >> 28, 1u);  // a fetch: the wait for the start
  EXPECT_EQ(list.document["instructions"][2]["meaning"], "play w[0, 1000), marker0 at 8");
  EXPECT_EQ(list.document["instructions"][2]["line"], 4);
  EXPECT_EQ(ktTools_Words(program, 1, &words, &count), KTTOOLS_E_ARGUMENT);
  ktTools_FreeProgram(program);
}

// A ramp, so that a level is the sample's number.
const std::vector<std::int16_t>& ramp() {
  static const auto kRamp = [] {
    std::vector<std::int16_t> samples(1000);
    std::iota(samples.begin(), samples.end(), std::int16_t{0});
    return samples;
  }();
  return kRamp;
}

TEST(ScriptTools, TimelinesTellWhatPlays) {
  ktTools_Program* const program = compiled(
      "script s repeat forever\n generate w marker3(8) wait until trigger2 clear trigger2 wait 64 end repeat end "
      "script");
  const ktTools_Trigger trigger = {5000, 2};
  ktTools_Timeline* unlent = nullptr;
  ktTools_Timeline* timeline = nullptr;
  ASSERT_EQ(ktTools_MakeTimeline(program, 0, &trigger, 1, &unlent), 0);
  EXPECT_EQ(ktTools_LendSamples(program, "W", 1, ramp().data(), 999), KTTOOLS_E_ARGUMENT);
  EXPECT_EQ(ktTools_LendSamples(program, "v", 1, ramp().data(), 1000), KTTOOLS_E_ARGUMENT);
  ASSERT_EQ(ktTools_LendSamples(program, "W", 1, ramp().data(), 1000), 0);
  ASSERT_EQ(ktTools_MakeTimeline(program, 0, &trigger, 1, &timeline), 0);
  for (const std::int32_t number : {0, 8, -1}) {
    const ktTools_Trigger wrong = {0, number};
    ktTools_Timeline* none = nullptr;
    EXPECT_EQ(ktTools_MakeTimeline(program, 0, &wrong, 1, &none), KTTOOLS_E_ARGUMENT) << number;
  }
  ktTools_FreeProgram(program);

  ktTools_Length length;
  ASSERT_EQ(ktTools_PlayLength(timeline, &length), 0);
  // 64 and 1000 samples, 62 passes of 64 up to the trigger, 64, and 1000 again.
  EXPECT_EQ(length.kind, KTTOOLS_LENGTH_WAITING);
  EXPECT_EQ(length.trigger, 2);
  EXPECT_EQ(length.waitingSince, 64u + 1000 + 62 * 64 + 64 + 1000);
  EXPECT_EQ(length.line, 2u);

  ktTools_Run runs[4];
  std::uint64_t count = 0;
  ASSERT_EQ(ktTools_Runs(timeline, 4000, 4, runs, &count), 0);
  ASSERT_EQ(count, 4u);
  EXPECT_EQ(runs[0].kind, KTTOOLS_RUN_WAIT_FOR_TRIGGER);
  EXPECT_EQ(runs[0].sampleCount, 62u * 64);
  EXPECT_EQ(runs[2].kind, KTTOOLS_RUN_WAVEFORM);
  EXPECT_EQ(runs[2].round, 1u);
  EXPECT_EQ(runs[2].markers, 8u);
  EXPECT_EQ(runs[3].sampleCount, KTTOOLS_NO_SAMPLE);
  const char* name = nullptr;
  std::uint64_t nameLength = 0;
  ASSERT_EQ(ktTools_WaveformName(timeline, runs[2].waveform, &name, &nameLength), 0);
  EXPECT_EQ(std::string(name, nameLength), "w");

  std::int16_t levels[3];
  std::uint8_t markers[3];
  ASSERT_EQ(ktTools_Samples(timeline, runs[2].firstSample + 7, 3, levels, markers, &count), 0);
  EXPECT_THAT(levels, testing::ElementsAre(7, 8, 9));
  EXPECT_THAT(markers, testing::ElementsAre(0, 8, 0));
  EXPECT_EQ(ktTools_Samples(unlent, 0, 3, levels, markers, &count), KTTOOLS_E_SAMPLES);
  EXPECT_EQ(ktTools_Samples(unlent, 72, 3, nullptr, markers, &count), 0);
  EXPECT_EQ(markers[0], 8);
  std::int32_t lows[2];
  std::int32_t highs[2];
  ASSERT_EQ(ktTools_Envelope(timeline, 64, 600, 2, lows, highs, &count), 0);
  EXPECT_THAT(lows, testing::ElementsAre(0, 600));
  EXPECT_THAT(highs, testing::ElementsAre(599, 999));
  EXPECT_EQ(ktTools_Envelope(timeline, 64, 0, 2, lows, highs, &count), KTTOOLS_E_ARGUMENT);
  ASSERT_EQ(ktTools_MarkerCount(timeline, 3, 0, KTTOOLS_NO_SAMPLE, &count), 0);
  EXPECT_EQ(count, 2u);
  ASSERT_EQ(ktTools_MarkerPulse(timeline, 3, 1, &count), 0);
  EXPECT_EQ(count, runs[2].firstSample + 8);
  ASSERT_EQ(ktTools_MarkerPulse(timeline, 3, 2, &count), 0);
  EXPECT_EQ(count, KTTOOLS_NO_SAMPLE);
  ktTools_FreeTimeline(unlent);
  ktTools_FreeTimeline(timeline);
}

TEST(ScriptTools, CompareTellsTheFirstDifference) {
  ktTools_Program* const first = compiled("script s generate w generate w end script");
  ktTools_Program* const second = compiled("script s generate w wait 100 end script");
  const auto compare = [&](const std::string& name) {
    return ask(
        [&](ktTools_Document* document) { return ktTools_Compare(first, second, name.data(), name.size(), document); });
  };
  EXPECT_EQ(compare("").code, KTTOOLS_E_SAMPLES);
  for (ktTools_Program* program : {first, second}) {
    ASSERT_EQ(ktTools_LendSamples(program, "w", 1, ramp().data(), 1000), 0);
  }
  const json difference = compare("").document["scripts"][0]["difference"];
  EXPECT_EQ(difference["sample"], "1064") << difference;
  EXPECT_EQ(difference["second"]["column"], 21) << difference;
  EXPECT_EQ(compare("t").code, KTTOOLS_E_ARGUMENT);
  ktTools_FreeProgram(first);
  ktTools_FreeProgram(second);
}

TEST(ScriptTools, FitTellsWhatHasNoPlace) {
  const Answer tight = fit(kText, R"({"memorySizeBytes":1024})", R"([{"name":"w","samples":1000}])");
  EXPECT_EQ(tight.code, 0);
  EXPECT_EQ(tight.document["fits"], false);
  EXPECT_NE(tight.document["waveforms"][0]["refusal"], nullptr);
  EXPECT_EQ(tight.document["scripts"][0]["plays"]["samples"], "2128");
  EXPECT_EQ(fit(kText, "", R"([{"name":"w","samples":1000}])").document["fits"], true);
  EXPECT_EQ(fit(kText, "", "").code, KTTOOLS_E_SCRIPT);
  const json unknown = fit("script s\ngenerate plse end script", "", R"([{"name":"pulse","samples":64}])").document;
  EXPECT_EQ(unknown["diagnostics"][0]["fixes"][0]["text"], "pulse") << unknown;
  EXPECT_EQ(unknown["diagnostics"][0]["fixes"][0]["confidence"], "maybe");
  EXPECT_EQ(unknown["diagnostics"][0]["fixes"][0]["range"]["start"]["offset"], 18);
}

TEST(ScriptTools, FitTakesWhatTheHostDoes) {
  const std::string text =
      "script s\n generate a wait until trigger2 repeat until trigger3 generate b end repeat end script";
  const std::string waveforms = R"([{"name":"a","samples":100},{"name":"b","samples":300}])";
  const json waiting =
      fit(text, "", waveforms, R"({"triggers":["trigger2@1ms"],"cleared":["A"],"streaming":"b"})").document;
  EXPECT_EQ(waiting["scripts"][0]["plays"],
            json::parse(R"({"kind":"waiting","trigger":"trigger3","inLoop":true,"line":2,"column":33,
                            "sinceSample":"1360","sinceSeconds":"0.00136"})"));
  EXPECT_EQ(waiting["memoryMap"]["holes"], 2);
  EXPECT_EQ(waiting["streaming"]["seconds"], "0.0003");
  const json done = fit(text, "", waveforms, R"({"triggers":["trigger3@2ms","trigger2@0","trigger7@1"]})").document;
  EXPECT_EQ(done["idleTriggers"], json::array({"trigger7"}));
  EXPECT_EQ(done["scripts"][0]["plays"]["kind"], "exact");
  EXPECT_EQ(done["streaming"], nullptr);
  for (const char* request :
       {"[]", "{", R"({"triggers":"trigger1@0"})", R"({"triggers":[1]})", R"({"cleared":["c"]})",
        R"({"triggers":["trigger1@-1"]})", R"({"streaming":1})", R"({"streaming":"c"})", R"({"streams":"a"})"}) {
    EXPECT_EQ(fit(text, "", waveforms, request).code, KTTOOLS_E_JSON) << request;
  }
}

TEST(ScriptTools, RefusesWhatNoCallerMayGive) {
  for (const char* generator :
       {"{", "[]", "7", R"({"sampleWidth":16})", R"({"sampleWidthBits":12})", R"({"sampleWidthBits":"16"})",
        R"({"memorySizeBytes":4294967296})", R"({"minFetchSamples":-1})", R"({"sampleRateHz":1e300})", "\xFF"}) {
    const Answer answer = check("", generator);
    EXPECT_EQ(answer.code, KTTOOLS_E_JSON) << generator;
    EXPECT_NE(answer.document["error"], "") << generator;
  }
  for (const char* waveforms : {"{}", "[1]", R"([{"name":"a","samples":64},{"name":"A","samples":64}])",
                                R"([{"name":"w"}, 2])", R"([{"samples":64}])", R"([{"name":"w","samples":1.5}])"}) {
    EXPECT_EQ(fit(kText, "", waveforms).code, KTTOOLS_E_JSON) << waveforms;
  }
  ktTools_Document document;
  EXPECT_EQ(ktTools_Check(nullptr, 5, nullptr, 0, &document), KTTOOLS_E_ARGUMENT);
  ktTools_FreeDocument(&document);
  EXPECT_EQ(ktTools_Check("", UINT64_MAX, nullptr, 0, &document), KTTOOLS_E_ARGUMENT);
  ktTools_FreeDocument(&document);
  EXPECT_EQ(ktTools_Check("", 0, nullptr, 0, nullptr), KTTOOLS_E_ARGUMENT);
}

// What is built, walked and freed for nested parts takes no stack, and no part is gone over again and again.
TEST(ScriptTools, NestingCostsNoMoreThanLength) {
  struct {
    int count;
    const char* opener;
    const char* closer;
  } const cases[] = {{100'000, "repeat 2\n", ""},
                     {10'000, "repeat 2 ", " end repeat"},
                     {100'000, "(", ")"},
                     {10'000, "generate w marker0(", ")"},
                     {10'000, "script s\nrepeat 2 ", ""},
                     {10'000, "end\nrepeat ", ""},
                     {10'000, "script s genrate subset(0,", ""},
                     {100'000, "/", ""},
                     {10'000, "script s wait 64 end script ", "x"}};
  for (const auto& [count, opener, closer] : cases) {
    std::string text = "script s ";
    for (int i = 0; i < count; ++i) text += opener;
    for (int i = 0; i < count; ++i) text += closer;
    const Answer answer = check(text);
    EXPECT_EQ(answer.code, 0) << opener;
    EXPECT_THAT(answer.document["diagnostics"].size(), testing::AllOf(testing::Ge(1u), testing::Le(20u))) << opener;
    ktTools_Token* tokens = nullptr;
    std::uint64_t found = 0;
    ASSERT_EQ(ktTools_Tokenize(text.data(), text.size(), &tokens, &found), 0) << opener;
    ktTools_FreeTokens(tokens);
  }
}

TEST(ScriptTools, TakesAnyBytes) {
  forEachSeed(300, [](Random& random) {
    std::string bytes(pick(random, 0, 200), '\0');
    for (char& byte : bytes) byte = static_cast<char>(pick(random, 0, 255));
    EXPECT_EQ(check(bytes).code, 0);
    kindsOf(bytes);
    fit(bytes, bytes, bytes);
  });
}

}  // namespace
