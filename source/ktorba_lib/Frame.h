// What every exported function runs inside: an error that the caller's record holds already is honoured, what the body
// raises becomes a code, and no exception of the library crosses into the host. Reentrant; keeps no state.
#pragma once

#include <cstdint>
#include <exception>

#include "kterr/Exception.h"

namespace ktorba_lib {

// Whose record the end of a call hands its code and text to: null in libktorba, the caller's in
// libktorba_elaborating. The two libraries differ in nothing else; each links its own definition.
tStatus* elaborationTarget(tStatus* caller) noexcept;

// The private record of one call. Nothing here throws, also when memory runs out.
class CallRecord {
 public:
  void take(const kterr::ExceptionBase& error) noexcept;
  void takeForeign() noexcept;  // any other standard exception, a failed allocation for one

  // Hands code and text over to `target`, unless that is null, and returns the code.
  std::int32_t finish(tStatus* target) noexcept;

 private:
  kterr::OwnedStatus status_;
};

// Runs `body` as one exported call and returns its code: the caller's own at once when that is an error, else 0 or
// the code of what the body raised. `caller` may be null.
template <typename Body>
std::int32_t atBoundary(tStatus* caller, Body body) {
  if (caller != nullptr && caller->code < 0) return caller->code;
  const kterr::CallScope scope;
  CallRecord record;
  try {
    body();
  } catch (const kterr::ExceptionBase& error) {
    record.take(error);
  } catch (const std::exception&) {
    record.takeForeign();
  }
  return record.finish(elaborationTarget(caller));
}

}  // namespace ktorba_lib
