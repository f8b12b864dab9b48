// A script text with the name of its file, and its lines by number.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace cli {

class ScriptFile {
 public:
  // `text` without a byte order mark at its start.
  ScriptFile(std::string name, std::string text);

  // Reads the file whole. Throws UserError when it is missing, a directory or unreadable.
  static ScriptFile read(const std::string& path);

  const std::string& name() const { return name_; }
  const std::string& text() const { return text_; }

  // The line of that number, from 1, without its end; empty behind the last one.
  std::string_view line(std::uint32_t number) const;

  // Line and position, both from 1, of the byte at `offset`.
  struct Place {
    std::uint32_t line;
    std::uint32_t position;
  };
  Place placeOf(std::size_t offset) const;

 private:
  std::string name_;
  std::string text_;
  std::vector<std::size_t> lineStarts_;
};

}  // namespace cli
