#include "tools/fit/describeMemory.h"

#include <algorithm>
#include <vector>

#include "tools/text/quantities.h"

namespace tools {
namespace {

std::string inPercent(double share) {
  const auto tenths = static_cast<std::uint64_t>(1000 * share);
  return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10) + " %";
}

// A character of the bar.
struct Cell {
  std::uint64_t used = 0;  // bytes
  std::uint64_t most = 0;  // of them, of one waveform,
  std::size_t waveform = 0;
};

class Bar {
 public:
  Bar(std::uint64_t bytes, std::size_t cells) : bytes_(bytes), cells_(std::min<std::uint64_t>(cells, bytes)) {}

  void add(const MappedBlock& block, std::size_t waveform) {
    const std::uint64_t end = block.firstByte + block.bytes;
    for (std::size_t cell = block.firstByte * cells_.size() / bytes_; cell < cells_.size() && start(cell) < end;
         ++cell) {
      const std::uint64_t first = std::max(block.firstByte, start(cell));
      const std::uint64_t used = std::max(first, std::min(end, start(cell + 1))) - first;
      cells_[cell].used += used;
      if (used <= cells_[cell].most) continue;
      cells_[cell].most = used;
      cells_[cell].waveform = waveform;
    }
  }

  std::string text() const {
    std::string text;
    for (std::size_t cell = 0; cell < cells_.size(); ++cell) text += shadeOf(cell);
    return text;
  }

 private:
  std::uint64_t start(std::size_t cell) const { return bytes_ * cell / cells_.size(); }

  const char* shadeOf(std::size_t index) const {
    const Cell& cell = cells_[index];
    if (cell.used == 0) return "\u2591";
    if (2 * cell.used < start(index + 1) - start(index)) return "\u2592";
    return cell.waveform % 2 == 0 ? "\u2588" : "\u2593";
  }

  std::uint64_t bytes_;
  std::vector<Cell> cells_;
};

}  // namespace

std::string describeUse(const MemoryMap& map) {
  const double share = static_cast<double>(map.usedBytes()) / static_cast<double>(map.memoryBytes());
  return formatCount(map.usedBytes()) + " of " + formatCount(map.memoryBytes()) + " bytes (" + inPercent(share) + ")";
}

std::string describeHoles(const MemoryMap& map) {
  if (map.holeCount() == 0) return "no hole";
  const std::string size =
      formatCount(map.largestHoleBytes()) + " bytes (" + formatCount(map.largestHoleSamples()) + " samples)";
  if (map.holeCount() == 1) return "one hole of " + size;
  return formatCount(map.holeCount()) + " holes, the largest of " + size + ", fragmentation " +
         inPercent(map.fragmentation());
}

std::string describeLongest(const MemoryMap& map) {
  const auto longest = map.longest();
  if (!longest) return "";
  if (longest->samples == 0) return longest->waveform + " can be no longer, all others staying";
  return longest->waveform + " could be " + formatCount(longest->samples) + " samples longer, all others staying";
}

std::string memoryBar(const MemoryMap& map, int columns) {
  Bar bar(map.memoryBytes(), static_cast<std::size_t>(std::max(1, columns)));
  std::size_t waveforms = 0;
  for (const MappedBlock& block : map.blocks()) {
    if (!block.isHole()) bar.add(block, waveforms++);
  }
  return bar.text();
}

}  // namespace tools
