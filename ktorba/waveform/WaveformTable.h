// The table of named waveforms. It holds no samples and does not talk to the hardware; the block of sample memory
// behind an entry belongs to the allocator, the table only stores where it starts. One thread at a time.
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

  // Adds an entry at memory offset and write position 0. Raises ktmxl::kErrorWaveformPreviouslyAllocated for a name in
  // use and then leaves the table alone. An empty name is replaced by a fixed prefix and the first number from the
  // entry's id upward that gives a free name. The name's form and the length (samples) are the caller's to check.
  WaveformEntry& addWaveform(const std::string& name, std::uint32_t allocatedLength) override;

  // Does nothing when there is no such waveform.
  void removeWaveform(const std::string& name) override;

  // Starts the ids from 0 again, too.
  void removeAllWaveforms() override;

  // Each raises ktorba_errors::kErrorSpecifiedWaveformNotFound when there is none. Linear by id, logarithmic by name.
  Entries::iterator findWaveformById(std::uint32_t id) override;
  Entries::const_iterator findWaveform(const std::string& name) const override;
  Entries::iterator findWaveform(const std::string& name) override;

 private:
  std::string madeUpName() const;

  Entries entries_;
  std::uint32_t nextId_ = 0;
};

extern template class WaveformTable<WaveformEntry>;

}  // namespace ktorba
