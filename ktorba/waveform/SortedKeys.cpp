#include "ktorba/waveform/SortedKeys.h"

#include <algorithm>

namespace ktorba {
namespace {

// Longest run. Measured: from 64 keys on, a shorter one makes large sets slower and a longer one small ones.
constexpr std::size_t kRunLength = 256;

// Makes sure that the next insertion needs no memory, and so cannot fail.
template <typename Element>
void makeRoom(std::vector<Element>& elements) {
  if (elements.size() == elements.capacity()) elements.reserve(2 * elements.size() + 1);
}

}  // namespace

void SortedKeys::clear() {
  bounds_.clear();
  runs_.clear();
}

void SortedKeys::insert(Key key) {
  if (runs_.empty()) return addRun(0, key, makeRun());
  std::size_t index = runOf(key);
  if (runs_[index].size() == kRunLength) {
    split(index);
    index = runOf(key);
  }
  Run& run = runs_[index];
  run.insert(std::ranges::lower_bound(run, key), key);
}

void SortedKeys::erase(Key key) {
  const std::size_t index = runOf(key);
  Run& run = runs_[index];
  run.erase(std::ranges::lower_bound(run, key));
  if (!run.empty()) return;
  const auto position = static_cast<std::ptrdiff_t>(index);
  bounds_.erase(bounds_.begin() + position);
  runs_.erase(runs_.begin() + position);
}

std::optional<SortedKeys::Key> SortedKeys::atOrAbove(Key key) const {
  if (runs_.empty()) return std::nullopt;
  const std::size_t index = runOf(key);
  const Run& run = runs_[index];
  if (run.back() >= key) return *std::ranges::lower_bound(run, key);
  if (index + 1 == runs_.size()) return std::nullopt;
  return runs_[index + 1].front();
}

std::optional<SortedKeys::Key> SortedKeys::below(Key key) const {
  if (runs_.empty()) return std::nullopt;
  const std::size_t index = runOf(key);
  const Run& run = runs_[index];
  if (run.front() < key) return *(std::ranges::lower_bound(run, key) - 1);
  if (index == 0) return std::nullopt;
  return runs_[index - 1].back();
}

std::optional<SortedKeys::Key> SortedKeys::highest() const {
  if (runs_.empty()) return std::nullopt;
  return runs_.back().back();
}

// The run that holds the key if any does.
std::size_t SortedKeys::runOf(Key key) const {
  const auto behind = std::upper_bound(bounds_.begin() + 1, bounds_.end(), key);
  return static_cast<std::size_t>(behind - bounds_.begin() - 1);
}

SortedKeys::Run SortedKeys::makeRun() {
  Run run;
  run.reserve(kRunLength);
  return run;
}

void SortedKeys::split(std::size_t run) {
  const auto middle = runs_[run].begin() + kRunLength / 2;
  Run upper = makeRun();
  upper.assign(middle, runs_[run].end());
  const Key bound = upper.front();
  addRun(run + 1, bound, std::move(upper));
  runs_[run].resize(kRunLength / 2);
}

void SortedKeys::addRun(std::size_t index, Key bound, Run keys) {
  if (keys.empty()) keys.push_back(bound);
  const auto position = static_cast<std::ptrdiff_t>(index);
  makeRoom(bounds_);
  makeRoom(runs_);
  bounds_.insert(bounds_.begin() + position, bound);
  runs_.insert(runs_.begin() + position, std::move(keys));
}

}  // namespace ktorba
