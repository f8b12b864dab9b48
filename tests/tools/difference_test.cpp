// Two scripts against each other: cases by hand, and random ones whose first difference is found by going sample by
// sample, without the leaps over what repeats.
#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

#include "testing/TimelineScene.h"
#include "testing/golden.h"
#include "tools/difference/comparePlays.h"

namespace tools {
namespace {

constexpr std::uint64_t kLimit = 20'000;  // samples that are walked through

std::int32_t levelAt(const Scene& scene, const PlayCursor& cursor) {
  const std::uint32_t held = cursor.heldStep();
  if (held == Step::kNone) return 0;
  const Step& step = scene.timeline->play().steps()[held];
  const bool isPlaying = cursor.step().kind == StepKind::kWaveform;
  return scene.sources[step.waveform][step.firstInWaveform + (isPlaying ? cursor.offset() : step.sampleCount - 1)];
}

std::uint8_t markersAt(const PlayCursor& cursor) {
  return cursor.step().markerOffset == cursor.offset() ? cursor.step().markerMask : std::uint8_t{0};
}

// The first sample at which they differ; nothing when they agree to the end or the limit.
std::optional<std::uint64_t> walkToDifference(const Scene& one, const Scene& other) {
  PlayCursor first(one.timeline->play());
  PlayCursor second(other.timeline->play());
  for (std::uint64_t sample = 0; sample < kLimit; ++sample) {
    if (first.isOver() && second.isOver()) return std::nullopt;
    if (first.isOver() || second.isOver() || first.triggerUse() != second.triggerUse() ||
        levelAt(one, first) != levelAt(other, second) || markersAt(first) != markersAt(second)) {
      return sample;
    }
    first.advance(1);
    second.advance(1);
  }
  return std::nullopt;
}

PlayComparison compare(const Scene& one, const Scene& other) {
  return comparePlays({one.timeline->play(), one.sources}, {other.timeline->play(), other.sources});
}

// A count, a length or a marker of the script made another one.
std::string changed(std::string script, Random& random) {
  std::vector<std::size_t> digits;
  for (std::size_t at = 1; at < script.size(); ++at) {
    if (std::isdigit(static_cast<unsigned char>(script[at])) != 0) digits.push_back(at);
  }
  if (!digits.empty()) {
    script[digits[pick(random, 0, static_cast<std::uint32_t>(digits.size()) - 1)]] =
        static_cast<char>('0' + pick(random, 0, 9));
  }
  return script;
}

TEST(ComparePlays, FindsTheFirstDifferenceAsAWalkDoes) {
  std::uint64_t different = 0;
  forEachSeed(3'000, [&](Random& random) {
    const GeneratorOptions generator = randomGenerator(random);
    const scripts::Waveforms waveforms =
        scripts::randomWaveforms(random, generator.minFetchSamples, 300, generator.sampleWidthBits);
    const std::string text = scripts::randomScript(random, waveforms, generator.minFetchSamples);
    const Scene one(text, waveforms, generator, {});
    std::optional<Scene> other;
    while (!other) {
      try {
        other.emplace(changed(text, random), waveforms, generator, std::vector<RaisedTrigger>{});
      } catch (const std::runtime_error&) {
        // The change made it no script.
      }
    }
    SCOPED_TRACE(text + other->file.text());
    const auto walked = walkToDifference(one, *other);
    const auto computed = compare(one, *other).difference;
    if (walked || (computed && computed->sample < kLimit)) {
      ASSERT_TRUE(computed.has_value());
      EXPECT_EQ(walked, computed->sample);
      ++different;
    }
    EXPECT_FALSE(compare(one, one).difference);
  });
  EXPECT_GT(different, 0u);
}

// Two scripts, one behind the other.
std::string answer(const std::string& input) {
  const std::size_t second = input.find("script", input.find("end script") + 10);
  const scripts::Waveforms waveforms = {
      {"a", scripts::Samples(100, 7)}, {"b", scripts::Samples(100, 8)}, {"same", scripts::Samples(200, 7)}};
  GeneratorOptions generator;
  generator.memorySizeBytes = 1u << 16;
  const Scene one(input.substr(0, second), waveforms, generator, {});
  const Scene other(input.substr(second), waveforms, generator, {});
  const PlayComparison comparison = compare(one, other);
  if (!comparison.difference) return comparison.isWhole ? "same\n" : "same as far as can be counted\n";
  const PlayDifference& difference = *comparison.difference;
  std::ostringstream text;
  text << "at sample " << difference.sample << ": instruction " << difference.first.address << " "
       << describe(difference.first, difference.kind) << ", instruction " << difference.second.address << " "
       << describe(difference.second, difference.kind) << "\n";
  return text.str();
}

TEST(ComparePlays, SaysWhatIsDifferent) { GoldenFile(KTORBA_DIFFERENCES).check(answer); }

}  // namespace
}  // namespace tools
