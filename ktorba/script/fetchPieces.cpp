#include "ktorba/script/fetchPieces.h"

#include <algorithm>
#include <iterator>

#include "kterr/Failure.h"
#include "ktorba/script/scriptProcessorSource.h"

namespace ktorba {
namespace {

// The last piece of a fetch of which `rest` samples are left, cut so that it holds `marker`.
FetchPiece lastPiece(const MarkerRecord& marker, bool isFirst, std::uint32_t rest, std::uint32_t minFetchSamples) {
  std::uint32_t start = std::min(marker.position, rest - minFetchSamples);
  if (isFirst && marker.position < std::uint64_t{2} * minFetchSamples) start = 0;
  return {start, rest - start, marker.position - start, marker.markerMask};
}

}  // namespace

void checkMarkers(MarkerRecords markers, std::uint32_t length, std::uint32_t minFetchSamples) {
  for (const MarkerRecord& marker : markers) {
    if (marker.position < length) continue;
    kterr::Failure(ktorba_errors::kErrorMarkerPositionExceedsLastElementInWaveform)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeWaveformLength, length)
        .usage(kterr::kUsageTypeMarkerPosition, marker.position)
        .raise();
  }
  const std::uint64_t count = markers.size();
  if (minFetchSamples > 0 && count > length / minFetchSamples) {
    kterr::Failure(ktorba_errors::kErrorInvalidNumberOfMarkersOnAWaveform)
        .at(kScriptProcessorSource)
        .usage("Maximum number of markers", length / minFetchSamples)
        .usage("Number of markers", static_cast<std::uint32_t>(count))
        .raise();
  }
  for (std::size_t i = 1; i < markers.size(); ++i) {
    if (markers[i].position >= std::uint64_t{markers[i - 1].position} + minFetchSamples) continue;
    kterr::Failure(ktorba_errors::kErrorInvalidDistanceBetweenTwoMarkerPositions)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeMinMarkerDistFromOtherMarker, minFetchSamples)
        .raise();
  }
}

// Only from the end backwards is it known how much room a marker has behind it.
FetchPieces splitAtMarkers(MarkerRecords markers, std::uint32_t length, std::uint32_t minFetchSamples) {
  FetchPieces pieces;
  pieces.reserve(markers.size() + 1);
  std::uint32_t rest = length;
  for (auto marker = markers.rbegin(); marker != markers.rend(); ++marker) {
    const bool isFirst = std::next(marker) == markers.rend();
    pieces.push_back(lastPiece(*marker, isFirst, rest, minFetchSamples));
    rest = pieces.back().start;
  }
  if (rest > 0) pieces.push_back({0, rest, 0, 0});
  return pieces;
}

}  // namespace ktorba
