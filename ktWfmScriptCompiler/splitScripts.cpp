#include "ktWfmScriptCompiler/splitScripts.h"

#include <algorithm>

#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktcheckname/compareNames.h"

namespace ktwfmscriptcompiler {
namespace {

bool isKeyword(std::string_view word, TokenType type) {
  return ktcheckname::compareNames(word, keywordText(type)) == 0;
}

// Finds the words of a text one by one and passes over everything else.
class WordScanner {
 public:
  explicit WordScanner(const std::string& text) : text_(text) {}

  // Returns the next word, empty at the end of the text.
  std::string_view next() {
    while (offset_ < text_.size() && !isIdentifierCharacter(text_[offset_])) skip();
    const std::size_t first = offset_;
    while (isIdentifierCharacter(text_[offset_])) ++offset_;
    return std::string_view(text_).substr(first, offset_ - first);
  }

  std::size_t offset() const { return offset_; }
  SourcePosition position() const { return {line_, static_cast<std::uint32_t>(offset_ - lineStart_) + 1}; }

 private:
  void skip() {
    if (text_.compare(offset_, 2, "//") == 0) offset_ = std::min(text_.find('\n', offset_), text_.size());
    if (offset_ < text_.size() && text_[offset_++] == '\n') {
      lineStart_ = offset_;
      ++line_;
    }
  }

  const std::string& text_;
  std::size_t offset_ = 0;  // of the next unread byte
  std::size_t lineStart_ = 0;
  std::uint32_t line_ = 1;
};

// Holds nothing but blanks and comments.
bool isBlank(std::string_view text) {
  for (;;) {
    text.remove_prefix(std::min(text.find_first_not_of(" \t\r\n"), text.size()));
    if (!text.starts_with("//")) return text.empty();
    text.remove_prefix(std::min(text.find('\n'), text.size()));
  }
}

}  // namespace

std::vector<ScriptText> splitScripts(const std::string& text) {
  std::vector<ScriptText> scripts;
  WordScanner scanner(text);
  std::size_t first = 0;
  SourcePosition start = scanner.position();
  bool afterEnd = false;
  for (std::string_view word = scanner.next(); !word.empty(); word = scanner.next()) {
    if (afterEnd && isKeyword(word, TokenType::kScript)) {
      scripts.push_back({std::string_view(text).substr(first, scanner.offset() - first), start});
      first = scanner.offset();
      start = scanner.position();
    }
    afterEnd = isKeyword(word, TokenType::kEnd);
  }
  const std::string_view rest = std::string_view(text).substr(first);
  if (!isBlank(rest)) scripts.push_back({rest, start});
  return scripts;
}

}  // namespace ktwfmscriptcompiler
