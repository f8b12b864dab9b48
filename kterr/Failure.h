// How the library fails: one statement that names the constant, the place and the values, in the order in which they
// stand in the elaboration.
//
//   kterr::Failure(ktorba_errors::kErrorNumSamplesInWaveformMustBeGreaterThanZero)
//       .at(kSource)
//       .usage(kterr::kUsageTypeWaveformLength, numSamples)
//       .raise();
//
// Source names are frozen texts, not file paths of a build: hosts match on them. Values that cannot be written for
// want of memory are left out; the code is always set.
#pragma once

#include <concepts>
#include <string>

#include "kterr/Elaboration.h"
#include "kterr/Exception.h"

namespace kterr {

// Writes elaborations into a record that it borrows: the part of a failure that does not throw.
class ElaborationWriter {
 public:
  // Opens the elaboration of `status`, whose code has just been set, and writes "error_constant" (left out when
  // `constantText` is null).
  ElaborationWriter(tStatus& status, const char* constantText);

  void place(const char* file, std::uint32_t line);
  void message(const char* key, const char* text);
  void translator();  // opens the "translator" block; done by usage() and comment() as well
  void comment(const char* text);

  template <typename Value>
  void usage(const char* tag, Value value) {
    translator();
    cursor_ = addUsage(cursor_, tag, value);
  }

 private:
  void leaveTranslator();  // members of the top-level object do not go into the block

  JsonCursor cursor_;  // end of the top-level object, or of ordered_data once the block is open
  bool inTranslator_ = false;
  bool hasBlock_ = false;
};

class [[nodiscard]] Failure {
 public:
  explicit Failure(const ErrorConstant& constant);

  // Adds the place. The line is the caller's unless a frozen one is given.
  Failure& at(const char* source, std::uint32_t line = __builtin_LINE());

  // Adds a message pair: usually the name of the raising function and what went wrong.
  Failure& message(const char* key, const char* text);

  // Adds a typed value under one of the tags of usageTags.h or a descriptive text.
  template <typename Value>
  requires std::integral<Value> || std::floating_point<Value> Failure& usage(const char* tag, Value value) {
    writer_.usage(tag, value);
    return *this;
  }
  Failure& usage(const char* tag, const std::string& value);
  Failure& usage(const char* tag, const char* value);

  // Throws the failure as kterr::Exception. Inline: each frame that an exception leaves costs more than its text.
  [[noreturn]] void raise() { throw exception_; }

 private:
  Exception exception_;
  ElaborationWriter writer_;
};

}  // namespace kterr
