// The step from the layers that report into a located status to the engine, where failures are exceptions.
#pragma once

#include "kterr/Exception.h"

namespace ktorba {

// Calls `operation` with a fresh located status and raises the error that it reports there, unless another exception
// of the library is already propagating. Returns whether there was none: what goes on to the next step asks.
template <typename Operation>
bool raisingLocated(Operation&& operation) {
  kterr::tLocatedStatus status = kterr::makeLocatedStatus();
  operation(status);
  kterr::raiseLocated(status);
  return !failed(status);
}

// The same for a step of a transfer, which a failure must end in any case: one that went on would never come to its
// end, or to the wrong one. `end` raises where the error itself is not raised.
template <typename Operation>
void raisingLocatedOr(void (*end)(), Operation&& operation) {
  if (!raisingLocated(operation)) end();
}

}  // namespace ktorba
