#include "hostRuntime/CleanUpList.h"

#include <algorithm>

namespace host_runtime {
namespace {

using Lock = platform::MutexLock<std::mutex>;

}  // namespace

bool CleanUpList::add(CleanUpProcedure procedure, std::uint32_t handle) {
  const Entry entry = {procedure, handle};
  const Lock lock(lock_);
  if (std::ranges::find(entries_, entry) != entries_.end()) return false;
  entries_.push_back(entry);
  return true;
}

bool CleanUpList::remove(CleanUpProcedure procedure, std::uint32_t handle) {
  const Lock lock(lock_);
  return std::erase(entries_, Entry{procedure, handle}) != 0;
}

void CleanUpList::runAll() {
  Entry latest{};
  while (takeLatest(latest)) latest.procedure(latest.handle);
}

bool CleanUpList::takeLatest(Entry& entry) {
  const Lock lock(lock_);
  if (entries_.empty()) return false;
  entry = entries_.back();
  entries_.pop_back();
  return true;
}

}  // namespace host_runtime
