// A host of the library on the platform doubles, and the platform calls that the library makes for it, made bare.
#pragma once

#include <benchmark/benchmark.h>

#include <cstdint>
#include <iterator>
#include <string>

#include "ktorba/hwRecords/registers.h"
#include "ktorba/ktorba.h"
#include "platform/fpga/KtFpga.h"
#include "platform/fpga/ktifwu.h"
#include "testing/FpgaDouble.h"
#include "testing/FrameworkDouble.h"

// Ends the benchmark with the code of the first call that fails.
inline void require(benchmark::State& state, std::int32_t code) {
  if (code != 0) state.SkipWithError(std::to_string(code).c_str());
}

class HostOnDouble {
 public:
  explicit HostOnDouble(benchmark::State& state, std::uint8_t instance = 0) {
    require(state, ktORBA_OpenOrbaSession(kSession, kSession, kSession, nullptr, instance, &session, nullptr));
  }
  ~HostOnDouble() { ktORBA_CloseOrbaSession(session, nullptr); }
  HostOnDouble(const HostOnDouble&) = delete;
  HostOnDouble& operator=(const HostOnDouble&) = delete;

  static constexpr std::uint32_t kSession = 1;
  std::uint32_t session = 0;
};

inline std::uint64_t platformCalls() { return fpgaDouble().callCount + frameworkDouble().callCount; }

// Counts the platform calls of one iteration, so that ours and the bare ones are seen to be as many.
class PlatformCallCounter {
 public:
  explicit PlatformCallCounter(benchmark::State& state) : state_(state), before_(platformCalls()) {}
  ~PlatformCallCounter() {
    state_.counters["platform_calls"] =
        static_cast<double>(platformCalls() - before_) / static_cast<double>(state_.iterations());
  }
  PlatformCallCounter(const PlatformCallCounter&) = delete;
  PlatformCallCounter& operator=(const PlatformCallCounter&) = delete;

 private:
  benchmark::State& state_;
  std::uint64_t before_;
};

namespace bare {

struct Address {
  std::uint8_t subsystem;
  std::uint64_t offset;
};

inline Address contextualize(ktorba::Register number) {
  tStatus status{};
  Address address{};
  ktIFW_Context_Contextualize(HostOnDouble::kSession, 1, static_cast<std::uint64_t>(number), &address.subsystem,
                              &address.offset, &status);
  return address;
}

inline std::uint64_t readRegister(ktorba::Register number) {
  const Address address = contextualize(number);
  tStatus status{};
  std::uint64_t value = 0;
  ktIFW_Target_Read(HostOnDouble::kSession, address.subsystem, address.offset, &value, 1000, &status);
  return value;
}

inline void writeCommand(ktorba::Command command) {
  const Address address = contextualize(ktorba::Register::kCommand);
  tStatus status{};
  ktIFW_Target_Write(HostOnDouble::kSession, address.subsystem, address.offset, static_cast<std::uint64_t>(command),
                     true, 1000, &status);
}

inline void announceMemoryWrite() {
  constexpr ktorba::Register kNumbers[] = {ktorba::Register::kWriteAddress,       ktorba::Register::kWriteElements,
                                           ktorba::Register::kWriteFirstWordMask, ktorba::Register::kWriteLastWordMask,
                                           ktorba::Register::kWriteMasked,        ktorba::Register::kCommand};
  constexpr std::uint32_t kCount = std::size(kNumbers);
  std::uint8_t subsystems[kCount];
  std::uint64_t offsets[kCount];
  std::uint64_t values[kCount] = {};
  for (std::uint32_t i = 0; i < kCount; ++i) {
    const Address address = contextualize(kNumbers[i]);
    subsystems[i] = address.subsystem;
    offsets[i] = address.offset;
  }
  tStatus status{};
  ktIFW_Target_WriteArray(HostOnDouble::kSession, subsystems, offsets, values, kCount, true, 1000, &status);
}

inline void writeFifo(const std::uint8_t* data, std::uint64_t count) {
  std::uint64_t free = 0;
  KtFpgaDll_WriteFifoU8(HostOnDouble::kSession, 0, data, count, 1000, &free);
}

}  // namespace bare
