#include "ktWfmScriptCompiler/Compiler.h"

#include "ktWfmScriptCompiler/ParserFactory.h"

namespace ktwfmscriptcompiler {

Compiler::Compiler(const ScriptTraits& traits)
    : parser_(ParserFactory().createParser(traits)),
      validator_(traits),
      fetchTranslator_(validator_),
      instructionTranslator_(traits, nesting_, fetchTranslator_, validator_),
      containerTranslator_(traits, nesting_, instructionTranslator_, validator_),
      sequenceGenerator_(traits, nesting_, containerTranslator_, validator_) {}

}  // namespace ktwfmscriptcompiler
