#include "cli/scriptPage.h"

#include <algorithm>
#include <sstream>

#include "cli/troff.h"
#include "tools/text/characters.h"

namespace tools::cli {
namespace {

constexpr std::string_view kFence = "```";
constexpr std::string_view kFaultyFence = "```ktorba-error ";
constexpr std::string_view kCodeIndent = "    ";

// The text of "[text](target)" at the start, and how long the whole is; nothing where there is no link.
std::pair<std::string_view, std::size_t> cutLink(std::string_view text) {
  const std::size_t middle = text.find("](");
  const std::size_t end = text.find(')', middle);
  if (!text.starts_with('[') || middle == std::string_view::npos || end == std::string_view::npos) return {};
  return {text.substr(1, middle - 1), end + 1};
}

// Code in bold, links as their text.
std::string spanned(std::string_view text) {
  std::string out;
  bool isCode = false;
  while (!text.empty()) {
    const auto [linkText, linkLength] = isCode ? std::pair<std::string_view, std::size_t>() : cutLink(text);
    if (linkLength > 0) {
      out += spanned(linkText);
    } else if (text.front() == '`') {
      isCode = !isCode;
      out += isCode ? "\\fB" : "\\fR";
    } else {
      out += toTroff(text.substr(0, 1));
    }
    text.remove_prefix(std::max<std::size_t>(1, linkLength));
  }
  return out.starts_with("\\&") || !(out.starts_with('.') || out.starts_with('\'')) ? out : "\\&" + out;
}

class ScriptPage {
 public:
  std::string make(const std::string& document) {
    std::istringstream lines(document);
    for (std::string line; std::getline(lines, line);) add(line);
    return out_;
  }

 private:
  void add(const std::string& line) {
    const bool isFence = line.starts_with(kFence);
    if (isFence) return toggleCode(line);
    if (isFenced_) return addLine(toTroff(line));
    if (line.starts_with(kCodeIndent) != isIndented_) toggleIndentedCode();
    if (isIndented_) return addLine(toTroff(line.substr(kCodeIndent.size())));
    addText(line);
  }

  void addText(const std::string& line) {
    if (line.starts_with("#")) return addHeading(line);
    if (line.starts_with("|")) return addRow(line);
    if (line.starts_with("- [")) isContents_ = true;
    if (line.empty()) isContents_ = false;
    if (isContents_) return;
    if (line.empty()) return addLine(".PP");
    if (line.starts_with("- ")) return addLine(".IP \\(bu 2\n" + spanned(line.substr(2)));
    addLine(spanned(line.substr(line.find_first_not_of(' '))));
  }

  void addHeading(const std::string& line) {
    const std::size_t depth = line.find(' ');
    if (depth == 1) return;  // the title; the page has its own
    addLine((depth == 2 ? ".SH " : ".SS ") + spanned(line.substr(depth + 1)));
  }

  // A row of two cells is a term and what is said of it; the heads of the columns go.
  void addRow(const std::string& line) {
    const std::size_t middle = line.find(" | ");
    if (line.starts_with("|---") || line.starts_with("| Rule") || middle == std::string::npos) return;
    addLine(".TP\n" + spanned(line.substr(2, middle - 2)));
    addLine(spanned(line.substr(middle + 3, line.rfind(" |") - middle - 3)));
  }

  void toggleCode(const std::string& line) {
    isFenced_ = !isFenced_;
    if (line.starts_with(kFaultyFence)) addLine("\\fB" + line.substr(kFaultyFence.size()) + "\\fR:");
    addLine(isFenced_ ? ".RS\n.nf" : ".fi\n.RE");
  }

  void toggleIndentedCode() {
    isIndented_ = !isIndented_;
    addLine(isIndented_ ? ".RS\n.nf" : ".fi\n.RE");
  }

  void addLine(const std::string& text) { out_ += text + "\n"; }

  std::string out_;
  bool isFenced_ = false;
  bool isIndented_ = false;
  bool isContents_ = false;  // the list of what follows, which pages do not have
};

}  // namespace

std::string makeScriptPage(const std::string& document, const std::string& version) {
  return ".TH KTORBA\\-SCRIPT 7 \"\" \"ktorba " + version +
         "\" \"Miscellaneous\"\n.SH NAME\nktorba\\-script \\- the language of waveform generator scripts\n"
         ".SH DESCRIPTION\n" +
         ScriptPage().make(document) + ".SH SEE ALSO\n.BR ktorba (1)\n";
}

}  // namespace tools::cli
