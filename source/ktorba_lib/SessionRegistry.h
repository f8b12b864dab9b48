// The process-wide table of open sessions: issues their handles, refuses a second session on one generator, and lends
// counted references. Any thread may call any operation; the table's lock is held only while the table is searched or
// changed, never while a session is built, used or destroyed.
#pragma once

#include <cstdint>
#include <functional>
#include <mutex>
#include <vector>

#include "platform/system/Mutex.h"
#include "source/ktorba_lib/SessionInterface.h"
#include "source/ktorba_lib/openSession.h"

namespace ktorba_lib {

class SessionRegistry {
 public:
  using SessionFactory = std::function<SessionPtr(const GeneratorAddress&)>;

  // `factory` builds sessions, on whatever thread opens one; `firstHandle` must not be 0.
  explicit SessionRegistry(SessionFactory factory, std::uint32_t firstHandle = 1)
      : factory_(std::move(factory)), nextHandle_(firstHandle) {}
  SessionRegistry(const SessionRegistry&) = delete;
  SessionRegistry& operator=(const SessionRegistry&) = delete;

  // Builds a session and adds it. Returns its handle, or 0, the new session destroyed, where addSession() does.
  // What the building raises passes out, nothing is added then.
  std::uint32_t openSession(const GeneratorAddress& generator);

  // Adds a session and returns its handle: counting up from the first handle, a handle is given again only after the
  // 32-bit counter has wrapped, and never while it is in use. Returns 0, nothing added, when a session of that name
  // (its generator's identity) is in the table or the table is full.
  std::uint32_t addSession(const SessionPtr& session);

  // The session of a handle, with a reference of the caller's own; empty when there is none.
  SessionPtr findSession(std::uint32_t handle);

  // Takes a session out of the table and hands the table's reference to the caller; empty when there is none.
  SessionPtr removeSession(std::uint32_t handle);

 private:
  struct SessionEntry {
    std::uint32_t handle;  // unique, never 0
    SessionPtr session;    // never empty
  };
  using Entries = std::vector<SessionEntry>;

  Entries::iterator entryOf(std::uint32_t handle) KTORBA_REQUIRES(lock_);
  bool isOpen(const char* identity) const KTORBA_REQUIRES(lock_);
  void advanceNextHandle() KTORBA_REQUIRES(lock_);

  SessionFactory factory_;
  platform::Mutex<std::recursive_mutex> lock_;
  std::uint32_t nextHandle_ KTORBA_GUARDED_BY(lock_);  // what the next session gets; 0 when the table is full
  Entries entries_ KTORBA_GUARDED_BY(lock_);           // in the order of opening
};

// The process's registry: made on first use, never destroyed, so that calls on other threads stay safe while the
// process ends.
SessionRegistry& getRegistry();

// The session of a handle in the process's registry, or raises nKTAPALS100_tStatus_kInvalidParameter.
SessionPtr getSessionPtr(std::uint32_t handle);

}  // namespace ktorba_lib
