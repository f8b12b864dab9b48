#include "tools/diagnostics/messages.h"

#include "tools/diagnostics/Diagnostic.h"

namespace tools {
namespace {

struct Words {
  std::string_view headline;
  std::string_view help;
};
constexpr Words kWords[] = {
    {"", ""},
#define KTORBA_MESSAGE_GROUP(title, text)
#define KTORBA_MESSAGE(name, headline, help, example) {headline, help},
#include "tools/diagnostics/messages.def"
#undef KTORBA_MESSAGE
#undef KTORBA_MESSAGE_GROUP
};

// Values are put in once, whatever they hold.
std::string fillIn(std::string_view pattern, std::span<const std::string> values) {
  std::string text;
  for (std::size_t i = 0; i < pattern.size(); ++i) {
    const bool isMark = pattern[i] == '{' && i + 2 < pattern.size() && pattern[i + 2] == '}';
    const std::size_t value = isMark ? static_cast<std::size_t>(pattern[i + 1] - '0') : values.size();
    if (value < values.size()) text += values[value];
    if (isMark) i += 2;
    if (!isMark) text += pattern[i];
  }
  return text;
}

}  // namespace

void say(Diagnostic& diagnostic, MessageKind kind, std::initializer_list<std::string> values) {
  const Words& words = kWords[static_cast<std::size_t>(kind)];
  diagnostic.kind = kind;
  diagnostic.message = fillIn(words.headline, values);
  diagnostic.help = fillIn(words.help, values);
}

}  // namespace tools
