// The clean-up procedures that a host runtime keeps, in the order of their registration. Any thread may call; no lock
// is held while a procedure runs, so that it may register and withdraw.
#pragma once

#include <cstdint>
#include <mutex>
#include <vector>

#include "platform/system/Mutex.h"

namespace host_runtime {

using CleanUpProcedure = std::int32_t (*)(std::uint32_t handle);
using AtExit = int (*)(void (*function)());

class CleanUpList {
 public:
  CleanUpList() = default;
  ~CleanUpList() { runAll(); }
  CleanUpList(const CleanUpList&) = delete;
  CleanUpList& operator=(const CleanUpList&) = delete;

  // False when the pair was there already. Throws std::bad_alloc.
  bool add(CleanUpProcedure procedure, std::uint32_t handle);
  // False when the pair was not there.
  bool remove(CleanUpProcedure procedure, std::uint32_t handle);
  // Calls and forgets them, the latest first, until none is left.
  void runAll();

 private:
  struct Entry {
    CleanUpProcedure procedure;
    std::uint32_t handle;
    bool operator==(const Entry&) const = default;
  };

  bool takeLatest(Entry& entry);

  platform::Mutex<std::mutex> lock_;
  std::vector<Entry> entries_ KTORBA_GUARDED_BY(lock_);
};

}  // namespace host_runtime
