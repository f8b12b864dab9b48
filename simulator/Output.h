// Where played samples go. The sequencer opens a window, fills it and commits what it filled. Guarded by its FPGA's
// lock.
#pragma once

#include <cstdint>

#include "ktorba/simulator.h"
#include "platform/system/prefetch.h"
#include "simulator/LazyQueue.h"

namespace simulator {

// Memory for `room` samples and marker bytes; null where they are not wanted.
struct OutputWindow {
  std::byte* samples;
  std::uint8_t* markers;
  std::uint64_t room;  // never 0 as a window is opened

  bool isWanted() const { return samples != nullptr || markers != nullptr; }
  // What is left behind the first `count` samples.
  OutputWindow behind(std::uint64_t count, std::uint32_t bytesPerSample) const {
    return {samples == nullptr ? nullptr : samples + count * bytesPerSample,
            markers == nullptr ? nullptr : markers + count, room - count};
  }
  // Tells the processor that `count` samples behind the first `skipped` are filled soon, if there is room for them.
  void prefetch(std::uint64_t skipped, std::uint64_t count, std::uint32_t bytesPerSample) const {
    if (room < skipped + count) return;
    if (samples != nullptr) platform::prefetchForWriting(samples + skipped * bytesPerSample, count * bytesPerSample);
    if (markers != nullptr) platform::prefetchForWriting(markers + skipped, count);
  }
};

class Output {
 public:
  virtual ~Output() = default;
  // `wanted` is a guess of how much will come, never 0.
  virtual OutputWindow open(std::uint64_t firstSample, std::uint64_t wanted) = 0;
  virtual void commit(std::uint64_t samples) = 0;
};

class NoOutput final : public Output {
 public:
  OutputWindow open(std::uint64_t, std::uint64_t wanted) override { return {nullptr, nullptr, wanted}; }
  void commit(std::uint64_t) override {}
};

// Straight into the caller's memory, which has room for all that will be wanted.
class DirectOutput final : public Output {
 public:
  DirectOutput(void* samples, std::uint8_t* markers, std::uint32_t bytesPerSample)
      : samples_(static_cast<std::byte*>(samples)), markers_(markers), bytesPerSample_(bytesPerSample) {}
  OutputWindow open(std::uint64_t, std::uint64_t wanted) override { return {samples_, markers_, wanted}; }
  void commit(std::uint64_t samples) override {
    if (samples_ != nullptr) samples_ += samples * bytesPerSample_;
    if (markers_ != nullptr) markers_ += samples;
  }

 private:
  std::byte* samples_;
  std::uint8_t* markers_;
  std::uint32_t bytesPerSample_;
};

class RecordedOutput final : public Output {
 public:
  RecordedOutput(std::uint64_t capacity, std::uint32_t bytesPerSample, std::uint64_t& lost);
  OutputWindow open(std::uint64_t firstSample, std::uint64_t wanted) override;
  void commit(std::uint64_t samples) override;
  std::uint64_t size() const { return markers_.size(); }
  // Takes min(capacity, size()) samples and returns their number.
  std::uint64_t read(std::uint64_t capacity, void* samples, std::uint8_t* markers);
  void clear();

 private:
  LazyQueue<std::byte> samples_;
  LazyQueue<std::uint8_t> markers_;
  std::uint32_t bytesPerSample_;
  std::uint64_t& lost_;
};

class CallbackOutput final : public Output {
 public:
  CallbackOutput(ktSim_OutputCallback callback, void* user, std::uint32_t bytesPerSample);
  OutputWindow open(std::uint64_t firstSample, std::uint64_t wanted) override;
  void commit(std::uint64_t samples) override;

 private:
  ktSim_OutputCallback callback_;
  void* user_;
  platform::LazyMemory samples_;
  platform::LazyMemory markers_;
  std::uint64_t firstSample_ = 0;
};

}  // namespace simulator
