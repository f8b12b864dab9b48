#include "ktWfmScriptCompiler/Vocabulary.h"

#include <algorithm>
#include <bit>

#include "ktWfmScriptCompiler/Keywords.h"

namespace ktwfmscriptcompiler {

namespace {

bool isAsciiByte(char byte) { return static_cast<unsigned char>(byte) < 0x80; }

bool isAsciiWordByte(char byte) {
  return (byte >= '0' && byte <= '9') || (byte >= 'A' && byte <= 'Z') || (byte >= 'a' && byte <= 'z');
}

std::uint64_t wordKey(std::string_view word) {
  std::uint64_t key = 0;
  for (const char byte : word) key = appendToWordKey(key, byte);
  return key;
}

// A name with any other ASCII byte can never be written in a script.
bool hasKey(std::string_view name) {
  return !name.empty() && name.size() <= kLongestKeyedWord && std::ranges::all_of(name, isAsciiWordByte);
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
  slots_.resize(std::bit_ceil(2 * names_.size()));
  slotShift_ = 64 - static_cast<unsigned>(std::countr_zero(slots_.size()));
  for (const auto& [name, meaning] : names_) {
    if (!hasKey(name)) continue;
    const std::uint64_t key = wordKey(name);
    std::size_t slot = slotOf(key);
    while (slots_[slot].key != 0) slot = (slot + 1) & (slots_.size() - 1);
    slots_[slot] = {key, meaning};
  }
}

Meaning Vocabulary::findName(std::string_view word) const {
  const auto found = names_.find(word);
  return found == names_.end() ? Meaning{} : found->second;
}

}  // namespace ktwfmscriptcompiler
