#include "tools/script_tools/boundary.h"

#include <cstdlib>
#include <cstring>

#include "tools/script_tools/documents.h"

namespace tools {
namespace {

constexpr std::uint64_t kMostBytes = 0xFFFFFFFE;  // of a text; offsets have 32 bits

}  // namespace

std::string_view view(const char* text, std::uint64_t length) {
  require(length <= kMostBytes && (text != nullptr || length == 0));
  return {text == nullptr ? "" : text, static_cast<std::size_t>(length)};
}

void give(const std::string& text, ktTools_Document* document) {
  if (document == nullptr) return;
  char* const copy = static_cast<char*>(std::malloc(text.size() + 1));
  if (copy == nullptr) throw std::bad_alloc();
  std::memcpy(copy, text.c_str(), text.size() + 1);
  *document = {copy, text.size()};
}

std::int32_t failWith(std::int32_t code, const char* message, ktTools_Document* document) noexcept {
  try {
    give(makeErrorDocument(message), document);
  } catch (...) {  // the code tells enough
  }
  return code;
}

}  // namespace tools
