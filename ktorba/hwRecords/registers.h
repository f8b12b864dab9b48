// The generator's register block: number, direction and meaning of every register, once. The command layer addresses
// registers by these names, the simulated generator implements them, docs/registers.md lists them.
#pragma once

#include <cstdint>

namespace ktorba {

// clang-format off
#define KTORBA_REGISTERS(X) \
  X(kMinFetchSamples,        0, Read,  "shortest fetch, samples (low byte)") \
  X(kSampleWidthBits,        1, Read,  "bits per sample (low byte)") \
  X(kMemoryWordBits,         2, Read,  "bits per memory word (low 16 bits)") \
  X(kMemorySizeBytes,        3, Read,  "sample memory, bytes") \
  X(kSequenceMemoryWords,    4, Read,  "sequence memory, 128-bit instruction words") \
  X(kMaxPrimingWords,        5, Read,  "largest priming depth, memory words (low 16 bits)") \
  X(kCommand,                7, Write, "command: 1 reset, 2 initiate, 4 abort, 8 start the announced memory write") \
  X(kGenerationStatus,       8, Read,  "bit 0 generation done, bit 1 data underflow, bit 2 memory write complete") \
  X(kWriteMasked,            9, Write, "memory write: 1 when the byte masks apply") \
  X(kWriteAddress,          10, Write, "memory write: byte address") \
  X(kWriteElements,         11, Write, "memory write: transfer, download elements") \
  X(kPrimingDepth,          12, Write, "priming depth - 1, memory words") \
  X(kMemoryWriteGrantTime,  13, Write, "memory write grant time") \
  X(kMemoryReadGrantTime,   14, Write, "memory read grant time") \
  X(kWriteFirstWordMask,    15, Write, "memory write: byte mask of the first word, or 65535") \
  X(kWriteLastWordMask,     16, Write, "memory write: byte mask of the last word, or 65535") \
  X(kDownloadFifoNumber,    17, Read,  "number of the download DMA FIFO (low byte)") \
  X(kStreamingStartWord,    18, Write, "first memory word of the streaming waveform") \
  X(kStreamingEndWord,      19, Write, "last memory word of the streaming waveform") \
  X(kStreamingParamA,       20, Write, "read grant time + write grant time") \
  X(kStreamingParamB,       21, Write, "read grant time + write grant time") \
  X(kStreamingEnabled,      22, Write, "1 when a streaming waveform is configured") \
  X(kStreamingWritePointer, 23, Write, "streaming write pointer, memory word") \
  X(kStreamingLoadPointer,  24, Write, "1: load the streaming write pointer") \
  X(kStreamingFreeSpace,    25, Read,  "streaming free space, memory words") \
  X(kStreamingParamC,       26, Write, "20") \
  X(kDownloadElementBits,   27, Read,  "bits per download element; 0 stands for 32")
// clang-format on

enum class Register : std::uint8_t {
#define KTORBA_REGISTER_ENUM(name, number, access, meaning) name = number,
  KTORBA_REGISTERS(KTORBA_REGISTER_ENUM)
#undef KTORBA_REGISTER_ENUM
};

enum class RegisterAccess : std::uint8_t { Read, Write };

struct RegisterInfo {
  Register number;
  const char* name;
  RegisterAccess access;
  const char* meaning;
};

inline constexpr RegisterInfo kRegisters[] = {
#define KTORBA_REGISTER_INFO(name, number, access, meaning) {Register::name, #name, RegisterAccess::access, meaning},
    KTORBA_REGISTERS(KTORBA_REGISTER_INFO)
#undef KTORBA_REGISTER_INFO
};

// The register of that number; null when there is none.
constexpr const RegisterInfo* findRegister(std::uint64_t number) {
  for (const RegisterInfo& info : kRegisters) {
    if (static_cast<std::uint64_t>(info.number) == number) return &info;
  }
  return nullptr;
}

// Values of Register::kCommand.
enum class Command : std::uint8_t { kReset = 1, kInitiate = 2, kAbort = 4, kStartMemoryWrite = 8 };

// Bits of Register::kGenerationStatus.
inline constexpr std::uint64_t kStatusDone = 1;
inline constexpr std::uint64_t kStatusUnderflow = 2;
inline constexpr std::uint64_t kStatusWriteComplete = 4;

// What the mask registers get when no mask applies.
inline constexpr std::uint64_t kNoByteMask = 65535;

}  // namespace ktorba
