// Locks that the compiler checks: what a comment calls guarded is annotated with its lock, and clang refuses to compile
// a use of it without. Other compilers see plain locks. Any thread may lock; see the lock that is wrapped for the rest.
#pragma once

#ifdef __clang__
#define KTORBA_ANNOTATION(...) __attribute__((__VA_ARGS__))
#else
#define KTORBA_ANNOTATION(...)
#endif

// Behind a member: only with `lock` held may it be touched. Behind a function: only with `lock` held may it be called.
#define KTORBA_GUARDED_BY(lock) KTORBA_ANNOTATION(guarded_by(lock))
#define KTORBA_REQUIRES(lock) KTORBA_ANNOTATION(requires_capability(lock))

namespace platform {

// A lock of any kind, std::mutex for one.
template <typename Lockable>
class KTORBA_ANNOTATION(capability("mutex")) Mutex {
 public:
  void lock() KTORBA_ANNOTATION(acquire_capability()) { lockable_.lock(); }
  void unlock() KTORBA_ANNOTATION(release_capability()) { lockable_.unlock(); }

 private:
  Lockable lockable_;
};

// Holds a lock for as long as it lives.
template <typename Lockable>
class KTORBA_ANNOTATION(scoped_lockable) MutexLock {
 public:
  explicit MutexLock(Mutex<Lockable>& mutex) KTORBA_ANNOTATION(acquire_capability(mutex)) : mutex_(mutex) {
    mutex_.lock();
  }
  ~MutexLock() KTORBA_ANNOTATION(release_capability()) { mutex_.unlock(); }
  MutexLock(const MutexLock&) = delete;
  MutexLock& operator=(const MutexLock&) = delete;

 private:
  Mutex<Lockable>& mutex_;
};

}  // namespace platform
