// The compiler's output: one record per procedure of a script text. Waveforms are known by name only.
#pragma once

#include <boost/container/small_vector.hpp>
#include <cstdint>
#include <string>
#include <vector>

#include "conventions/conventions.h"

namespace ktwfmscriptcompiler {

// sampleCount of a generate without a subset.
using ktorba::kWholeWaveform;

struct MarkerRecord {
  std::uint32_t position = 0;   // samples from the start of the fetch
  std::uint8_t markerMask = 0;  // bit n: marker n fires here

  bool operator==(const MarkerRecord&) const = default;
};

// Few fetches have more than two markers: theirs take no memory of their own.
using MarkerRecords = boost::container::small_vector<MarkerRecord, 2>;

struct FetchRecord {
  std::string waveformName;        // empty for a wait
  std::uint8_t triggerNumber = 0;  // hardware trigger 1..8 that ends a wait until a trigger, else 0
  std::uint32_t startOffset = 0;   // samples
  std::uint32_t sampleCount = 0;   // samples, or kWholeWaveform
  bool isWait = false;
  std::uint8_t clearFlag = 0;  // bit h-1: clears hardware trigger h
  MarkerRecords markers;       // ascending by position, each position once

  bool operator==(const FetchRecord&) const = default;
};

struct SequenceBlock {
  ktorba::LoopKind loopKind = ktorba::LoopKind::kCounted;  // a plain run is counted once
  std::uint32_t iterationCount = 1;
  std::uint8_t triggerNumber = 0;  // hardware trigger 1..8 that ends an until loop, else 0
  std::uint8_t clearFlag = 0;      // flags pending when the loop was entered
  std::vector<FetchRecord> fetches;

  bool operator==(const SequenceBlock&) const = default;
};

struct CompiledScript {
  std::string name;        // as written
  bool isEndless = false;  // the body was a single repeat forever, translated in place of the procedure's
  std::vector<SequenceBlock> blocks;

  bool operator==(const CompiledScript&) const = default;
};

}  // namespace ktwfmscriptcompiler
