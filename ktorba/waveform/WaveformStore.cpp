#include "ktorba/waveform/WaveformStore.h"

#include "ktcheckname/checkName.h"
#include "kterr/Failure.h"
#include "ktorba/waveform/ScopeExitCleanupOperation.h"

namespace ktorba {
namespace {

// Frozen: hosts know these failures as the facade's.
constexpr char kSource[] = R"(includes\ktorba\hwControl\HWControl)";

void checkForm(const std::string& name) {
  if (name.empty()) kterr::Failure(ktorba_errors::kErrorWaveformNameIsEmpty).at(kSource).raise();
  kterr::OwnedStatus status;
  ktcheckname::checkName(name.c_str(), status);
  kterr::raiseIfError(status);
}

}  // namespace

WaveformEntry& WaveformStore::allocate(const std::string& name, std::uint32_t numSamples) {
  checkNew(name, numSamples);
  const std::uint32_t bytes = blockSize(numSamples);
  WaveformEntry& waveform = table_.addWaveform(name, numSamples);
  ScopeExitCleanupOperation removal([&] { table_.removeWaveform(name); });
  waveform.memoryOffset = memory_.allocateBlock(bytes);
  removal.dismiss();
  return waveform;
}

// In both the blocks go first: that can fail for want of memory, and then nothing has changed.
void WaveformStore::clear(const std::string& name) {
  memory_.freeBlock(table_.getWaveform(name).memoryOffset);
  table_.removeWaveform(name);
}

void WaveformStore::clearAll() {
  memory_.freeAllBlocks();
  table_.removeAllWaveforms();
}

void WaveformStore::checkNew(const std::string& name, std::uint32_t numSamples) const {
  checkForm(name);
  if (table_.containsWaveform(name)) {
    kterr::Failure(ktorba_errors::kErrorWaveformNameAlreadyExists)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformName, name)
        .raise();
  }
  if (numSamples == 0) {
    kterr::Failure(ktorba_errors::kErrorNumSamplesInWaveformMustBeGreaterThanZero).at(kSource).raise();
  }
  if (numSamples < traits_.minFetchSamples) {
    kterr::Failure(ktorba_errors::kErrorRequestedWaveformLengthIsTooSmall)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformLength, numSamples)
        .usage(kterr::kUsageTypeMinWaveformLength, traits_.minFetchSamples)
        .raise();
  }
  if (numSamples % traits_.alignmentQuantum != 0) {
    kterr::Failure(ktorba_errors::kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformLength, numSamples)
        .usage(kterr::kUsageTypeAlignmentQuantum, traits_.alignmentQuantum)
        .raise();
  }
}

std::uint64_t WaveformStore::blockBytes(std::uint32_t numSamples) const {
  const std::uint64_t wordBytes = memory_.getBlockGranularity();
  const std::uint64_t bytes = std::uint64_t{traits_.sampleBytes()} * numSamples;
  return (bytes + wordBytes - 1) / wordBytes * wordBytes;
}

std::uint32_t WaveformStore::blockSize(std::uint32_t numSamples) const {
  const std::uint64_t bytes = blockBytes(numSamples);
  const std::uint32_t largest = memory_.getLargestAvailableBlockSize();
  if (bytes > largest) {
    kterr::Failure(ktorba_errors::kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA)
        .at(kSource)
        .usage(kterr::kUsageTypeLargestAvailMemoryBlock, largest)
        .raise();
  }
  return static_cast<std::uint32_t>(bytes);
}

}  // namespace ktorba
