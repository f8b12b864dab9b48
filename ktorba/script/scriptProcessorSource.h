// The source name under which failures of script processing are raised. Frozen: hosts match on it.
#pragma once

namespace ktorba {

inline constexpr char kScriptProcessorSource[] = R"(ktorba\script\ScriptProcessor)";

}  // namespace ktorba
