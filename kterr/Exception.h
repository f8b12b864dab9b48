// The one exception type of the library: it carries a tStatus, that is a code and the elaboration of the failure.
// Always thrown as kterr::Exception; caught as that, as ExceptionBase or as std::exception. An exception belongs to
// one thread at a time.
//
// Raise sites do not build exceptions by hand: see kterr/Failure.h.
#pragma once

#include <exception>

#include "kterr/Status.h"

namespace kterr {

class ExceptionBase {
 public:
  ExceptionBase() = default;
  virtual ~ExceptionBase();  // frees the text through the record's own callback
  ExceptionBase(const ExceptionBase&) = delete;
  ExceptionBase& operator=(const ExceptionBase&) = delete;

  // The elaboration text, owned by this object; null when there is none.
  virtual const char* getJson() const noexcept;

  std::int32_t code() const noexcept { return status_.code; }
  tStatus& status() const noexcept { return status_; }

 protected:
  // Mutable because copying an exception moves its text to the copy: the thrown object owns it, and the object
  // copied from is left with the code alone.
  mutable OwnedStatus status_;
};

class Exception : public virtual ExceptionBase, public virtual std::exception {
 public:
  Exception() = default;
  Exception(const Exception& other);
  Exception& operator=(const Exception&) = delete;

  const char* what() const noexcept override;  // as getJson()
};

// One call from outside into the library, from its construction to its destruction. What propagates on the thread when
// it begins is the host's affair: a host may call from a destructor that its own exception runs, and failures are
// raised then as ever. Outside of any call, every exception counts as the library's own. Calls may nest.
class CallScope {
 public:
  CallScope();
  ~CallScope();
  CallScope(const CallScope&) = delete;
  CallScope& operator=(const CallScope&) = delete;

 private:
  int outer_;
};

// Throws when `status` holds an error, taking its text over; does nothing while another exception of the library is
// propagating. The bridge from code that reports into a record.
void raiseIfError(tStatus& status);

// Throws when `status` holds an error, with "file", "line" and "component" as far as it gives them and no
// "error_constant"; does nothing while another exception of the library is propagating. Called right after a lower
// layer returns.
void raiseLocated(const tLocatedStatus& status);

}  // namespace kterr
