#include "ktisl/FifoFpgaHw.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

#include "platform/KtFpgaDouble.h"

namespace {

using Fifo = ktisl::FifoFpgaHw<unsigned char>;
using Status = Fifo::Status;
using testing::ElementsAre;

// First in this program to call StartFifo, so that the threads bind it together.
TEST(FifoFpgaHw, BindsFunctionsOfThreadsThatCallFirstTogether) {
  const auto start = [](std::uint32_t number) {
    Status status = kterr::makeLocatedStatus();
    Fifo(1, number).start(status);
  };
  std::vector<std::jthread> threads;
  for (std::uint32_t number = 0; number < 4; ++number) threads.emplace_back(start, number);
  threads.clear();
  EXPECT_THAT(ktFpgaDouble().record.take(), testing::SizeIs(4));
}

struct Results {
  unsigned char byte = 9;
  unsigned char* elements = nullptr;
  std::uint64_t counts[2] = {};  // each 0, or its place among the results
};

struct Operation {
  const char* call;
  std::uint64_t counts[2];
  void (*run)(Fifo&, Results&, Status&);
};

constexpr Operation kOperations[] = {
    {"ReadFifoU8 7 3 1 20", {2}, [](Fifo& f, Results& r, Status& s) { f.read(&r.byte, 1, 20, r.counts[0], s); }},
    {"WriteFifoU8 7 3 9 1 20", {1}, [](Fifo& f, Results& r, Status& s) { f.write(&r.byte, 1, 20, r.counts[0], s); }},
    {"ConfigureFifo2 7 3 40960", {1}, [](Fifo& f, Results& r, Status& s) { f.configure(40960, r.counts[0], s); }},
    {"StartFifo 7 3", {}, [](Fifo& f, Results&, Status& s) { f.start(s); }},
    {"StopFifo 7 3", {}, [](Fifo& f, Results&, Status& s) { f.stop(s); }},
    {"AcquireFifoReadElementsU8 7 3 8 20",
     {1, 2},
     [](Fifo& f, Results& r, Status& s) { f.acquireReadElements(r.elements, 8, 20, r.counts[0], r.counts[1], s); }},
    {"AcquireFifoWriteElementsU8 7 3 8 20",
     {1, 2},
     [](Fifo& f, Results& r, Status& s) { f.acquireWriteElements(r.elements, 8, 20, r.counts[0], r.counts[1], s); }},
    {"ReleaseFifoElements 7 3 8", {}, [](Fifo& f, Results&, Status& s) { f.releaseElements(8, s); }},
    {"GetPeerToPeerFifoEndpoint 7 3",
     {1},
     [](Fifo& f, Results& r, Status& s) { r.counts[0] = f.getPeerToPeerEndpoint(s); }},
};

TEST(FifoFpgaHw, CallsTheLibraryAndMergesItsStatus) {
  auto& fpga = ktFpgaDouble();
  Fifo fifo(7, 3);
  for (const Operation& operation : kOperations) {
    SCOPED_TRACE(operation.call);
    Status status = kterr::makeLocatedStatus();
    Results results;
    fpga.results = {5};
    operation.run(fifo, results, status);
    EXPECT_THAT(fpga.record.take(), ElementsAre(operation.call));
    EXPECT_THAT(results.counts, testing::ElementsAreArray(operation.counts));
    EXPECT_EQ(status.code, 5);

    fpga.results = {-7};
    operation.run(fifo, results = {}, status);
    EXPECT_EQ(status.code, -7);
    EXPECT_STREQ(status.file, R"(ktisl\FifoFpgaHw)");

    fpga.record.take();
    operation.run(fifo, results = {}, status);
    EXPECT_THAT(results.counts, testing::Each(0u));
    EXPECT_THAT(fpga.record.take(), ElementsAre());
  }
}

TEST(FifoFpgaHw, RestartsOnlyWhatStopped) {
  for (const std::int32_t stopResult : {0, 5, -7}) {
    Status status = kterr::makeLocatedStatus();
    ktFpgaDouble().results = {stopResult};
    Fifo(7, 3).restart(status);
    EXPECT_EQ(status.code, stopResult);
    EXPECT_EQ(ktFpgaDouble().record.take().size(), stopResult < 0 ? 1u : 2u);
  }
}

}  // namespace
