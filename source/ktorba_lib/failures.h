// The failures that the exported functions raise themselves: a constant and one message pair, from one frozen place.
// Any thread may call.
#pragma once

#include <cstdint>

#include "kterr/ErrorConstant.h"

namespace ktorba_lib {

// Raises `constant` with the message pair `function`: `message`.
[[noreturn]] void raise(const kterr::ErrorConstant& constant, const char* function, const char* message,
                        std::uint32_t line = __builtin_LINE());

// Raises nKTAPALS100_tStatus_kInvalidParameter in the same way when `argument` is null.
void requireArgument(const void* argument, const char* function, const char* message,
                     std::uint32_t line = __builtin_LINE());

}  // namespace ktorba_lib
