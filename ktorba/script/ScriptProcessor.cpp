#include "ktorba/script/ScriptProcessor.h"

#include "ktorba/script/EngineRecords.h"
#include "ktorba/script/InstructionWordsBuilder.h"

namespace ktorba {

ScriptProcessor::ScriptProcessor(const ktwfmscriptcompiler::ScriptTraits& traits,
                                 SequenceInstructionsGeneratorInterface* encoder, std::uint32_t minFetchSamples)
    : compiler_(traits), encoder_(encoder), minFetchSamples_(minFetchSamples) {}

void ScriptProcessor::compileScripts(const std::string& text, std::vector<CompiledScript>& scripts,
                                     ktwfmscriptcompiler::SourceMap* map) {
  using Keeps = ktwfmscriptcompiler::ScriptSink::Keeps;
  EngineRecords compiled(map == nullptr ? Keeps::kScripts : Keeps::kScriptsAndMap);
  compiler_.compile(text, compiled);
  scripts = compiled.takeScripts();
  if (map != nullptr) *map = compiled.takeMap();
}

void ScriptProcessor::buildInstructionWords(const CompiledScript& script, const WaveformFinderInterface& waveforms,
                                            ScriptEntry& entry, std::vector<InstructionOrigin>* origins) {
  InstructionWordsBuilder(*encoder_, minFetchSamples_, waveforms, entry, origins).build(script);
}

}  // namespace ktorba
