// Words of other languages, and how what they say is said in a script.
#pragma once

#include <string_view>

namespace tools {

// One sentence, or empty for a word that is not known; letter case does not count.
std::string_view explainForeignWord(std::string_view word);

}  // namespace tools
