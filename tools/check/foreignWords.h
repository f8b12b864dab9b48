// Words of other languages, and how what they say is said in a script.
#pragma once

#include <span>
#include <string_view>

namespace tools {

struct ForeignWord {
  std::string_view word;
  std::string_view help;
};

// In the order of the alphabet.
std::span<const ForeignWord> allForeignWords();

// One sentence, or empty for a word that is not known; letter case does not count.
std::string_view explainForeignWord(std::string_view word);

}  // namespace tools
