// One stored status, code and elaboration, under a lock of its own: what a session remembers of its first failure.
// Any thread may call any operation; each holds the lock for its whole duration. Nothing throws except getElaboration
// for want of memory.
#pragma once

#include <cstddef>
#include <mutex>
#include <string>

#include "kterr/Status.h"
#include "platform/system/Mutex.h"

namespace atat {

class ErrorStore {
 public:
  ErrorStore() = default;  // code 0, no elaboration
  virtual ~ErrorStore() = default;
  ErrorStore(const ErrorStore&) = delete;
  ErrorStore& operator=(const ErrorStore&) = delete;

  // Takes `status`'s code by the priority rule and, where it was taken, a copy of its elaboration.
  // Returns whether both were done; `status` is left as it is.
  virtual bool mergeFrom(const tStatus& status);

  // The reverse of mergeFrom: merges what is stored into `status`.
  virtual bool copyTo(tStatus& status);

  // The elaboration's text, empty when there is none.
  virtual std::string getElaboration();

  // Copies the elaboration into `buffer` of `bufferSize` bytes, cut to fit and always terminated. Returns the bytes
  // that the whole needs with its terminator, 0 when there is none. Nothing is copied when `buffer` is null or
  // `bufferSize` is 0.
  virtual std::size_t copyElaboration(char* buffer, std::size_t bufferSize);

  // Code 0 and elaboration "{}".
  virtual void clear();

 private:
  platform::Mutex<std::mutex> lock_;
  kterr::OwnedStatus status_ KTORBA_GUARDED_BY(lock_);
};

// The one store of the process; lives until the library is unloaded.
ErrorStore& processErrorStore();

}  // namespace atat
