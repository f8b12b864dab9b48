// The session's registry of named waveforms, seen from outside: the narrow finder for scripts and settings, and the
// table itself for the facade. Names differing only in letter case are one name. References to entries stay valid
// until the entry is removed. One thread at a time.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>

#include "ktcheckname/compareNames.h"

namespace ktorba {

class WaveformEntry {
 public:
  virtual ~WaveformEntry() = default;

  std::string name;
  std::uint32_t allocatedLength = 0;  // samples
  std::uint32_t memoryOffset = 0;     // first byte of the block in sample memory
  std::uint32_t writePosition = 0;    // bytes from the waveform's start
  std::uint32_t id = 0;
};

class WaveformFinderInterface {
 public:
  virtual ~WaveformFinderInterface() = default;

  // Raise ktorba_errors::kErrorSpecifiedWaveformNotFound for an unknown name.
  virtual const WaveformEntry& getWaveform(const std::string& name) const = 0;
  virtual WaveformEntry& getWaveform(const std::string& name) = 0;

  virtual bool containsWaveform(const std::string& name) const = 0;
};

class WaveformTableInterface : public WaveformFinderInterface {
 public:
  using Entries = std::map<std::string, std::shared_ptr<WaveformEntry>, ktcheckname::NameLess>;

  // Adds an entry of `allocatedLength` samples at memory offset and write position 0, with the next id. Raises
  // ktmxl::kErrorWaveformPreviouslyAllocated for a name in use and then leaves the table alone. An empty name is
  // replaced by a fixed prefix and the first number from the entry's id upward that gives a free name. The name's form
  // and the length are the caller's to check.
  virtual WaveformEntry& addWaveform(const std::string& name, std::uint32_t allocatedLength) = 0;

  // Does nothing when there is no such waveform.
  virtual void removeWaveform(const std::string& name) = 0;

  // Starts the ids from 0 again, too.
  virtual void removeAllWaveforms() = 0;

  // Each raises ktorba_errors::kErrorSpecifiedWaveformNotFound when there is none.
  virtual Entries::iterator findWaveformById(std::uint32_t id) = 0;
  virtual Entries::const_iterator findWaveform(const std::string& name) const = 0;
  virtual Entries::iterator findWaveform(const std::string& name) = 0;
};

}  // namespace ktorba
