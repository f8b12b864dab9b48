#include "ktorba/download/DownloadManager.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstring>
#include <new>
#include <numeric>
#include <thread>

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

// A FIFO that grants another number of bytes than it is asked for, and takes long to write `slowCount`.
class WilfulFifo : public ktisl::FifoFpgaHw<unsigned char> {
 public:
  using FifoFpgaHw::FifoFpgaHw;
  void acquireWriteElements(unsigned char*& elements, std::uint64_t count, std::uint32_t timeoutMs,
                            std::uint64_t& acquired, std::uint64_t& remaining, Status& given) override {
    FifoFpgaHw::acquireWriteElements(elements, std::min(count, most), timeoutMs, acquired, remaining, given);
    acquired += excess;
  }
  void write(const unsigned char* data, std::uint64_t count, std::uint32_t timeoutMs, std::uint64_t& remaining,
             Status& given) override {
    FifoFpgaHw::write(data, count, timeoutMs, remaining, given);
    if (count == slowCount) std::this_thread::sleep_for(std::chrono::milliseconds(300));
  }
  std::uint64_t slowCount = ~std::uint64_t{0};
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

TEST(DownloadManager, PadsAreWrittenOnTheSameDeadline) {
  Path path;
  path.fifo.slowCount = 4;
  EXPECT_EQ(path.write(4, 0, 200), kTimeoutCode);
  EXPECT_EQ(path.fifoCounts(), "0 4 ") << "no time left for the four bytes behind the data";
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

}  // namespace
}  // namespace ktorba
