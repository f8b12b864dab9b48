// The step from the layers that report into a located status to the engine, where failures are exceptions.
#pragma once

#include "kterr/Exception.h"

namespace ktorba {

// Calls `operation` with a fresh located status and raises the error that it reports there, unless another exception
// is already propagating.
template <typename Operation>
void raisingLocated(Operation&& operation) {
  kterr::tLocatedStatus status = kterr::makeLocatedStatus();
  operation(status);
  kterr::raiseLocated(status);
}

}  // namespace ktorba
