#include "tools/check/lookalikes.h"

#include <algorithm>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr Lookalike kLookalikes[] = {
    {0x00A0, "no-break space", " "},
    {0x00AD, "soft hyphen", ""},
    {0x037E, "Greek question mark", ""},
    {0x0430, "Cyrillic small a", "a"},
    {0x0435, "Cyrillic small ie", "e"},
    {0x043E, "Cyrillic small o", "o"},
    {0x0440, "Cyrillic small er", "p"},
    {0x0441, "Cyrillic small es", "c"},
    {0x0456, "Cyrillic small i", "i"},
    {0x2002, "en space", " "},
    {0x2003, "em space", " "},
    {0x2007, "figure space", " "},
    {0x2009, "thin space", " "},
    {0x200A, "hair space", " "},
    {0x200B, "zero-width space", ""},
    {0x200C, "zero-width non-joiner", ""},
    {0x200D, "zero-width joiner", ""},
    {0x2010, "hyphen", ""},
    {0x2011, "no-break hyphen", ""},
    {0x2012, "figure dash", ""},
    {0x2013, "en dash", ""},
    {0x2014, "em dash", ""},
    {0x2018, "left single quote", ""},
    {0x2019, "right single quote", ""},
    {0x201A, "low single quote", ","},
    {0x201C, "left double quote", ""},
    {0x201D, "right double quote", ""},
    {0x201E, "low double quote", ""},
    {0x202F, "narrow no-break space", " "},
    {0x2044, "fraction slash", "/"},
    {0x2060, "word joiner", ""},
    {0x2212, "minus sign", ""},
    {0x2215, "division slash", "/"},
    {0x3000, "ideographic space", " "},
    {0x3001, "ideographic comma", ","},
    {0xFEFF, "zero-width no-break space", ""},
    {0xFF08, "full-width left parenthesis", "("},
    {0xFF09, "full-width right parenthesis", ")"},
    {0xFF0C, "full-width comma", ","},
    {0xFF0F, "full-width slash", "/"},
    {0xFF10, "full-width digit 0", "0"},
    {0xFF11, "full-width digit 1", "1"},
    {0xFF12, "full-width digit 2", "2"},
    {0xFF13, "full-width digit 3", "3"},
    {0xFF14, "full-width digit 4", "4"},
    {0xFF15, "full-width digit 5", "5"},
    {0xFF16, "full-width digit 6", "6"},
    {0xFF17, "full-width digit 7", "7"},
    {0xFF18, "full-width digit 8", "8"},
    {0xFF19, "full-width digit 9", "9"},
};

}  // namespace

std::span<const Lookalike> allLookalikes() { return kLookalikes; }

std::string adviceOn(const Lookalike& lookalike) {
  const std::string_view type = lookalike.replacement;
  if (type.empty()) return "Remove it.";
  return "Type " + (type == " " ? "a blank" : "`" + std::string(type) + "`") + " instead.";
}

std::optional<FoundLookalike> findLookalike(std::string_view text, std::size_t from) {
  for (std::size_t offset = from; offset < text.size();) {
    const Character character = decodeCharacter(text.substr(offset));
    const auto found = std::ranges::lower_bound(kLookalikes, character.codePoint, {}, &Lookalike::codePoint);
    if (found != std::end(kLookalikes) && found->codePoint == character.codePoint) {
      return FoundLookalike{offset, character.length, found};
    }
    offset += character.length;
  }
  return std::nullopt;
}

}  // namespace tools
