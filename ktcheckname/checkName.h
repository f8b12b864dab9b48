// The rule for the name of a new waveform.
#pragma once

#include "ktorba/ktorba.h"

namespace ktcheckname {

// Longest name, in bytes.
inline constexpr unsigned kMaxNameLength = 511;

// Records the first fault of `name` in `status`, code and elaboration; leaves `status` alone when the name is good or
// the record holds an error already. Does not throw: raise the record afterwards (kterr::raiseIfError).
void checkName(const char* name, tStatus& status);

}  // namespace ktcheckname
