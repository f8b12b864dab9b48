// What is computed against what the simulated sequencer plays: samples, markers and runs of random scripts with random
// triggers, and every question that can be asked of a timeline against the plain answer from all samples.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <sstream>

#include "testing/TimelineScene.h"
#include "testing/golden.h"
#include "tools/timeline/LevelRanges.h"

namespace tools {
namespace {

constexpr std::uint32_t kLimit = 6'000;  // samples compared of a script

std::vector<std::int32_t> renderedLevels(const Scene& scene, std::uint64_t begin, std::uint64_t count,
                                         std::vector<std::uint8_t>& markers) {
  const Renderer renderer(*scene.timeline, scene.sources, scene.generator.sampleWidthBits);
  SampleBuffer buffer(scene.generator.sampleWidthBits);
  buffer.resize(count);
  markers.assign(count, 0xEE);
  const std::uint64_t rendered = renderer.render(begin, count, buffer.data(), markers.data());
  markers.resize(rendered);
  std::vector<std::int32_t> levels;
  for (std::uint64_t sample = 0; sample < rendered; ++sample) levels.push_back(buffer[sample]);
  return levels;
}

std::vector<TracedRun> runsBefore(const Timeline& timeline, std::uint64_t limit) {
  std::vector<TracedRun> runs;
  for (RunCursor cursor(timeline, 0); !cursor.isAtEnd() && cursor.run().firstSample < limit; cursor.next()) {
    runs.push_back({cursor.run().firstSample, timeline.play().steps()[cursor.run().step].address, cursor.run().pass});
  }
  return runs;
}

void expectEqualPlay(const Scene& scene, const SequencerPlay& simulated) {
  std::vector<std::uint8_t> markers;
  EXPECT_EQ(renderedLevels(scene, 0, kLimit, markers), simulated.levels);
  EXPECT_EQ(markers, simulated.markers);
  EXPECT_EQ(runsBefore(*scene.timeline, simulated.levels.size()), simulated.runs);
  const auto length = scene.timeline->length().samples();
  EXPECT_EQ(length && *length <= kLimit, simulated.isDone);
  if (simulated.isDone) {
    EXPECT_EQ(length, simulated.levels.size());
  }
}

// Windows anywhere, behind the end too.
void expectEqualAnswers(const Scene& scene, const SequencerPlay& simulated, Random& random) {
  const Timeline& timeline = *scene.timeline;
  const LevelRanges ranges(timeline, scene.sources, scene.generator.sampleWidthBits);
  const auto played = static_cast<std::uint32_t>(simulated.levels.size());
  for (int question = 0; question < 8; ++question) {
    const std::uint32_t begin = pick(random, 0, played - 1);
    const std::uint32_t end = pick(random, begin, std::min(played, begin + (question < 4 ? 100 : kLimit)));
    LevelRange range;
    for (std::uint32_t sample = begin; sample < end; ++sample) range.add(simulated.levels[sample]);
    EXPECT_EQ(ranges.over(begin, end), range) << begin << " to " << end;
    std::vector<std::uint8_t> markers;
    EXPECT_EQ(renderedLevels(scene, begin, end - begin, markers),
              std::vector(simulated.levels.begin() + begin, simulated.levels.begin() + end));
    EXPECT_EQ(markers, std::vector(simulated.markers.begin() + begin, simulated.markers.begin() + end));
    const auto run = timeline.runAt(begin);
    const auto next = std::ranges::upper_bound(simulated.runs, begin, {}, &TracedRun::firstSample);
    EXPECT_EQ(run->firstSample, (next - 1)->firstSample);
    const std::uint32_t marker = pick(random, 0, ktorba::kMarkerCount - 1);
    std::vector<std::uint64_t> pulses;
    for (std::uint32_t sample = 0; sample < end; ++sample) {
      if ((simulated.markers[sample] >> marker & 1) != 0) pulses.push_back(sample);
    }
    const auto before = std::ranges::lower_bound(pulses, begin) - pulses.begin();
    EXPECT_EQ(timeline.markerCount(marker, begin, end), pulses.size() - static_cast<std::size_t>(before));
    for (std::size_t n = 0; n < pulses.size(); ++n) EXPECT_EQ(timeline.markerPulse(marker, n), pulses[n]);
  }
}

TEST(Timeline, EqualsWhatTheSequencerPlays) {
  forEachSeed(20'000, [](Random& random) {
    const GeneratorOptions generator = randomGenerator(random);
    const scripts::Waveforms waveforms =
        scripts::randomWaveforms(random, generator.minFetchSamples, 1000, generator.sampleWidthBits);
    std::vector<RaisedTrigger> raised;
    for (std::uint32_t left = pick(random, 0, 12); left > 0; --left) {
      raised.push_back({pick(random, 0, kLimit), static_cast<std::uint8_t>(pick(random, 2, 8))});
    }
    const std::string text = scripts::randomScript(random, waveforms, generator.minFetchSamples);
    const Scene scene(text, waveforms, generator, raised);
    const SequencerPlay simulated = simulate(scene, kLimit);
    SCOPED_TRACE(text);
    expectEqualPlay(scene, simulated);
    expectEqualAnswers(scene, simulated, random);
  });
}

// ---- Cases by hand, as folded text ----

std::string tell(std::uint64_t samples) { return samples == kBeyond ? "for ever" : std::to_string(samples); }

std::string describe(const Stretch& stretch) {
  static constexpr const char* kPieces[] = {"straight", "wait", "loop", "script"};
  std::string text = std::to_string(stretch.firstSample) + " to " + tell(stretch.endSample()) + ": " +
                     kPieces[static_cast<std::size_t>(stretch.repeats)] + " from " + tell(stretch.start);
  if (stretch.repeats != Stretch::Repeats::kNothing) text += ", passes of " + tell(stretch.period);
  if (stretch.pass != 0) text += ", pass " + std::to_string(stretch.pass);
  if (stretch.round != 0) text += ", round " + std::to_string(stretch.round);
  return text + "\n";
}

std::string describe(const PlayLength& length) {
  switch (length.kind()) {
    case PlayLength::Kind::kExact:
      return std::to_string(*length.samples());
    case PlayLength::Kind::kTooLong:
      return "too long";
    case PlayLength::Kind::kEndless:
      return "endless";
    case PlayLength::Kind::kWaiting:
      break;
  }
  return "waits for " + ktorba::triggerName(length.trigger()) + " at instruction " + std::to_string(length.address()) +
         " since " + std::to_string(length.waitingSince());
}

std::string describe(const Run& run, const Timeline& timeline) {
  const Step& step = timeline.play().steps()[run.step];
  return std::to_string(run.firstSample) + " to " + tell(run.endSample()) + ", instruction " +
         std::to_string(step.address) + ", pass " + std::to_string(run.pass) + ", round " + std::to_string(run.round);
}

std::uint64_t numberOf(const std::string& text) { return std::stoull(text); }

// Lines in front of the script: "raise trigger1 SAMPLE", "run SAMPLE", "count marker0 BEGIN END", "pulse marker0 N".
std::string answer(const std::string& input) {
  std::istringstream lines(input);
  std::vector<std::vector<std::string>> questions;
  std::vector<RaisedTrigger> raised;
  std::string line;
  std::string script;
  while (std::getline(lines, line)) {
    std::istringstream words(line);
    const std::vector<std::string> parts{std::istream_iterator<std::string>(words), {}};
    if (!script.empty() || parts[0] == "script") {
      script += line + '\n';
    } else if (parts[0] == "raise") {
      raised.push_back({numberOf(parts[2]), static_cast<std::uint8_t>(parts[1].back() - '0' + 1)});
    } else {
      questions.push_back(parts);
    }
  }
  GeneratorOptions generator;
  generator.memorySizeBytes = 1u << 22;
  const Scene scene(script, {{"a", scripts::Samples(100)}, {"million", scripts::Samples(1'000'000)}}, generator,
                    raised);
  const Timeline& timeline = *scene.timeline;
  std::string text;
  for (const Stretch& stretch : timeline.stretches()) text += describe(stretch);
  text += "length: " + describe(timeline.length()) + "\n";
  for (const auto& parts : questions) {
    for (const std::string& part : parts) text += part + ' ';
    const auto marker = static_cast<std::uint32_t>(parts[1].back() - '0');
    if (parts[0] == "run") {
      const auto run = timeline.runAt(numberOf(parts[1]));
      text += "= " + (run ? describe(*run, timeline) : "none");
    } else if (parts[0] == "count") {
      text += "= " + std::to_string(timeline.markerCount(marker, numberOf(parts[2]), numberOf(parts[3])));
    } else {
      const auto pulse = timeline.markerPulse(marker, numberOf(parts[2]));
      text += "= " + (pulse ? std::to_string(*pulse) : "none");
    }
    text += '\n';
  }
  return text;
}

TEST(Timeline, AnswersWithoutPlaying) { GoldenFile(KTORBA_TIMELINES).check(answer); }

}  // namespace
}  // namespace tools
