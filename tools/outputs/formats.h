// The writers behind Outputs, one per kind of file. Each is told all that it may know before it gets the first block,
// and needs no more memory for a long play than for a short one. Each throws what its target throws. The lengths of
// sound files stand at their beginning, so that they need a target that can seek.
#pragma once

#include <memory>

#include "tools/outputs/ByteTarget.h"
#include "tools/outputs/Output.h"
#include "tools/recording/Recording.h"

namespace tools {

class OutputWriter : public RecordingSink {
 public:
  virtual void finish() = 0;  // call it once, last
};

// Bytes of a file, from the header of what it holds; saturated. Nothing is certain of what is compressed or drawn.
struct SizeBounds {
  std::uint64_t least = 0;
  std::uint64_t greatest = UINT64_MAX;
};

// `perSample` * `count` + `more`, at most UINT64_MAX.
std::uint64_t saturatedBytes(std::uint64_t perSample, std::uint64_t count, std::uint64_t more);

enum class SoundFormat { kWav, kFlac };

// Throws Refusal when the format cannot hold such samples.
void checkSound(const std::string& path, SoundFormat format, unsigned sampleWidthBits, double sampleRateHz);
SizeBounds boundSound(SoundFormat format, const RecordingHeader& header);
// Throws Refusal when the format cannot hold so many.
std::unique_ptr<OutputWriter> writeSound(ByteTarget& target, SoundFormat format, const RecordingHeader& header);

SizeBounds boundCsv(const RecordingHeader& header);
std::unique_ptr<OutputWriter> writeCsv(ByteTarget& target, const RecordingHeader& header);

SizeBounds boundNpy(const RecordingHeader& header);
std::unique_ptr<OutputWriter> writeNpy(ByteTarget& target, const RecordingHeader& header);

SizeBounds boundVcd(const RecordingHeader& header);
// Throws Refusal where the format cannot count that far.
std::unique_ptr<OutputWriter> writeVcd(ByteTarget& target, const RecordingHeader& header);

// Bytes, and behind them the samples alone, little-endian.
std::unique_ptr<OutputWriter> writeSamplesBehind(const std::string& bytes, ByteTarget& target);

std::unique_ptr<OutputWriter> writePicture(ByteTarget& target, PictureFormat format, const RecordingHeader& header);

}  // namespace tools
