#include "cli/documents.h"

#include <map>

#include "cli/troff.h"

namespace tools::cli {
namespace {

constexpr std::string_view kManEnd = R"(.SH EXIT STATUS
0 for success, 1 for errors in what was given, 2 for a wrong command line. An interrupted command ends by the signal.
.SH ENVIRONMENT
.TP
.B NO_COLOR
When it is set, messages are not coloured, unless \-\-color asks for it.
.SH FILES
.TP
.I *.kts
Scripts, as
.BR ktorba\-script (7)
describes them.
.TP
.I OUTPUT.NUMBER.part
An output that is being written. It gets its name when it is whole, and is removed when the command fails or is
interrupted.
.SH SEE ALSO
.BR ktorba\-script (7)
)";

std::string manOption(const OptionHelp& option) {
  std::string names;
  for (const std::string& name : {option.shortName, option.longName}) {
    if (!name.empty()) names += (names.empty() ? "\\fB" : ", \\fB") + toTroff(name) + "\\fR";
  }
  if (!option.value.empty()) names += (names.empty() ? "\\fI" : " \\fI") + toTroff(option.value) + "\\fR";
  return ".TP\n" + names + "\n" + toTroff(option.description) + ".\n";
}

std::string manCommand(const CommandHelp& command) {
  std::string text = command.name.empty() ? "" : ".SS ktorba " + command.name + "\n";
  text += toTroff(command.description) +
          (command.description.ends_with('?') || command.description.ends_with('.') ? "\n" : ".\n");
  for (const OptionHelp& option : command.options) text += manOption(option);
  return text + ".PP\n.nf\n" + toTroff(command.remarks) + "\n.fi\n";
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
  const std::string words = alternatives(option);
  const std::string action = words.empty() ? "_files" : "(" + words + ")";
  const std::string value = option.value.empty() ? "" : ":" + quoteForZsh(option.value) + ":" + action;
  if (option.longName.empty() && option.shortName.empty()) return "'*" + value + "'";
  std::string text;
  for (const std::string& name : {option.shortName, option.longName}) {
    if (!name.empty())
      text += (text.empty() ? "'*" : " '*") + name + "[" + quoteForZsh(option.description) + "]" + value + "'";
  }
  return text;
}

std::string quoteForFish(const std::string& text) {
  std::string quoted = "'";
  for (const char c : text) quoted += (c == '\'' || c == '\\' ? "\\" : "") + std::string(1, c);
  return quoted + "'";
}

// The words of a line that completes the option; empty for arguments that are any file, as all are by themselves.
std::string fishOption(const OptionHelp& option) {
  const std::string words = alternatives(option);
  std::string text;
  if (!option.shortName.empty()) text += " -s " + option.shortName.substr(1);
  if (!option.longName.empty()) text += " -l " + option.longName.substr(2);
  if (text.empty() && words.empty()) return {};
  if (!words.empty()) {
    text += " -x -a " + quoteForFish(words);
  } else if (!option.value.empty()) {
    text += " -r";
  }
  return text + " -d " + quoteForFish(option.description) + "\n";
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
  return text + std::string(kManEnd);
}

std::string makeBashCompletion(const std::vector<CommandHelp>& commands) {
  std::string names;
  std::string options;
  std::map<std::string, std::string> values;  // by what stands in front of them
  for (const CommandHelp& command : commands) {
    if (!command.name.empty()) names += command.name + " ";
    options += "    " + (command.name.empty() ? "*" : command.name) + ") words=\"" + optionWords(command) + "\" ;;\n";
    for (const OptionHelp& option : command.options) {
      const std::string words = alternatives(option);
      if (!words.empty()) values[option.longName.empty() ? command.name : option.longName] = words;
    }
  }
  std::string valueCases;
  for (const auto& [before, words] : values) valueCases += "    " + before + ") words=\"" + words + "\" ;;\n";
  // The tool itself, which matches any word, comes last.
  const std::size_t firstLine = options.find('\n') + 1;
  options = options.substr(firstLine) + options.substr(0, firstLine);
  return "# Completion of ktorba for bash.\n_ktorba() {\n  local current=${COMP_WORDS[COMP_CWORD]} "
         "previous=${COMP_WORDS[COMP_CWORD-1]} words=\n  COMPREPLY=()\n  case $previous in\n" +
         valueCases + "  esac\n  if [[ $COMP_CWORD == 1 && $current != -* ]]; then\n    words=\"" + names +
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

std::string makeFishCompletion(const std::vector<CommandHelp>& commands) {
  std::string text = "# Completion of ktorba for fish.\n";
  for (const CommandHelp& command : commands) {
    if (command.name.empty()) continue;
    text += "complete -c ktorba -n __fish_use_subcommand -f -a " + command.name + " -d " +
            quoteForFish(command.description) + "\n";
    for (const OptionHelp& option : command.options) {
      const std::string words = fishOption(option);
      if (!words.empty()) text += "complete -c ktorba -n '__fish_seen_subcommand_from " + command.name + "'" + words;
    }
  }
  return text;
}

}  // namespace tools::cli
