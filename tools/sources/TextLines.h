// The rows of a text file, read in blocks: UTF-8 or another superset of ASCII, or UTF-16 with a byte-order mark; rows
// end with a line feed, with a carriage return and one, or, where the file begins so, with a carriage return alone.
// One thread at a time.
#pragma once

#include <cstdint>
#include <fstream>
#include <string>
#include <string_view>

namespace tools {

class TextLines {
 public:
  // `source` is named in messages and outlives this object. Throws Refusal when `path` cannot be read.
  TextLines(const std::string& source, const std::string& path);

  // The next row without its end, in UTF-8 where the file is UTF-16; valid until the next call. False at the end of the
  // file. Throws Refusal for what is no text and for a row of more than a mebibyte.
  bool next(std::string_view& line);

  // The number of the row that was read last, from 1, as editors count.
  std::uint64_t row() const { return row_; }

 private:
  enum class Encoding : std::uint8_t { kBytes, kLittleEndian16, kBigEndian16 };

  bool fill();
  void detectEncoding();
  void detectLineEnd();
  void appendBlock();
  void appendUtf16();
  void appendUnit(char16_t unit);
  [[noreturn]] void refuse(const std::string& reason, const std::string& help = {}) const;

  const std::string& source_;
  std::ifstream stream_;
  Encoding encoding_ = Encoding::kBytes;
  char lineEnd_ = '\n';
  std::string block_;  // read last
  std::string text_;   // decoded; what lies before position_ has been given out
  std::size_t position_ = 0;
  std::string halfUnit_;        // of UTF-16, where a block ends within a unit
  char16_t highSurrogate_ = 0;  // where a block ends between two surrogates
  bool isFirstBlock_ = true;
  std::uint64_t row_ = 0;
};

}  // namespace tools
