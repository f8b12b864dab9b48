// The C interface of the tools: what it answers, and what it refuses.
#include "ktorba/script_tools.h"

#include <gmock/gmock.h>

#include <nlohmann/json.hpp>

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

Answer fit(const std::string& text, const std::string& generator, const std::string& waveforms) {
  return ask([&](ktTools_Document* document) {
    return ktTools_Fit(text.data(), text.size(), generator.data(), generator.size(), waveforms.data(), waveforms.size(),
                       document);
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

TEST(ScriptTools, ProgramsHaveWordsAndListings) {
  const std::string waveforms = R"([{"name":"w","samples":1000}])";
  ktTools_Program* program = nullptr;
  const Answer compiled = ask([&](ktTools_Document* document) {
    return ktTools_Compile(kText, sizeof(kText) - 1, nullptr, 0, waveforms.data(), waveforms.size(), &program,
                           document);
  });
  ASSERT_EQ(compiled.code, 0) << compiled.document;
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

TEST(ScriptTools, FitTellsWhatHasNoPlace) {
  const Answer tight = fit(kText, R"({"memorySizeBytes":1024})", R"([{"name":"w","samples":1000}])");
  EXPECT_EQ(tight.code, 0);
  EXPECT_EQ(tight.document["fits"], false);
  EXPECT_NE(tight.document["waveforms"][0]["refusal"], nullptr);
  EXPECT_EQ(tight.document["scripts"][0]["samples"], 2128);
  EXPECT_EQ(fit(kText, "", R"([{"name":"w","samples":1000}])").document["fits"], true);
  EXPECT_EQ(fit(kText, "", "").code, KTTOOLS_E_SCRIPT);
  const json unknown = fit("script s\ngenerate plse end script", "", R"([{"name":"pulse","samples":64}])").document;
  EXPECT_EQ(unknown["diagnostics"][0]["fixes"][0]["text"], "pulse") << unknown;
  EXPECT_EQ(unknown["diagnostics"][0]["fixes"][0]["confidence"], "maybe");
  EXPECT_EQ(unknown["diagnostics"][0]["fixes"][0]["range"]["start"]["offset"], 18);
}

TEST(ScriptTools, RefusesWhatNoCallerMayGive) {
  for (const char* generator :
       {"{", "[]", "7", R"({"sampleWidth":16})", R"({"sampleWidthBits":12})", R"({"sampleWidthBits":"16"})",
        R"({"memorySizeBytes":4294967296})", R"({"minFetchSamples":-1})", R"({"sampleRateHz":1e300})", "\xFF"}) {
    const Answer answer = check("", generator);
    EXPECT_EQ(answer.code, KTTOOLS_E_JSON) << generator;
    EXPECT_NE(answer.document["error"], "") << generator;
  }
  for (const char* waveforms :
       {"{}", "[1]", R"([{"name":"w"}, 2])", R"([{"samples":64}])", R"([{"name":"w","samples":1.5}])"}) {
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
