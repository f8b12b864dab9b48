// The tolerant front end beside the compiler, which is the judge: over mutations of valid scripts the two agree on
// whether there is an error, and on its code and place; and of several mutations most are told, and never more.
#include <gmock/gmock.h>

#include <algorithm>

#include "conventions/conventions.h"
#include "ktWfmScriptCompiler/compile.h"
#include "testing/RandomScript.h"
#include "testing/caught.h"
#include "testing/seeds.h"
#include "tools/check/checkText.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/syntax/SyntaxTree.h"

namespace tools {
namespace {

const ktwfmscriptcompiler::ScriptTraits& traits() {
  static const auto kTraits = [] {
    auto standard = ktwfmscriptcompiler::standardScriptTraits();
    standard.alignmentQuantum = 1;
    standard.minWaitLength = 64;
    return standard;
  }();
  return kTraits;
}

std::size_t choose(Random& random, std::size_t count) { return pick(random, 0, static_cast<std::uint32_t>(count - 1)); }

// A text of one to three scripts.
std::string validText(Random& random) {
  std::string text;
  for (std::size_t count = choose(random, 3) + 1; count > 0; --count) {
    text += scripts::randomScript(random, scripts::randomWaveforms(random, 64, 4096, 16), 64) + "\n";
  }
  return text;
}

constexpr std::string_view kPieces[] = {
    "script",     "end",        "generate",   "repeat", "wait",   "clear", "until", "forever", "subset",
    "marker0",    "trigger3",   "(",          ")",      ",",      "64",    "0",     "w",       "if",
    "/",          "//",         "\n",         "#",      "5ms",    "1e6",   "_x",    ";",       "-3",
    "9999999999", "end repeat", "end script", "\u00e4", "stream", "*"};

// Removes, doubles, swaps or puts in a byte or a word.
std::string mutate(Random& random, std::string text) {
  const std::size_t at = choose(random, text.size());
  const std::string_view piece = kPieces[choose(random, std::size(kPieces))];
  const std::size_t length = 1 + choose(random, 8);
  switch (choose(random, 5)) {
    case 0:
      return text.erase(at, 1);
    case 1:
      return text.erase(at, length);
    case 2:
      return text.insert(at, " " + std::string(piece) + " ");
    case 3:
      return text.insert(at, piece);
    default:
      text[at] = static_cast<char>(choose(random, 256));
      return text;
  }
}

// How many scripts of the text begin in front of a place.
std::ptrdiff_t scriptAt(const ScriptFile& file, Place place) {
  const SyntaxTree tree(file.text(), traits());
  return std::ranges::count_if(tree.nodes(), [&](const SyntaxNode& node) {
    return node.kind == NodeKind::kScript && tree.tokens()[node.firstToken].offset() <= file.offsetOf(place);
  });
}

TEST(CheckText, TheFirstErrorIsTheCompilers) {
  forEachSeed(1000, [](Random& random) {
    std::string text = validText(random);
    for (std::size_t count = choose(random, 4); count > 0 && !text.empty(); --count) text = mutate(random, text);
    const ScriptFile file("t", text);
    const auto errors = findErrors(file, traits(), 1e6);
    Diagnostic expected;
    try {
      ktwfmscriptcompiler::compile(file.text(), traits());
    } catch (const kterr::Exception& failure) {
      expected = diagnoseFailure(failure.code(), failure.getJson());
    }
    ASSERT_EQ(errors.empty(), expected.code == 0) << text;
    if (errors.empty()) return;
    // Grammar comes before the rules, in the compiler for the whole text, here for each script.
    const auto isExpected = [&](const Diagnostic& error) {
      return error.code == expected.code && error.place == expected.place;
    };
    const auto found = std::ranges::find_if(errors, isExpected);
    ASSERT_NE(found, errors.end()) << text << expected.message;
    ASSERT_TRUE(found == errors.begin() || scriptAt(file, errors.front().place) < scriptAt(file, expected.place))
        << text << errors.front().message;
  });
}

std::vector<std::string> linesOf(const std::string& text) {
  std::vector<std::string> lines;
  for (std::size_t start = 0; start < text.size();) {
    const std::size_t end = std::min(text.find('\n', start), text.size());
    lines.push_back(text.substr(start, end - start));
    start = end + 1;
  }
  return lines;
}

std::string typo(Random& random, std::string word) {
  const std::size_t at = choose(random, word.size());
  const char letter = static_cast<char>('a' + choose(random, 26));
  switch (choose(random, 4)) {
    case 0:
      return word.erase(at, 1);
    case 1:
      return word.insert(at, 1, letter);
    case 2:
      word[at] = letter;
      return word;
    default:
      std::swap(word[at], word[at + 1 < word.size() ? at + 1 : at - 1]);
      return word;
  }
}

// One mistake within a line, as people make them.
std::string spoil(Random& random, std::string line) {
  const std::size_t blank = std::min(line.find(' '), line.size());
  const std::size_t digit = line.find_first_of("0123456789", blank);
  const std::size_t mark = line.find_first_of("(),");
  switch (choose(random, 6)) {
    case 0:
      return mark == std::string::npos ? line : line.erase(mark, 1);
    case 1:
      return digit == std::string::npos ? line : line.insert(digit, "-");
    case 2:
      return line + ";";
    case 3:
      return line + " 5ms";
    case 4:
      return line.substr(0, blank);
    default:
      return typo(random, line.substr(0, blank)) + line.substr(blank);
  }
}

std::string joinLines(const std::vector<std::string>& lines) {
  std::string text;
  for (const std::string& line : lines) text += line + "\n";
  return text;
}

std::size_t countErrors(const std::string& text) { return findErrors(ScriptFile("t", text), traits(), 1e6).size(); }

TEST(CheckText, TellsMostOfSeveralMistakesAndNoMoreThanThere) {
  std::size_t made = 0;
  std::size_t told = 0;
  forEachSeed(200, [&](Random& random) {
    const std::vector<std::string> good = linesOf(validText(random));
    std::vector<std::string> bad = good;
    std::size_t count = 0;
    for (std::size_t line = choose(random, 4); line < good.size() && count < 8; line += 1 + choose(random, 5)) {
      if (good[line].empty()) continue;
      std::vector<std::string> alone = good;
      alone[line] = spoil(random, good[line]);
      if (countErrors(joinLines(alone)) == 0) continue;
      bad[line] = alone[line];
      ++count;
    }
    const std::size_t shown = countErrors(joinLines(bad));
    EXPECT_LE(shown, count) << joinLines(bad);
    made += count;
    told += shown;
  });
  EXPECT_GE(static_cast<double>(told), 0.8 * static_cast<double>(made));
}

// The word of the first fix, or nothing.
std::string firstFix(const std::string& text) {
  const auto errors = findErrors(ScriptFile("t", text), traits(), 1e6);
  return errors.empty() || errors[0].fixes.empty() ? "" : errors[0].fixes[0].text;
}

TEST(CheckText, SuggestsWhatCouldStandThere) {
  const std::tuple<const char*, const char*, bool> cases[] = {
      {"wait until triger1 generate w", "trigger: `trigger1`", true},
      {"repeat until Triger4 generate w end repeat", "trigger: `trigger4`", true},
      {"clear trigger1 trigegr2 generate w", "trigger: `trigger2`", true},
      {"generate w market0(0)", "marker: `marker0`", true},
      {"wait 64 marker0(0) merker1(0)", "marker: `marker1`", true},
      {"generate w subst(0, 64)", "keyword: `subset`", true},
      {"generate w wiat 64", "instruction: `wait`", true},
      {"generate w rpt 2", "", false},
      {"wait unitll trigger1 generate w", "keyword: `until`", false},
  };
  for (const auto& [body, expected, isCertain] : cases) {
    const auto errors = findErrors(ScriptFile("t", "script s " + std::string(body) + " end script"), traits(), 1e6);
    ASSERT_FALSE(errors.empty()) << body;
    if (*expected == '\0') {
      EXPECT_TRUE(errors[0].fixes.empty()) << body;
      continue;
    }
    EXPECT_THAT(errors[0].help, testing::StartsWith("A similar " + std::string(expected) + ". ")) << body;
    ASSERT_EQ(errors[0].fixes.size(), 1u) << body;
    EXPECT_EQ(errors[0].fixes[0].isCertain, isCertain) << body;
  }
}

TEST(CheckText, KnowsMistypedKeywords) {
  const std::vector<std::string> words = {"script ",  "s generate ", "w subset",  "(0,64) marker3",    "(0) repeat ",
                                          "forever ", "wait ",       "until ",    "trigger5 ",         "end ",
                                          "repeat ",  "wait ",       "64 clear ", "trigger1 ",         "repeat ",
                                          "until ",   "trigger2 ",   "generate ", "w end repeat end ", "script"};
  std::size_t right = 0;
  std::size_t wrong = 0;
  std::size_t all = 0;
  forEachSeed(1, [&](Random& random) {
    while (all < 105) {
      const std::size_t mistyped = choose(random, words.size());
      std::string text;
      std::string meant;
      for (std::size_t i = 0; i < words.size(); ++i) {
        if (i != mistyped) {
          text += words[i];
          continue;
        }
        std::string word = words[i].substr(0, words[i].find_last_not_of(' ') + 1);
        const std::size_t start = word.find_last_of(") ") + 1;
        meant = word.substr(start);
        text += word.substr(0, start) + typo(random, meant) + words[i].substr(word.size());
      }
      if (countErrors(text) == 0) continue;
      ++all;
      const std::string fix = firstFix(text);
      right += fix == meant;
      wrong += !fix.empty() && fix != meant;
    }
  });
  EXPECT_GE(right, 100u);
  EXPECT_LE(wrong, 2u);
}

}  // namespace
}  // namespace tools
