// What scripts, instructions and generators agree on: how markers and triggers are counted, numbered and called, how
// loops end, what a generator is found by, and how it is set before a host asks for anything.
// Constants and pure functions; any thread may use them.
#pragma once

#include <cstdint>
#include <string>

namespace ktorba {

// ---- Markers: 0 to 7, by the same number in scripts, in masks and on the hardware ----

inline constexpr std::uint32_t kMarkerCount = 8;

// The bit of a marker in a marker mask; 0 for numbers that the mask has no bit for.
constexpr std::uint8_t markerBitOf(std::uint32_t marker) { return static_cast<std::uint8_t>(1u << (marker % 32)); }

// "marker3".
inline std::string markerName(std::uint32_t marker) { return "marker" + std::to_string(marker); }

// ---- Triggers: 1 to 8 on the hardware. Starting generation raises the first one, which no script names; the others
// are trigger1 to trigger7 of the scripts, whose vocabulary has table numbers 0 to 6 for them. ----

inline constexpr std::uint32_t kHardwareTriggerCount = 8;
inline constexpr std::uint32_t kTriggerCount = kHardwareTriggerCount - 1;  // that scripts name
inline constexpr std::uint8_t kStartTrigger = 1;

// The hardware trigger of a table number 0 to 7, of which the last is the start trigger; 0 for any other number.
constexpr std::uint8_t hardwareTriggerOf(std::uint32_t tableNumber) {
  constexpr std::uint32_t kCount = kHardwareTriggerCount;
  return tableNumber < kCount ? static_cast<std::uint8_t>((tableNumber + 1) % kCount + 1) : 0;
}

// The bit of a hardware trigger in a clear flag, and in every other mask of triggers.
constexpr std::uint8_t clearFlagOf(std::uint32_t hardwareTrigger) {
  return static_cast<std::uint8_t>(1u << (hardwareTrigger - 1));
}

// "trigger3" for hardware trigger 4, "start" for the start trigger.
inline std::string triggerName(std::uint32_t hardwareTrigger) {
  return hardwareTrigger == kStartTrigger ? "start" : "trigger" + std::to_string(hardwareTrigger - kStartTrigger);
}

// ---- Loops ----

// What ends a loop. A run of instructions outside any loop counts as a counted one of a single pass.
enum class LoopKind : std::uint16_t { kCounted = 0, kForever = 1, kUntilTrigger = 2 };

// ---- Waveforms ----

// The length of a fetch that names none: the whole waveform.
inline constexpr std::uint32_t kWholeWaveform = 0xFFFFFFFF;

// ---- Generators in an FPGA's design ----

// The type of a generator's context in the interface framework.
inline constexpr std::uint16_t kGeneratorContextType = 101;

// Versions of a generator's register block.
struct GeneratorVersion {
  std::uint16_t major;
  std::uint16_t minor;
};
inline constexpr GeneratorVersion kOldestGeneratorVersion{4, 2};     // that this library drives
inline constexpr GeneratorVersion kStreamingGeneratorVersion{4, 3};  // the first with the streaming registers

// The name of a generator's download FIFO, by the number that the generator gives for it.
inline std::string downloadFifoName(std::uint32_t number) { return "wfm gen.download fifo " + std::to_string(number); }

// Bits of a download element where the generator says 0.
inline constexpr std::uint32_t kDefaultDownloadElementBits = 32;

// ---- Settings that hold until a host asks for others ----

inline constexpr std::uint16_t kDefaultReadGrantTime = 60;
inline constexpr std::uint16_t kDefaultWriteGrantTime = 30;
inline constexpr std::uint32_t kDefaultPrimingWords = 200;  // memory words

}  // namespace ktorba
