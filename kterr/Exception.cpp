#include "kterr/Exception.h"

#include <utility>

#include "kterr/Elaboration.h"

namespace kterr {
namespace {

// Enough for the longest path and line number of a located record, so that its place is written without growing.
constexpr std::uint32_t kPlaceCapacity = 258;

JsonCursor openPlace(tStatus& status) {
  return ensureCapacity(status, kPlaceCapacity) ? openElaboration(status) : JsonCursor{};
}

void elaborate(tStatus& status, const tLocatedStatus& place) {
  if (place.file[0] != '\0') put(put(openPlace(status), "file", place.file), "line", place.line);
  if (place.component[0] != '\0') put(openPlace(status), "component", place.component);
}

// Exceptions that were propagating on this thread when the library was entered.
thread_local int foreignExceptions = 0;

bool isPropagating() { return std::uncaught_exceptions() > foreignExceptions; }

}  // namespace

CallScope::CallScope() : outer_(std::exchange(foreignExceptions, std::uncaught_exceptions())) {}

CallScope::~CallScope() { foreignExceptions = outer_; }

ExceptionBase::~ExceptionBase() { status_.code = 0; }

const char* ExceptionBase::getJson() const noexcept { return status_.json; }

Exception::Exception(const Exception& other) : ExceptionBase(), std::exception() {
  mergeStatus(status_, other.status());
}

const char* Exception::what() const noexcept { return getJson(); }

void raiseIfError(tStatus& status) {
  if (status.code >= 0 || isPropagating()) return;
  Exception exception;
  mergeStatus(exception.status(), status);
  throw exception;
}

void raiseLocated(const tLocatedStatus& status) {
  if (status.code >= 0 || isPropagating()) return;
  Exception exception;
  if (setCode(exception.status(), status.code) && status.structSize >= kLocatedStatusSize) {
    elaborate(exception.status(), status);
  }
  throw exception;
}

}  // namespace kterr
