// What is refused is tested in tests/ktorba/hwControl.
#include "ktorba/settings/SettingsCalculator.h"

#include <gtest/gtest.h>

#include "ktorba/waveform/WaveformTable.h"
#include "testing/caught.h"

namespace ktorba {
namespace {

class SettingsCalculatorTest : public testing::Test {
 protected:
  SettingsCalculatorTest() {
    traits.memoryWordBits = 64;
    traits.sampleWidthBits = 16;
    traits.samplesPerMemoryWord = 4;
    traits.maxPrimingWords = 512;
  }

  void calculate() { SettingsCalculator(traits).calculateSettings(waveforms, requested, adjusted, hardware); }

  HWTraits traits;
  WaveformTable<WaveformEntry> waveforms;
  GenerationSettings requested;
  AdjustedSettings adjusted;
  HWSettingsRecord hardware;
};

TEST_F(SettingsCalculatorTest, PrimingDepthIsRoundedUpAndCappedToTheScript) {
  for (const auto& [samples, scriptWords, words, actual] : {std::tuple{801u, 100u, 100u, 804u},
                                                            {801u, 0u, 201u, 804u},
                                                            {801u, 0xFFFFFFFF, 201u, 804u},
                                                            {2048u, 0u, 512u, 2048u},
                                                            {0u, 7u, 0u, 0u}}) {
    requested.primingDepth = samples;
    requested.activeScriptLength = scriptWords;
    calculate();
    EXPECT_EQ(hardware.settings.primingDepthWords, words);
    EXPECT_EQ(adjusted.actualPrimingDepth, actual);
    EXPECT_EQ(static_cast<GenerationSettings&>(adjusted), requested);
  }
}

TEST_F(SettingsCalculatorTest, StreamingWaveformIsPlacedInMemoryWords) {
  requested.memoryReadGrantTime = 61;
  calculate();
  EXPECT_EQ(hardware.settings, (HWSettings{61, 30, 200, false, 0, 0, 0, 0, 0, 0}));

  WaveformEntry& waveform = waveforms.addWaveform("Loop", 183);  // the shortest
  waveform.memoryOffset = 4096;
  requested.streamingWaveformName = "loop";
  for (const auto& [positionBytes, pointerWord] : {std::pair{0u, 512u}, {8u, 512u}, {10u, 513u}, {366u, 557u}}) {
    waveform.writePosition = positionBytes;
    calculate();
    EXPECT_EQ(hardware.settings, (HWSettings{61, 30, 200, true, 512, 557, 91, 91, 20, pointerWord}));
  }
  EXPECT_STREQ(hardware.streamingWaveformName, "loop");
  EXPECT_EQ(hardware.streamingWaveformNameLength, 4u);

  requested.memoryReadGrantTime = 62;
  EXPECT_EQ(caught([&] { calculate(); }).code(), -1074101607) << "too short now";
  requested.streamingWaveformName = std::string(512, 'x');
  EXPECT_EQ(caught([&] { calculate(); }).code(), -1074097806) << "whether there is such a waveform or not";
  requested.primingDepth = 2049;
  EXPECT_EQ(caught([&] { calculate(); }).code(), -1074101595) << "before all names";
  EXPECT_EQ(hardware.settings.memoryReadGrantTime, 61) << "a failure leaves the hardware's record";
}

}  // namespace
}  // namespace ktorba
