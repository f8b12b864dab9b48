#include "ktisl/ErrorStore.h"

#include <algorithm>
#include <cstring>

namespace atat {
namespace {

bool copyStatus(tStatus& destination, const tStatus& source) {
  return kterr::setCode(destination, source.code) && kterr::setJson(destination, source.json);
}

}  // namespace

bool ErrorStore::mergeFrom(const tStatus& status) {
  const platform::MutexLock guard(lock_);
  return copyStatus(status_, status);
}

bool ErrorStore::copyTo(tStatus& status) {
  const platform::MutexLock guard(lock_);
  return copyStatus(status, status_);
}

std::string ErrorStore::getElaboration() {
  const platform::MutexLock guard(lock_);
  return status_.json != nullptr ? status_.json : "";
}

std::size_t ErrorStore::copyElaboration(char* buffer, std::size_t bufferSize) {
  const platform::MutexLock guard(lock_);
  const char* text = status_.json != nullptr ? status_.json : "";
  const std::size_t length = std::strlen(text);
  if (buffer != nullptr && bufferSize > 0) {
    const std::size_t copied = std::min(length, bufferSize - 1);
    std::memcpy(buffer, text, copied);
    buffer[copied] = '\0';
  }
  return status_.json != nullptr ? length + 1 : 0;
}

void ErrorStore::clear() {
  const platform::MutexLock guard(lock_);
  status_.code = 0;
  kterr::setJson(status_, nullptr);
}

ErrorStore& processErrorStore() {
  static ErrorStore store;
  return store;
}

}  // namespace atat
