#include "tools/timeline/WaveformSummary.h"

namespace tools {
namespace {

constexpr std::uint64_t kChunkSamples = 256;

}  // namespace

WaveformSummary::WaveformSummary(const SampleSpan& samples) : samples_(samples) {
  std::vector<LevelRange> chunks;
  chunks.reserve(samples.size() / kChunkSamples + 1);
  for (std::uint64_t begin = 0; begin < samples.size(); begin += kChunkSamples) {
    chunks.push_back(scan(begin, std::min<std::uint64_t>(begin + kChunkSamples, samples.size())));
  }
  chunks_ = RangeTree(std::move(chunks));
}

LevelRange WaveformSummary::scan(std::uint64_t begin, std::uint64_t end) const {
  return samples_.visit([&](const auto& samples) {
    LevelRange range;
    for (std::uint64_t index = begin; index < end; ++index) range.add(samples[index]);
    return range;
  });
}

LevelRange WaveformSummary::over(std::uint64_t begin, std::uint64_t end) const {
  const std::uint64_t firstChunk = (begin + kChunkSamples - 1) / kChunkSamples;
  const std::uint64_t endChunk = end / kChunkSamples;
  if (firstChunk >= endChunk) return scan(begin, end);
  LevelRange range = chunks_.over(firstChunk, endChunk);
  range.add(scan(begin, firstChunk * kChunkSamples));
  range.add(scan(endChunk * kChunkSamples, end));
  return range;
}

}  // namespace tools
