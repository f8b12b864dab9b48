// A compiled script as the engine keeps it: the compiler's output, copied into types of the engine's own so that the
// engine's records do not change with the compiler's. What blocks and fetches refer to belongs to the script's arena,
// which copies of a script share. Constant once made; any thread may read.
#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "conventions/conventions.h"
#include "ktWfmScriptCompiler/Arena.h"

namespace ktorba {

struct MarkerRecord {
  std::uint32_t position = 0;   // samples from the first sample of the fetch
  std::uint8_t markerMask = 0;  // bit n: marker n
};

using MarkerRecords = std::span<const MarkerRecord>;

struct FetchRecord {
  std::string_view waveformName;   // empty for a wait
  std::uint8_t triggerNumber = 0;  // hardware trigger 1..8 that ends a wait; 0 none
  std::uint32_t startOffset = 0;   // samples
  std::uint32_t sampleCount = 0;   // samples, or kWholeWaveform
  bool isWait = false;
  std::uint8_t clearFlag = 0;  // bit h-1: clears hardware trigger h
  MarkerRecords markers;       // ascending by position, each position once
};

// One loop of the sequencer; a run of instructions outside any repeat is a loop of one iteration.
struct SequenceBlock {
  LoopKind loopKind = LoopKind::kCounted;
  std::uint32_t iterationCount = 1;
  std::uint8_t triggerNumber = 0;  // hardware trigger 1..8 of an until-loop, else 0
  std::uint8_t clearFlag = 0;
  std::span<const FetchRecord> fetches;
};

struct CompiledScript {
  std::string name;
  bool isEndless = false;  // the body was exactly one repeat forever, which the compiler removed
  std::vector<SequenceBlock> blocks;
  std::size_t mostInstructions = 0;  // that encoding can make of it, so that room is made once; 0 is not known
  std::shared_ptr<ktwfmscriptcompiler::Arena> arena;  // holds the records
};

}  // namespace ktorba
