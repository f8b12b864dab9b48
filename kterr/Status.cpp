#include "kterr/Status.h"

#include <algorithm>
#include <bit>
#include <cstdlib>
#include <cstring>

namespace kterr {
namespace {

constexpr std::uint32_t kMaxCapacity = 0x7FFFFFFF;
constexpr std::uint32_t kMinCapacity = 512;
constexpr char kEmptyObject[] = "{}";

bool replaces(std::int32_t newCode, std::int32_t code) { return code == 0 ? newCode != 0 : code > 0 && newCode < 0; }

std::uint32_t bufferSize(std::uint32_t capacity) { return std::bit_ceil(std::max(capacity, kMinCapacity)); }

void shortenPath(char (&destination)[101], const char* path) {
  constexpr std::size_t kKept = 49;
  const std::size_t length = std::strlen(path);
  if (length < sizeof destination) {
    std::memcpy(destination, path, length + 1);
    return;
  }
  std::memcpy(destination, path, kKept);
  std::memcpy(destination + kKept, "..", 2);
  std::memcpy(destination + kKept + 2, path + length - kKept, kKept + 1);
}

}  // namespace

tStatus makeStatus() { return {0, 0, defaultReallocJson, nullptr}; }

bool setCode(tStatus& status, std::int32_t newCode) {
  if (!replaces(newCode, status.code)) return false;
  status.code = newCode;
  if (status.json != nullptr && ensureCapacity(status, sizeof kEmptyObject + 1)) {
    copyJson(status.json, status.capacity, kEmptyObject);
  }
  return true;
}

bool setJson(tStatus& status, const char* text) {
  if (text == nullptr) text = kEmptyObject;
  const std::size_t length = std::strlen(text);
  if (length > kMaxJsonLength) return false;
  if (!ensureCapacity(status, static_cast<std::uint32_t>(length) + 2)) return false;
  return copyJson(status.json, status.capacity, text);
}

void mergeStatus(tStatus& destination, tStatus& source) {
  if (!setCode(destination, source.code)) return;
  if (destination.reallocJson != source.reallocJson) {
    setJson(destination, source.json);
    return;
  }
  freeJson(destination);
  destination.capacity = source.capacity;
  destination.json = source.json;
  source.capacity = 0;
  source.json = nullptr;
}

bool ensureCapacity(tStatus& status, std::uint32_t capacity) {
  if (status.json != nullptr && status.capacity >= capacity) return true;
  return status.reallocJson != nullptr && status.reallocJson(&status, capacity) && status.json != nullptr &&
         status.capacity >= capacity;
}

bool terminateJson(tStatus& status) {
  if (status.json == nullptr || status.capacity == 0) return false;
  char* const last = status.json + status.capacity - 1;
  if (std::memchr(status.json, '\0', status.capacity) == nullptr) *last = '\0';
  return true;
}

void freeJson(tStatus& status) {
  if (status.json != nullptr && status.reallocJson != nullptr) status.reallocJson(&status, 0);
}

bool defaultReallocJson(tStatus* status, std::uint32_t newCapacity) {
  if (newCapacity == 0) {
    std::free(status->json);
    status->capacity = 0;
    status->json = nullptr;
    return true;
  }
  if (newCapacity <= status->capacity) return true;
  if (newCapacity > kMaxCapacity) return false;
  const std::uint32_t size = bufferSize(newCapacity);
  char* buffer = static_cast<char*>(std::malloc(size));
  if (buffer == nullptr) return false;
  // A text longer than the record's capacity says does not fit what was asked for: the record is left as it is.
  if (!copyJson(buffer, size, status->json != nullptr ? status->json : kEmptyObject)) {
    std::free(buffer);
    return false;
  }
  std::free(status->json);
  status->capacity = size;
  status->json = buffer;
  return true;
}

bool copyJson(char* buffer, std::uint32_t capacity, const char* text) {
  const std::size_t length = std::strlen(text != nullptr ? text : buffer);
  if (capacity <= length + 1) return false;
  if (text != nullptr) std::memmove(buffer, text, length);
  std::memset(buffer + length, 0, capacity - 1 - length);
  buffer[capacity - 1] = kSentinel;
  return true;
}

tLocatedStatus makeLocatedStatus() { return {kLocatedStatusSize, 0, "", "", 0, 0}; }

bool setCode(tLocatedStatus& status, std::int32_t newCode) {
  if (!replaces(newCode, status.code)) return false;
  status.code = newCode;
  return true;
}

void mergeCode(tLocatedStatus& status, std::int32_t newCode, const char* component, const char* file,
               std::uint32_t line) {
  if (!setCode(status, newCode) || status.structSize < kLocatedStatusSize) return;
  const std::size_t length = std::min(std::strlen(component), sizeof status.component - 1);
  std::memcpy(status.component, component, length);
  status.component[length] = '\0';
  shortenPath(status.file, file);
  status.line = line;
}

}  // namespace kterr
