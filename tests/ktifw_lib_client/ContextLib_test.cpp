// Contexts of the simulated framework; its record of calls shows what was asked of it.
#include "ktifw_lib_client/ContextLib.h"

#include <gmock/gmock.h>

#include "ktifw_lib_client/SubsystemMapLib.h"
#include "testing/SimulatedGenerator.h"

namespace {

using testing::ElementsAre;

class ContextLib : public testing::Test {
 protected:
  ContextLib() { generator.recordCalls(); }

  std::uint32_t addContext() {
    std::uint32_t number = 0;
    EXPECT_EQ(ktSim_AddContext(generator.fpga.fpgaSession, generator.fpga.parentContext, 7, &number), 0);
    return number;
  }

  SimulatedGenerator generator;
  const std::uint32_t other = addContext();  // beside the generator's, which is 2
  ktifw_lib_client::SubsystemMapLib map{generator.fpga.ifwSession};
  ktifw_lib_client::ContextLib parent{generator.fpga.ifwSession, generator.fpga.parentContext, map};
  ktifw_lib_client::ContextLib context{generator.fpga.ifwSession, 2, map};
  ktifw::Status status = kterr::makeLocatedStatus();
  std::uint8_t subsystem = 0;
  std::uint64_t offset = 0;
  bool isOlder = false;
  bool isNewer = true;
  std::vector<ktifw::ContextInterface*> children;
};

TEST_F(ContextLib, PassesQuestionsAndAnswersThrough) {
  const auto read = context.contextualize(5, status);
  EXPECT_TRUE(read.subsystem == 1 && read.offset == 0x10005);
  const auto write = context.contextualizeWrite(6, 99, status);
  EXPECT_TRUE(write.subsystem == 1 && write.offset == 0x10006 && write.value == 99);
  EXPECT_THAT(context.getInfo(status).values, ElementsAre(101, 4, 3, 0));
  context.getSubsystemAndOffset(subsystem, offset, status);
  EXPECT_TRUE(subsystem == 1 && offset == 0x10000);
  auto* const child = parent.getChild(7, 0, status);
  EXPECT_EQ(child, map.getContext(other, status));
  auto* const ofGenerator = map.getContext(2, status);
  parent.getChildrenByUid(101, children, status);
  parent.getAllChildren(children, status);
  EXPECT_THAT(children, ElementsAre(ofGenerator, ofGenerator, child));
  generator.takeCalls();
  context.checkVersion(5, 2, false, &isOlder, &isNewer, status);
  context.checkVersion(4, 3, true, nullptr, nullptr, status);
  EXPECT_TRUE(isOlder && !isNewer);
  EXPECT_EQ(status.code, 0);
  EXPECT_EQ(parent.getChild(7, 1, status), nullptr);
  EXPECT_EQ(status.code, KTSIM_E_CHILD);
  EXPECT_EQ(generator.takeCalls(),
            "ktIFW_Context_CheckVersion context=2 major=5 minor=2 flag=0\n"
            "ktIFW_Context_CheckVersion context=2 major=4 minor=3 flag=1\n"
            "ktIFW_Context_GetChild context=1 childType=7 flag=1 = -70011\n");
}

TEST_F(ContextLib, AsksUnderAnErrorOnlyWhatAlwaysAsks) {
  status.code = -7;
  EXPECT_EQ(context.contextualize(5, status).offset, 0u) << "the framework is told of the error";
  context.contextualizeWrite(6, 99, status);
  context.checkVersion(5, 2, false, &isOlder, &isNewer, status);
  EXPECT_TRUE(!isOlder && isNewer) << "results written under an error";
  EXPECT_EQ(generator.takeCalls(),
            "ktIFW_Context_Contextualize context=2 offset=5\n"
            "ktIFW_Context_Contextualize context=2 offset=6\n"
            "ktIFW_Context_CheckVersion context=2 major=5 minor=2 flag=0\n");
  context.getInfo(status);
  context.getSubsystemAndOffset(subsystem, offset, status);
  EXPECT_EQ(parent.getChild(7, 0, status), nullptr);
  parent.getChildrenByUid(101, children, status);
  parent.getAllChildren(children, status);
  EXPECT_EQ(generator.takeCalls(), "");
}

}  // namespace
