// The bounds within which the engine can drive a generator at all.
#pragma once

#include "ktorba/hwRecords/HWTraits.h"

namespace ktorba {

// Raises ktorba_errors::kErrorInternalSWError, with a message that names the trait and its value, for traits that the
// engine's arithmetic and the byte masks of memory writes cannot express. Call it before traits are used.
void requireWorkableTraits(const HWTraits& traits);

}  // namespace ktorba
