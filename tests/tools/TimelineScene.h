// Scripts and waveforms as the timeline sees them, built for a small generator.
#pragma once

#include <gtest/gtest.h>

#include <cstring>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "testing/RandomScript.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace tools {

inline GeneratorOptions randomGenerator(Random& random) {
  GeneratorOptions generator;
  generator.sampleWidthBits = pick(random, 0, 1) == 0 ? 16 : 32;
  generator.minFetchSamples = pick(random, 8, 64);
  generator.memorySizeBytes = 1u << 16;
  generator.memoryWordBytes = 8u << pick(random, 0, 1);
  return generator;
}

// A program, its waveforms in sample memory, and the timeline of it.
struct Scene {
  Scene(const std::string& text, const scripts::Waveforms& waveforms, const GeneratorOptions& options,
        std::vector<RaisedTrigger> triggers)
      : raised(std::move(triggers)), generator(options), file("script.kts", text), builder(generator) {
    std::vector<Diagnostic> diagnostics;
    builder.compile(file, diagnostics);
    memory.resize(generator.memorySizeBytes);
    for (const auto& [name, samples] : waveforms) place(name, samples);
    std::vector<Program> programs = builder.build(diagnostics);
    if (programs.size() != 1 || !diagnostics.empty()) throw std::runtime_error("the script builds");
    words = programs[0].entry.instructionWords;
    timeline.emplace(StraightPlay(programs[0], builder), raised);
    for (const std::string& name : timeline->play().waveforms()) sources.push_back(&buffers.at(name));
  }

  void place(const std::string& name, const scripts::Samples& samples) {
    const std::uint32_t offset = builder.addWaveform(name, samples.size()).memoryOffset;
    SampleBuffer buffer(generator.sampleWidthBits);
    for (const std::uint32_t sample : samples) {
      buffer.push(generator.sampleWidthBits == 16 ? static_cast<std::int16_t>(sample)
                                                  : static_cast<std::int32_t>(sample));
    }
    buffer.visit(
        [&](const auto& typed) { std::memcpy(memory.data() + offset, typed.data(), typed.size() * sizeof(typed[0])); });
    buffers.emplace(name, std::move(buffer));
  }

  std::vector<RaisedTrigger> raised;
  GeneratorOptions generator;
  ScriptFile file;
  ProgramBuilder builder;
  std::vector<std::byte> memory;
  std::map<std::string, SampleBuffer> buffers;
  std::vector<nSequenceInstruction::SequenceInstructionWords> words;
  std::optional<Timeline> timeline;
  TimelineWaveforms sources;
};

}  // namespace tools
