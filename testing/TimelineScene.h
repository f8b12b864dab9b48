// Scripts and waveforms as the timeline sees them, built for a small generator, and what the simulated sequencer plays
// of them.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

#include "testing/RandomScript.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace tools {

GeneratorOptions randomGenerator(Random& random);

// A program, its waveforms in sample memory, and the timeline of it.
class Scene {
 public:
  // Throws std::runtime_error where the text is not one script that builds.
  Scene(const std::string& text, const scripts::Waveforms& waveforms, const GeneratorOptions& options,
        std::vector<RaisedTrigger> triggers);

  std::vector<RaisedTrigger> raised;
  GeneratorOptions generator;
  ScriptFile file;
  ProgramBuilder builder;
  std::vector<std::byte> memory;
  std::map<std::string, SampleBuffer> buffers;
  std::vector<nSequenceInstruction::SequenceInstructionWords> words;
  std::vector<Place> places;  // of the words
  std::optional<Timeline> timeline;
  TimelineWaveforms sources;

 private:
  void place(const std::string& name, const scripts::Samples& samples);
};

struct TracedRun {
  std::uint64_t firstSample;
  std::uint32_t address;
  std::uint64_t pass;
  bool operator==(const TracedRun&) const = default;
};

// What the sequencer plays of a program, up to a limit.
struct SequencerPlay {
  std::vector<std::int32_t> levels;
  std::vector<std::uint8_t> markers;
  std::vector<TracedRun> runs;
  bool isDone = false;
};

// Throws std::logic_error when the sequencer finds a fault.
SequencerPlay simulate(const Scene& scene, std::uint64_t limit);

}  // namespace tools
