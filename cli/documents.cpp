#include "cli/documents.h"

namespace tools::cli {
namespace {

// Text for troff: dashes that can be copied, no escapes, no requests.
std::string troff(const std::string& text) {
  std::string escaped;
  bool isLineStart = true;
  for (const char c : text) {
    if (isLineStart && (c == '.' || c == '\'')) escaped += "\\&";
    if (c == '\\') {
      escaped += "\\e";
    } else {
      escaped += c == '-' ? "\\-" : std::string(1, c);
    }
    isLineStart = c == '\n';
  }
  return escaped;
}

std::string manOption(const OptionHelp& option) {
  std::string names;
  for (const std::string& name : {option.shortName, option.longName}) {
    if (!name.empty()) names += (names.empty() ? "\\fB" : ", \\fB") + troff(name) + "\\fR";
  }
  if (!option.value.empty()) names += (names.empty() ? "\\fI" : " \\fI") + troff(option.value) + "\\fR";
  return ".TP\n" + names + "\n" + troff(option.description) + ".\n";
}

std::string manCommand(const CommandHelp& command) {
  std::string text = command.name.empty() ? "" : ".SS ktorba " + command.name + "\n";
  text += troff(command.description) +
          (command.description.ends_with('?') || command.description.ends_with('.') ? "\n" : ".\n");
  for (const OptionHelp& option : command.options) text += manOption(option);
  return text + ".PP\n.nf\n" + troff(command.remarks) + "\n.fi\n";
}

// Both names of every option, each with a blank behind it.
std::string optionWords(const CommandHelp& command) {
  std::string words;
  for (const OptionHelp& option : command.options) {
    if (!option.shortName.empty()) words += option.shortName + " ";
    if (!option.longName.empty()) words += option.longName + " ";
  }
  return words;
}

// The alternatives of a value like "text|json" given as "{text,json}"; empty for others.
std::string alternatives(const OptionHelp& option) {
  const std::size_t open = option.value.find('{');
  const std::size_t close = option.value.find('}');
  if (open == std::string::npos || close == std::string::npos) return {};
  std::string words = option.value.substr(open + 1, close - open - 1);
  for (char& c : words) c = c == ',' ? ' ' : c;
  return words;
}

std::string quoteForZsh(const std::string& text) {
  std::string quoted;
  for (const char c : text) {
    if (c == '\'') {
      quoted += "'\\''";
    } else {
      quoted += c == '[' || c == ']' || c == ':' ? std::string("\\") + c : std::string(1, c);
    }
  }
  return quoted;
}

std::string zshOption(const OptionHelp& option) {
  if (option.longName.empty() && option.shortName.empty()) return "'*:" + quoteForZsh(option.value) + ":_files'";
  std::string value;
  if (!option.value.empty()) {
    const std::string words = alternatives(option);
    value = ":" + quoteForZsh(option.value) + ":" + (words.empty() ? "_files" : "(" + words + ")");
  }
  std::string text;
  for (const std::string& name : {option.shortName, option.longName}) {
    if (!name.empty())
      text += (text.empty() ? "'*" : " '*") + name + "[" + quoteForZsh(option.description) + "]" + value + "'";
  }
  return text;
}

}  // namespace

std::string makeManPage(const std::vector<CommandHelp>& commands, const std::string& version) {
  std::string text =
      ".TH KTORBA 1 \"\" \"ktorba " + version +
      "\" \"User Commands\"\n.SH NAME\nktorba \\- check, explain and play waveform generator scripts\n"
      ".SH SYNOPSIS\n.B ktorba\n\\fICOMMAND\\fR [\\fIOPTION\\fR]... [\\fIFILE\\fR]...\n.SH DESCRIPTION\n";
  for (const CommandHelp& command : commands) {
    text += manCommand(command);
    if (command.name.empty()) text += ".SH COMMANDS\n";
  }
  return text + ".SH EXIT STATUS\n0 for success, 1 for errors in what was given, 2 for a wrong command line.\n";
}

std::string makeBashCompletion(const std::vector<CommandHelp>& commands) {
  std::string names;
  std::string options;
  std::string values;
  for (const CommandHelp& command : commands) {
    if (!command.name.empty()) names += command.name + " ";
    options += "    " + (command.name.empty() ? "*" : command.name) + ") words=\"" + optionWords(command) + "\" ;;\n";
    for (const OptionHelp& option : command.options) {
      if (!alternatives(option).empty())
        values += "    " + option.longName + ") words=\"" + alternatives(option) + "\" ;;\n";
    }
  }
  // The tool itself, which matches any word, comes last.
  const std::size_t firstLine = options.find('\n') + 1;
  options = options.substr(firstLine) + options.substr(0, firstLine);
  return "# Completion of ktorba for bash.\n_ktorba() {\n  local current=${COMP_WORDS[COMP_CWORD]} "
         "previous=${COMP_WORDS[COMP_CWORD-1]} words=\n  COMPREPLY=()\n  case $previous in\n" +
         values + "  esac\n  if [[ $COMP_CWORD == 1 && $current != -* ]]; then\n    words=\"" + names +
         "\"\n  elif [[ $current == -* ]]; then\n    case ${COMP_WORDS[1]} in\n" + options +
         "    esac\n  fi\n  [[ -z $words ]] || COMPREPLY=($(compgen -W \"$words\" -- \"$current\"))\n}\n"
         "complete -o default -F _ktorba ktorba\n";
}

std::string makeZshCompletion(const std::vector<CommandHelp>& commands) {
  std::string descriptions;
  std::string cases;
  for (const CommandHelp& command : commands) {
    if (command.name.empty()) continue;
    descriptions += "    '" + command.name + ":" + quoteForZsh(command.description) + "'\n";
    cases += "    " + command.name + ") _arguments";
    for (const OptionHelp& option : command.options) cases += " \\\n      " + zshOption(option);
    cases += " ;;\n";
  }
  return "#compdef ktorba\n# Completion of ktorba for zsh.\n_ktorba() {\n  local -a commands=(\n" + descriptions +
         "  )\n  if (( CURRENT == 2 )); then\n    _describe command commands\n    return\n  fi\n  shift words\n"
         "  (( CURRENT-- ))\n  case $words[1] in\n" +
         cases + "  esac\n}\n_ktorba \"$@\"\n";
}

}  // namespace tools::cli
