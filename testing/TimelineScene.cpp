#include "testing/TimelineScene.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>

#include "simulator/Sequencer.h"
#include "testing/require.h"

namespace tools {

GeneratorOptions randomGenerator(Random& random) {
  GeneratorOptions generator;
  generator.sampleWidthBits = pick(random, 0, 1) == 0 ? 16 : 32;
  generator.minFetchSamples = pick(random, 8, 64);
  generator.memorySizeBytes = 1u << 16;
  generator.memoryWordBytes = 8u << pick(random, 0, 1);
  return generator;
}

Scene::Scene(const std::string& text, const scripts::Waveforms& waveforms, const GeneratorOptions& options,
             std::vector<RaisedTrigger> triggers)
    : raised(std::move(triggers)), generator(options), file("script.kts", text), builder(generator) {
  std::vector<Diagnostic> diagnostics;
  builder.compile(file, diagnostics);
  memory.resize(generator.memorySizeBytes);
  for (const auto& [name, samples] : waveforms) place(name, samples);
  std::vector<Program> programs = builder.build(diagnostics);
  if (programs.size() != 1 || !diagnostics.empty()) throw std::runtime_error("the script builds");
  words = programs[0].entry.instructionWords;
  places = programs[0].places;
  timeline.emplace(StraightPlay(programs[0], builder), raised);
  for (const std::string& name : timeline->play().waveforms()) sources.push_back(buffers.at(name));
}

void Scene::place(const std::string& name, const scripts::Samples& samples) {
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

SequencerPlay simulate(const Scene& scene, std::uint64_t limit) {
  using namespace simulator;
  const std::uint32_t width = scene.generator.bytesPerSample();
  const MemoryGeometry geometry{width, scene.generator.memoryWordBytes / width,
                                scene.generator.memorySizeBytes / scene.generator.memoryWordBytes,
                                scene.generator.sequenceWords};
  StreamingRange streaming(geometry.sampleMemoryWords, geometry.samplesPerWord);
  DeviceFaults faults;
  ktSim_Counters counters{};
  std::vector<nSequenceInstruction::SequenceInstructionWords> sequence(scene.generator.sequenceWords);
  std::ranges::copy(scene.words, sequence.begin());
  Sequencer sequencer({geometry, scene.memory.data(), sequence.data(), streaming, faults, counters});
  sequencer.setTrace(LazyQueue<ktSim_TraceEntry>(limit));
  sequencer.initiate();
  for (const RaisedTrigger& trigger : scene.raised) sequencer.raiseAt(trigger.trigger, trigger.sample);
  SequencerPlay play;
  std::vector<std::byte> samples(limit * width);
  play.markers.resize(limit);
  DirectOutput output(samples.data(), play.markers.data(), width);
  play.markers.resize(sequencer.play(limit, output));
  for (std::uint64_t sample = 0; sample < play.markers.size(); ++sample) {
    std::int16_t narrow = 0;
    std::int32_t wide = 0;
    if (width == 2) std::memcpy(&narrow, samples.data() + sample * 2, 2);
    if (width == 4) std::memcpy(&wide, samples.data() + sample * 4, 4);
    play.levels.push_back(width == 2 ? narrow : wide);
  }
  for (std::uint64_t entry = 0; entry < sequencer.trace().size(); ++entry) {
    const ktSim_TraceEntry& traced = sequencer.trace().head()[entry];
    const auto opcode = traced.words[3] >> 28;
    if (opcode == 1 || opcode == 5) play.runs.push_back({traced.firstSample, traced.address, traced.loopPass});
  }
  play.isDone = sequencer.isDone();
  require(faults.count() == 0, "no fault");
  return play;
}

}  // namespace tools
