// What every word of a script means: the keywords and the marker and trigger names of one ScriptTraits, in one table
// that is asked once per word. Matches exactly what compareNames matches, whatever the letter case.
//
// Nearly all words are short and ASCII: those are found by a hash over their bytes, folded to one number, the key.
// Every other word goes to a map that compares names in full. Constant once built; any thread may ask.
#pragma once

#include <cstdint>
#include <map>
#include <string_view>
#include <vector>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktWfmScriptCompiler/Token.h"
#include "ktWfmScriptCompiler/wordScan.h"

namespace ktwfmscriptcompiler {

struct Meaning {
  TokenType type = TokenType::kIdentifier;  // kIdentifier: not in the vocabulary
  std::uint32_t value = 0;                  // of a marker or trigger name: its table number
};

class Vocabulary {
 public:
  // Reads the two name tables once; where two words are the same name the language's order of precedence decides.
  explicit Vocabulary(const ScriptTraits& traits);

  // Looks up a word of letters, digits and non-ASCII bytes.
  Meaning find(std::string_view word) const;

  // Looks up such a word by its key: its bytes folded, at most kScanBytes, all ASCII. Only while keysSuffice().
  Meaning findKey(std::uint64_t key) const {
    const Slot* slot = &slots_[slotOf(key)];
    while (slot->key != key && slot->key != 0) ++slot;
    return slot->meaning;
  }

  // Whether every name is ASCII, so that an ASCII word can match by its bytes alone.
  bool keysSuffice() const { return keysSuffice_; }

  // Whether a name may begin with a digit; if not, a word that does need not be looked up.
  bool hasDigitNames() const { return hasDigitNames_ || !keysSuffice_; }

 private:
  struct Slot {
    std::uint64_t key = 0;  // 0: free
    Meaning meaning;
  };

  void add(std::string_view name, Meaning meaning);
  void buildSlots();
  std::size_t slotOf(std::uint64_t key) const { return (key * 0x9E3779B97F4A7C15u) >> slotShift_; }

  std::map<std::string_view, Meaning, ktcheckname::NameLess> names_;  // keys live in the traits and the keyword table
  std::vector<Slot> slots_;      // open addressing; room behind the last place lets a search run on to a free one
  unsigned slotShift_ = 0;       // leaves the bits of a hash that are a place
  std::size_t longestName_ = 0;  // bytes, of the ASCII names
  bool hasDigitNames_ = false;
  bool keysSuffice_ = true;
};

}  // namespace ktwfmscriptcompiler
