#include "tools/player/BlockPlayer.h"

#include <algorithm>
#include <cstring>

namespace tools {
namespace {

// Above the instructions of one block: of the loops that begin and end between two samples, not more are open than the
// sequencer holds, and a script's last block is followed by its end.
constexpr std::uint64_t kTraceCapacity = std::uint64_t{40} * BlockPlayer::kMostSamples;

}  // namespace

BlockPlayer::BlockPlayer(Host& host, unsigned sampleWidthBits, RecordingParts wanted)
    : host_(host), wanted_(wanted), samples_(sampleWidthBits) {
  if (wanted.samples) samples_.resize(kMostSamples);
  if (wanted.markers) markerBits_.resize(kMostSamples);
  host_.recordSegments(wanted.segments ? kTraceCapacity : 0);
}

std::uint64_t BlockPlayer::fill(std::uint64_t firstSample, std::uint64_t count) {
  const std::uint64_t played =
      host_.play(count, wanted_.samples ? samples_.data() : nullptr, wanted_.markers ? markerBits_.data() : nullptr);
  if (wanted_.markers) findMarkers(firstSample, played);
  if (wanted_.segments) host_.takeSegments(segments_);
  return played;
}

// Eight samples at a time, since hardly any has a marker.
void BlockPlayer::findMarkers(std::uint64_t firstSample, std::uint64_t count) {
  markers_.clear();
  for (std::uint64_t first = 0; first < count; first += sizeof(std::uint64_t)) {
    std::uint64_t eight = 0;
    std::memcpy(&eight, markerBits_.data() + first, sizeof eight);
    if (eight == 0) continue;
    for (std::uint64_t i = first; i < std::min(count, first + sizeof eight); ++i) {
      if (markerBits_[i] != 0) markers_.push_back({firstSample + i, markerBits_[i]});
    }
  }
}

RecordingBlock BlockPlayer::block(std::uint64_t firstSample, std::uint64_t count) const {
  return {firstSample, wanted_.samples ? samples_.first(count) : SampleSpan(), markers_, segments_};
}

}  // namespace tools
