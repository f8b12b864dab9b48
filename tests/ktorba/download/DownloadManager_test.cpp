#include "ktorba/download/DownloadManager.h"

#include <gtest/gtest.h>

#include <numeric>

#include "kterr/Exception.h"
#include "ktorba/FakeGenerator.h"

namespace ktorba {
namespace {

constexpr std::int32_t kTimeoutCode = -1074101611;

template <typename Call>
std::int32_t codeOf(Call&& call) {
  try {
    call();
  } catch (const kterr::Exception& e) {
    return e.code();
  }
  return 0;
}

// A view that wants its bytes copied; fails at the copy when told to.
class CopiedView : public DataWrapperNoCopy<std::uint8_t> {
 public:
  using DataWrapperNoCopy::DataWrapperNoCopy;
  bool mustCopy() const override { return true; }
  void copyTo(std::uint8_t* destination, std::uint64_t offset, std::uint64_t count) const override {
    if (fails) throw std::bad_alloc();
    std::memcpy(destination, getPointer(offset), count);
  }
  bool fails = false;
};

class DownloadManagerTest : public testing::Test {
 protected:
  DownloadManagerTest() : manager(generator, generator) {
    manager.receiveHWTraits(generator.traits);
    std::iota(bytes.begin(), bytes.end(), std::uint8_t{0});
    opening = generator.takeLog();
  }

  // A request for `count` bytes to `offset`, as the facade makes it.
  MemoryWriteRequest request(std::uint64_t count, std::uint64_t offset) {
    MemoryWriteRequest made;
    made.maxChunkBytes = 32;
    made.byteCount = count;
    std::uint64_t total = 0;
    manager.prepareSampleWrite(count, 0, offset, total, made);
    return made;
  }

  std::int32_t write(const MemoryWriteRequest& made, std::int32_t timeoutMs) {
    return codeOf([&] { manager.writeData(made, DataWrapperNoCopy(bytes.data(), bytes.size()), timeoutMs); });
  }

  FakeGenerator generator;
  DownloadManager manager;
  std::string opening;
  std::vector<std::uint8_t> bytes = std::vector<std::uint8_t>(200);
};

TEST_F(DownloadManagerTest, FifoIsConfiguredWhenItsDepthIsNotTheOneAskedFor) {
  EXPECT_EQ(opening, "configure 40960; start; ");
  manager.configureFifoDepth(40960);
  EXPECT_EQ(generator.takeLog(), "");
  manager.configureFifoDepth(5000);
  manager.configureFifoDepth(8192);  // what 5000 became
  manager.configureFifoDepth(5000);
  manager.reset();
  EXPECT_EQ(generator.takeLog(), "configure 5000; start; configure 5000; start; restart; ");
  generator.failures["start"] = -7;
  EXPECT_EQ(codeOf([&] { manager.configureFifoDepth(9000); }), -7);
  generator.failures.clear();
  manager.configureFifoDepth(9000);
  EXPECT_EQ(generator.takeLog(), "configure 9000; start; configure 9000; start; ");
}

TEST_F(DownloadManagerTest, MasksAndPadsWriteTheBytesAskedForAndNoOthers) {
  for (const unsigned wordBytes : {1u, 2u, 4u, 8u, 16u, 64u}) {
    generator.traits.memoryWordBits = static_cast<std::uint16_t>(wordBytes * 8);
    generator.traits.downloadElementBits = 8;
    manager.receiveHWTraits(generator.traits);
    for (std::uint64_t offset = 0; offset <= wordBytes; ++offset) {
      for (std::uint64_t count = 1; count <= 2 * wordBytes + 1; ++count) {
        std::vector<std::uint8_t> expected = generator.memory;
        std::copy_n(bytes.begin(), count, expected.begin() + static_cast<std::ptrdiff_t>(offset));
        ASSERT_EQ(write(request(count, offset), 1000), 0);
        ASSERT_EQ(generator.memory, expected) << wordBytes << "-byte words, " << count << " bytes at " << offset;
        std::rotate(bytes.begin(), bytes.begin() + 1, bytes.end());
      }
    }
  }
}

TEST_F(DownloadManagerTest, RequestNamesAddressSizeAndMasks) {
  generator.traits.memoryWordBits = 128;
  manager.receiveHWTraits(generator.traits);
  MemoryWriteRequest made;
  std::uint64_t total = 0;
  manager.prepareSampleWrite(20, 1000, 36, total, made);
  EXPECT_EQ(made.memoryAddress, 1032u);
  EXPECT_EQ(total, 32u);
  EXPECT_EQ(made.transferElements, 8u);
  EXPECT_EQ(made.firstWordByteMask, ~std::uint64_t{0xF});
  EXPECT_EQ(made.lastWordByteMask, 0xFFu);
  total = 0;
  manager.prepareSampleWrite(16, 0, 32, total, made);
  EXPECT_EQ(made.firstWordByteMask & made.lastWordByteMask, ~std::uint64_t{0});
}

TEST_F(DownloadManagerTest, DataGoesInWholeSamplesThatFitTheFreeSpace) {
  generator.freeSpace = {7, 0, 1, 100};
  EXPECT_EQ(write(request(50, 3), 1000), 0);
  EXPECT_EQ(generator.takeLog(),
            "announce 0+14 masked; write 3; write 6; write 0; write 0; write 32; write 12; "
            "write 3; complete?; ");
  EXPECT_EQ(write(request(16, 8), kNoTimeLimit), 0);
  EXPECT_EQ(generator.takeLog(), "announce 8+4 masked; write 0 unlimited; write 16 unlimited; complete?; ");
  EXPECT_EQ(write(request(0, 8), 0), 0);
  EXPECT_EQ(generator.takeLog(), "announce 8+0 masked; write 0; complete?; ");
}

TEST_F(DownloadManagerTest, TransferThatDidNotCompleteIsWaitedForByTheNext) {
  generator.neverCompletes = true;
  EXPECT_EQ(write(request(8, 0), 20), kTimeoutCode);
  generator.takeLog();
  EXPECT_EQ(write(request(8, 8), 0), kTimeoutCode);
  EXPECT_EQ(generator.takeLog(), "complete?; complete?; ") << "nothing is announced over an unfinished transfer";
  generator.neverCompletes = false;
  EXPECT_EQ(write(request(8, 8), 0), kTimeoutCode);
  EXPECT_EQ(generator.takeLog(), "complete?; announce 8+2 masked; write 0; ");
  EXPECT_EQ(write(request(8, 8), kNoTimeLimit), kTimeoutCode) << "bytes that nobody sends are not waited for";
  manager.reset();
  generator.endMemoryWrite();
  generator.neverCompletes = true;
  generator.takeLog();
  EXPECT_EQ(write(request(8, 8), 20), kTimeoutCode);
  generator.failures["complete?"] = -7;
  EXPECT_EQ(write(request(8, 8), kNoTimeLimit), -7) << "a wait without limit ends with the bus";
}

TEST_F(DownloadManagerTest, FailuresPassOutAndNoChunksMeansNoWaiting) {
  generator.failures["announce"] = -5;
  EXPECT_EQ(write(request(8, 0), 1000), -5);
  generator.failures = {{"write", -6}};
  EXPECT_EQ(write(request(8, 0), 1000), -6) << "a failed announcement is not waited for";
  generator.failures.clear();
  DownloadManager fresh(generator, generator);
  fresh.receiveHWTraits(generator.traits);
  MemoryWriteRequest noChunks = request(8, 0);
  noChunks.maxChunkBytes = 0;
  EXPECT_EQ(codeOf([&] { fresh.writeData(noChunks, DataWrapperNoCopy(bytes.data(), 8), kNoTimeLimit); }), kTimeoutCode);
}

TEST_F(DownloadManagerTest, CopiedDataIsPutIntoFifoMemoryAndAlwaysReleased) {
  CopiedView view(bytes.data(), bytes.size());
  manager.writeData(request(24, 0), view, 1000);
  EXPECT_EQ(generator.takeLog(),
            "announce 0+6 masked; write 0; acquire 24; release 16; acquire 8; release 8; complete?; ");
  EXPECT_TRUE(std::equal(bytes.begin(), bytes.begin() + 24, generator.memory.begin()));
  view.fails = true;
  EXPECT_THROW(manager.writeData(request(8, 0), view, 1000), std::bad_alloc);
  EXPECT_EQ(generator.takeLog(), "announce 0+2 masked; write 0; acquire 8; release 8; ");
}

}  // namespace
}  // namespace ktorba
