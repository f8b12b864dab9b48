#include "ktorba/download/DownloadManager.h"

#include <gtest/gtest.h>

#include <cstring>
#include <new>
#include <numeric>

#include "kterr/Exception.h"
#include "ktisl/FifoFpgaHw.h"
#include "testing/SimulatedControl.h"

namespace ktorba {
namespace {

constexpr std::int32_t kTimeoutCode = -1074101611;

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

// A FIFO that grants another number of bytes than it is asked for.
class WilfulFifo : public ktisl::FifoFpgaHw<unsigned char> {
 public:
  using FifoFpgaHw::FifoFpgaHw;
  void acquireWriteElements(unsigned char*& elements, std::uint64_t count, std::uint32_t timeoutMs,
                            std::uint64_t& acquired, std::uint64_t& remaining, Status& given) override {
    FifoFpgaHw::acquireWriteElements(elements, std::min(count, most), timeoutMs, acquired, remaining, given);
    acquired += excess;
  }
  std::uint64_t most = ~std::uint64_t{0};
  std::uint64_t excess = 0;
};

// A download path to a simulated generator of 32-bit samples.
struct Path : SimulatedControl<> {
  explicit Path(std::uint32_t memoryWordBytes = 8) : SimulatedControl(traits(memoryWordBytes)) {
    HWTraits hwTraits;
    control.getHWTraits(hwTraits, status, false);
    manager.receiveHWTraits(hwTraits);
    manager.configureFifoDepth(4096);
    std::iota(bytes.begin(), bytes.end(), std::uint8_t{1});
    generator.recordCalls();
  }

  static ktSim_Traits traits(std::uint32_t memoryWordBytes) {
    ktSim_Traits made = smallTraits();
    made.sampleWidthBits = 32;
    made.memoryWordBytes = memoryWordBytes;
    made.memorySizeBytes = 8192;
    made.downloadElementBits = 8;
    return made;
  }

  // Writes the first `count` bytes to `offset`; 0 or the failure's code.
  std::int32_t write(std::uint64_t count, std::uint64_t offset, std::int32_t timeoutMs, std::uint64_t chunk = 2000) {
    generator.takeCalls();
    return send(DataWrapperNoCopy(bytes.data(), bytes.size()), count, offset, timeoutMs, chunk);
  }

  std::int32_t send(const DataWrapperInterface& data, std::uint64_t count, std::uint64_t offset, std::int32_t timeoutMs,
                    std::uint64_t chunk = 2000) {
    MemoryWriteRequest request;
    request.maxChunkBytes = chunk;
    request.byteCount = count;
    std::uint64_t total = 0;
    manager.prepareSampleWrite(count, 0, offset, total, request);
    try {
      manager.writeData(request, data, timeoutMs);
    } catch (const kterr::Exception& e) {
      return e.code();
    }
    return 0;
  }

  // The bytes of each FIFO call since the last write began, as "3 2000 0 ".
  std::string fifoCounts() {
    const std::string calls = generator.takeCalls();
    std::string counts;
    for (std::size_t at = 0; (at = calls.find("count=", at)) != std::string::npos; ++at) {
      counts += calls.substr(at + 6, calls.find('\n', at) - at - 6) + " ";
    }
    return counts;
  }

  std::vector<std::uint8_t> memory() { return generator.sampleMemory(0, 192); }

  WilfulFifo fifo{generator.fpga.fpgaSession, 0};
  DownloadManager manager{control, fifo};
  std::vector<std::uint8_t> bytes = std::vector<std::uint8_t>(8000);
};

TEST(DownloadManager, MasksAndPadsWriteTheBytesAskedForAndNoOthers) {
  for (const std::uint32_t wordBytes : {8u, 16u, 64u}) {
    Path path(wordBytes);
    for (std::uint64_t offset = 0; offset <= wordBytes; ++offset) {
      for (std::uint64_t count = 1; count <= 2 * wordBytes; ++count) {
        std::vector<std::uint8_t> expected = path.memory();
        std::copy_n(path.bytes.begin(), count, expected.begin() + static_cast<std::ptrdiff_t>(offset));
        ASSERT_EQ(path.write(count, offset, 10000, 4 * (1 + count % 5)), 0);
        ASSERT_EQ(path.memory(), expected) << wordBytes << "-byte words, " << count << " bytes at " << offset;
        std::rotate(path.bytes.begin(), path.bytes.begin() + 1, path.bytes.end());
      }
    }
  }
}

TEST(DownloadManager, DataGoesInWholeSamplesThatFitTheFreeSpace) {
  Path path;
  EXPECT_EQ(ktSim_SetDrainRate(path.generator.number, 0), 0);
  EXPECT_EQ(path.write(5000, 3, 20), kTimeoutCode);
  EXPECT_EQ(path.fifoCounts().substr(0, 18), "3 2000 2000 92 0 0") << "the last byte of 4096 is no whole sample";
  EXPECT_EQ(path.write(8, 0, 0), kTimeoutCode);
  EXPECT_EQ(path.fifoCounts(), "") << "nothing is sent over an unfinished transfer";
  EXPECT_EQ(path.write(8, 0, kNoTimeLimit), kTimeoutCode) << "bytes that nobody sends are not waited for";
  path.control.commandReset(path.status);
  path.manager.reset();
  EXPECT_EQ(path.write(8, 0, kNoTimeLimit, 0), kTimeoutCode) << "nor is a write in chunks of nothing";
}

TEST(DownloadManager, TransferThatWasAllSentIsWaitedForByTheNext) {
  Path path;
  EXPECT_EQ(ktSim_HoldMemoryWrites(path.generator.number, true), 0);
  EXPECT_EQ(path.write(8, 0, 20), kTimeoutCode);
  EXPECT_EQ(path.write(8, 8, 20), kTimeoutCode);
  EXPECT_EQ(path.fifoCounts(), "");
  path.generator.failCall("ktIFW_Target_Read", -7, 100);
  EXPECT_EQ(path.write(8, 8, kNoTimeLimit), -7) << "a wait without limit ends with the bus";
  EXPECT_EQ(ktSim_HoldMemoryWrites(path.generator.number, false), 0);
  EXPECT_EQ(path.write(8, 8, kNoTimeLimit), 0);
  EXPECT_EQ(path.fifoCounts(), "0 8 ");
}

TEST(DownloadManager, CopiedDataIsPutIntoFifoMemoryAndAlwaysReleased) {
  Path path;
  CopiedView view(path.bytes.data(), path.bytes.size());
  EXPECT_EQ(path.send(view, 16, 0, 1000, 12), 0);
  EXPECT_EQ(path.fifoCounts(), "0 12 12 4 4 ") << "free space; then acquired and released";
  EXPECT_TRUE(std::equal(path.bytes.begin(), path.bytes.begin() + 16, path.memory().begin()));
  path.fifo.most = 4;
  EXPECT_EQ(path.send(view, 8, 8, 1000), 0);
  EXPECT_EQ(path.fifoCounts(), "0 4 4 4 4 ") << "what is granted is taken";
  path.fifo.most = 8;
  path.fifo.excess = 100'000;
  EXPECT_EQ(path.send(view, 8, 16, 1000), 0) << "reads nothing behind the data";
  EXPECT_EQ(path.fifoCounts(), "0 8 8 ");
  EXPECT_TRUE(std::equal(path.bytes.begin(), path.bytes.begin() + 8, path.memory().begin() + 16));
  path.fifo.excess = 0;
  view.fails = true;
  EXPECT_THROW(path.send(view, 8, 0, 1000), std::bad_alloc);
  EXPECT_EQ(path.fifoCounts(), "0 8 8 ");
}

TEST(DownloadManager, FifoIsConfiguredWhenItsDepthIsNotTheOneAskedFor) {
  Path path;
  for (const std::uint64_t depth : {4096, 5000, 8192, 5000}) path.manager.configureFifoDepth(depth);
  EXPECT_EQ(path.generator.takeCalls(),
            "KtFpgaDll_ConfigureFifo2 fifo=0 depth=5000\nKtFpgaDll_StartFifo fifo=0\n"
            "KtFpgaDll_ConfigureFifo2 fifo=0 depth=5000\nKtFpgaDll_StartFifo fifo=0\n")
      << "5000 became 8192";
}

}  // namespace
}  // namespace ktorba
