// Control functions that concern one generator.
#include <algorithm>
#include <cstring>

#include "conventions/conventions.h"
#include "ktorba/simulator.h"
#include "simulator/controlFrame.h"

using simulator::Generator;
using simulator::onGenerator;

namespace {

bool isTrigger(std::uint32_t number) { return number >= 1 && number <= ktorba::kHardwareTriggerCount; }

void give(std::uint64_t* result, std::uint64_t value) {
  if (result != nullptr) *result = value;
}

struct ByteRange {
  std::uint64_t address;
  std::uint64_t count;

  bool isWithin(std::uint64_t size) const { return address <= size && count <= size - address; }
};

std::int32_t copyOut(const std::byte* memory, std::uint64_t size, ByteRange range, void* bytes) {
  if (!range.isWithin(size) || (bytes == nullptr && range.count != 0)) return KTSIM_E_ARGUMENT;
  if (range.count != 0) std::memcpy(bytes, memory + range.address, range.count);
  return 0;
}

std::int32_t copyIn(std::byte* memory, std::uint64_t size, ByteRange range, const void* bytes) {
  if (!range.isWithin(size) || (bytes == nullptr && range.count != 0)) return KTSIM_E_ARGUMENT;
  if (range.count != 0) std::memcpy(memory + range.address, bytes, range.count);
  return 0;
}

constexpr std::uint64_t kInstructionBytes = sizeof(simulator::SequenceInstructionWords);
// No sequence memory reaches so far; keeps the byte counts below from wrapping.
constexpr std::uint64_t kBeyondSequence = std::uint64_t{1} << 32;

ByteRange instructionRange(std::uint64_t address, std::uint64_t instructions) {
  return {std::min(address, kBeyondSequence) * kInstructionBytes,
          std::min(instructions, kBeyondSequence) * kInstructionBytes};
}

}  // namespace

void ktSim_DefaultTraits(ktSim_Traits* traits) {
  if (traits == nullptr) return;
  traits->sampleWidthBits = 16;
  traits->memoryWordBytes = 16;
  traits->memorySizeBytes = 64u << 20;
  traits->minFetchSamples = 64;
  traits->sequenceWords = 4096;
  traits->maxPrimingWords = 512;
  traits->downloadElementBits = 0;
  traits->hasStreamingRegisters = true;
  traits->versionMajor = ktorba::kStreamingGeneratorVersion.major;
  traits->versionMinor = ktorba::kStreamingGeneratorVersion.minor;
  traits->contextType = ktorba::kGeneratorContextType;
  traits->reportedType = ktorba::kGeneratorContextType;
  traits->instance = -1;
  traits->downloadFifoNumber = -1;
}

void ktSim_TraitLimits(ktSim_Traits* least, ktSim_Traits* greatest) {
  if (least != nullptr) *least = Generator::kLeastTraits;
  if (greatest != nullptr) *greatest = Generator::kGreatestTraits;
}

// ---- Time and triggers ----

std::int32_t ktSim_Advance(std::uint32_t generator, std::uint64_t samples, std::uint64_t* played) {
  return onGenerator(generator, [&](Generator& on) {
    give(played, on.advance(samples));
    return 0;
  });
}

std::int32_t ktSim_AdvanceInto(std::uint32_t generator, std::uint64_t count, void* samples, std::uint8_t* markers,
                               std::uint64_t* played) {
  return onGenerator(generator, [&](Generator& on) {
    give(played, on.advanceInto(count, samples, markers));
    return 0;
  });
}

std::int32_t ktSim_SetAutoAdvance(std::uint32_t generator, std::uint64_t samplesPerAccess) {
  return onGenerator(generator, [&](Generator& on) {
    on.setAutoAdvance(samplesPerAccess);
    return 0;
  });
}

std::int32_t ktSim_SetWallClock(std::uint32_t generator, double samplesPerSecond) {
  constexpr double kHighestRate = 1e12;
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (!(samplesPerSecond >= 0 && samplesPerSecond <= kHighestRate)) return KTSIM_E_ARGUMENT;
    on.setWallClock(samplesPerSecond);
    return 0;
  });
}

std::int32_t ktSim_RaiseTrigger(std::uint32_t generator, std::uint32_t trigger) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (!isTrigger(trigger)) return KTSIM_E_ARGUMENT;
    on.sequencer().raise(trigger);
    return 0;
  });
}

std::int32_t ktSim_RaiseTriggerAt(std::uint32_t generator, std::uint32_t trigger, std::uint64_t sample) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    return isTrigger(trigger) && on.sequencer().raiseAt(trigger, sample) ? 0 : KTSIM_E_ARGUMENT;
  });
}

// ---- Output ----

std::int32_t ktSim_RecordOutput(std::uint32_t generator, std::uint64_t capacitySamples) {
  return onGenerator(generator, [&](Generator& on) {
    on.recordOutput(capacitySamples);
    return 0;
  });
}

std::int32_t ktSim_ReadOutput(std::uint32_t generator, std::uint64_t capacity, void* samples, std::uint8_t* markers,
                              std::uint64_t* count) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (count == nullptr || on.recorded() == nullptr) return KTSIM_E_ARGUMENT;
    *count = capacity == 0 ? on.recorded()->size() : on.recorded()->read(capacity, samples, markers);
    return 0;
  });
}

std::int32_t ktSim_SetOutputCallback(std::uint32_t generator, ktSim_OutputCallback callback, void* user) {
  return onGenerator(generator, [&](Generator& on) {
    std::unique_ptr<simulator::Output> output;
    if (callback != nullptr) {
      output = std::make_unique<simulator::CallbackOutput>(callback, user, on.geometry().bytesPerSample);
    }
    on.setOutput(std::move(output));
    return 0;
  });
}

std::int32_t ktSim_RecordTrace(std::uint32_t generator, std::uint64_t capacity) {
  return onGenerator(generator, [&](Generator& on) {
    on.sequencer().setTrace(simulator::LazyQueue<ktSim_TraceEntry>(capacity));
    return 0;
  });
}

std::int32_t ktSim_ReadTrace(std::uint32_t generator, std::uint64_t capacity, ktSim_TraceEntry* entries,
                             std::uint64_t* count) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (count == nullptr || (entries == nullptr && capacity != 0)) return KTSIM_E_ARGUMENT;
    auto& trace = on.sequencer().trace();
    *count = capacity == 0 ? trace.size() : std::min(capacity, trace.size());
    if (capacity == 0 || *count == 0) return 0;
    std::copy_n(trace.head(), *count, entries);
    trace.consume(*count);
    return 0;
  });
}

// ---- State ----

std::int32_t ktSim_GetState(std::uint32_t generator, ktSim_State* state) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (state == nullptr) return KTSIM_E_ARGUMENT;
    *state = on.state();
    return 0;
  });
}

std::int32_t ktSim_GetCounters(std::uint32_t generator, ktSim_Counters* counters) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (counters == nullptr) return KTSIM_E_ARGUMENT;
    *counters = on.counters();
    return 0;
  });
}

std::int32_t ktSim_GetDeviceFault(std::uint32_t generator, std::uint64_t index, ktSim_DeviceFault* fault) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    const ktSim_DeviceFault* const found = on.faults().find(index);
    if (fault == nullptr || found == nullptr) return KTSIM_E_ARGUMENT;
    *fault = *found;
    return 0;
  });
}

std::int32_t ktSim_ClearDeviceFaults(std::uint32_t generator) {
  return onGenerator(generator, [](Generator& on) {
    on.faults().clear();
    return 0;
  });
}

std::int32_t ktSim_ReadSampleMemory(std::uint32_t generator, std::uint64_t address, void* bytes, std::uint64_t count) {
  return onGenerator(generator, [&](Generator& on) {
    return copyOut(on.sampleMemory(), on.traits().memorySizeBytes, {address, count}, bytes);
  });
}

std::int32_t ktSim_WriteSampleMemory(std::uint32_t generator, std::uint64_t address, const void* bytes,
                                     std::uint64_t count) {
  return onGenerator(generator, [&](Generator& on) {
    return copyIn(on.sampleMemory(), on.traits().memorySizeBytes, {address, count}, bytes);
  });
}

std::int32_t ktSim_ReadSequenceMemory(std::uint32_t generator, std::uint64_t address, std::uint32_t* words,
                                      std::uint64_t instructions) {
  return onGenerator(generator, [&](Generator& on) {
    return copyOut(on.sequenceMemory(), on.traits().sequenceWords * kInstructionBytes,
                   instructionRange(address, instructions), words);
  });
}

std::int32_t ktSim_WriteSequenceMemory(std::uint32_t generator, std::uint64_t address, const std::uint32_t* words,
                                       std::uint64_t instructions) {
  return onGenerator(generator, [&](Generator& on) {
    const std::int32_t code = copyIn(on.sequenceMemory(), on.traits().sequenceWords * kInstructionBytes,
                                     instructionRange(address, instructions), words);
    if (code == 0 && instructions != 0) on.sequencer().rewritten(address, address + instructions - 1);
    return code;
  });
}

std::int32_t ktSim_PeekRegister(std::uint32_t generator, std::uint32_t number, std::uint64_t* value) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    return value == nullptr ? KTSIM_E_ARGUMENT : on.peekRegister(number, *value);
  });
}

// ---- Faults on demand ----

std::int32_t ktSim_OverrideRegister(std::uint32_t generator, std::uint32_t number, std::uint64_t value) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (ktorba::findRegister(number) == nullptr) return KTSIM_E_REGISTER;
    on.overrideRegister(number, value);
    return 0;
  });
}

std::int32_t ktSim_RestoreRegister(std::uint32_t generator, std::uint32_t number) {
  return onGenerator(generator, [&](Generator& on) -> std::int32_t {
    if (ktorba::findRegister(number) == nullptr) return KTSIM_E_REGISTER;
    on.overrideRegister(number, std::nullopt);
    return 0;
  });
}

std::int32_t ktSim_HoldMemoryWrites(std::uint32_t generator, bool hold) {
  return onGenerator(generator, [&](Generator& on) {
    on.holdMemoryWrites(hold);
    return 0;
  });
}

std::int32_t ktSim_SetDrainRate(std::uint32_t generator, std::uint64_t bytesPerMs) {
  return onGenerator(generator, [&](Generator& on) {
    on.setDrainRate(bytesPerMs);
    return 0;
  });
}
