#include "ktorba/script/EngineRecords.h"

#include <utility>

namespace ktorba {
namespace {

static_assert(kWholeWaveform == ktwfmscriptcompiler::kWholeWaveform);

// Instructions around those of a script's blocks, and around those of a block's fetches.
constexpr std::size_t kScriptFrame = 2;
constexpr std::size_t kLoopFrame = 2;

// Fills a record in its place: it is too large to be moved for nothing.
void convertFetch(ktwfmscriptcompiler::FetchRecord& fetch, FetchRecord& converted) {
  converted.waveformName = std::move(fetch.waveformName);
  converted.triggerNumber = fetch.triggerNumber;
  converted.startOffset = fetch.startOffset;
  converted.sampleCount = fetch.sampleCount;
  converted.isWait = fetch.isWait;
  converted.clearFlag = fetch.clearFlag;
  converted.markers.reserve(fetch.markers.size());
  for (const auto& marker : fetch.markers) converted.markers.push_back({marker.position, marker.markerMask});
}

}  // namespace

void EngineRecords::startScript(std::string_view name, bool isEndless) {
  scripts_.push_back({std::string(name), isEndless, {}, kScriptFrame});
}

std::vector<CompiledScript> EngineRecords::takeScripts() { return std::exchange(scripts_, {}); }

void EngineRecords::takeBlock(ktwfmscriptcompiler::SequenceBlock& block) {
  CompiledScript& script = scripts_.back();
  script.blocks.push_back({block.loopKind, block.iterationCount, block.triggerNumber, block.clearFlag, {}});
  std::vector<FetchRecord>& fetches = script.blocks.back().fetches;
  fetches.reserve(block.fetches.size());
  script.mostInstructions += kLoopFrame;
  for (ktwfmscriptcompiler::FetchRecord& fetch : block.fetches) {
    convertFetch(fetch, fetches.emplace_back());
    script.mostInstructions += 1 + fetch.markers.size();  // a marker cuts its fetch no more than once
  }
}

}  // namespace ktorba
