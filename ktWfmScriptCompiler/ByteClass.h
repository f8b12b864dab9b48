// What every byte of a script text is. Internal to the compiler.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "ktWfmScriptCompiler/Keywords.h"

namespace ktwfmscriptcompiler {

// kPunctuation is the first of kPunctuationMarks; the others follow it in their order.
enum class ByteClass : std::uint8_t { kInvalid, kWord, kBlank, kLineFeed, kSlash, kPunctuation };

// The place of a mark among kPunctuationMarks.
constexpr std::size_t markOf(ByteClass punctuation) {
  return static_cast<std::size_t>(punctuation) - static_cast<std::size_t>(ByteClass::kPunctuation);
}

// NUL is invalid, so the terminator behind a std::string ends every scan.
inline constexpr std::array<ByteClass, 256> kByteClasses = [] {
  std::array<ByteClass, 256> classes{};
  const auto fill = [&](int first, int last, ByteClass byteClass) {
    for (int byte = first; byte <= last; ++byte) classes[static_cast<std::size_t>(byte)] = byteClass;
  };
  fill('0', '9', ByteClass::kWord);
  fill('A', 'Z', ByteClass::kWord);
  fill('a', 'z', ByteClass::kWord);
  fill(0x80, 0xFF, ByteClass::kWord);  // UTF-8 text may stand in names
  for (const char blank : {' ', '\t', '\r'}) fill(blank, blank, ByteClass::kBlank);
  auto punctuation = static_cast<std::uint8_t>(ByteClass::kPunctuation);
  for (const Keyword& mark : kPunctuationMarks) fill(*mark.text, *mark.text, static_cast<ByteClass>(punctuation++));
  fill('\n', '\n', ByteClass::kLineFeed);
  fill('/', '/', ByteClass::kSlash);
  return classes;
}();

inline ByteClass classOf(char byte) { return kByteClasses[static_cast<unsigned char>(byte)]; }

// Whether words are made of it.
inline bool isIdentifierCharacter(char byte) { return classOf(byte) == ByteClass::kWord; }

}  // namespace ktwfmscriptcompiler
