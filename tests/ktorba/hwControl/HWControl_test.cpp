#include "ktorba/hwControl/HWControl.h"

#include <gmock/gmock.h>

#include <random>

#include "kterr/Exception.h"
#include "ktorba/FakeGenerator.h"
#include "ktorba/script/ScriptTable.h"
#include "ktorba/waveform/WaveformTable.h"

namespace ktorba {
namespace {

using testing::HasSubstr;

class HWControlTest : public testing::Test {
 protected:
  HWControlTest() { open(); }

  void open() {
    control = std::make_unique<HWControl>(generator, generator, ktwfmscriptcompiler::standardScriptTraits(), waveforms,
                                          scripts);
  }

  // "" after a success; else the failure's elaboration from its constant on, without file and line.
  template <typename Call>
  std::string failureOf(Call&& call) {
    generator.log.clear();
    try {
      call();
    } catch (const kterr::Exception& e) {
      if (e.getJson() == nullptr) return std::to_string(e.code());
      std::string text = e.getJson();
      const std::size_t file = text.find(R"("file":)"), component = text.find(R"("component")");
      return text.erase(file, component - file);
    }
    return "";
  }

  void write(const std::string& name, std::uint32_t count, std::uint32_t timeoutMs = 1000, std::int16_t first = 0) {
    std::vector<std::int16_t> samples(count);
    for (std::int16_t& sample : samples) sample = first++;
    control->writeWaveform(name, DataWrapperNoCopy(samples.data(), samples.size()), timeoutMs, true);
  }

  std::uint32_t select(const std::string& name) {
    std::uint32_t length = 0;
    control->selectActiveScript(name, length);
    return length;
  }

  // Makes `name` the streaming waveform and starts playing it.
  void stream(const std::string& name) {
    control->writeScript("script s generate " + name + " end script");
    select("s");
    HWSettingsRecord record;
    name.copy(record.streamingWaveformName, name.size());
    record.streamingWaveformNameLength = static_cast<std::uint32_t>(name.size());
    record.settings.streamingEnabled = true;
    control->receiveSettings(record);
    control->configureGeneration(false);
    control->startGeneration();
    generator.takeLog();
  }

  FakeGenerator generator;
  WaveformTable<WaveformEntry> waveforms;
  ScriptTable scripts;
  std::unique_ptr<HWControl> control;
};

TEST_F(HWControlTest, OpeningStartsTheFifoAndReadsTheTraits) {
  EXPECT_EQ(generator.takeLog(), "configure 40960; start; traits; ");
  HWTraits traits;
  control->getHWTraits(traits, false);
  EXPECT_EQ(traits.auxiliarySize, 40960u);
  control->setAuxiliarySize(5, false);
  control->getHWTraits(traits, true);
  EXPECT_EQ(traits.auxiliarySize, 5u);
  EXPECT_EQ(control->getLargestAllocatableLength(), 2048u);
}

TEST_F(HWControlTest, UnworkableTraitsAreNamed) {
  const HWTraits good = generator.traits;
  const std::pair<void (*)(HWTraits&), const char*> cases[] = {
      {[](HWTraits& t) { t.sampleWidthBits = 12; }, "sampleWidthBits is 12; it must be a whole number of bytes"},
      {[](HWTraits& t) { t.memoryWordBits = 7; }, "memoryWordBits is 7; it must be at least 8"},
      {[](HWTraits& t) { t.memoryWordBits = 40; }, "memoryWordBits is 40; it must be a whole number of samples"},
      {[](HWTraits& t) { t.memoryWordBits = 1024; }, "memoryWordBits is 1024; it must be at most 512"},
      {[](HWTraits& t) { t.downloadElementBits = 7; }, "downloadElementBits is 7; it must be at least 8"},
      {[](HWTraits& t) { t.minFetchSamples = 0; }, "minFetchSamples is 0; it must be at least 1"},
  };
  for (const auto& [spoil, message] : cases) {
    generator.traits = good;
    spoil(generator.traits);
    EXPECT_THAT(failureOf([&] { open(); }),
                testing::AllOf(HasSubstr("ktorba_errors::kErrorInternalSWError"), HasSubstr(message)));
  }
}

// The first rule broken is the one reported, with these values.
TEST_F(HWControlTest, AllocationRules) {
  control->allocateWaveform("taken", 8);
  struct Case {
    const char* name;
    std::uint32_t samples;
    const char* failure;
  };
  const Case cases[] = {
      {"", 0, "kErrorWaveformNameIsEmpty"},
      {"_x", 0, "kErrorLeadingUnderscoreInString"},
      {"TAKEN", 0, R"("usage":"kUsageTypeWaveformName","value":"TAKEN")"},
      {"w", 0, R"(kErrorNumSamplesInWaveformMustBeGreaterThanZero","component":"ktorbau"})"},
      {"w", 7, R"(TypeWaveformLength","value":7,"value_type":"uint32_t"},{"type":"usage","usage":"kUsageTypeMinWave)"},
      {"w", 2041, R"("usage":"kUsageTypeLargestAvailMemoryBlock","value":4080,"value_type":"uint32_t")"},
      {"w", 0x80000008, "kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA"},
      {"w", 2037, ""},  // takes the last word in part
  };
  for (const Case& c : cases) {
    const std::string failure = failureOf([&] { control->allocateWaveform(c.name, c.samples); });
    EXPECT_THAT(failure, HasSubstr(c.failure)) << c.name << " " << c.samples;
    EXPECT_EQ(failure.empty(), *c.failure == '\0');
  }
  EXPECT_EQ(control->getLargestAllocatableLength(), 0u);
  control->clearAllWaveforms();
  EXPECT_EQ(control->getLargestAllocatableLength(), 2048u);
}

TEST_F(HWControlTest, WritePositions) {
  control->allocateWaveform("w", 10);
  const auto move = [&](std::uint32_t mode, std::uint32_t offset) {
    return failureOf([&] { control->setWaveformNextWritePosition("W", mode, offset); });
  };
  EXPECT_EQ(move(0, 10), "");
  EXPECT_EQ(move(1, static_cast<std::uint32_t>(-3)), "");
  EXPECT_EQ(waveforms.getWaveform("w").writePosition, 14u);
  EXPECT_THAT(move(1, 4), HasSubstr(R"("kUsageTypeAllocWaveformLength","value":10,"value_type":"uint32_t"},)"
                                    R"({"type":"usage","usage":"Write Position","value":"11","value_type":"int64_t")"));
  EXPECT_THAT(move(1, static_cast<std::uint32_t>(-8)), HasSubstr(R"("value":"-1","value_type":"int64_t")"));
  EXPECT_THAT(move(0, 0x40000000), HasSubstr(R"("value":"-1073741824")")) << "the product is signed, 32 bits wide";
  EXPECT_THAT(move(2, 0), HasSubstr(R"("usage":"kUsageTypeParameterName","value":"Write Position")"));
  EXPECT_EQ(waveforms.getWaveform("w").writePosition, 14u);
}

TEST_F(HWControlTest, WritesLandWhereTheyShouldAndNowhereElse) {
  std::mt19937 random(7);
  const auto pick = [&](std::uint32_t most) { return static_cast<std::uint32_t>(random() % (most + 1)); };
  for (const char* name : {"a", "b", "c"}) control->allocateWaveform(name, 8 + pick(90));
  std::vector<std::uint8_t> expected = generator.memory;
  for (int round = 0; round < 300; ++round) {
    const std::string name(1, static_cast<char>('a' + pick(2)));
    WaveformEntry& waveform = waveforms.getWaveform(name);
    const std::uint32_t position = pick(waveform.allocatedLength - 1);
    const std::uint32_t count = 1 + pick(waveform.allocatedLength - position - 1);
    const auto first = static_cast<std::int16_t>(random());
    control->setWaveformNextWritePosition(name, 0, position);
    control->setWaveformWriteChunkSize(2 + pick(60));
    write(name, count, 1000, first);
    EXPECT_EQ(waveform.writePosition, 2 * (position + count));
    for (std::uint32_t i = 0; i < count; ++i) {
      const auto sample = static_cast<std::uint16_t>(first + static_cast<std::int32_t>(i));
      std::memcpy(&expected[waveform.memoryOffset + 2 * (position + i)], &sample, 2);
    }
    ASSERT_EQ(generator.memory, expected) << "round " << round;
  }
}

TEST_F(HWControlTest, FailedWritesLeaveNothingBehind) {
  EXPECT_THAT(failureOf([&] { write("w", 0); }),
              HasSubstr(R"("kUsageTypeWaveformLength","value":0,"value_type":"uint)"));
  generator.failures["announce"] = -9;
  EXPECT_THAT(failureOf([&] { write("new", 16); }), HasSubstr("fake"));
  EXPECT_FALSE(control->waveformExists("new"));
  EXPECT_EQ(control->getLargestAllocatableLength(), 2048u);
  control->allocateWaveform("old", 16);
  EXPECT_THAT(failureOf([&] { write("old", 4); }), HasSubstr("fake"));
  EXPECT_EQ(waveforms.getWaveform("old").writePosition, 0u);
  generator.failures.clear();
  EXPECT_EQ(failureOf([&] { write("new", 16, static_cast<std::uint32_t>(-1)); }), "");
  EXPECT_THAT(generator.log, HasSubstr("write 32 unlimited; "));
  EXPECT_THAT(failureOf([&] { write("new", 1); }),
              HasSubstr(R"("kUsageTypeAllocWaveformLength","value":16,"value_type":"uint32_t"},)"
                        R"({"type":"usage","usage":"Write Position","value":"16","value_type":"uint64_t"},)"
                        R"({"type":"usage","usage":"kUsageTypeNumSampsToWrite","value":"1","value_type":"uint64_t")"));
}

TEST_F(HWControlTest, StreamingWritesWrapWhileRunningOnly) {
  control->allocateWaveform("before", 8);
  control->allocateWaveform("loop", 15);
  EXPECT_THAT(failureOf([&] { control->checkStreamingWaveformSpace(); }),
              HasSubstr(R"(kErrorSpecifiedWaveformNotFound","component":"ktorbau"})"));
  stream("Loop");
  write("loop", 10);
  write("loop", 9);
  write("loop", 11);
  EXPECT_EQ(generator.takeLog(),
            "announce 16+6 masked; write 0; write 20; write 4; complete?; "
            "announce 32+4 masked; write 4; write 10; write 2; complete?; "
            "announce 16+2 masked; write 0; write 8; complete?; "
            "announce 24+6 masked; write 0; write 22; write 2; complete?; ");
  EXPECT_EQ(waveforms.getWaveform("loop").writePosition, 30u) << "the next write wraps it";
  EXPECT_THAT(failureOf([&] { write("loop", 16); }), HasSubstr("kErrorCannotWriteDataOutsideWaveformBoundaries"));
  generator.streamingSpace = 3;
  EXPECT_EQ(control->checkStreamingWaveformSpace(), 8u) << "its last word is not whole";
  generator.takeLog();
  control->abortGeneration();
  EXPECT_EQ(generator.takeLog(), "abort; rewind; ");
  EXPECT_EQ(waveforms.getWaveform("loop").writePosition, 0u);
  write("loop", 15);
  EXPECT_THAT(failureOf([&] { write("loop", 1); }), HasSubstr("kErrorCannotWriteDataOutsideWaveformBoundaries"));
  control->abortGeneration();
  EXPECT_EQ(generator.takeLog(), "abort; ");
}

TEST_F(HWControlTest, ScriptsAreDownloadedWhenSequenceMemoryDoesNotHoldThem) {
  control->allocateWaveform("w", 8);
  EXPECT_THAT(failureOf([&] { control->startGeneration(); }), HasSubstr("kErrorActiveSequenceNotSpecified"));
  control->writeScript("script a generate w end script script b repeat forever generate w end repeat end script");
  generator.takeLog();
  EXPECT_EQ(select("A"), 6u);
  EXPECT_EQ(generator.takeLog(), "announce 0+20; write 0; write 80; complete?; ");
  EXPECT_EQ(select("a"), 6u);
  EXPECT_EQ(generator.takeLog(), "");
  generator.failures["complete?"] = -9;
  EXPECT_THAT(failureOf([&] { select("b"); }), HasSubstr("fake"));
  EXPECT_EQ(scripts.getActiveScript(), "a");
  generator.failures.clear();
  EXPECT_EQ(failureOf([&] { select("a"); }), "");
  EXPECT_THAT(generator.takeLog(), HasSubstr("announce 0+20; ")) << "the failed download overwrote it";
  EXPECT_EQ(select("b"), 0xFFFFFFFFu);
  EXPECT_EQ(select(""), 0u);
  generator.traits.sequenceMemoryWords = 4;
  open();
  EXPECT_THAT(failureOf([&] { control->writeScript("script c generate w end script"); }),
              HasSubstr(R"(kErrorSequenceSizeTooLarge","component":"ktorbau"})"));
}

TEST_F(HWControlTest, StatusIsUnderflowThenDone) {
  generator.takeLog();
  EXPECT_FALSE(control->checkGenerationStatus());
  generator.done = true;
  EXPECT_TRUE(control->checkGenerationStatus());
  EXPECT_EQ(generator.takeLog(), "underflow?; done?; underflow?; done?; ");
  generator.underflow = true;
  EXPECT_THAT(failureOf([&] { control->checkGenerationStatus(); }), HasSubstr("kErrorDeviceDataUnderflow"));
}

}  // namespace
}  // namespace ktorba
