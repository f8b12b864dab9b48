// What a call raises, for tests to look at.
#pragma once

#include <gtest/gtest.h>

#include <string>

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

// Its code with its elaboration right behind, or nothing where `call` raises none.
template <typename Call>
std::string failureOf(const Call& call) {
  try {
    call();
  } catch (const kterr::Exception& exception) {
    return std::to_string(exception.code()) + (exception.getJson() != nullptr ? exception.getJson() : "");
  }
  return "";
}
