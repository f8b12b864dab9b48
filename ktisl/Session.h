// The base of every session: a name, a store of its own for errors, the process-wide one, and a count of references.
//
// Sessions live on the heap and are held by boost::intrusive_ptr: the count starts at 0, each pointer adds one, and
// the thread that brings it back to 0 deletes the session through its virtual destructor. Counting and the error
// stores may be used from any thread; what a derived class adds says for itself.
#pragma once

#include <atomic>
#include <cstdint>
#include <mutex>
#include <string>
#include <utility>

#include "ktisl/ErrorStore.h"

namespace atat {

class Session {
 public:
  Session() : processErrors_(&processErrorStore()) {}
  virtual ~Session() = default;
  Session(const Session&) = delete;
  Session& operator=(const Session&) = delete;

  // The session's name, owned by the session; fixed for its life.
  virtual const char* getName() const = 0;

  ErrorStore& errors() { return errors_; }
  ErrorStore& processErrors() { return *processErrors_; }

 protected:
  // For derived classes that must keep operations of one session apart; nothing here takes it.
  std::mutex& lock() { return lock_; }

 private:
  ErrorStore errors_;
  ErrorStore* processErrors_;  // not owned, never null
  std::mutex lock_;
};

}  // namespace atat

namespace ktisl {

class Session : public atat::Session {
 public:
  explicit Session(std::string name) : name_(std::move(name)) {}

  const char* getName() const override { return name_.c_str(); }

  friend void intrusive_ptr_add_ref(const Session* session) noexcept {
    session->references_.fetch_add(1, std::memory_order_relaxed);
  }

  friend void intrusive_ptr_release(const Session* session) noexcept {
    if (session->references_.fetch_sub(1, std::memory_order_acq_rel) == 1) delete session;
  }

 private:
  std::string name_;
  mutable std::atomic<std::uint32_t> references_{0};
};

}  // namespace ktisl
