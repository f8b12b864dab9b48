// Internal to this folder: how a call into the interface framework reports into the caller's located status.
#pragma once

#include "ktifw_lib_client/Interfaces.h"

namespace ktifw_lib_client {

using ktifw::Status;

// The record that one framework call gets: its code and elaboration until they are merged into a located status.
class FrameworkStatus {
 public:
  explicit FrameworkStatus(std::int32_t code) { status_.code = code; }

  tStatus* get() { return &status_; }

  // Takes the code by the priority rule and, where there is an elaboration, the place that it names: the ends of
  // "component" and "file", made valid UTF-8, and "line". Reads no further than the record says that its text reaches.
  void mergeInto(Status& status);

 private:
  kterr::OwnedStatus status_;
};

// Runs `call` with a framework record that starts at `code`, then merges the record into `status`.
template <typename Call>
void callFramework(Status& status, std::int32_t code, const Call& call) {
  FrameworkStatus framework(code);
  call(framework.get());
  framework.mergeInto(status);
}

// Reports that memory for a result array or a register transfer could not be had.
void setOutOfMemory(Status& status, std::uint32_t line = __builtin_LINE());

}  // namespace ktifw_lib_client
