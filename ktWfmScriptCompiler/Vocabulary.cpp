#include "ktWfmScriptCompiler/Vocabulary.h"

#include <algorithm>
#include <bit>

#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktWfmScriptCompiler/Keywords.h"

namespace ktwfmscriptcompiler {
namespace {

bool isAsciiByte(char byte) { return static_cast<unsigned char>(byte) < 0x80; }

bool isAsciiIdentifierCharacter(char byte) { return isAsciiByte(byte) && isIdentifierCharacter(byte); }

std::uint64_t keyOf(std::string_view name) {
  char bytes[kScanBytes] = {};
  name.copy(bytes, kScanBytes);
  return foldWordBytes(loadBytes(bytes)) & firstBytes(name.size());
}

// A name with any other ASCII byte can never be written in a script.
bool hasKey(std::string_view name) {
  return !name.empty() && name.size() <= kScanBytes && std::ranges::all_of(name, isAsciiIdentifierCharacter);
}

}  // namespace

Vocabulary::Vocabulary(const ScriptTraits& traits) {
  for (const Keyword& keyword : kStrongKeywords) add(keyword.text, {keyword.type});
  for (const auto& [name, number] : traits.markerNames) add(name, {TokenType::kMarkerName, number});
  for (const auto& [name, number] : traits.triggerNames) add(name, {TokenType::kTriggerName, number});
  for (const Keyword& keyword : kWeakKeywords) add(keyword.text, {keyword.type});
  buildSlots();
}

void Vocabulary::add(std::string_view name, Meaning meaning) {
  names_.emplace(name, meaning);  // keeps the meaning that an equal name has already
  if (std::ranges::all_of(name, isAsciiByte)) {
    longestName_ = std::max(longestName_, name.size());
    hasDigitNames_ |= !name.empty() && name[0] >= '0' && name[0] <= '9';
  } else {
    keysSuffice_ = false;
  }
}

void Vocabulary::buildSlots() {
  const std::size_t places = std::bit_ceil(4 * names_.size());
  slotShift_ = 64 - static_cast<unsigned>(std::countr_zero(places));
  slots_.resize(places + names_.size());
  for (const auto& [name, meaning] : names_) {
    if (!hasKey(name)) continue;
    const std::uint64_t key = keyOf(name);
    std::size_t slot = slotOf(key);
    while (slots_[slot].key != 0) ++slot;
    slots_[slot] = {key, meaning};
  }
}

Meaning Vocabulary::find(std::string_view word) const {
  if (keysSuffice_ && word.size() > longestName_ && std::ranges::all_of(word, isAsciiByte)) return {};
  const auto found = names_.find(word);
  return found == names_.end() ? Meaning{} : found->second;
}

}  // namespace ktwfmscriptcompiler
