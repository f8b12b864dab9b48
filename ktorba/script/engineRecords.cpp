#include "ktorba/script/engineRecords.h"

#include <utility>

namespace ktorba {
namespace {

static_assert(kWholeWaveform == ktwfmscriptcompiler::kWholeWaveform);

// Takes the records over, so that the memory of each list serves the next one.
template <typename To, typename From>
std::vector<To> convertAll(std::vector<From> records, To (*convert)(From&)) {
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
          convertAll(std::move(fetch.markers), convertMarker)};
}

SequenceBlock convertBlock(ktwfmscriptcompiler::SequenceBlock& block) {
  return {block.loopKind, block.iterationCount, block.triggerNumber, block.clearFlag,
          convertAll(std::move(block.fetches), convertFetch)};
}

CompiledScript convertScript(ktwfmscriptcompiler::CompiledScript& script) {
  return {std::move(script.name), script.isEndless, convertAll(std::move(script.blocks), convertBlock)};
}

}  // namespace

std::vector<CompiledScript> toEngineRecords(std::vector<ktwfmscriptcompiler::CompiledScript>&& scripts) {
  return convertAll(std::move(scripts), convertScript);
}

}  // namespace ktorba
