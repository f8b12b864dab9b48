// A generator's command layer and download FIFO in one double: it performs announced memory writes with their byte
// masks into `memory`, and logs what was asked of it as one readable line.
#pragma once

#include <algorithm>
#include <cstring>
#include <deque>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "ktisl/Fifo.h"
#include "ktorba/commandControl/CommandControlInterface.h"

namespace ktorba {

class FakeGenerator : public CommandControlInterface, public ktisl::Fifo<unsigned char> {
 public:
  using Status = kterr::tLocatedStatus;

  std::string log;
  HWTraits traits;
  std::vector<std::uint8_t> memory = std::vector<std::uint8_t>(4096, 0xEE);
  std::map<std::string, std::int32_t> failures;  // an operation's first word in the log, and the code it reports
  std::deque<std::uint64_t> freeSpace;           // what the FIFO reports next; 1 MiB when it runs out
  bool neverCompletes = false;
  bool done = false, underflow = false;
  std::uint64_t streamingSpace = 0;

  FakeGenerator() {
    traits.memoryWordBits = 64;
    traits.memorySizeBytes = static_cast<std::uint32_t>(memory.size());
    traits.sequenceMemoryWords = 128;
    traits.maxPrimingWords = 512;
    traits.sampleWidthBits = 16;
    traits.downloadElementBits = 32;
    traits.samplesPerMemoryWord = 4;
    traits.minFetchSamples = traits.minFetchSamplesByte = 8;
    traits.alignmentQuantum = 1;
  }

  void endMemoryWrite() { announced_.transferElements = 0, received_ = 0; }  // as a reset does
  std::string takeLog() { return std::exchange(log, ""); }

  void getHWTraits(HWTraits& out, Status& status, bool refresh) override {
    if (refresh) note("traits", status);
    out = traits;
  }
  void setSettings(const HWSettings&, Status& status) override { note("keep", status); }
  void writeSettings(Status& status, bool force) override { note(force ? "settings!" : "settings", status); }
  void commandInitiate(Status& status) override { note("initiate", status); }
  void commandReset(Status& status) override { note("reset", status); }
  void commandAbort(Status& status) override { note("abort", status); }
  void readGenerationDone(bool& out, Status& status) override { note("done?", status), out = done; }
  void readDataUnderflow(bool& out, Status& status) override { note("underflow?", status), out = underflow; }
  void announceMemoryWrite(const MemoryWriteRequest& request, Status& status) override {
    note("announce", status,
         std::to_string(request.memoryAddress) + "+" + std::to_string(request.transferElements) +
             (request.maskedWrite != 0 ? " masked" : ""));
    announced_ = request;
    received_ = 0;
  }
  void readMemoryWriteComplete(bool& out, Status& status) override {
    note("complete?", status);
    out = !neverCompletes && received_ == announcedBytes();
  }
  void resetStreamingWritePointer(Status& status) override { note("rewind", status); }
  std::uint64_t readStreamingSpace(Status& status) override { return note("space?", status), streamingSpace; }

  void write(const unsigned char* data, std::uint64_t count, std::uint32_t timeoutMs, std::uint64_t& empty,
             Status& status) override {
    note("write", status, std::to_string(count) + (timeoutMs == 0x7FFFFFFF ? " unlimited" : ""));
    for (std::uint64_t i = 0; i < count; ++i) receive(data[i]);
    empty = nextFreeSpace();
  }
  void configure(std::uint64_t depth, std::uint64_t& actual, Status& status) override {
    note("configure", status, std::to_string(depth));
    actual = (depth + 4095) / 4096 * 4096;
  }
  void restart(Status& status) override { note("restart", status); }
  void start(Status& status) override { note("start", status); }
  void acquireWriteElements(unsigned char*& elements, std::uint64_t count, std::uint32_t, std::uint64_t& acquired,
                            std::uint64_t& empty, Status& status) override {
    note("acquire", status, std::to_string(count));
    acquired = std::min<std::uint64_t>(count, lent_.size());
    elements = lent_.data();
    empty = nextFreeSpace();
  }
  void releaseElements(std::uint64_t count, Status& status) override {
    note("release", status, std::to_string(count));
    for (std::uint64_t i = 0; i < count; ++i) receive(lent_[i]);
  }

  void read(unsigned char*, std::uint64_t, std::uint32_t, std::uint64_t&, Status&) override {}
  void stop(Status&) override {}
  void acquireReadElements(unsigned char*&, std::uint64_t, std::uint32_t, std::uint64_t&, std::uint64_t&,
                           Status&) override {}
  std::uint32_t getPeerToPeerEndpoint(Status&) override { return 0; }

 private:
  void note(const std::string& operation, Status& status, const std::string& details = "") {
    log += operation + (details.empty() ? "; " : " " + details + "; ");
    const auto failure = failures.find(operation);
    if (failure != failures.end()) kterr::mergeCode(status, failure->second, "fake", "fake.c", 1);
  }
  std::uint64_t nextFreeSpace() {
    if (freeSpace.empty()) return 1 << 20;
    const std::uint64_t next = freeSpace.front();
    freeSpace.pop_front();
    return next;
  }
  std::uint64_t announcedBytes() const { return announced_.transferElements * (traits.downloadElementBits / 8ull); }
  void receive(std::uint8_t byte) {
    const std::uint64_t wordBytes = traits.memoryWordBits / 8u;
    const std::uint64_t at = received_++;
    const bool first = at < wordBytes, last = at + wordBytes >= announcedBytes();
    const std::uint64_t mask =
        (first ? announced_.firstWordByteMask : ~0ull) & (last ? announced_.lastWordByteMask : ~0ull);
    if ((mask >> at % wordBytes & 1) != 0) memory.at(announced_.memoryAddress + at) = byte;
  }

  MemoryWriteRequest announced_;
  std::uint64_t received_ = 0;
  std::vector<std::uint8_t> lent_ = std::vector<std::uint8_t>(16);
};

}  // namespace ktorba
