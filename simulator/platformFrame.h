// The frame of every platform call: the FPGA's lock, the call log, faults on demand, and no exception beyond it.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <mutex>
#include <new>
#include <string>
#include <utility>

#include "simulator/Fpga.h"

namespace simulator {

struct Outcome {
  std::int32_t code;
  std::string elaboration;  // JSON of a failure on demand; empty for any other
};

// Makes one platform call: `describe` gives its line for the record, `body` carries it out and returns a code; both get
// the FPGA.
template <typename Describe, typename Body>
Outcome runPlatformCall(const std::shared_ptr<Fpga>& fpga, const char* function, Describe describe,
                        Body body) noexcept {
  if (fpga == nullptr) return {KTSIM_E_SESSION, {}};
  try {
    const std::lock_guard lock(fpga->mutex);
    const bool isRecording = fpga->calls.isRecording();
    const std::string line = isRecording ? describe(*fpga) : std::string();
    CallLog::Failure failure = fpga->calls.begin(function);
    std::int32_t code = failure.code < 0 ? failure.code : body(*fpga);
    if (code == 0) code = failure.code;
    if (isRecording) fpga->calls.write(line, code);
    return {code, std::move(failure.elaboration)};
  } catch (const std::bad_alloc&) {
    return {KTSIM_E_MEMORY, {}};
  } catch (...) {
    return {KTSIM_E_INTERNAL, {}};
  }
}

struct Argument {
  const char* name;
  std::uint64_t value;
  const char* text = nullptr;  // in place of the value
};

// "function name=value name=text"
inline std::string describeCall(const char* function, std::initializer_list<Argument> arguments) {
  std::string line = function;
  for (const Argument& argument : arguments) {
    line.append(" ").append(argument.name).append("=");
    line += argument.text != nullptr ? argument.text : std::to_string(argument.value);
  }
  return line;
}

}  // namespace simulator
