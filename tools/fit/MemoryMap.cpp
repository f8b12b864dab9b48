#include "tools/fit/MemoryMap.h"

#include <algorithm>

namespace tools {

MemoryMap::MemoryMap(std::vector<MappedBlock> waveforms, std::uint64_t memoryBytes, std::uint32_t wordBytes,
                     std::uint32_t sampleBytes)
    : memoryBytes_(memoryBytes), wordBytes_(wordBytes), sampleBytes_(sampleBytes) {
  std::ranges::sort(waveforms, {}, &MappedBlock::firstByte);
  std::uint64_t end = 0;
  const auto appendHole = [&](std::uint64_t until) {
    if (until > end) append({"", end, until - end, (until - end) / sampleBytes_});
  };
  for (MappedBlock& waveform : waveforms) {
    appendHole(waveform.firstByte);
    end = waveform.firstByte + waveform.bytes;
    append(std::move(waveform));
  }
  appendHole(memoryBytes_ - unusableBytes());
}

void MemoryMap::append(MappedBlock block) {
  if (block.isHole()) {
    ++holeCount_;
    freeBytes_ += block.bytes;
    largestHoleBytes_ = std::max(largestHoleBytes_, block.bytes);
  }
  blocks_.push_back(std::move(block));
}

double MemoryMap::fragmentation() const {
  return freeBytes_ == 0 ? 0 : static_cast<double>(freeBytes_ - largestHoleBytes_) / static_cast<double>(freeBytes_);
}

std::uint64_t MemoryMap::holeBytesAt(std::size_t index) const {
  return index < blocks_.size() && blocks_[index].isHole() ? blocks_[index].bytes : 0;
}

// Its own block joins the holes beside it.
std::optional<Extension> MemoryMap::longest() const {
  const auto lengthOf = [](const MappedBlock& block) { return block.isHole() ? 0 : block.samples; };
  const auto longest = std::ranges::max_element(blocks_, {}, lengthOf);
  if (longest == blocks_.end() || longest->isHole()) return std::nullopt;
  const auto index = static_cast<std::size_t>(longest - blocks_.begin());
  const std::uint64_t joined = holeBytesAt(index - 1) + longest->bytes + holeBytesAt(index + 1);
  return Extension{longest->waveform, std::max(joined, largestHoleBytes_) / sampleBytes_ - longest->samples};
}

}  // namespace tools
