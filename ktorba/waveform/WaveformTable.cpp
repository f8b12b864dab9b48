#include "ktorba/waveform/WaveformTable.h"

#include <algorithm>

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba/waveform/WaveformTable)";

// Frozen: hosts may know waveforms by the names made from it.
constexpr char kMadeUpNamePrefix[] = "cef2f2637054ceca09186954adb08ad";

template <typename Position>
Position found(Position position, Position end, const std::string& name) {
  if (position == end) {
    kterr::Failure(ktorba_errors::kErrorSpecifiedWaveformNotFound)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformName, name)
        .raise();
  }
  return position;
}

}  // namespace

template <typename Entry>
const WaveformEntry& WaveformTable<Entry>::getWaveform(const std::string& name) const {
  return *findWaveform(name)->second;
}

template <typename Entry>
WaveformEntry& WaveformTable<Entry>::getWaveform(const std::string& name) {
  return *findWaveform(name)->second;
}

template <typename Entry>
bool WaveformTable<Entry>::containsWaveform(const std::string& name) const {
  return entries_.contains(name);
}

template <typename Entry>
WaveformEntry& WaveformTable<Entry>::addWaveform(const std::string& name, std::uint32_t allocatedLength) {
  if (!name.empty() && entries_.contains(name)) {
    kterr::Failure(ktmxl::kErrorWaveformPreviouslyAllocated)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformName, name)
        .raise();
  }
  auto entry = std::make_shared<Entry>();
  entry->name = name.empty() ? madeUpName() : name;
  entry->allocatedLength = allocatedLength;
  entry->id = nextId_;
  WaveformEntry& added = *entries_.emplace(entry->name, entry).first->second;
  ++nextId_;
  return added;
}

template <typename Entry>
void WaveformTable<Entry>::removeWaveform(const std::string& name) {
  entries_.erase(name);
}

template <typename Entry>
void WaveformTable<Entry>::removeAllWaveforms() {
  entries_.clear();
  nextId_ = 0;
}

template <typename Entry>
WaveformTableInterface::Entries::iterator WaveformTable<Entry>::findWaveformById(std::uint32_t id) {
  const auto position = std::ranges::find_if(entries_, [id](const auto& entry) { return entry.second->id == id; });
  if (position == entries_.end()) {
    kterr::Failure(ktorba_errors::kErrorSpecifiedWaveformNotFound).at(kSource).raise();
  }
  return position;
}

template <typename Entry>
WaveformTableInterface::Entries::const_iterator WaveformTable<Entry>::findWaveform(const std::string& name) const {
  return found(entries_.find(name), entries_.end(), name);
}

template <typename Entry>
WaveformTableInterface::Entries::iterator WaveformTable<Entry>::findWaveform(const std::string& name) {
  return found(entries_.find(name), entries_.end(), name);
}

template <typename Entry>
std::string WaveformTable<Entry>::madeUpName() const {
  for (std::uint64_t number = nextId_;; ++number) {
    std::string name = kMadeUpNamePrefix + std::to_string(number);
    if (!entries_.contains(name)) return name;
  }
}

template class WaveformTable<WaveformEntry>;

}  // namespace ktorba
