#include "tools/sources/TextLines.h"

#include <utf8.h>

#include <iterator>
#include <utility>

#include "platform/system/paths.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

constexpr std::size_t kBlockBytes = 1 << 20;
constexpr std::size_t kLongestRow = 1 << 20;
constexpr char kUtf16Help[] = "Save it as UTF-8, or as UTF-16 with a byte-order mark.";

bool isHighSurrogate(char16_t unit) { return unit >= 0xD800 && unit < 0xDC00; }
bool isLowSurrogate(char16_t unit) { return unit >= 0xDC00 && unit < 0xE000; }

}  // namespace

TextLines::TextLines(const std::string& source, const std::string& path)
    : source_(source), stream_(platform::toPath(path), std::ios::binary) {
  if (!stream_) refuse("cannot be opened for reading");
}

void TextLines::refuse(const std::string& reason, const std::string& help) const {
  throw Refusal(source_ + ": " + reason, help);
}

bool TextLines::next(std::string_view& line) {
  std::size_t end = text_.find(lineEnd_, position_);
  while (end == std::string::npos && fill()) end = text_.find(lineEnd_, position_);
  if (end == std::string::npos) end = text_.size();
  if (position_ >= text_.size()) return false;
  if (end - position_ > kLongestRow) refuse("row " + std::to_string(row_ + 1) + " is longer than a mebibyte");
  line = std::string_view(text_).substr(position_, end - position_);
  if (line.ends_with('\r')) line.remove_suffix(1);
  position_ = end + 1;
  ++row_;
  return true;
}

// Reads one more block behind what has not been given out yet; false at the end of the file.
bool TextLines::fill() {
  if (text_.size() - std::min(position_, text_.size()) > kLongestRow) return false;
  text_.erase(0, position_);
  position_ = 0;
  block_.resize(kBlockBytes);
  stream_.read(block_.data(), static_cast<std::streamsize>(block_.size()));
  if (stream_.bad()) refuse("cannot be read");
  block_.resize(static_cast<std::size_t>(stream_.gcount()));
  if (block_.empty()) {
    if (!halfUnit_.empty() || highSurrogate_ != 0) refuse("ends within a character of UTF-16");
    return false;
  }
  if (isFirstBlock_) detectEncoding();
  appendBlock();
  if (isFirstBlock_) detectLineEnd();
  isFirstBlock_ = false;
  return true;
}

void TextLines::detectEncoding() {
  if (block_.starts_with("\xEF\xBB\xBF")) {
    block_.erase(0, 3);
  } else if (block_.starts_with("\xFF\xFE") || block_.starts_with("\xFE\xFF")) {
    encoding_ = block_.front() == '\xFF' ? Encoding::kLittleEndian16 : Encoding::kBigEndian16;
    block_.erase(0, 2);
  }
}

void TextLines::detectLineEnd() {
  if (text_.find('\n') == std::string::npos && text_.find('\r') != std::string::npos) lineEnd_ = '\r';
}

void TextLines::appendBlock() {
  if (encoding_ != Encoding::kBytes) return appendUtf16();
  if (block_.find('\0') != std::string::npos) refuse("holds a byte of 0, which no text does", kUtf16Help);
  text_ += block_;
}

void TextLines::appendUtf16() {
  const std::string bytes = std::exchange(halfUnit_, "") + block_;
  const std::size_t whole = bytes.size() & ~std::size_t{1};
  const std::size_t high = encoding_ == Encoding::kBigEndian16 ? 0 : 1;
  for (std::size_t i = 0; i < whole; i += 2) {
    appendUnit(static_cast<char16_t>(static_cast<unsigned char>(bytes[i + high]) << 8 |
                                     static_cast<unsigned char>(bytes[i + 1 - high])));
  }
  halfUnit_ = bytes.substr(whole);
}

void TextLines::appendUnit(char16_t unit) {
  if (isLowSurrogate(unit) != (highSurrogate_ != 0)) refuse("is not valid UTF-16", kUtf16Help);
  if (isHighSurrogate(unit)) {
    highSurrogate_ = unit;
    return;
  }
  char32_t character = unit;
  if (const char32_t high = std::exchange(highSurrogate_, 0); high != 0) {
    character = 0x10000 + ((high - 0xD800) << 10) + (character - 0xDC00);
  }
  utf8::append(character, std::back_inserter(text_));
}

}  // namespace tools
