#include "ktWfmScriptCompiler/FetchInstructionTranslator.h"

#include <algorithm>

#include "conventions/conventions.h"

namespace ktwfmscriptcompiler {
namespace {

std::size_t countPositions(const NodeList<MarkerModifier>& modifiers) {
  std::size_t count = 0;
  for (const MarkerModifier& modifier : modifiers) count += modifier.positions.size();
  return count;
}

// Joins records of equal position in an ascending list.
void mergeEqualPositions(MarkerRecords& markers) {
  std::size_t kept = 0;
  for (const MarkerRecord& marker : markers) {
    if (kept > 0 && markers[kept - 1].position == marker.position) {
      markers[kept - 1].markerMask |= marker.markerMask;
    } else {
      markers[kept++] = marker;
    }
  }
  markers.resize(kept);
}

}  // namespace

FetchInstructionTranslator::FetchInstructionTranslator(const InstructionValidatorInterface& validator)
    : validator_(validator) {}

void FetchInstructionTranslator::translateFetch(const FetchInstruction& instruction, std::string_view waveformName,
                                                bool isWait, std::uint32_t startOffset, std::uint32_t lengthSamples,
                                                std::uint8_t hardwareTrigger, std::uint8_t clearFlag,
                                                SequenceBlock& block) {
  FetchRecord& record = block.fetches.emplace_back();
  record.waveformName = waveformName;
  record.triggerNumber = hardwareTrigger;
  record.startOffset = startOffset;
  record.sampleCount = lengthSamples;
  record.isWait = isWait;
  record.clearFlag = clearFlag;
  if (!instruction.markers.empty()) translateMarkers(instruction.markers, record.markers);
  const MarkerList markers{record.markers.data(), record.markers.size()};
  if (lengthSamples != kWholeWaveform) validator_.checkMarkersInsideFetch(instruction, lengthSamples, markers);
  validator_.checkMarkerPositionsAligned(instruction, markers);
  validator_.checkFetchLengthAligned(instruction, lengthSamples);
  validator_.checkStartOffsetAligned(instruction, startOffset);
}

void FetchInstructionTranslator::translateMarkers(const NodeList<MarkerModifier>& modifiers, MarkerRecords& markers) {
  markers.reserve(markers.size() + countPositions(modifiers));
  for (const MarkerModifier& modifier : modifiers) {
    const std::uint8_t bit = ktorba::markerBitOf(modifier.markerNumber);
    for (const std::uint32_t position : modifier.positions) markers.push_back({position, bit});
  }
  if (!std::ranges::is_sorted(markers, {}, &MarkerRecord::position)) {
    std::ranges::sort(markers, {}, &MarkerRecord::position);
  }
  mergeEqualPositions(markers);
}

}  // namespace ktwfmscriptcompiler
