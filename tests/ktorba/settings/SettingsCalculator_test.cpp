#include "ktorba/settings/SettingsCalculator.h"

#include <gmock/gmock.h>

#include "kterr/Exception.h"
#include "ktorba/waveform/WaveformTable.h"

namespace ktorba {
namespace {

class SettingsCalculatorTest : public testing::Test {
 protected:
  SettingsCalculatorTest() {
    traits.memoryWordBits = 64;
    traits.sampleWidthBits = 16;
    traits.samplesPerMemoryWord = 4;
    traits.maxPrimingWords = 512;
    hardware.settings.primingDepthWords = 4711;  // what a failure must leave
  }

  // The elaboration of the failure, empty after a success.
  std::string calculate() {
    try {
      SettingsCalculator(traits).calculateSettings(waveforms, requested, adjusted, hardware);
    } catch (const kterr::Exception& e) {
      return e.getJson();
    }
    return "";
  }

  HWTraits traits;
  WaveformTable<WaveformEntry> waveforms;
  GenerationSettings requested;
  AdjustedSettings adjusted;
  HWSettingsRecord hardware;
};

TEST_F(SettingsCalculatorTest, PrimingDepthIsRoundedUpAndCappedToTheScript) {
  struct Case {
    std::uint32_t samples, scriptWords, words, actual;
  };
  for (const Case& c : {Case{801, 100, 100, 804}, Case{801, 0, 201, 804}, Case{801, 0xFFFFFFFF, 201, 804},
                        Case{2048, 0, 512, 2048}, Case{0, 7, 0, 0}}) {
    requested.primingDepth = c.samples;
    requested.activeScriptLength = c.scriptWords;
    EXPECT_EQ(calculate(), "");
    EXPECT_EQ(hardware.settings.primingDepthWords, c.words);
    EXPECT_EQ(adjusted.actualPrimingDepth, c.actual);
    EXPECT_EQ(static_cast<GenerationSettings&>(adjusted), requested);
  }
}

TEST_F(SettingsCalculatorTest, StreamingWaveformIsPlacedInMemoryWords) {
  requested.memoryReadGrantTime = 61;
  EXPECT_EQ(calculate(), "");
  EXPECT_EQ(hardware.settings, (HWSettings{61, 30, 200, false, 0, 0, 0, 0, 0, 0}));

  WaveformEntry& waveform = waveforms.addWaveform("Loop", 1001);
  waveform.memoryOffset = 4096;
  requested.streamingWaveformName = "loop";
  for (const auto& [positionBytes, pointerWord] : {std::pair{0u, 512u}, {8u, 512u}, {10u, 513u}, {2002u, 762u}}) {
    waveform.writePosition = positionBytes;
    EXPECT_EQ(calculate(), "");
    EXPECT_EQ(hardware.settings, (HWSettings{61, 30, 200, true, 512, 762, 91, 91, 20, pointerWord}));
  }
  EXPECT_STREQ(hardware.streamingWaveformName, "loop");
  EXPECT_EQ(hardware.streamingWaveformNameLength, 4u);
}

TEST_F(SettingsCalculatorTest, RefusalsNameTheLimitAndLeaveTheHardwareRecord) {
  struct Case {
    std::uint32_t primingDepth;
    std::string name;
    const char* error;
    const char* values;
  };
  waveforms.addWaveform("short", 180);
  const Case cases[] = {
      {2049, std::string(512, 'x'), "ktorba_errors::kErrorPrimingDepthTooLarge",
       R"({"type":"usage","usage":"kUsageTypeMaxValue","value":2048,"value_type":"uint32_t"}])"},
      {2048, std::string(512, 'x'), "ktmxl::kErrorNameTooLong",
       R"("usage":"kUsageTypeMaxLength","value":"511","value_type":"uint64_t")"},
      {2048, std::string(511, 'x'), "ktorba_errors::kErrorSpecifiedWaveformNotFound", ""},
      {2048, "Short", "ktorba_errors::kErrorRequestedWaveformLengthIsTooSmall",
       R"("usage":"kUsageTypeWaveformLength","value":180,"value_type":"uint32_t"},)"
       R"({"type":"usage","usage":"kUsageTypeMinWaveformLength","value":181,)"},
  };
  for (const Case& c : cases) {
    requested.primingDepth = c.primingDepth;
    requested.streamingWaveformName = c.name;
    EXPECT_THAT(calculate(), testing::AllOf(testing::HasSubstr(c.error), testing::HasSubstr(c.values)));
    EXPECT_EQ(hardware.settings.primingDepthWords, 4711u);
  }
  waveforms.addWaveform("enough", 181);
  requested.streamingWaveformName = "enough";
  EXPECT_EQ(calculate(), "");
}

}  // namespace
}  // namespace ktorba
