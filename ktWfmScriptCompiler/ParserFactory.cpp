#include "ktWfmScriptCompiler/ParserFactory.h"

#include "ktWfmScriptCompiler/ParserImpl.h"

namespace ktwfmscriptcompiler {

std::unique_ptr<ParserInterface> ParserFactory::createParser(const ScriptTraits& traits) const {
  auto lexer = std::make_shared<Lexer>(traits);
  auto impl = std::make_shared<ParserImpl>(traits, lexer.get());
  return std::make_unique<Parser>(std::move(impl), std::move(lexer));
}

}  // namespace ktwfmscriptcompiler
