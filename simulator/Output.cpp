#include "simulator/Output.h"

#include <algorithm>
#include <cstring>

namespace simulator {
namespace {

constexpr std::uint64_t kBlockSamples = 65536;

}  // namespace

RecordedOutput::RecordedOutput(std::uint64_t capacity, std::uint32_t bytesPerSample, std::uint64_t& lost)
    : samples_(std::min(capacity, UINT64_MAX / bytesPerSample) * bytesPerSample),
      markers_(capacity),
      bytesPerSample_(bytesPerSample),
      lost_(lost) {}

OutputWindow RecordedOutput::open(std::uint64_t, std::uint64_t wanted) {
  if (markers_.room() == 0) return {nullptr, nullptr, wanted};
  return {samples_.tail(), markers_.tail(), std::min(wanted, markers_.room())};
}

void RecordedOutput::commit(std::uint64_t samples) {
  if (markers_.room() == 0) {
    lost_ += samples;
    return;
  }
  samples_.produce(samples * bytesPerSample_);
  markers_.produce(samples);
}

std::uint64_t RecordedOutput::read(std::uint64_t capacity, void* samples, std::uint8_t* markers) {
  const std::uint64_t count = std::min(capacity, size());
  if (samples != nullptr && count != 0) std::memcpy(samples, samples_.head(), count * bytesPerSample_);
  if (markers != nullptr && count != 0) std::memcpy(markers, markers_.head(), count);
  samples_.consume(count * bytesPerSample_);
  markers_.consume(count);
  return count;
}

void RecordedOutput::clear() {
  samples_.clear();
  markers_.clear();
}

CallbackOutput::CallbackOutput(ktSim_OutputCallback callback, void* user, std::uint32_t bytesPerSample)
    : callback_(callback), user_(user), samples_(kBlockSamples * bytesPerSample), markers_(kBlockSamples) {}

OutputWindow CallbackOutput::open(std::uint64_t firstSample, std::uint64_t) {
  firstSample_ = firstSample;
  return {samples_.data(), reinterpret_cast<std::uint8_t*>(markers_.data()), kBlockSamples};
}

void CallbackOutput::commit(std::uint64_t samples) {
  if (samples == 0) return;
  callback_(user_, firstSample_, samples_.data(), reinterpret_cast<const std::uint8_t*>(markers_.data()), samples);
}

}  // namespace simulator
