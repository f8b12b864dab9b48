// What the command layer keeps after failures to read traits; the registers it uses, and their order, stand in
// tests/source/ktorba_lib/platformCalls.txt, what it refuses in tests/ktorba/hwControl.
#include <gtest/gtest.h>

#include "testing/SimulatedControl.h"

namespace ktorba {
namespace {

class CommandControlTest : public testing::Test, protected SimulatedControl<> {};

TEST_F(CommandControlTest, TraitsThatCouldNotBeReadAreReadAgain) {
  HWTraits traits;
  control.getHWTraits(traits, status, false);
  generator.overrideRegister(3, 8192);
  generator.failCall("ktIFW_Target_Read", -9);
  control.getHWTraits(traits, status, true);
  EXPECT_EQ(std::exchange(status, kterr::makeLocatedStatus()).code, -9);
  control.getHWTraits(traits, status, false);
  EXPECT_EQ(traits.memorySizeBytes, 8192u);
}

TEST_F(CommandControlTest, AnErrorInTheStatusStopsEveryOperation) {
  generator.recordCalls();
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
