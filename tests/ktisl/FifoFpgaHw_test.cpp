#include "ktisl/FifoFpgaHw.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

#include "platform/KtFpgaDouble.h"

namespace {

using Fifo = ktisl::FifoFpgaHw<unsigned char>;
using kterr::tLocatedStatus;
using testing::ElementsAre;

// What the operations gave: the first byte, then the counts in their order, then the endpoint.
struct Results {
  unsigned char byte = 9;
  unsigned char* elements = &byte;
  std::uint64_t first = 0;
  std::uint64_t second = 0;
  bool operator==(const Results& other) const {
    return *elements == *other.elements && first == other.first && second == other.second;
  }
};

struct Operation {
  const char* call;
  Results results;  // as the double gives them
  std::function<void(Fifo&, Results&, tLocatedStatus&)> run;
};

const Operation kOperations[] = {
    {"ReadFifoU8 7 3 1 20",
     {.byte = 5, .first = 1},
     [](auto& f, auto& r, auto& s) { f.read(&r.byte, 1, 20, r.first, s); }},
    {"WriteFifoU8 7 3 9 1 20", {.first = 1}, [](auto& f, auto& r, auto& s) { f.write(&r.byte, 1, 20, r.first, s); }},
    {"ConfigureFifo2 7 3 40960", {.first = 1}, [](auto& f, auto& r, auto& s) { f.configure(40960, r.first, s); }},
    {"StartFifo 7 3", {}, [](auto& f, auto&, auto& s) { f.start(s); }},
    {"StopFifo 7 3", {}, [](auto& f, auto&, auto& s) { f.stop(s); }},
    {"AcquireFifoReadElementsU8 7 3 8 20",
     {.byte = 5, .first = 1, .second = 2},
     [](auto& f, auto& r, auto& s) { f.acquireReadElements(r.elements, 8, 20, r.first, r.second, s); }},
    {"AcquireFifoWriteElementsU8 7 3 8 20",
     {.byte = 5, .first = 1, .second = 2},
     [](auto& f, auto& r, auto& s) { f.acquireWriteElements(r.elements, 8, 20, r.first, r.second, s); }},
    {"ReleaseFifoElements 7 3 8", {}, [](auto& f, auto&, auto& s) { f.releaseElements(8, s); }},
    {"GetPeerToPeerFifoEndpoint 7 3",
     {.first = 1},
     [](auto& f, auto& r, auto& s) { r.first = f.getPeerToPeerEndpoint(s); }},
};

TEST(FifoFpgaHw, CallsTheLibraryAndMergesItsStatus) {
  auto& fpga = ktFpgaDouble();
  Fifo fifo(7, 3);
  for (const Operation& operation : kOperations) {
    SCOPED_TRACE(operation.call);
    tLocatedStatus status = kterr::makeLocatedStatus();
    Results results;
    fpga.results = {5};
    operation.run(fifo, results, status);
    EXPECT_THAT(fpga.record.take(), ElementsAre(operation.call));
    EXPECT_EQ(results, operation.results);
    EXPECT_EQ(status.code, 5);

    fpga.results = {-7};
    operation.run(fifo, results, status);
    EXPECT_EQ(status.code, -7);
    EXPECT_STREQ(status.component, "ktorbau");
    EXPECT_STREQ(status.file, R"(ktisl\FifoFpgaHw)");

    fpga.record.take();
    Results untouched;
    operation.run(fifo, untouched, status);
    EXPECT_EQ(untouched, Results{});
    EXPECT_THAT(fpga.record.take(), ElementsAre());
  }
}

TEST(FifoFpgaHw, RestartsOnlyWhatStopped) {
  auto& fpga = ktFpgaDouble();
  Fifo fifo(7, 3);
  for (const std::int32_t stopResult : {0, 5, -7}) {
    tLocatedStatus status = kterr::makeLocatedStatus();
    fpga.results = {stopResult};
    fifo.restart(status);
    EXPECT_EQ(status.code, stopResult);
    EXPECT_EQ(fpga.record.take().size(), stopResult < 0 ? 1u : 2u);
  }
}

}  // namespace
