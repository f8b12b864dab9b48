// A failure at a place in the script: line and position are the first two values of its elaboration.
#pragma once

#include <source_location>

#include "ktWfmScriptCompiler/SourcePosition.h"
#include "kterr/Failure.h"

namespace ktwfmscriptcompiler {

class [[nodiscard]] ScriptFailure : public kterr::Failure {
 public:
  ScriptFailure(const kterr::ErrorConstant& constant, const char* source, SourcePosition place,
                std::source_location here = std::source_location::current())
      : Failure(constant) {
    at(source, here)
        .usage(kterr::kUsageTypeLineNumber, place.line)
        .usage(kterr::kUsageTypePositionInLine, place.positionInLine);
  }
};

}  // namespace ktwfmscriptcompiler
