#include "ktisl/FifoFpgaHw.h"

#include <algorithm>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "SimulatedFifo.h"

namespace {

using Fifo = ktisl::FifoFpgaHw<unsigned char>;
using Status = Fifo::Status;

class FifoFpgaHw : public testing::Test {
 protected:
  FifoFpgaHw() { fpga.recordCalls(); }
  ~FifoFpgaHw() override { EXPECT_EQ(status.code, 0); }

  SimulatedFifo fpga;
  Fifo fifo{fpga.session, fpga.fifo};
  Status status = kterr::makeLocatedStatus();
  unsigned char bytes[4] = {1, 2, 3, 4};
  unsigned char* elements = nullptr;
  std::uint64_t count = 0;
  std::uint64_t remaining = 0;
};

// First in this program to call StopFifo, so that the threads bind it together.
TEST_F(FifoFpgaHw, BindsItsFunctionsForThreadsThatCallFirstTogether) {
  std::vector<std::jthread> threads;
  for (int i = 0; i < 4; ++i) {
    threads.emplace_back([this] {
      Status own = kterr::makeLocatedStatus();
      fifo.stop(own);
      EXPECT_EQ(own.code, 0);
    });
  }
}

TEST_F(FifoFpgaHw, MovesBytesThroughTheFifo) {
  fifo.configure(5000, count, status);
  EXPECT_EQ(count, 8192u);
  fifo.start(status);
  fifo.write(bytes, 4, 20, remaining, status);
  EXPECT_EQ(remaining, 8188u);
  fifo.read(bytes, 1, 20, remaining, status);
  EXPECT_EQ(remaining, 3u);

  fifo.acquireWriteElements(elements, 6, 20, count, remaining, status);
  EXPECT_EQ(count, 6u);
  EXPECT_EQ(remaining, 8183u);
  std::fill_n(elements, 6, static_cast<unsigned char>(9));
  fifo.releaseElements(6, status);
  fifo.acquireReadElements(elements, 5, 20, count, remaining, status);
  EXPECT_EQ(count, 5u);
  EXPECT_EQ(elements[0] * 10 + elements[4], 29);
  fifo.releaseElements(5, status);
  EXPECT_EQ(fifo.getPeerToPeerEndpoint(status), fpga.fifo + 1000);

  fifo.stop(status);
  Status stopped = status;
  fifo.write(bytes, 4, 20, remaining, stopped);
  EXPECT_EQ(stopped.code, KTSIM_E_FIFO_STOPPED);
  fifo.restart(status);
  fifo.write(bytes, 4, 20, remaining, status);
}

TEST_F(FifoFpgaHw, MergesTheLibrarysStatusAndThenDoesNothing) {
  const std::pair<const char*, std::function<void(Status&)>> kOperations[] = {
      {"ReadFifoU8", [&](Status& s) { fifo.read(bytes, 1, 20, remaining, s); }},
      {"WriteFifoU8", [&](Status& s) { fifo.write(bytes, 1, 20, remaining, s); }},
      {"ConfigureFifo2", [&](Status& s) { fifo.configure(40960, count, s); }},
      {"StopFifo", [&](Status& s) { fifo.restart(s); }},
      {"StartFifo", [&](Status& s) { fifo.start(s); }},
      {"StopFifo", [&](Status& s) { fifo.stop(s); }},
      {"AcquireFifoReadElementsU8", [&](Status& s) { fifo.acquireReadElements(elements, 1, 20, count, remaining, s); }},
      {"AcquireFifoWriteElementsU8",
       [&](Status& s) { fifo.acquireWriteElements(elements, 1, 20, count, remaining, s); }},
      {"ReleaseFifoElements", [&](Status& s) { fifo.releaseElements(1, s); }},
      {"GetPeerToPeerFifoEndpoint", [&](Status& s) { EXPECT_EQ(fifo.getPeerToPeerEndpoint(s), 0u); }},
  };
  for (const auto& [function, run] : kOperations) {
    SCOPED_TRACE(function);
    Status failing = kterr::makeLocatedStatus();
    failing.code = 5;
    fpga.failCall((std::string("KtFpgaDll_") + function).c_str(), -7);
    run(failing);
    EXPECT_EQ(failing.code, -7);
    EXPECT_STREQ(failing.file, R"(ktisl\FifoFpgaHw)");
    fpga.takeCalls();
    run(failing);
    EXPECT_EQ(fpga.takeCalls(), "");
  }
}

}  // namespace
