#include "ktorba/script/EngineRecords.h"

#include <utility>

namespace ktorba {
namespace {

// Instructions around those of a script's blocks, and around those of a block's fetches.
constexpr std::size_t kScriptFrame = 2;
constexpr std::size_t kLoopFrame = 2;

MarkerRecords convertMarkers(const ktwfmscriptcompiler::MarkerRecords& markers, ktwfmscriptcompiler::Arena& arena) {
  const std::span<MarkerRecord> converted = arena.create<MarkerRecord>(markers.size());
  for (std::size_t i = 0; i < markers.size(); ++i) converted[i] = {markers[i].position, markers[i].markerMask};
  return converted;
}

FetchRecord convertFetch(const ktwfmscriptcompiler::FetchRecord& fetch, ktwfmscriptcompiler::Arena& arena) {
  return {arena.store(fetch.waveformName),
          fetch.triggerNumber,
          fetch.startOffset,
          fetch.sampleCount,
          fetch.isWait,
          fetch.clearFlag,
          convertMarkers(fetch.markers, arena)};
}

}  // namespace

std::vector<CompiledScript> EngineRecords::takeScripts() { return std::exchange(scripts_, {}); }

void EngineRecords::takeScript(std::string_view name, bool isEndless) {
  scripts_.push_back({std::string(name), isEndless, {}, kScriptFrame, std::make_shared<ktwfmscriptcompiler::Arena>()});
}

void EngineRecords::takeBlock(ktwfmscriptcompiler::SequenceBlock& block) {
  CompiledScript& script = scripts_.back();
  const std::span<FetchRecord> fetches = script.arena->create<FetchRecord>(block.fetches.size());
  script.mostInstructions += kLoopFrame;
  for (std::size_t i = 0; i < fetches.size(); ++i) {
    fetches[i] = convertFetch(block.fetches[i], *script.arena);
    script.mostInstructions += 1 + fetches[i].markers.size();  // a marker cuts its fetch no more than once
  }
  script.blocks.push_back({block.loopKind, block.iterationCount, block.triggerNumber, block.clearFlag, fetches});
}

}  // namespace ktorba
