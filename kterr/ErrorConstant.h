// The library's error constants as C++ values, one per row of errors.def: what raise sites name, and the list that
// documentation and tools read. All of it is constant data; any thread may read it.
#pragma once

#include <cstdint>
#include <span>

namespace kterr {

struct ErrorConstant {
  const char* text;     // as written under "error_constant"; null where the elaboration carries no such key
  std::int32_t code;    // negative
  const char* cName;    // name in <ktorba/error_codes.h>
  const char* meaning;  // what happened, one sentence
  const char* help;     // what the user can do about it
};

// Every constant, in the order of errors.def.
std::span<const ErrorConstant> allErrorConstants();

}  // namespace kterr

// The namespaces are those of the constants' texts.
#define KTORBA_ERROR(scope, name, code, meaning, help)                                                  \
  namespace scope {                                                                                     \
  inline constexpr kterr::ErrorConstant name{#scope "::" #name, code, #scope "_" #name, meaning, help}; \
  }
#define KTORBA_PLATFORM(name, code, meaning, help) \
  inline constexpr kterr::ErrorConstant name{#name, code, "ktorba_" #name, meaning, help};
#define KTORBA_CODE(name, code, text, meaning, help)                                            \
  namespace ktorba_codes {                                                                      \
  inline constexpr kterr::ErrorConstant name{text, code, "ktorba_codes_" #name, meaning, help}; \
  }
#include "kterr/errors.def"
#undef KTORBA_ERROR
#undef KTORBA_PLATFORM
#undef KTORBA_CODE
