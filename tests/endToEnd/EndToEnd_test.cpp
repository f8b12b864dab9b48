// The library and the simulated generator against the reference player: the same samples and markers, one by one.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>

#include "RandomScript.h"
#include "SimulatedHost.h"
#include "ktWfmScriptCompiler/ParserFactory.h"
#include "ktorba/error_codes.h"

namespace endToEnd {
namespace {

constexpr std::uint64_t kLimit = 20'000;  // samples compared per script

// KTORBA_SCRIPTS sets how many scripts are played, KTORBA_SEED the first seed.
std::uint64_t fromEnvironment(const char* name, std::uint64_t otherwise) {
  const char* text = std::getenv(name);
  return text != nullptr ? std::strtoull(text, nullptr, 10) : otherwise;
}

std::uint32_t pickFrom(Random& random, std::initializer_list<std::uint32_t> choices) {
  return choices.begin()[pick(random, 0, static_cast<std::uint32_t>(choices.size()) - 1)];
}

ktSim_Traits randomTraits(Random& random) {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  traits.sampleWidthBits = pickFrom(random, {16, 32});
  traits.memoryWordBytes = pickFrom(random, {8, 16, 32});
  traits.memorySizeBytes = 1 << 20;
  traits.minFetchSamples = pick(random, 1, 128);
  traits.downloadElementBits = pickFrom(random, {0, 8, 16, 32, 64});
  return traits;
}

// Writes the waveform in pieces: in order, sometimes going back over what has been written.
void writeInPieces(Random& random, SimulatedHost& host, const std::string& name, const Samples& samples) {
  const auto length = static_cast<std::uint32_t>(samples.size());
  EXPECT_OK(ktORBA_AllocateWaveform(host.session, name.c_str(), length, nullptr));
  for (std::uint32_t position = 0; position < length;) {
    const std::uint32_t count = pick(random, 1, length - position);
    EXPECT_OK(host.write(name, samples, position, count));
    position += count;
    if (pick(random, 0, 3) != 0) continue;
    const std::uint32_t back = pick(random, 0, position);
    EXPECT_OK(ktORBA_SetWaveformNextWritePosition(host.session, name.c_str(), 0u - back, ktORBA_kFromCurrentPosition,
                                                  nullptr));
    position -= back;
  }
}

std::vector<TriggerEvent> raiseRandomTriggers(Random& random, const SimulatedHost& host) {
  std::vector<TriggerEvent> events(pick(random, 0, 12));
  for (TriggerEvent& event : events) {
    event = {pick(random, 0, 6), pick(random, 0, kLimit)};
    EXPECT_OK(ktSim_RaiseTriggerAt(host.generator, event.tableNumber + 2, event.sample));
  }
  return events;
}

Played playReference(const std::string& text, const Waveforms& waveforms, std::uint32_t minFetchSamples,
                     const std::vector<TriggerEvent>& events) {
  const ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  const auto parser = ktwfmscriptcompiler::ParserFactory().createParser(traits);
  const auto root = parser->parse(text);
  const auto& procedures = dynamic_cast<const ktwfmscriptcompiler::ProcedureCollection&>(*root).procedures;
  return play(procedures.front(), waveforms, minFetchSamples, events, kLimit);
}

void comparePlayed(const Played& ours, const Played& expected) {
  ASSERT_EQ(ours.samples.size(), expected.samples.size());
  const auto sample = std::mismatch(ours.samples.begin(), ours.samples.end(), expected.samples.begin());
  EXPECT_EQ(sample.first, ours.samples.end()) << "samples differ from " << sample.first - ours.samples.begin();
  const auto marker = std::mismatch(ours.markers.begin(), ours.markers.end(), expected.markers.begin());
  EXPECT_EQ(marker.first, ours.markers.end()) << "markers differ from " << marker.first - ours.markers.begin();
}

void playRandomScript(std::uint64_t seed) {
  Random random(seed);
  const ktSim_Traits traits = randomTraits(random);
  const Waveforms waveforms =
      randomWaveforms(random, traits.minFetchSamples, traits.minFetchSamples + 700, traits.sampleWidthBits);
  const std::string text = randomScript(random, waveforms, traits.minFetchSamples);
  SCOPED_TRACE("KTORBA_SEED=" + std::to_string(seed) + " KTORBA_SCRIPTS=1\n" + text);

  SimulatedHost host(traits);
  for (const auto& [name, samples] : waveforms) writeInPieces(random, host, name, samples);
  EXPECT_OK(ktORBA_WriteScript(host.session, text.c_str(), nullptr));
  EXPECT_OK(ktORBA_SelectActiveScript(host.session, "main", nullptr));
  const std::vector<TriggerEvent> events = raiseRandomTriggers(random, host);
  EXPECT_OK(ktORBA_StartGeneration(host.session, nullptr));
  const Played played = host.advance(kLimit);
  const Played expected = playReference(text, waveforms, traits.minFetchSamples, events);
  comparePlayed(played, expected);
  if (expected.samples.size() == kLimit) return;
  std::uint8_t isDone = 0;
  EXPECT_OK(ktORBA_CheckGenerationStatus(host.session, &isDone, nullptr));
  EXPECT_EQ(isDone, expected.isDone);
}

TEST(EndToEnd, RandomScriptsPlayAsTheyRead) {
  const std::uint64_t first = fromEnvironment("KTORBA_SEED", 1);
  const std::uint64_t count = fromEnvironment("KTORBA_SCRIPTS", 3000);
  for (std::uint64_t seed = first; seed < first + count && !HasFailure(); ++seed) playRandomScript(seed);
}

// A waveform that is played round and round while the host keeps writing a running count into it.
class Streaming : public testing::Test {
 protected:
  static constexpr std::uint32_t kLength = 4096;

  static ktSim_Traits traits() {
    ktSim_Traits traits;
    ktSim_DefaultTraits(&traits);
    traits.sampleWidthBits = 32;
    return traits;
  }

  void SetUp() override {
    EXPECT_OK(ktORBA_AllocateWaveform(host_.session, "stream1", kLength, nullptr));
    writeNext(kLength);
    EXPECT_OK(
        ktORBA_WriteScript(host_.session, "script s repeat forever generate stream1 end repeat end script", nullptr));
    EXPECT_OK(ktORBA_ConfigureStreamingWaveform(host_.session, "stream1", nullptr));
    EXPECT_OK(ktORBA_SelectActiveScript(host_.session, "s", nullptr));
    EXPECT_OK(ktORBA_StartGeneration(host_.session, nullptr));
    host_.advance(traits().minFetchSamples);  // the opening wait
  }

  void writeNext(std::uint32_t count) {
    Samples samples(count);
    for (std::uint32_t& sample : samples) sample = written_++;
    EXPECT_OK(host_.write("stream1", samples, 0, count));
  }

  // Plays, and expects the count to run on.
  void playNext(std::uint64_t count) {
    for (const std::uint32_t sample : host_.advance(count).samples) ASSERT_EQ(sample, played_++);
  }

  std::uint64_t freeSpace() {
    std::uint64_t space = 0;
    EXPECT_OK(ktORBA_CheckStreamingWaveformSpace(host_.session, &space, nullptr));
    return space;
  }

  SimulatedHost host_{traits()};
  std::uint32_t written_ = 0;
  std::uint32_t played_ = 0;
};

TEST_F(Streaming, LosesAndRepeatsNothingOverAHundredRounds) {
  Random random(1);
  std::uint8_t isDone = 1;
  while (played_ < 100 * kLength && !HasFailure()) {
    playNext(pick(random, 1, kLength / 2));
    const std::uint64_t space = freeSpace();
    if (space > 0)
      writeNext(pick(random, static_cast<std::uint32_t>(space + 1) / 2, static_cast<std::uint32_t>(space)));
    EXPECT_OK(ktORBA_CheckGenerationStatus(host_.session, &isDone, nullptr));
    EXPECT_EQ(isDone, 0);
  }
}

TEST_F(Streaming, ReportsUnderflowWhenTheHostStopsWriting) {
  playNext(kLength / 2);
  writeNext(static_cast<std::uint32_t>(freeSpace()));
  host_.advance(3 * kLength);
  std::uint8_t isDone = 0;
  EXPECT_EQ(ktORBA_CheckGenerationStatus(host_.session, &isDone, nullptr), ktorba_errors_kErrorDeviceDataUnderflow);
}

}  // namespace
}  // namespace endToEnd
