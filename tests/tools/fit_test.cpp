// The map of sample memory, as the library's own allocator would have it; what is said of it stands in sessions, too.
#include <gmock/gmock.h>

#include <map>

#include "ktorba/waveform/MemoryBlockManager.h"
#include "testing/seeds.h"
#include "tools/fit/describeMemory.h"

namespace tools {
namespace {

constexpr std::uint32_t kWordBytes = 16;
constexpr std::uint32_t kSampleBytes = 2;

// Waveforms that come and go as in a session.
struct Memory {
  explicit Memory(std::uint32_t bytes) : size(bytes), manager(bytes, kWordBytes) {}

  void place(std::uint32_t bytes, std::uint32_t unplayedSamples) {
    const std::uint32_t start = manager.allocateBlock(bytes);
    placed[start] = {"w" + std::to_string(++count), start, bytes, bytes / kSampleBytes - unplayedSamples};
  }
  void clear(std::uint32_t index) {
    const auto block = std::next(placed.begin(), index);
    manager.freeBlock(block->first);
    placed.erase(block);
  }
  MemoryMap map() const {
    std::vector<MappedBlock> blocks;
    for (const auto& [start, block] : placed) blocks.insert(blocks.begin(), block);
    return {blocks, size, kWordBytes, kSampleBytes};
  }

  std::uint32_t size;
  ktorba::MemoryBlockManager manager;
  std::map<std::uint32_t, MappedBlock> placed;
  unsigned count = 0;
};

void playAtRandom(Memory& memory, Random& random) {
  for (std::uint32_t step = pick(random, 0, 40); step > 0; --step) {
    const std::uint32_t words = memory.manager.getLargestAvailableBlockSize() / kWordBytes;
    if (!memory.placed.empty() && (words == 0 || pick(random, 0, 2) == 0)) {
      memory.clear(pick(random, 0, static_cast<std::uint32_t>(memory.placed.size()) - 1));
    } else if (words > 0) {
      memory.place(kWordBytes * pick(random, 1, std::min(words, 12u)), pick(random, 0, 7));
    }
  }
}

TEST(MemoryMap, HasTheHolesOfTheAllocator) {
  forEachSeed(300, [](Random& random) {
    Memory memory(pick(random, 16, 1000));
    playAtRandom(memory, random);
    const MemoryMap map = memory.map();
    std::uint64_t end = 0;
    for (const MappedBlock& block : map.blocks()) {
      EXPECT_EQ(block.firstByte, end);
      end += block.bytes;
    }
    EXPECT_EQ(end + map.unusableBytes(), memory.size);
    EXPECT_EQ(map.blocks().size(), memory.placed.size() + map.holeCount());
    EXPECT_EQ(map.largestHoleBytes(), memory.manager.getLargestAvailableBlockSize());
  });
}

TEST(MemoryMap, TellsHowMuchLongerTheLongestCouldBe) {
  forEachSeed(300, [](Random& random) {
    Memory memory(pick(random, 16, 1000));
    playAtRandom(memory, random);
    const auto longest = memory.map().longest();
    ASSERT_EQ(longest.has_value(), !memory.placed.empty());
    if (!longest) return;
    const auto isIt = [&](const auto& entry) { return entry.second.waveform == longest->waveform; };
    const auto block = std::ranges::find_if(memory.placed, isIt);
    for (const auto& [start, other] : memory.placed) EXPECT_LE(other.samples, block->second.samples);
    memory.manager.freeBlock(block->first);
    EXPECT_EQ((block->second.samples + longest->samples) * kSampleBytes,
              memory.manager.getLargestAvailableBlockSize() / kSampleBytes * kSampleBytes);
  });
}

TEST(MemoryMap, IsToldInWordsAndDrawnToScale) {
  struct Case {
    std::vector<MappedBlock> waveforms;
    std::uint64_t bytes;
    int columns;
    const char* bar;
    const char* holes;
  };
  const Case cases[] = {
      {{}, 160, 4, "░░░░", "one hole of 160 bytes (80 samples)"},
      {{}, 8, 4, "░░░░", "no hole"},
      {{{"a", 0, 160, 80}}, 160, 0, "█", "no hole"},
      {{{"a", 0, 80, 40}, {"b", 80, 80, 40}}, 160, 5, "███▓▓", "no hole"},
      {{{"a", 0, 16, 8}, {"b", 32, 16, 8}, {"c", 48, 96, 41}},
       160,
       10,
       "█░▓██████░",
       "2 holes, the largest of 16 bytes (8 samples), fragmentation 50.0 %"},
      {{{"a", 0, 16, 8}, {"b", 128, 32, 16}}, 160, 3, "▒░▓", "one hole of 112 bytes (56 samples)"},
      {{{"a", 0, 16, 8}}, 20, 100, "████████████████░░░░", "no hole"},
      {{{"a", 0, 4294967280, 9}}, 4294967295, 3, "███", "no hole"},
  };
  for (const auto& [waveforms, bytes, columns, bar, holes] : cases) {
    const MemoryMap map(waveforms, bytes, kWordBytes, kSampleBytes);
    EXPECT_EQ(memoryBar(map, columns), bar);
    EXPECT_EQ(describeHoles(map), holes);
  }
}

}  // namespace
}  // namespace tools
