#include "source/ktorba_lib/SessionRegistry.h"

#include <algorithm>
#include <limits>
#include <string_view>
#include <utility>

#include "source/ktorba_lib/failures.h"

namespace ktorba_lib {
namespace {

using Lock = platform::MutexLock<std::recursive_mutex>;

constexpr std::size_t kMaxSessions = std::numeric_limits<std::uint32_t>::max();

char toUpper(char c) { return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c; }

bool isSameIdentity(std::string_view a, std::string_view b) { return std::ranges::equal(a, b, {}, toUpper, toUpper); }

}  // namespace

std::uint32_t SessionRegistry::openSession(const GeneratorAddress& generator) {
  return addSession(factory_(generator));
}

std::uint32_t SessionRegistry::addSession(const SessionPtr& session) {
  const Lock lock(lock_);
  if (entries_.size() == kMaxSessions || isOpen(session->getName())) return 0;
  entries_.push_back({nextHandle_, session});
  advanceNextHandle();
  return entries_.back().handle;
}

SessionPtr SessionRegistry::findSession(std::uint32_t handle) {
  const Lock lock(lock_);
  const auto entry = entryOf(handle);
  return entry != entries_.end() ? entry->session : SessionPtr();
}

SessionPtr SessionRegistry::removeSession(std::uint32_t handle) {
  const Lock lock(lock_);
  const auto entry = entryOf(handle);
  if (entry == entries_.end()) return {};
  SessionPtr session = std::move(entry->session);
  entries_.erase(entry);
  return session;
}

SessionRegistry::Entries::iterator SessionRegistry::entryOf(std::uint32_t handle) {
  return std::ranges::find(entries_, handle, &SessionEntry::handle);
}

bool SessionRegistry::isOpen(const char* identity) const {
  return std::ranges::any_of(
      entries_, [identity](const SessionEntry& entry) { return isSameIdentity(entry.session->getName(), identity); });
}

void SessionRegistry::advanceNextHandle() {
  if (entries_.size() == kMaxSessions) {
    nextHandle_ = 0;
    return;
  }
  do {
    if (++nextHandle_ == 0) nextHandle_ = 1;
  } while (entryOf(nextHandle_) != entries_.end());
}

SessionRegistry& getRegistry() {
  static SessionRegistry& registry = *new SessionRegistry(openSession);
  return registry;
}

SessionPtr getSessionPtr(std::uint32_t handle) {
  SessionPtr session = getRegistry().findSession(handle);
  if (session == nullptr) {
    raise(nKTAPALS100_tStatus_kInvalidParameter, "ktorba_lib::getSessionPtr", "Invalid orba session handle", 57);
  }
  return session;
}

}  // namespace ktorba_lib
