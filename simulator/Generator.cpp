#include "simulator/Generator.h"

#include <algorithm>
#include <utility>

#include "conventions/conventions.h"
#include "platform/system/clock.h"

namespace simulator {
namespace {

using ktorba::Command;
using ktorba::Register;
using ktorba::RegisterAccess;

constexpr std::uint32_t kInstructionBytes = sizeof(SequenceInstructionWords);
// So much playing is made up for in one access, to keep a late one short.
constexpr std::uint64_t kMostCatchUpSamples = std::uint64_t{1} << 26;

MemoryGeometry geometryOf(const ktSim_Traits& traits) {
  const std::uint32_t bytesPerSample = traits.sampleWidthBits / 8;
  return {bytesPerSample, traits.memoryWordBytes / bytesPerSample, traits.memorySizeBytes / traits.memoryWordBytes,
          traits.sequenceWords};
}

bool isStreamingRegister(Register number) {
  return number >= Register::kStreamingStartWord && number <= Register::kStreamingParamC;
}

template <typename Number>
bool isBetween(Number least, Number value, Number most) {
  return least <= value && value <= most;
}

}  // namespace

const ktSim_Traits Generator::kLeastTraits = {16, 8, 0, 0, 1, 0, 0, false, 0, 0, 0, 0, -1, -1};
const ktSim_Traits Generator::kGreatestTraits = {32,   64,     0xFFFFFFFF, 255,    1u << 24, 65535, 512,
                                                 true, 0xFFFF, 0xFFFF,     0xFFFF, 0xFFFF,   255,   255};

bool Generator::areAcceptable(const ktSim_Traits& traits) {
  const auto isWithin = [&](auto... fields) {
    return (isBetween(kLeastTraits.*fields, traits.*fields, kGreatestTraits.*fields) && ...);
  };
  const std::uint32_t width = traits.sampleWidthBits;
  return isWithin(&ktSim_Traits::sampleWidthBits, &ktSim_Traits::memoryWordBytes, &ktSim_Traits::minFetchSamples,
                  &ktSim_Traits::sequenceWords, &ktSim_Traits::maxPrimingWords, &ktSim_Traits::downloadElementBits,
                  &ktSim_Traits::instance, &ktSim_Traits::downloadFifoNumber) &&
         (width == 16 || width == 32) && traits.memoryWordBytes % (width / 8) == 0 &&
         traits.downloadElementBits % 8 == 0;
}

Generator::Generator(const ktSim_Traits& traits)
    : traits_(traits),
      geometry_(geometryOf(traits)),
      downloadElementBytes_(
          (traits.downloadElementBits == 0 ? ktorba::kDefaultDownloadElementBits : traits.downloadElementBits) / 8),
      sampleMemory_(traits.memorySizeBytes),
      sequenceMemory_(std::size_t{traits.sequenceWords} * kInstructionBytes),
      streaming_(geometry_.sampleMemoryWords, geometry_.samplesPerWord),
      fifo_(ktorba::downloadFifoName(static_cast<std::uint32_t>(traits.downloadFifoNumber)), this),
      sequencer_({geometry_, sampleMemory_.data(),
                  reinterpret_cast<const SequenceInstructionWords*>(sequenceMemory_.data()), streaming_, faults_,
                  counters_}),
      output_(std::make_unique<NoOutput>()) {}

// ---- Registers ----

void Generator::beginAccess() {
  catchUp();
  if (samplesPerAccess_ != 0) advance(samplesPerAccess_);
  fifo_.drain();
}

std::int32_t Generator::checkRegister(std::uint64_t number, RegisterAccess access) const {
  const ktorba::RegisterInfo* const info = ktorba::findRegister(number);
  if (info == nullptr || info->access != access) return KTSIM_E_REGISTER;
  if (isStreamingRegister(info->number) && !traits_.hasStreamingRegisters) return KTSIM_E_REGISTER;
  return 0;
}

std::int32_t Generator::readRegister(std::uint64_t number, std::uint64_t& value) {
  if (const std::int32_t code = checkRegister(number, RegisterAccess::Read)) return code;
  ++counters_.registerReads;
  return peekRegister(number, value);
}

std::int32_t Generator::peekRegister(std::uint64_t number, std::uint64_t& value) const {
  const ktorba::RegisterInfo* const info = ktorba::findRegister(number);
  if (info == nullptr) return KTSIM_E_REGISTER;
  value = overrides_[number].value_or(info->access == RegisterAccess::Write ? written_[number] : valueOf(info->number));
  return 0;
}

std::uint64_t Generator::valueOf(Register number) const {
  switch (number) {
    case Register::kMinFetchSamples:
      return traits_.minFetchSamples;
    case Register::kSampleWidthBits:
      return traits_.sampleWidthBits;
    case Register::kMemoryWordBits:
      return std::uint64_t{traits_.memoryWordBytes} * 8;
    case Register::kMemorySizeBytes:
      return traits_.memorySizeBytes;
    case Register::kSequenceMemoryWords:
      return traits_.sequenceWords;
    case Register::kMaxPrimingWords:
      return traits_.maxPrimingWords;
    case Register::kGenerationStatus:
      return statusBits();
    case Register::kDownloadFifoNumber:
      return static_cast<std::uint64_t>(traits_.downloadFifoNumber);
    case Register::kStreamingFreeSpace:
      return streaming_.freeWords();
    case Register::kDownloadElementBits:
      return traits_.downloadElementBits;
    default:
      return 0;
  }
}

std::uint64_t Generator::statusBits() const {
  const bool isWriteComplete = !write_.isInProgress() && !holdsWrites_;
  return (sequencer_.isDone() ? ktorba::kStatusDone : 0) | (sequencer_.hasUnderflow() ? ktorba::kStatusUnderflow : 0) |
         (isWriteComplete ? ktorba::kStatusWriteComplete : 0);
}

std::int32_t Generator::writeRegister(std::uint64_t number, std::uint64_t value) {
  if (const std::int32_t code = checkRegister(number, RegisterAccess::Write)) return code;
  ++counters_.registerWrites;
  written_[number] = value;
  if (number == static_cast<std::uint64_t>(Register::kCommand)) return command(value);
  if (number == static_cast<std::uint64_t>(Register::kStreamingLoadPointer) && value == 1) {
    streaming_.load({written(Register::kStreamingEnabled) == 1, written(Register::kStreamingStartWord),
                     written(Register::kStreamingEndWord), written(Register::kStreamingWritePointer)},
                    sequencer_.isRunning());
  }
  return 0;
}

std::int32_t Generator::command(std::uint64_t code) {
  switch (code) {
    case static_cast<std::uint64_t>(Command::kReset):
      sequencer_.reset();
      write_.cancel();
      return 0;
    case static_cast<std::uint64_t>(Command::kInitiate):
      initiate();
      return 0;
    case static_cast<std::uint64_t>(Command::kAbort):
      sequencer_.abort();
      return 0;
    case static_cast<std::uint64_t>(Command::kStartMemoryWrite):
      announceMemoryWrite();
      return 0;
    default:
      return KTSIM_E_COMMAND;
  }
}

void Generator::initiate() {
  sequencer_.initiate();
  if (recorded_ != nullptr) recorded_->clear();
  restartClock();
}

// ---- Memory writes ----

void Generator::announceMemoryWrite() {
  const std::uint64_t position = sequencer_.position();
  if (write_.isInProgress()) {
    faults_.record(KTSIM_F_WRITE_INTERRUPTED, KTSIM_NO_ADDRESS, position,
                   "memory write announced with %llu bytes of the one before missing",
                   static_cast<unsigned long long>(write_.bytesMissing()));
  }
  const bool isMasked = written(Register::kWriteMasked) == 1;
  isSequenceWrite_ = !isMasked;
  const platform::LazyMemory& memory = isMasked ? sampleMemory_ : sequenceMemory_;
  const std::uint32_t wordBytes = isMasked ? traits_.memoryWordBytes : kInstructionBytes;
  writeAddress_ = written(Register::kWriteAddress);
  const std::uint64_t elements = std::min(written(Register::kWriteElements), UINT64_MAX / downloadElementBytes_);
  const std::uint64_t byteCount = elements * downloadElementBytes_;
  isWriteInside_ =
      writeAddress_ % wordBytes == 0 && writeAddress_ <= memory.size() && byteCount <= memory.size() - writeAddress_;
  if (!isWriteInside_) {
    faults_.record(KTSIM_F_WRITE_RANGE, KTSIM_NO_ADDRESS, position,
                   "write of %llu bytes at %llu, %s memory has %llu bytes in words of %u",
                   static_cast<unsigned long long>(byteCount), static_cast<unsigned long long>(writeAddress_),
                   isMasked ? "sample" : "sequence", static_cast<unsigned long long>(memory.size()), wordBytes);
  }
  std::uint8_t* const bytes = reinterpret_cast<std::uint8_t*>(memory.data());
  write_.begin({isWriteInside_ ? bytes + writeAddress_ : nullptr, byteCount, wordBytes,
                isMasked ? written(Register::kWriteFirstWordMask) : UINT64_MAX,
                isMasked ? written(Register::kWriteLastWordMask) : UINT64_MAX});
  if (byteCount == 0) ++counters_.memoryWrites;
  fifo_.drainAtOnce();
}

void Generator::take(const std::uint8_t* bytes, std::uint64_t count) {
  const MemoryWrite::Arrival arrival = write_.take(bytes, count);
  counters_.bytesReceived += count;
  if (!write_.isInProgress()) ++counters_.memoryWrites;
  if (!isWriteInside_) return;
  const std::uint64_t first = writeAddress_ + arrival.offset;
  const std::uint64_t last = first + count - 1;
  if (isSequenceWrite_) {
    sequencer_.rewritten(first / kInstructionBytes, last / kInstructionBytes);
  } else {
    streaming_.written(first / traits_.memoryWordBytes, last / traits_.memoryWordBytes);
  }
}

// ---- Time ----

void Generator::catchUp() {
  if (wallClockRate_ == 0 || !sequencer_.isRunning()) return;
  const double elapsedSeconds = static_cast<double>(platform::monotonicMilliseconds() - clockStartMs_) / 1000;
  const auto due = clockStartSample_ + static_cast<std::uint64_t>(std::min(elapsedSeconds * wallClockRate_, 9e18));
  if (due > sequencer_.position()) advance(std::min(due - sequencer_.position(), kMostCatchUpSamples));
}

void Generator::restartClock() {
  if (wallClockRate_ != 0) clockStartMs_ = platform::monotonicMilliseconds();
  clockStartSample_ = sequencer_.position();
}

std::uint64_t Generator::advanceInto(std::uint64_t samples, void* into, std::uint8_t* markers) {
  DirectOutput direct(into, markers, geometry_.bytesPerSample);
  return sequencer_.play(samples, direct);
}

void Generator::setAutoAdvance(std::uint64_t samplesPerAccess) {
  samplesPerAccess_ = samplesPerAccess;
  wallClockRate_ = 0;
}

void Generator::setWallClock(double samplesPerSecond) {
  samplesPerAccess_ = 0;
  wallClockRate_ = samplesPerSecond;
  restartClock();
}

void Generator::setOutput(std::unique_ptr<Output> output) {
  recorded_ = nullptr;
  output_ = output != nullptr ? std::move(output) : std::make_unique<NoOutput>();
}

void Generator::recordOutput(std::uint64_t capacity) {
  std::unique_ptr<RecordedOutput> recording;
  if (capacity != 0) {
    recording = std::make_unique<RecordedOutput>(capacity, geometry_.bytesPerSample, counters_.samplesLost);
  }
  RecordedOutput* const recorded = recording.get();
  setOutput(std::move(recording));
  recorded_ = recorded;
}

void Generator::setDrainRate(std::uint64_t bytesPerMs) {
  fifo_.setDrainRate(bytesPerMs);
  fifo_.drainAtOnce();
}

// ---- What is seen from outside ----

ktSim_State Generator::state() const {
  ktSim_State state{};
  sequencer_.describe(state);
  state.writeReady = (statusBits() & ktorba::kStatusWriteComplete) != 0;
  state.streaming = streaming_.isLoaded();
  state.writeBytesMissing = write_.bytesMissing();
  state.fifoDepth = fifo_.depth();
  state.fifoLevel = fifo_.level();
  state.streamingFreeWords = streaming_.freeWords();
  return state;
}

ktSim_Counters Generator::counters() const {
  ktSim_Counters counters = counters_;
  counters.deviceFaults = faults_.count();
  return counters;
}

}  // namespace simulator
