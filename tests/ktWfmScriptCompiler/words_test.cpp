#include <gtest/gtest.h>

#include "ScriptTest.h"
#include "ktWfmScriptCompiler/Keywords.h"
#include "ktWfmScriptCompiler/Lexer.h"
#include "testing/seeds.h"

namespace ktwfmscriptcompiler {
namespace {

Token firstToken(Lexer& lexer, const std::string& text) {
  lexer.setScript(text);
  return lexer.getNextToken();
}

// Names that take a keyword's place, or try to; that are long, or not ASCII; and of both tables.
ScriptTraits crowdedTraits() {
  ScriptTraits traits;
  traits.markerNames = {{"Subset", 1}, {"REPEAT", 2}, {"7up", 3}, {"both", 4}, {"alongername", 5}, {"no_word", 6}};
  traits.triggerNames = {{"\xEF\xAC\x86ream", 1},
                         {"both", 2},
                         {"stra\xC3\x9F"
                          "e",
                          3},
                         {"\x11", 4},
                         {"12", 5}};
  return traits;
}

// The rule as it reads: one name after the other.
Meaning meaningByComparison(const std::string& word, const ScriptTraits& traits) {
  const auto same = [&](std::string_view name) { return ktcheckname::compareNames(word, name) == 0; };
  for (const Keyword& keyword : kStrongKeywords) {
    if (same(keyword.text)) return {keyword.type};
  }
  for (const auto& [name, number] : traits.markerNames) {
    if (same(name)) return {TokenType::kMarkerName, number};
  }
  for (const auto& [name, number] : traits.triggerNames) {
    if (same(name)) return {TokenType::kTriggerName, number};
  }
  for (const Keyword& keyword : kWeakKeywords) {
    if (same(keyword.text)) return {keyword.type};
  }
  return {};
}

TEST(Words, MatchExactlyWhatCompareNamesMatches) {
  const ScriptTraits crowded = crowdedTraits();
  Lexer ofCrowded(crowded);
  for (const char* word : {"sUBSET", "repeat", "7UP", "BOTH", "aLongerName", "alongernam", "stream", "STRASSE", "12"}) {
    const Meaning expected = meaningByComparison(word, crowded);
    const Token token = firstToken(ofCrowded, word);
    EXPECT_TRUE(token.type == expected.type && token.value == expected.value && token.text == word) << word;
  }

  const std::vector<std::string> pieces = {"s",    "S",        "\xC5\xBF", "st",       "\xEF\xAC\x86", "cript", "ream",
                                           "ta",   "tri",      "GGER",     "mark",     "er",           "1",     "8",
                                           "wait", "\xC3\x9F", "\xC3",     "\xE2\x82", "subse",        "t"};
  forEachSeed(1, [&pieces](Random& random) {
    for (const ScriptTraits& traits : {testTraits(), crowdedTraits()}) {
      Lexer lexer(traits);
      for (int round = 0; round < 20000; ++round) {
        std::string word = round % 2 == 0 ? "s" : "t";
        for (auto count = random() % 4; count > 0; --count) word += pieces[random() % pieces.size()];
        const Meaning expected = meaningByComparison(word, traits);
        const Token token = firstToken(lexer, word);
        ASSERT_EQ(token.type, expected.type) << word;
        ASSERT_EQ(token.value, expected.value) << word;
      }
    }
  });
}

TEST(Words, HaveLeadingZerosAndAnEndThatStays) {
  const ScriptTraits traits = testTraits();
  Lexer lexer(traits);
  EXPECT_EQ(firstToken(lexer, std::string(1000, '0') + "2147483647").value, 2147483647u);
  EXPECT_THROW(firstToken(lexer, "1" + std::string(1000, '0')), kterr::Exception);
  firstToken(lexer, "a\n //");
  for (int i = 0; i < 2; ++i) {
    const Token end = lexer.getNextToken();
    EXPECT_EQ(end.type, TokenType::kEndOfScript);
    EXPECT_EQ(end.position, (SourcePosition{2, 4}));
  }
}

}  // namespace
}  // namespace ktwfmscriptcompiler
