#include "ktWfmScriptCompiler/ParseTree.h"

#include "kterr/Failure.h"

namespace ktwfmscriptcompiler {

void raiseWrongNode() { kterr::Failure(ktmxl::kErrorSoftwareFault).at(R"(ktWfmScriptCompiler\ParseTree)").raise(); }

}  // namespace ktwfmscriptcompiler
