#include "tools/timeline/MarkerIndex.h"

#include <algorithm>

namespace tools {

MarkerIndex::MarkerIndex(const StraightPlay& play) : play_(play) {
  std::array<std::uint64_t, ktorba::kMarkerCount> total{};
  for (std::uint32_t block = 0; block < play.blocks().size(); ++block) {
    const Block& its = play.blocks()[block];
    std::array<std::size_t, ktorba::kMarkerCount> first{};
    for (std::size_t marker = 0; marker < markers_.size(); ++marker) first[marker] = markers_[marker].steps.size();
    for (std::uint32_t step = its.firstStep; step < its.endStep; ++step) {
      for (std::uint32_t marker = 0; marker < markers_.size(); ++marker) {
        if ((play.steps()[step].markerMask & ktorba::markerBitOf(marker)) != 0) markers_[marker].steps.push_back(step);
      }
    }
    for (std::size_t marker = 0; marker < markers_.size(); ++marker) {
      Marker& fired = markers_[marker];
      const std::uint64_t inPass = fired.steps.size() - first[marker];
      if (inPass == 0) continue;
      fired.blocks.push_back(block);
      fired.first.push_back(static_cast<std::uint32_t>(first[marker]));
      fired.before.push_back(total[marker]);
      total[marker] = extentSum(total[marker], extentProduct(inPass, its.passes));
    }
  }
}

std::uint32_t MarkerIndex::perPass(const Marker& marker, std::size_t entry) {
  const auto end =
      entry + 1 < marker.first.size() ? marker.first[entry + 1] : static_cast<std::uint32_t>(marker.steps.size());
  return end - marker.first[entry];
}

std::uint64_t MarkerIndex::countBefore(std::uint32_t marker, std::uint64_t sample) const {
  const Marker& fired = markers_[marker];
  const auto entry = std::ranges::partition_point(
      fired.blocks, [&](std::uint32_t block) { return play_.blocks()[block].start < sample; });
  if (entry == fired.blocks.begin()) return 0;
  const auto index = static_cast<std::size_t>(entry - fired.blocks.begin()) - 1;
  const Block& block = play_.blocks()[fired.blocks[index]];
  const std::uint64_t inPass = perPass(fired, index);
  const std::uint64_t passes = std::min((sample - block.start) / block.bodySamples, block.passes);
  const std::uint64_t before = extentSum(fired.before[index], extentProduct(passes, inPass));
  if (passes == block.passes) return before;
  const std::uint64_t inBody = (sample - block.start) % block.bodySamples;
  const auto first = fired.steps.begin() + fired.first[index];
  const auto later = std::partition_point(first, first + static_cast<std::ptrdiff_t>(inPass), [&](std::uint32_t at) {
    return play_.steps()[at].startInBody + play_.steps()[at].markerOffset < inBody;
  });
  return extentSum(before, static_cast<std::uint64_t>(later - first));
}

std::uint64_t MarkerIndex::pulse(std::uint32_t marker, std::uint64_t n) const {
  const Marker& fired = markers_[marker];
  const auto entry = std::ranges::upper_bound(fired.before, n);
  const auto index = static_cast<std::size_t>(entry - fired.before.begin()) - 1;
  const Block& block = play_.blocks()[fired.blocks[index]];
  const std::uint64_t inBlock = n - fired.before[index];
  const std::uint64_t inPass = perPass(fired, index);
  const Step& step = play_.steps()[fired.steps[fired.first[index] + inBlock % inPass]];
  return block.start + inBlock / inPass * block.bodySamples + step.startInBody + step.markerOffset;
}

}  // namespace tools
