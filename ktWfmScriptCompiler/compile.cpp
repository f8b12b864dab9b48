#include "ktWfmScriptCompiler/compile.h"

#include "ktWfmScriptCompiler/ParserFactory.h"
#include "ktWfmScriptCompiler/SequenceGenerator.h"

namespace ktwfmscriptcompiler {

std::vector<CompiledScript> compile(const std::string& text, const ScriptTraits& traits, SourceMap* map) {
  const std::unique_ptr<iParseTree> tree = ParserFactory().createParser(traits)->parse(text);

  InstructionContainerNestingPolicies nesting;
  const InstructionValidator validator(traits);
  FetchInstructionTranslator fetchTranslator(validator);
  InstructionTranslator instructionTranslator(traits, nesting, fetchTranslator, validator);
  InstructionContainerTranslator containerTranslator(traits, nesting, instructionTranslator, validator);
  SequenceGenerator generator(traits, nesting, containerTranslator, validator);

  ScriptCollector scripts;
  generator.generate(*tree, scripts);
  if (map != nullptr) *map = mapSource(*tree);
  return scripts.takeScripts();
}

}  // namespace ktwfmscriptcompiler
