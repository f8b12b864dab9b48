// The tolerant front end beside the compiler, which is the judge of whether a text has errors and of its first one.
#include <algorithm>

#include "conventions/conventions.h"
#include "ktWfmScriptCompiler/compile.h"
#include "kterr/Exception.h"
#include "testing/require.h"
#include "tools/check/checkText.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/syntax/SyntaxTree.h"

namespace {

using tools::Diagnostic;

const ktwfmscriptcompiler::ScriptTraits& traits() {
  static const auto kTraits = [] {
    auto standard = ktwfmscriptcompiler::standardScriptTraits();
    standard.alignmentQuantum = 8;
    standard.minWaitLength = 64;
    return standard;
  }();
  return kTraits;
}

// Nodes lie within the text and within each other, and tokens stand in its order.
void checkTree(const tools::SyntaxTree& tree) {
  std::size_t end = 0;
  for (std::uint32_t token = 0; token < tree.tokens().size(); ++token) {
    require(tree.tokens()[token].offset() >= end, "order of tokens");
    end = tree.tokens()[token].offset() + tree.textOf(token).size();
  }
  require(end <= tree.text().size() && tree.unreadFrom() <= tree.text().size(), "end of tokens");
  for (std::uint32_t node = 0; node < tree.nodes().size(); ++node) {
    const tools::SyntaxNode& at = tree.nodes()[node];
    require(at.endNode > node && at.endNode <= tree.nodes().size(), "end of a node");
    require(at.firstToken <= at.endToken && at.endToken < tree.tokens().size(), "tokens of a node");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const tools::ScriptFile file("t", std::string(reinterpret_cast<const char*>(data), size));
  checkTree(tools::SyntaxTree(file.text(), traits()));
  const auto errors = tools::findErrors(file, traits(), 1e6);
  try {
    ktwfmscriptcompiler::compile(file.text(), traits());
    require(errors.empty(), "an error in a text that compiles");
  } catch (const kterr::Exception& failure) {
    const Diagnostic expected = tools::diagnoseFailure(failure.code(), failure.getJson());
    const bool isTold =
        std::ranges::any_of(errors, [&](const Diagnostic& error) { return error.code == expected.code; });
    require(isTold || errors.size() == tools::kMaxErrors, "the code of the first error");
  }
  return 0;
}
