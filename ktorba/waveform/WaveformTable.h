// The table of named waveforms: see WaveformTableInterface.h for its operations. It holds no samples and does not talk
// to the hardware; the block of sample memory behind an entry belongs to the allocator, the table only stores where it
// starts. One thread at a time.
#pragma once

#include "ktorba/waveform/WaveformTableInterface.h"

namespace ktorba {

// Instantiated for WaveformEntry alone.
template <typename Entry>
class WaveformTable : public WaveformTableInterface {
 public:
  const WaveformEntry& getWaveform(const std::string& name) const override;
  WaveformEntry& getWaveform(const std::string& name) override;
  bool containsWaveform(const std::string& name) const override;
  WaveformEntry& addWaveform(const std::string& name, std::uint32_t allocatedLength) override;
  void removeWaveform(const std::string& name) override;
  void removeAllWaveforms() override;
  Entries::iterator findWaveformById(std::uint32_t id) override;  // linear; by name it is logarithmic
  Entries::const_iterator findWaveform(const std::string& name) const override;
  Entries::iterator findWaveform(const std::string& name) override;

 private:
  std::string madeUpName() const;

  Entries entries_;
  std::uint32_t nextId_ = 0;
};

extern template class WaveformTable<WaveformEntry>;

}  // namespace ktorba
