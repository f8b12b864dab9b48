// What the command layer refuses and what it keeps after failures; the registers it uses, and their order, stand in
// tests/source/ktorba_lib/platformCalls.txt.
#include "ktorba/commandControl/CommandControl.h"

#include <gtest/gtest.h>

#include <optional>

#include "ktifw_lib_client/FIFORegBusLib.h"
#include "ktifw_lib_client/SubsystemMapLib.h"
#include "source/ktorba_lib/SimulatedGenerator.h"

namespace ktorba {
namespace {

class CommandControlTest : public testing::Test {
 protected:
  void open(const ktSim_Traits& traits, std::uint64_t sampleWidth = 16) {
    generator.emplace(traits);
    EXPECT_EQ(ktSim_OverrideRegister(generator->number, 1, sampleWidth), 0);
    map.emplace(generator->fpga.ifwSession);
    bus.emplace(generator->fpga.ifwTarget);
    status = kterr::makeLocatedStatus();
    ktifw_lib_client::ContextLib parent(generator->fpga.ifwSession, generator->fpga.parentContext, *map);
    control.emplace(*parent.getChild(101, 0, status), *bus, status);
    EXPECT_EQ(ktSim_RecordCalls(generator->fpga.fpgaSession, 100), 0);
  }

  std::int32_t takeCode() { return std::exchange(status, kterr::makeLocatedStatus()).code; }

  void failNext(const char* function) {
    EXPECT_EQ(ktSim_FailCall(generator->fpga.fpgaSession, function, 1, -9, nullptr), 0);
  }

  bool writesSettings(bool force) {
    generator->takeCalls();
    control->writeSettings(status, force);
    return !generator->takeCalls().empty();
  }

  std::optional<SimulatedGenerator> generator;
  std::optional<ktifw_lib_client::SubsystemMapLib> map;
  std::optional<ktifw_lib_client::FIFORegBusLib> bus;
  std::optional<CommandControl> control;
  kterr::tLocatedStatus status = kterr::makeLocatedStatus();
};

TEST_F(CommandControlTest, OpenRefusesOtherBlocksAndVersions) {
  struct Case {
    std::uint16_t type, major, minor;
    std::uint64_t sampleWidth;
    std::int32_t code;
    std::uint32_t line;
  };
  for (const Case& c : {Case{102, 4, 3, 16, -1074101587, 208}, Case{101, 4, 1, 16, -1074101621, 217},
                        Case{101, 5, 0, 16, -1074101622, 222}, Case{101, 4, 3, 0x100, -1074097783, 261}}) {
    ktSim_Traits traits = SimulatedGenerator::smallTraits();
    traits.reportedType = c.type;
    traits.versionMajor = c.major;
    traits.versionMinor = c.minor;
    open(traits, c.sampleWidth);
    EXPECT_EQ(status.line, c.line);
    EXPECT_STREQ(status.component, "ktorbau");
    EXPECT_STREQ(status.file, R"(includes\ktorba\commandControl\CommandControl)");
    EXPECT_EQ(takeCode(), c.code);
  }
}

TEST_F(CommandControlTest, FailuresKeepTraitsAndLeaveSettingsUnwritten) {
  ktSim_Traits simulated = SimulatedGenerator::smallTraits();
  simulated.versionMinor = 2;
  open(simulated);
  EXPECT_TRUE(writesSettings(false));
  EXPECT_FALSE(writesSettings(false));
  EXPECT_TRUE(writesSettings(true));
  failNext("ktIFW_Target_WriteArray");
  EXPECT_TRUE(writesSettings(true));
  EXPECT_EQ(takeCode(), -9);
  EXPECT_TRUE(writesSettings(false)) << "nobody knows what a failed transfer left";
  HWSettings settings;
  settings.primingDepthWords = 0;
  control->setSettings(settings, status);
  control->writeSettings(status, false);
  EXPECT_NE(generator->takeCalls().find("\nwrite 14 <- 60, 13 <- 30, 12 <- 4294967295\n"), std::string::npos)
      << "three registers where there is no streaming";

  HWTraits traits;
  EXPECT_EQ(ktSim_OverrideRegister(generator->number, 3, 8192), 0);
  failNext("ktIFW_Target_Read");
  control->getHWTraits(traits, status, true);
  EXPECT_EQ(takeCode(), -9);
  control->getHWTraits(traits, status, false);
  EXPECT_EQ(traits.memorySizeBytes, 8192u) << "traits that could not be read are read again";
  EXPECT_EQ(traits.waveformMemorySize, 8192u / 9) << "the divisor is one more than the word's bytes";
}

TEST_F(CommandControlTest, AnErrorInTheStatusStopsEveryOperation) {
  open(SimulatedGenerator::smallTraits());
  generator->takeCalls();
  status.code = -1;
  HWTraits traits;
  bool flag = true;
  control->getHWTraits(traits, status, true);
  control->writeSettings(status, true);
  control->commandInitiate(status);
  control->readGenerationDone(flag, status);
  control->announceMemoryWrite({}, status);
  control->resetStreamingWritePointer(status);
  EXPECT_EQ(control->readStreamingSpace(status), 0u);
  EXPECT_EQ(generator->takeCalls(), "");
  EXPECT_TRUE(flag);
}

}  // namespace
}  // namespace ktorba
