// Turns what the host asks for (samples, names) into what the hardware takes (memory words, addresses), and checks it
// against the hardware's limits. A calculation over a copy of the traits; it writes nothing to the hardware.
#pragma once

#include "ktorba/hwRecords/HWSettings.h"
#include "ktorba/hwRecords/HWTraits.h"
#include "ktorba/settings/GenerationSettings.h"
#include "ktorba/waveform/WaveformTableInterface.h"

namespace ktorba {

struct AdjustedSettings : GenerationSettings {
  std::uint32_t actualPrimingDepth = 0;  // samples: the request rounded up to whole memory words
};

class SettingsCalculatorInterface {
 public:
  // Fills `hardware` completely, and only on success; `adjusted` may be partly filled by a failing calculation.
  // Raises ktorba_errors::kErrorPrimingDepthTooLarge, ktmxl::kErrorNameTooLong, and for the streaming waveform
  // ktorba_errors::kErrorSpecifiedWaveformNotFound and kErrorRequestedWaveformLengthIsTooSmall, in this order.
  virtual void calculateSettings(const WaveformFinderInterface& waveforms, const GenerationSettings& requested,
                                 AdjustedSettings& adjusted, HWSettingsRecord& hardware) const = 0;
  virtual ~SettingsCalculatorInterface() = default;
};

class SettingsCalculator : public SettingsCalculatorInterface {
 public:
  // `traits` must be workable ones: samples and memory words have at least 8 bits. Where a memory word holds no sample,
  // every calculation raises ktorba_errors::kErrorInternalSWError.
  explicit SettingsCalculator(const HWTraits& traits) : traits_(traits) {}

  void calculateSettings(const WaveformFinderInterface& waveforms, const GenerationSettings& requested,
                         AdjustedSettings& adjusted, HWSettingsRecord& hardware) const override;

 private:
  // Returns the depth in memory words that `samples` take, refusing more than the generator holds.
  std::uint32_t primingWords(std::uint32_t samples) const;
  void placeStreaming(const WaveformEntry& waveform, HWSettings& settings) const;

  HWTraits traits_;
};

}  // namespace ktorba
