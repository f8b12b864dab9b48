// The border between the compiler's records and the engine's: types of the same shape, so that neither side's
// records change with the other's.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/CompiledScript.h"
#include "ktorba/script/CompiledScript.h"

namespace ktorba {

// Copies the scripts field by field; names are moved.
std::vector<CompiledScript> toEngineRecords(std::vector<ktwfmscriptcompiler::CompiledScript>&& scripts);

}  // namespace ktorba
