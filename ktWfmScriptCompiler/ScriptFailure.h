// A failure at a place in the script: line and position are the first two values of its elaboration.
#pragma once

#include "ktWfmScriptCompiler/SourcePosition.h"
#include "kterr/Failure.h"

namespace ktwfmscriptcompiler {

class [[nodiscard]] ScriptFailure : public kterr::Failure {
 public:
  ScriptFailure(const kterr::ErrorConstant& constant, const char* source, SourcePosition place,
                std::uint32_t line = __builtin_LINE())
      : Failure(constant) {
    at(source, line)
        .usage(kterr::kUsageTypeLineNumber, place.line)
        .usage(kterr::kUsageTypePositionInLine, place.positionInLine);
  }
};

}  // namespace ktwfmscriptcompiler
