// Writes text and numbers into a ByteTarget, a block at a time and without regard to the locale.
#pragma once

#include <array>
#include <charconv>
#include <concepts>
#include <string_view>

#include "tools/outputs/ByteTarget.h"

namespace tools {

class TextWriter {
 public:
  explicit TextWriter(ByteTarget& target) : target_(target) {}

  TextWriter& operator<<(std::string_view text) {
    if (text.size() > room()) flush();
    if (text.size() > room()) {
      target_.write(text.data(), text.size());
    } else {
      used_ += text.copy(buffer_.data() + used_, text.size());
    }
    return *this;
  }
  TextWriter& operator<<(char c) { return *this << std::string_view(&c, 1); }
  template <typename Number>
  requires std::integral<Number> || std::floating_point<Number> TextWriter& operator<<(Number number) {
    if (room() < kLongestNumber) flush();
    char* const begin = buffer_.data() + used_;
    used_ += static_cast<std::size_t>(std::to_chars(begin, begin + kLongestNumber, number).ptr - begin);
    return *this;
  }

  // Hands everything over to the target; call it last.
  void flush() {
    target_.write(buffer_.data(), used_);
    used_ = 0;
  }

 private:
  static constexpr std::size_t kLongestNumber = 32;
  std::size_t room() const { return buffer_.size() - used_; }

  ByteTarget& target_;
  std::array<char, 65536> buffer_;
  std::size_t used_ = 0;
};

}  // namespace tools
