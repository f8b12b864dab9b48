// Where the markers of a straight play fire: how often up to a sample, and at which sample for the n-th time, each in
// logarithmic time. Constant once made; any thread may read. The straight play must outlive it.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "conventions/conventions.h"
#include "tools/timeline/StraightPlay.h"

namespace tools {

class MarkerIndex {
 public:
  explicit MarkerIndex(const StraightPlay& play);

  bool isUsed(std::uint32_t marker) const { return !markers_[marker].steps.empty(); }
  // The pulses of the marker before that sample of the straight play; kBeyond: more than 64 bits count.
  std::uint64_t countBefore(std::uint32_t marker, std::uint64_t sample) const;
  // The sample of the n-th pulse from 0, of which there are more than n.
  std::uint64_t pulse(std::uint32_t marker, std::uint64_t n) const;

 private:
  struct Marker {
    std::vector<std::uint32_t> steps;   // that fire it
    std::vector<std::uint32_t> blocks;  // that hold such steps,
    std::vector<std::uint32_t> first;   // the index of the first of them in `steps`, and
    std::vector<std::uint64_t> before;  // the pulses before the block
  };
  static std::uint32_t perPass(const Marker& marker, std::size_t entry);

  const StraightPlay& play_;
  std::array<Marker, ktorba::kMarkerCount> markers_;
};

}  // namespace tools
