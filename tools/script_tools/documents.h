// The documents of the C interface. All are UTF-8 JSON with "schema" 1.
#pragma once

#include <string>
#include <vector>

#include "tools/diagnostics/Diagnostic.h"
#include "tools/program/ProgramBuilder.h"

namespace tools {

struct WaveformFit {
  std::string name;
  std::uint64_t samples = 0;
  std::string reason;  // why it has no place; empty: it has one
};

std::string makeCheckDocument(const ScriptFile& file, const std::vector<Diagnostic>& diagnostics);
std::string makeListDocument(const Program& program, const ProgramBuilder& builder);
std::string makeFitDocument(const ScriptFile& file, const ProgramBuilder& builder,
                            const std::vector<WaveformFit>& waveforms, const std::vector<Program>& programs,
                            const std::vector<Diagnostic>& diagnostics);
std::string makeErrorTable();
// "error": what went wrong with the call itself.
std::string makeErrorDocument(const std::string& message);

}  // namespace tools
