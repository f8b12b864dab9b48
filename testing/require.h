// Expectations outside of GoogleTest's tests: in fuzzers, models, and what stands around tests.
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

// Throws std::logic_error with the words where `holds` is false.
inline void require(bool holds, std::string_view words) {
  if (!holds) throw std::logic_error(std::string(words));
}
