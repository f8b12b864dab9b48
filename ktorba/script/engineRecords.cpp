#include "ktorba/script/engineRecords.h"

#include <utility>

namespace ktorba {
namespace {

static_assert(kWholeWaveform == ktwfmscriptcompiler::kWholeWaveform);

template <typename ToList, typename FromList, typename Convert>
ToList convertAll(FromList&& records, Convert convert) {
  ToList converted;
  converted.reserve(records.size());
  for (auto& record : records) converted.push_back(convert(record));
  return converted;
}

MarkerRecord convertMarker(const ktwfmscriptcompiler::MarkerRecord& marker) {
  return {marker.position, marker.markerMask};
}

FetchRecord convertFetch(ktwfmscriptcompiler::FetchRecord& fetch) {
  return {std::move(fetch.waveformName),
          fetch.triggerNumber,
          fetch.startOffset,
          fetch.sampleCount,
          fetch.isWait,
          fetch.clearFlag,
          convertAll<MarkerRecords>(fetch.markers, convertMarker)};
}

// Blocks and scripts give up their lists at once, so that the memory of each serves the next one.
SequenceBlock convertBlock(ktwfmscriptcompiler::SequenceBlock& block) {
  return {block.loopKind, block.iterationCount, block.triggerNumber, block.clearFlag,
          convertAll<std::vector<FetchRecord>>(std::exchange(block.fetches, {}), convertFetch)};
}

CompiledScript convertScript(ktwfmscriptcompiler::CompiledScript& script) {
  return {std::move(script.name), script.isEndless,
          convertAll<std::vector<SequenceBlock>>(std::exchange(script.blocks, {}), convertBlock)};
}

}  // namespace

std::vector<CompiledScript> toEngineRecords(std::vector<ktwfmscriptcompiler::CompiledScript>&& scripts) {
  return convertAll<std::vector<CompiledScript>>(std::move(scripts), convertScript);
}

}  // namespace ktorba
