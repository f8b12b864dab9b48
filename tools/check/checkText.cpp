#include "tools/check/checkText.h"

#include <algorithm>

#include "ktWfmScriptCompiler/Compiler.h"
#include "ktWfmScriptCompiler/ParserImpl.h"
#include "kterr/Exception.h"
#include "tools/check/RuleChecker.h"
#include "tools/check/describeFault.h"
#include "tools/check/warnings.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/characters.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::Lexer;
using ktwfmscriptcompiler::LexerInterface;
using ktwfmscriptcompiler::ScriptTraits;
using ktwfmscriptcompiler::Token;

// UTF-16 has a byte of zero in most of its characters; other binary files begin with bytes that no text holds.
std::string guessEncoding(std::string_view text) {
  if (text.starts_with("\xFF\xFE") || text.starts_with("\xFE\xFF")) return "UTF-16";
  const auto zeros = std::ranges::count(text.substr(0, 1024), '\0');
  if (zeros * 3 > static_cast<std::ptrdiff_t>(std::min<std::size_t>(text.size(), 1024))) return "UTF-16";
  return zeros > 0 ? "a binary file" : "";
}

Diagnostic refuseEncoding(const ScriptFile& file, std::size_t invalid) {
  const std::string encoding = guessEncoding(file.text());
  Diagnostic diagnostic = diagnoseFailure(ktorba_codes::kTextNotConvertible.code, nullptr);
  diagnostic.place = file.placeOf(invalid);
  diagnostic.length = 1;
  say(diagnostic, encoding.empty() ? MessageKind::kNotUtf8 : MessageKind::kOtherEncoding, {encoding});
  return diagnostic;
}

// The rules of every script, and the faults of words and grammar, in the order of the text.
std::vector<Diagnostic> describeAll(const ScriptFile& file, const SyntaxTree& tree,
                                    const ktwfmscriptcompiler::ScriptTraits& traits, double sampleRateHz) {
  const FaultDescriber describer(file, tree, traits, sampleRateHz);
  std::vector<std::pair<std::uint32_t, Diagnostic>> found;  // with the token
  for (const SyntaxFault& fault : tree.faults()) {
    if (found.size() >= kMaxErrors) break;
    found.emplace_back(fault.token, describer.describe(fault));
  }
  std::size_t rules = 0;
  RuleChecker checker(tree, traits);
  for (std::uint32_t node = 0; node < tree.nodes().size() && rules < kMaxErrors; node = tree.nodes()[node].endNode) {
    if (tree.nodes()[node].kind != NodeKind::kScript) continue;
    for (const RuleFault& fault : checker.check(node, kMaxErrors - rules)) {
      found.emplace_back(fault.token, describer.describe(fault));
      ++rules;
    }
  }
  std::ranges::stable_sort(found, {}, [](const auto& entry) { return entry.first; });
  std::vector<Diagnostic> diagnostics;
  diagnostics.reserve(found.size());
  for (auto& [token, diagnostic] : found) diagnostics.push_back(std::move(diagnostic));
  if (diagnostics.size() > kMaxErrors) diagnostics.resize(kMaxErrors);
  return diagnostics;
}

// A lexer that remembers the token it handed out last.
class RememberingLexer final : public LexerInterface {
 public:
  explicit RememberingLexer(const ScriptTraits& traits) : lexer_(traits) {}

  void setScript(const std::string& text) override { lexer_.setScript(text); }
  Token getNextToken() override { return last_ = lexer_.getNextToken(); }
  const Token& last() const { return last_; }

 private:
  Lexer lexer_;
  Token last_;
};

// Has scripts translated for the sake of their errors.
class DiscardingSink final : public ktwfmscriptcompiler::ScriptSink {
 public:
  DiscardingSink() : ScriptSink(Keeps::kNothing) {}

 private:
  void takeScript(std::string_view, bool) override {}
  void takeBlock(ktwfmscriptcompiler::SequenceBlock&) override {}
};

}  // namespace

CheckedText checkText(const ScriptFile& file, const ScriptTraits& traits, double sampleRateHz) {
  CheckedText checked;
  checked.diagnostics = checkEncoding(file);
  if (!checked.diagnostics.empty()) return checked;
  try {
    RememberingLexer lexer(traits);
    const auto tree = ktwfmscriptcompiler::ParserImpl(traits, &lexer).parse(file.text());
    DiscardingSink sink;
    ktwfmscriptcompiler::Compiler(traits).translate(*tree, sink);
    const auto& scripts = ktwfmscriptcompiler::downcast<ktwfmscriptcompiler::ProcedureCollection>(*tree);
    checked.scripts = static_cast<std::size_t>(std::distance(scripts.procedures.begin(), scripts.procedures.end()));
    checked.diagnostics = findWarnings(scripts, lexer.last());
  } catch (const kterr::Exception&) {
    checked.diagnostics = findErrors(file, traits, sampleRateHz);
  }
  return checked;
}

std::vector<Diagnostic> checkEncoding(const ScriptFile& file) {
  const auto invalid = findInvalidUtf8(file.text());
  if (!invalid) return {};
  return {refuseEncoding(file, *invalid)};
}

std::vector<Diagnostic> findErrors(const ScriptFile& file, const ktwfmscriptcompiler::ScriptTraits& traits,
                                   double sampleRateHz) {
  const SyntaxTree tree(file.text(), traits);
  if (!tree.faults().empty() && guessEncoding(file.text()) != "") {
    Diagnostic diagnostic = FaultDescriber(file, tree, traits, sampleRateHz).describe(tree.faults().front());
    diagnostic.fixes.clear();
    say(diagnostic, MessageKind::kOtherEncoding, {guessEncoding(file.text())});
    return {diagnostic};
  }
  return describeAll(file, tree, traits, sampleRateHz);
}

}  // namespace tools
