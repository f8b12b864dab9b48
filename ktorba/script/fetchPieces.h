// Cutting a fetch at its markers. The sequencer fires at most one marker per fetch, near its start, so a fetch with
// several markers is played as several pieces. Pure functions; any thread may call.
//
// Lengths and positions are samples. `minFetchSamples` is the hardware's shortest fetch.
#pragma once

#include <boost/container/small_vector.hpp>
#include <cstdint>
#include <vector>

#include "ktorba/script/CompiledScript.h"

namespace ktorba {

struct FetchPiece {
  std::uint32_t start = 0;  // from the start of the fetch
  std::uint32_t length = 0;
  std::uint32_t markerOffset = 0;  // from the start of the piece, less than twice minFetchSamples
  std::uint8_t markerMask = 0;     // 0: no marker

  bool operator==(const FetchPiece&) const = default;
};

// Few fetches have more than a handful of markers: their pieces take no memory from the heap.
using FetchPieces = boost::container::small_vector<FetchPiece, 4>;

// Raises, in this order, when a marker lies behind the fetch's last sample
// (ktorba_errors::kErrorMarkerPositionExceedsLastElementInWaveform), when there are more markers than pieces can be
// (kErrorInvalidNumberOfMarkersOnAWaveform) or when two stand closer than minFetchSamples
// (kErrorInvalidDistanceBetweenTwoMarkerPositions).
void checkMarkers(MarkerRecords markers, std::uint32_t length, std::uint32_t minFetchSamples);

// Returns the pieces of a fetch of `length` samples, the last one first: together they cover it, each is at least
// minFetchSamples long, and each marker, which must have passed checkMarkers(), fires in a piece of its own.
FetchPieces splitAtMarkers(MarkerRecords markers, std::uint32_t length, std::uint32_t minFetchSamples);

}  // namespace ktorba
