#include "ktorba/waveform/MemoryBlockManager.h"

#include <gmock/gmock.h>

#include <vector>

#include "testing/WalkingMemoryBlockManager.h"
#include "testing/caught.h"
#include "testing/seeds.h"

namespace ktorba {
namespace {

// Few different sizes, so that equally large blocks are the rule; phases that fill and empty the memory in turn.
TEST(MemoryBlockManager, AnswersAsTheWalkOverAllFreeBlocks) {
  forEachSeed(8, [](Random& random) {
    const std::uint32_t granularity = 1u << random() % 5;
    const auto total = static_cast<std::uint32_t>(6000 * granularity + random() % granularity);
    MemoryBlockManager manager(total, granularity);
    WalkingMemoryBlockManager model(total, granularity);
    std::vector<std::uint32_t> live;
    for (int step = 0; step < 12000; ++step) {
      const bool filling = random() % 10 < (step / 3000 % 2 == 0 ? 7u : 3u);
      const auto size = static_cast<std::uint32_t>((1 + random() % 8) * granularity);
      if (random() % 8000 == 0) {
        model.freeAllBlocks();
        manager.freeAllBlocks();
        live.clear();
      } else if (filling && size <= model.largest.size) {
        live.push_back(model.allocateBlock(size));
        ASSERT_EQ(manager.allocateBlock(size), live.back()) << "step " << step;
      } else if (!live.empty()) {
        std::swap(live[random() % live.size()], live.back());
        model.freeBlock(live.back());
        manager.freeBlock(live.back());
        live.pop_back();
      }
      ASSERT_EQ(manager.getLargestFreeBlock(), model.largest) << "step " << step;
    }
  });
}

TEST(MemoryBlockManager, OffersWholeMemoryWordsOnly) {
  EXPECT_EQ(MemoryBlockManager(1000, 16).getLargestAvailableBlockSize(), 992u);
  MemoryBlockManager top(0xFFFFFFFF, 1);
  EXPECT_EQ(top.allocateBlock(0xFFFFFFFF), 0u);
  EXPECT_EQ(top.getLargestFreeBlock(), MemoryBlock{});
  top.freeBlock(0);
  EXPECT_EQ(top.getLargestAvailableBlockSize(), 0xFFFFFFFFu);
}

TEST(MemoryBlockManager, RefusesBrokenPreconditionsAndChangesNothing) {
  MemoryBlockManager manager(64, 8);
  manager.allocateBlock(32);
  const auto expectFault = [](const std::string& failure, const char* text) {
    EXPECT_THAT(failure, testing::AllOf(testing::StartsWith("-52003"), testing::HasSubstr(text)));
  };
  for (const std::uint32_t size : {0u, 33u}) {
    expectFault(failureOf([&] { manager.allocateBlock(size); }), "no free block of this size");
  }
  expectFault(failureOf([&] { manager.freeBlock(8); }), "no block starts there");
  EXPECT_EQ(manager.getLargestFreeBlock(), (MemoryBlock{32, 32}));
  manager.freeBlock(0);
  expectFault(failureOf([&] { manager.freeBlock(0); }), "no block starts there");
  EXPECT_EQ(manager.getLargestFreeBlock(), (MemoryBlock{0, 64}));
  expectFault(failureOf([] { MemoryBlockManager(64, 0); }), "granularity is 0");
}

}  // namespace
}  // namespace ktorba
