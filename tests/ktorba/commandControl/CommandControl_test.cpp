// What the command layer keeps after failures; the registers it uses, and their order, stand in
// tests/source/ktorba_lib/platformCalls.txt, what it refuses in tests/ktorba/hwControl.
#include <gtest/gtest.h>

#include "testing/SimulatedControl.h"

namespace ktorba {
namespace {

// A generator without streaming.
class CommandControlTest : public testing::Test, protected SimulatedControl<> {
 protected:
  CommandControlTest() : SimulatedControl(traits()) { generator.recordCalls(); }

  static ktSim_Traits traits() {
    ktSim_Traits traits = smallTraits();
    traits.versionMinor = 2;
    return traits;
  }

  void expectFailure() { EXPECT_EQ(std::exchange(status, kterr::makeLocatedStatus()).code, -9); }

  bool writesSettings(bool force) {
    generator.takeCalls();
    control.writeSettings(status, force);
    return !generator.takeCalls().empty();
  }
};

TEST_F(CommandControlTest, FailuresKeepTraitsAndLeaveSettingsUnwritten) {
  EXPECT_TRUE(writesSettings(false));
  EXPECT_FALSE(writesSettings(false));
  EXPECT_TRUE(writesSettings(true));
  generator.failCall("ktIFW_Target_WriteArray", -9);
  EXPECT_TRUE(writesSettings(true));
  expectFailure();
  EXPECT_TRUE(writesSettings(false)) << "nobody knows what a failed transfer left";
  HWSettings settings;
  settings.primingDepthWords = 0;
  control.setSettings(settings, status);
  control.writeSettings(status, false);
  EXPECT_NE(generator.takeCalls().find("\nwrite 14 <- 60, 13 <- 30, 12 <- 4294967295\n"), std::string::npos)
      << "three registers where there is no streaming";

  HWTraits traits;
  generator.overrideRegister(3, 8192);
  generator.failCall("ktIFW_Target_Read", -9);
  control.getHWTraits(traits, status, true);
  expectFailure();
  control.getHWTraits(traits, status, false);
  EXPECT_EQ(traits.memorySizeBytes, 8192u) << "traits that could not be read are read again";
}

TEST_F(CommandControlTest, AnErrorInTheStatusStopsEveryOperation) {
  generator.takeCalls();
  status.code = -1;
  HWTraits traits;
  bool flag = true;
  control.getHWTraits(traits, status, true);
  control.writeSettings(status, true);
  control.commandInitiate(status);
  control.readGenerationDone(flag, status);
  control.announceMemoryWrite({}, status);
  control.resetStreamingWritePointer(status);
  EXPECT_EQ(control.readStreamingSpace(status), 0u);
  EXPECT_EQ(generator.takeCalls(), "");
  EXPECT_TRUE(flag);
}

}  // namespace
}  // namespace ktorba
