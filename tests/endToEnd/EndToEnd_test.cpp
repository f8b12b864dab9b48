// The library and a generator against the reference player. Of a simulated one all samples and markers are compared,
// one by one; another device shows only whether it comes to an end.
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <chrono>

#include "conventions/conventions.h"
#include "ktWfmScriptCompiler/ParserFactory.h"
#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "testing/DeviceUnderTest.h"
#include "testing/RandomScript.h"
#include "testing/require.h"

// The call succeeds.
#define EXPECT_OK(call) EXPECT_EQ(call, 0) << #call

namespace scripts {
namespace {

constexpr std::uint64_t kLimit = 20'000;  // samples compared per script

// A host program in small: one generator and one session on it, through the two public interfaces alone.
class Host : public DeviceUnderTest {
 public:
  explicit Host(const ktSim_Traits& traits) : DeviceUnderTest(traits) {
    require(open(session) == 0, "a session opens");
    isWide_ = isSimulated() ? traits.sampleWidthBits == 32 : takesWideSamples();
    if (isSimulated()) minFetchSamples = traits.minFetchSamples;
  }
  ~Host() { EXPECT_OK(ktORBA_CloseOrbaSession(session, nullptr)); }

  std::uint32_t sampleWidthBits() const { return isWide_ ? 32 : 16; }

  // Writes `count` samples at the waveform's present write position.
  std::int32_t write(const std::string& name, const std::uint32_t* samples, std::uint32_t count) {
    if (isWide_) return ktORBA_WriteWaveformU32(session, name.c_str(), samples, count, kTimeoutMs, nullptr);
    const std::vector<std::int16_t> narrow(samples, samples + count);
    return ktORBA_WriteWaveformI16(session, name.c_str(), narrow.data(), count, kTimeoutMs, nullptr);
  }

  // Plays up to `count` samples and adds them to `played`; returns whether there were as many.
  bool advance(std::uint64_t count, Played& played) {
    Samples samples(count);
    std::vector<std::uint16_t> narrow(count);
    std::vector<std::uint8_t> markers(count, 0xEE);  // clearing them is the device's part
    void* const into = isWide_ ? static_cast<void*>(samples.data()) : narrow.data();
    const std::uint64_t done = simulated().playInto(count, into, markers.data());
    if (!isWide_) samples.assign(narrow.begin(), narrow.end());
    const auto end = static_cast<std::ptrdiff_t>(done);
    played.samples.insert(played.samples.end(), samples.begin(), samples.begin() + end);
    played.markers.insert(played.markers.end(), markers.begin(), markers.begin() + end);
    return done == count;
  }

  // Polls until generation is done; returns whether it was in time.
  bool waitUntilDone() {
    if (isSimulated()) ktSim_SetAutoAdvance(simulated().number, 1000);
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    std::uint8_t isDone = 0;
    while (isDone == 0 && std::chrono::steady_clock::now() < deadline) {
      EXPECT_OK(ktORBA_CheckGenerationStatus(session, &isDone, nullptr));
    }
    return isDone != 0;
  }

  std::uint32_t session = 0;
  std::uint32_t minFetchSamples = 256;  // more than any generator demands

 private:
  static constexpr std::int32_t kTimeoutMs = 1000;

  // A device refuses samples of another width than its own.
  bool takesWideSamples() {
    const Samples samples(minFetchSamples);
    if (ktORBA_WriteWaveformU32(session, "w", samples.data(), minFetchSamples, kTimeoutMs, nullptr) != 0) return false;
    EXPECT_OK(ktORBA_ClearWaveform(session, "w", nullptr));
    return true;
  }

  bool isWide_ = false;
};

std::uint32_t pickFrom(Random& random, std::initializer_list<std::uint32_t> choices) {
  return choices.begin()[pick(random, 0, static_cast<std::uint32_t>(choices.size()) - 1)];
}

ktSim_Traits randomTraits(Random& random) {
  ktSim_Traits traits = defaultTraits();
  traits.sampleWidthBits = pickFrom(random, {16, 32});
  traits.memoryWordBytes = pickFrom(random, {8, 16, 32});
  traits.memorySizeBytes = 1 << 20;
  traits.minFetchSamples = pick(random, 1, 128);
  traits.downloadElementBits = pickFrom(random, {0, 8, 16, 32, 64});
  return traits;
}

// Writes the waveform in pieces: in order, sometimes going back over what has been written.
void writeInPieces(Random& random, Host& host, const std::string& name, const Samples& samples) {
  const auto length = static_cast<std::uint32_t>(samples.size());
  EXPECT_OK(ktORBA_AllocateWaveform(host.session, name.c_str(), length, nullptr));
  for (std::uint32_t position = 0; position < length;) {
    const std::uint32_t count = pick(random, 1, length - position);
    EXPECT_OK(host.write(name, &samples[position], count));
    position += count;
    if (pick(random, 0, 3) != 0) continue;
    const std::uint32_t back = pick(random, 0, position);
    EXPECT_OK(ktORBA_SetWaveformNextWritePosition(host.session, name.c_str(), 0u - back, ktORBA_kFromCurrentPosition,
                                                  nullptr));
    position -= back;
  }
}

std::vector<TriggerEvent> randomTriggers(Random& random) {
  std::vector<TriggerEvent> events(pick(random, 0, 12));
  for (TriggerEvent& event : events) event = {pick(random, 0, ktorba::kTriggerCount - 1), pick(random, 0, kLimit)};
  std::ranges::sort(events, {}, &TriggerEvent::sample);
  return events;
}

// Plays in pieces up to the limit. Each trigger is scheduled some time before it is due, or raised when it is.
Played playInPieces(Random& random, Host& host, const std::vector<TriggerEvent>& events) {
  Played played;
  for (const TriggerEvent& event : events) {
    host.advance(pick(random, 0, static_cast<std::uint32_t>(event.sample - played.samples.size())), played);
    const std::uint32_t trigger = ktorba::hardwareTriggerOf(event.tableNumber);
    if (pick(random, 0, 1) == 0) {
      EXPECT_OK(ktSim_RaiseTriggerAt(host.simulated().number, trigger, event.sample));
    } else if (host.advance(event.sample - played.samples.size(), played)) {
      EXPECT_OK(ktSim_RaiseTrigger(host.simulated().number, trigger));
    }
  }
  const std::uint64_t most = pickFrom(random, {50, 5000, kLimit});
  while (host.advance(std::min(most, kLimit - played.samples.size()), played) && played.samples.size() < kLimit) {
  }
  return played;
}

template <typename Values>
void expectSame(const Values& ours, const Values& expected, const char* what) {
  EXPECT_EQ(ours.size(), expected.size()) << what;
  const auto differing = std::ranges::mismatch(ours, expected).in1;
  EXPECT_TRUE(ours == expected) << what << " differ from " << differing - ours.begin() << " on";
}

// The same text to the compiler: letters of any case, and other blanks and comments between words.
std::string respell(Random& random, const std::string& text) {
  static const std::string kGaps[] = {" ", "\n", "\r\n", "\t \n", " // end script\n", "//\r\n\r\n"};
  std::string spelled;
  for (const char c : text) {
    const std::string& gap = kGaps[pick(random, 0, std::size(kGaps) - 1)];
    if (std::isspace(c)) {
      spelled += gap;
    } else if (std::ispunct(c)) {
      spelled += gap + c + gap;
    } else {
      spelled += static_cast<char>(pick(random, 0, 1) == 0 ? c : std::toupper(c));
    }
  }
  return spelled;
}

// What the compiler made of the text, printed as a text again.
std::string reprint(const std::string& text) {
  const ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  return printAsScript(ktwfmscriptcompiler::compile(text, traits).at(0), traits);
}

// A random script with its waveforms, started on a host: as it stands, respelled, or printed again.
struct Piece {
  Piece(Random& random, Host& host)
      : minFetchSamples(host.minFetchSamples),
        waveforms(randomWaveforms(random, minFetchSamples, minFetchSamples + 700, host.sampleWidthBits())),
        text(randomScript(random, waveforms, minFetchSamples)) {
    SCOPED_TRACE(text);
    for (const auto& [name, samples] : waveforms) writeInPieces(random, host, name, samples);
    const std::uint32_t form = pick(random, 0, 2);
    const std::string written = form == 0 ? text : form == 1 ? respell(random, text) : reprint(text);
    EXPECT_OK(ktORBA_WriteScript(host.session, written.c_str(), nullptr));
    EXPECT_OK(ktORBA_SelectActiveScript(host.session, "main", nullptr));
    EXPECT_OK(ktORBA_StartGeneration(host.session, nullptr));
  }

  Played playReference(const std::vector<TriggerEvent>& events) const {
    const ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
    const auto parser = ktwfmscriptcompiler::ParserFactory().createParser(traits);
    const auto root = parser->parse(text);
    const auto& procedures = dynamic_cast<const ktwfmscriptcompiler::ProcedureCollection&>(*root).procedures;
    return play(procedures.front(), waveforms, minFetchSamples, events, kLimit);
  }

  std::uint32_t minFetchSamples;
  Waveforms waveforms;
  std::string text;
};

void playRandomScript(Random& random) {
  Host host(randomTraits(random));
  const Piece piece(random, host);
  SCOPED_TRACE(piece.text);
  const std::vector<TriggerEvent> events = randomTriggers(random);
  const Played played = playInPieces(random, host, events);
  const Played expected = piece.playReference(events);
  expectSame(played.samples, expected.samples, "samples");
  expectSame(played.markers, expected.markers, "markers");
  if (expected.samples.size() == kLimit) return;
  std::uint8_t isDone = 0;
  EXPECT_OK(ktORBA_CheckGenerationStatus(host.session, &isDone, nullptr));
  EXPECT_EQ(isDone, expected.isDone);
}

TEST(EndToEnd, RandomScriptsPlayAsTheyRead) {
  if (otherDevice()) GTEST_SKIP() << "what was played comes back from the simulated generator alone";
  forEachSeed(3000, playRandomScript);
}

TEST(EndToEnd, RandomScriptsComeToAnEndWhenTheirReferenceDoes) {
  forEachSeed(100, [](Random& random) {
    Host host(randomTraits(random));
    const Piece piece(random, host);
    SCOPED_TRACE(piece.text);
    EXPECT_TRUE(!piece.playReference({}).isDone || host.waitUntilDone());
    EXPECT_OK(ktORBA_AbortGeneration(host.session, nullptr));
  });
}

// A waveform that is played round and round while the host keeps writing a running count into it. The marker splits it
// inside a memory word.
TEST(Streaming, LosesAndRepeatsNothingOverAHundredRounds) {
  if (otherDevice()) GTEST_SKIP() << "what was played comes back from the simulated generator alone";
  constexpr std::uint32_t kLength = 4096, kSamplesPerWord = 4;
  ktSim_Traits traits = defaultTraits();
  traits.sampleWidthBits = 32;
  Host host(traits);
  std::uint32_t written = 0, played = 0;
  const auto writeNext = [&](std::uint32_t count) {
    Samples samples(count);
    for (std::uint32_t& sample : samples) sample = written++;
    EXPECT_OK(host.write("stream1", samples.data(), count));
  };
  EXPECT_OK(ktORBA_AllocateWaveform(host.session, "stream1", kLength, nullptr));
  EXPECT_OK(ktORBA_WriteScript(
      host.session, "script s repeat forever generate stream1 marker0(1001) end repeat end script", nullptr));
  EXPECT_OK(ktORBA_ConfigureStreamingWaveform(host.session, "stream1", nullptr));
  EXPECT_OK(ktORBA_SelectActiveScript(host.session, "s", nullptr));
  writeNext(kLength);
  EXPECT_OK(ktORBA_StartGeneration(host.session, nullptr));
  EXPECT_OK(ktSim_Advance(host.simulated().number, traits.minFetchSamples, nullptr));  // the opening wait
  forEachSeed(1, [&](Random& random) {
    while (played < 100 * kLength && !testing::Test::HasFailure()) {
      Played now;
      host.advance(pick(random, 1, kLength / 2), now);
      for (const std::uint32_t sample : now.samples) ASSERT_EQ(sample, played++);
      std::uint64_t space = 0;
      EXPECT_OK(ktORBA_CheckStreamingWaveformSpace(host.session, &space, nullptr));
      // Memory words that were played to their end and not written since.
      const std::uint32_t rewritten = (written - kLength + kSamplesPerWord - 1) / kSamplesPerWord;
      EXPECT_EQ(space, (played / kSamplesPerWord - rewritten) * kSamplesPerWord);
      const auto most = static_cast<std::uint32_t>(space);
      if (most > 0) writeNext(pick(random, (most + 1) / 2, most));
      std::uint8_t isDone = 1;
      EXPECT_OK(ktORBA_CheckGenerationStatus(host.session, &isDone, nullptr));
      EXPECT_EQ(isDone, 0);
    }
  });
}

}  // namespace
}  // namespace scripts
