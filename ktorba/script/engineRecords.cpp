#include "ktorba/script/engineRecords.h"

#include <utility>

namespace ktorba {
namespace {

static_assert(kWholeWaveform == ktwfmscriptcompiler::kWholeWaveform);

template <typename To, typename From>
std::vector<To> convertAll(std::vector<From>& records, To (*convert)(From&)) {
  std::vector<To> converted;
  converted.reserve(records.size());
  for (From& record : records) converted.push_back(convert(record));
  return converted;
}

MarkerRecord convertMarker(ktwfmscriptcompiler::MarkerRecord& marker) { return {marker.position, marker.markerMask}; }

FetchRecord convertFetch(ktwfmscriptcompiler::FetchRecord& fetch) {
  return {std::move(fetch.waveformName),
          fetch.triggerNumber,
          fetch.startOffset,
          fetch.sampleCount,
          fetch.isWait,
          fetch.clearFlag,
          convertAll(fetch.markers, convertMarker)};
}

SequenceBlock convertBlock(ktwfmscriptcompiler::SequenceBlock& block) {
  return {block.loopKind, block.iterationCount, block.triggerNumber, block.clearFlag,
          convertAll(block.fetches, convertFetch)};
}

CompiledScript convertScript(ktwfmscriptcompiler::CompiledScript& script) {
  return {std::move(script.name), script.isEndless, convertAll(script.blocks, convertBlock)};
}

}  // namespace

std::vector<CompiledScript> toEngineRecords(std::vector<ktwfmscriptcompiler::CompiledScript>&& scripts) {
  return convertAll(scripts, convertScript);
}

}  // namespace ktorba
