#include "ktWfmScriptCompiler/Parser.h"

#include "ktWfmScriptCompiler/ParserImpl.h"

namespace ktwfmscriptcompiler {

Parser::Parser(std::shared_ptr<ParserImpl> impl, std::shared_ptr<LexerInterface> lexer)
    : lexer_(std::move(lexer)), impl_(std::move(impl)) {}

std::unique_ptr<iParseTree> Parser::parse(const std::string& text) { return impl_->parse(text); }

}  // namespace ktwfmscriptcompiler
