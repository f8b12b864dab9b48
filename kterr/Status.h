// The two status records and the operations on them. A record holds a signed 32-bit code: negative is an error,
// positive a warning, zero success. An error is never replaced, a warning only by an error, success by anything
// that is not zero; so the first error set on a record wins, and with it the elaboration that belongs to it.
//
// None of these operations throws or locks: a record belongs to one thread at a time.
//
// tStatus itself is public (<ktorba/ktorba.h>). Invariants of its buffer `json` of `capacity` bytes:
//   - one NUL-terminated JSON text whose outermost value is an object;
//   - every byte between that NUL and the last byte is zero, and the last byte is the sentinel 'J';
//     the free room is found by counting those zero bytes, so no length is stored.
#pragma once

#include <cstdint>

#include "ktorba/ktorba.h"

namespace kterr {

// Longest elaboration text, in bytes without the NUL.
inline constexpr std::uint32_t kMaxJsonLength = 0x7FFFFFFD;
// Last byte of every elaboration buffer.
inline constexpr char kSentinel = 'J';

// An empty record: code 0, no buffer, defaultReallocJson.
tStatus makeStatus();

// Applies the priority rule; returns whether `newCode` replaced the record's code. When it did and there is a
// buffer, the text becomes "{}" (it stays when a buffer below 4 bytes cannot be grown; the result is true all the
// same).
bool setCode(tStatus& status, std::int32_t newCode);

// Replaces the text by a copy of `text` (null stands for "{}"). Returns false, the old text kept, when `text` is
// longer than kMaxJsonLength or the buffer cannot be grown to hold it.
bool setJson(tStatus& status, const char* text);

// When `source`'s code replaces `destination`'s, the text follows: taken over from `source`, which is left without a
// buffer, where both records use the same callback; copied where they do not.
void mergeStatus(tStatus& destination, tStatus& source);

// Makes sure that the record has a buffer of at least `capacity` bytes. Returns false when its callback refuses.
bool ensureCapacity(tStatus& status, std::uint32_t capacity);

// Makes sure that the text of a record that others have written ends within its buffer, cutting it off there if need
// be. Returns whether there is a text.
bool terminateJson(tStatus& status);

// Frees the buffer through the record's own callback; the code stays.
void freeJson(tStatus& status);

// The callback of every record made inside the library, over malloc and free. 0 frees; sizes up to the present
// capacity change nothing; else the buffer becomes 512 bytes or the next power of two, its text kept ("{}" where
// there was none). Returns false, nothing changed, above 0x7FFFFFFF or when memory cannot be had.
bool defaultReallocJson(tStatus* status, std::uint32_t newCapacity);

// Stamps `text` into a buffer so that the invariants above hold: text, NUL, zeros, sentinel. A null `text` re-stamps
// what the buffer holds. Returns false, nothing changed, when `capacity` is at most strlen(text) + 1.
bool copyJson(char* buffer, std::uint32_t capacity, const char* text);

// An empty record that frees its text when it goes, whatever has become of it.
struct OwnedStatus : tStatus {
  OwnedStatus() : tStatus(makeStatus()) {}
  ~OwnedStatus() { freeJson(*this); }
  OwnedStatus(const OwnedStatus&) = delete;
  OwnedStatus& operator=(const OwnedStatus&) = delete;
};

// The fixed-size record of the lower layers: the place of a failure, no text.
struct tLocatedStatus {
  std::uint32_t structSize;  // bytes; `component`, `file` and `line` are used only from kLocatedStatusSize up
  std::int32_t code;
  char component[10];  // NUL-terminated
  char file[101];      // NUL-terminated; longer paths keep their first and last 49 characters around ".."
  std::uint32_t line;
  std::uint64_t reserved;  // 0; part of the layout, used by nothing here
};

// What structSize holds when the text fields may be used; frozen with the record's layout at the platform boundary.
inline constexpr std::uint32_t kLocatedStatusSize = 208;

// {208, 0, "", "", 0, 0}
tLocatedStatus makeLocatedStatus();

inline bool failed(const tLocatedStatus& status) { return status.code < 0; }

// The priority rule; returns whether `newCode` replaced the code.
bool setCode(tLocatedStatus& status, std::int32_t newCode);

// Sets the code by the priority rule and, when that replaced it and the record is of full size, the place.
// Over-long components are cut, over-long paths shortened in their middle.
void mergeCode(tLocatedStatus& status, std::int32_t newCode, const char* component, const char* file,
               std::uint32_t line);

// The component that every failure of this library names.
inline constexpr char kComponent[] = "ktorbau";

}  // namespace kterr
