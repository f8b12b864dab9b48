// The documents of the C interface. All are UTF-8 JSON with "schema" 1.
#pragma once

#include <span>
#include <string>
#include <vector>

#include "tools/diagnostics/Diagnostic.h"
#include "tools/difference/compareScripts.h"
#include "tools/fit/Fit.h"
#include "tools/program/ProgramBuilder.h"

namespace tools {

std::string makeCheckDocument(const ScriptFile& file, const std::vector<Diagnostic>& diagnostics);
std::string makeListDocument(const Program& program, const ProgramBuilder& builder);
std::string makeFitDocument(const ScriptFile& file, const Fit& fit);
std::string makeDifferenceDocument(std::span<const ComparedScripts> scripts);
std::string makeErrorTable();
// "error": what went wrong with the call itself.
std::string makeErrorDocument(const std::string& message);

}  // namespace tools
