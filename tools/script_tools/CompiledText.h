// What stands behind a ktTools_Program: a text, its scripts, and the samples of their waveforms as far as the caller
// has lent them. Shared by the timelines that are made of it.
#pragma once

#include <map>
#include <memory>
#include <string>
#include <vector>

#include "ktcheckname/compareNames.h"
#include "ktorba/script_tools.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/recording/SampleBuffer.h"

namespace tools {

struct CompiledText {
  CompiledText(std::string text, const GeneratorOptions& options)
      : generator(options), file("script", std::move(text)), builder(options) {}

  GeneratorOptions generator;
  ScriptFile file;
  ProgramBuilder builder;
  std::vector<Program> programs;
  std::map<std::string, SampleSpan, ktcheckname::NameLess> samples;
};

}  // namespace tools

struct ktTools_Program {
  std::shared_ptr<tools::CompiledText> compiled;
};
