#include "ktorba/script/ScriptProcessor.h"

#include "ktWfmScriptCompiler/ParserFactory.h"
#include "ktorba/script/EngineRecords.h"
#include "ktorba/script/InstructionWordsBuilder.h"

namespace ktorba {

ScriptProcessor::ScriptProcessor(const ktwfmscriptcompiler::ScriptTraits& traits,
                                 SequenceInstructionsGeneratorInterface* encoder, std::uint32_t minFetchSamples)
    : parser_(ktwfmscriptcompiler::ParserFactory().createParser(traits)),
      validator_(traits),
      fetchTranslator_(validator_),
      instructionTranslator_(traits, nesting_, fetchTranslator_, validator_),
      containerTranslator_(traits, nesting_, instructionTranslator_, validator_),
      sequenceGenerator_(traits, nesting_, containerTranslator_, validator_),
      encoder_(encoder),
      minFetchSamples_(minFetchSamples) {}

void ScriptProcessor::compileScripts(const std::string& text, std::vector<CompiledScript>& scripts,
                                     ktwfmscriptcompiler::SourceMap* map) {
  const std::unique_ptr<ktwfmscriptcompiler::iParseTree> tree = parser_->parse(text);
  EngineRecords compiled;
  sequenceGenerator_.generate(*tree, compiled);
  if (map != nullptr) *map = mapSource(*tree);
  scripts = compiled.takeScripts();
}

void ScriptProcessor::buildInstructionWords(const CompiledScript& script, const WaveformFinderInterface& waveforms,
                                            ScriptEntry& entry, std::vector<InstructionOrigin>* origins) {
  InstructionWordsBuilder(*encoder_, minFetchSamples_, waveforms, entry, origins).build(script);
}

}  // namespace ktorba
