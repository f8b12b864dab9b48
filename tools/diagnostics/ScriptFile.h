// A script text with the name of its file, and its lines by number.
#pragma once

#include <compare>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace tools {

// A place in a text as the library counts it. Line 0: the text as a whole.
struct Place {
  std::uint32_t line = 0;      // from 1
  std::uint32_t position = 0;  // in the line, bytes from 1

  bool isKnown() const { return line > 0; }
  auto operator<=>(const Place&) const = default;
};

inline constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";

class ScriptFile {
 public:
  // A byte order mark at the start of `text` is no part of the script: places and offsets count from behind it.
  ScriptFile(std::string name, std::string text);

  // Reads the file whole; "-" is the standard input. Throws Refusal when it is missing, a directory or unreadable.
  static ScriptFile read(const std::string& path);

  const std::string& name() const { return name_; }
  const std::string& text() const { return text_; }
  bool hasByteOrderMark() const { return hasByteOrderMark_; }

  // The line of that number, from 1, without its end; empty behind the last one.
  std::string_view line(std::uint32_t number) const;

  // The word at a place, up to a blank or a mark; empty at the end of a line.
  std::string_view wordAt(Place place) const;

  // Of the byte at `offset`.
  Place placeOf(std::size_t offset) const;
  // The other way round; the text's size behind its end, 0 for an unknown place.
  std::size_t offsetOf(Place place) const;

 private:
  std::string name_;
  std::string text_;
  bool hasByteOrderMark_;
  std::vector<std::size_t> lineStarts_;
};

}  // namespace tools
