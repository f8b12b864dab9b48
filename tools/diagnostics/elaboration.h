// Turns the library's failures, codes with their JSON elaborations, into diagnostics.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "kterr/ErrorConstant.h"
#include "tools/diagnostics/Diagnostic.h"

namespace tools {

// The row of the error table for a constant's text, or else for a code; null when there is none.
const kterr::ErrorConstant* findErrorConstant(const std::string& text);
const kterr::ErrorConstant* findErrorConstant(std::int32_t code);

// What to do about an error, in words of the tools: of the library's own, which are for programs, some send to "the
// elaboration", which only those have.
std::string helpOf(const kterr::ErrorConstant& constant);

// What failed, in words, with the values of the failing request; line and position where the elaboration gives them.
// `elaboration` may be null or anything that is no elaboration: then the code alone speaks.
Diagnostic diagnoseFailure(std::int32_t code, const char* elaboration);

}  // namespace tools
