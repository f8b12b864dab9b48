// Records for tests: one that frees its text, callbacks that fail on purpose, and the buffer's invariants.
#pragma once

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "kterr/JsonReader.h"
#include "kterr/Status.h"

struct Record : tStatus {
  explicit Record(const char* text = nullptr, decltype(tStatus::reallocJson) callback = kterr::defaultReallocJson)
      : tStatus{0, 0, callback, nullptr} {
    if (text != nullptr) kterr::setJson(*this, text);
  }
  ~Record() { kterr::freeJson(*this); }
  Record(const Record&) = delete;
  Record& operator=(const Record&) = delete;

  std::string text() const { return json != nullptr ? json : ""; }
};

// Passes calls on to the default callback until a count of them has been granted; then it refuses to grow.
struct Limited {
  static inline int callsLeft = 0;
  static bool reallocJson(tStatus* status, std::uint32_t capacity) {
    if (capacity != 0 && callsLeft-- <= 0) return false;
    return kterr::defaultReallocJson(status, capacity);
  }
};

// One object or array that fills the text, zeros behind it, the sentinel last.
inline void expectWellFormed(const tStatus& status) {
  ASSERT_NE(status.json, nullptr);
  const std::size_t length = std::strlen(status.json);
  ASSERT_GE(status.capacity, length + 2);
  EXPECT_EQ(kterr::findEnd(status.json), status.json + length - 1) << status.json;
  const std::string behind(status.json + length, status.capacity - length);
  EXPECT_EQ(behind, std::string(behind.size() - 1, '\0') + kterr::kSentinel);
}
