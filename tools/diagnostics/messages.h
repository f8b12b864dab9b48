// The kinds of faults that the tools tell of a script, and their words: the table messages.def.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <span>
#include <string>
#include <string_view>

namespace tools {

enum class MessageKind : std::uint8_t {
  kNone,  // what the table does not have: a failure of the library in its own words, a file that cannot be read
#define KTORBA_MESSAGE_GROUP(title, text)
#define KTORBA_MESSAGE(name, headline, help, example) name,
#include "tools/diagnostics/messages.def"
#undef KTORBA_MESSAGE
#undef KTORBA_MESSAGE_GROUP
};

struct Diagnostic;

// Gives a diagnostic the kind and its words, with the values put in for {0}, {1}, ...
void say(Diagnostic& diagnostic, MessageKind kind, std::initializer_list<std::string> values = {});

}  // namespace tools
