// What a call raises, for tests to look at.
#pragma once

#include <gtest/gtest.h>

#include "kterr/Exception.h"

// The failure that `call` raises; an empty one, and the test fails, where it raises none.
template <typename Call>
kterr::Exception caught(const Call& call) {
  try {
    call();
  } catch (const kterr::Exception& exception) {
    return exception;
  }
  ADD_FAILURE() << "nothing was raised";
  return {};
}
