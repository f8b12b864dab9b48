// Wires a lexer and a parser for one ScriptTraits.
#pragma once

#include <memory>

#include "ktWfmScriptCompiler/Parser.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"

namespace ktwfmscriptcompiler {

class ParserFactory {
 public:
  virtual ~ParserFactory() = default;

  // Returns a parser for scripts in the vocabulary of `traits`, whose name tables must outlive it, unchanged.
  std::unique_ptr<ParserInterface> createParser(const ScriptTraits& traits) const;
};

}  // namespace ktwfmscriptcompiler
