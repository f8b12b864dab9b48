#include "ktorba/commandControl/CommandControl.h"

#include <gmock/gmock.h>

#include <map>
#include <string>
#include <vector>

#include "kterr/Exception.h"
#include "ktorba/commandControl/TransitionableCommandControl.h"

namespace ktorba {
namespace {

using Status = kterr::tLocatedStatus;

// A register block and its bus in one; `log` tells what was asked of them.
class FakeRegisters : public ktifw::ContextInterface, public ktifw::InstructionTarget {
 public:
  std::string log;
  std::map<std::uint64_t, std::uint64_t> values = {{17, 0x103}, {0, 0x108}, {2, 0x10040}, {3, 4096},
                                                   {4, 128},    {5, 512},   {1, 16},      {25, 1ull << 40}};
  std::uint16_t type = 101;
  std::string tooOldFor, tooNewFor;  // versions, as "4.2"
  std::int32_t busError = 0;         // what transfers report
  std::string failingRead;           // the only one that does, when not empty

  std::string takeLog() { return std::exchange(log, ""); }

  ktifw::ReadInstruction contextualize(std::uint64_t offset, Status&) override { return {7, offset}; }
  ktifw::WriteInstruction contextualizeWrite(std::uint64_t offset, std::uint64_t value, Status&) override {
    return {7, offset, value};
  }
  ktifw::ContextInfo getInfo(Status&) override {
    log += "info ";
    return {{type, 1, 2, 3}};
  }
  void checkVersion(std::uint16_t major, std::uint16_t minor, bool flag, bool* first, bool* second, Status&) override {
    const std::string version = std::to_string(major) + "." + std::to_string(minor);
    log += "version" + version + (flag ? "! " : " ");
    if (first != nullptr) *first = version == tooOldFor;
    if (second != nullptr) *second = version == tooNewFor;
  }
  void read(const ktifw::ReadInstruction& instruction, std::uint64_t& value, std::uint32_t timeoutMs,
            Status& status) override {
    if (status.code < 0) return;
    const std::string name = "r" + std::to_string(instruction.offset);
    log += name + " ";
    value = values[instruction.offset];
    if (failingRead.empty() || failingRead == name) report(timeoutMs, status);
  }
  void write(const ktifw::WriteInstruction& instruction, bool flag, std::uint32_t timeoutMs, Status& status) override {
    log += text(instruction) + (flag ? "; " : " unflagged; ");
    report(timeoutMs, status);
  }
  void writeArray(const ktifw::WriteInstruction* instructions, std::uint32_t count, bool flag, std::uint32_t timeoutMs,
                  Status& status) override {
    log += "[";
    for (std::uint32_t i = 0; i < count; ++i) log += (i == 0 ? "" : " ") + text(instructions[i]);
    log += flag ? "] " : "] unflagged ";
    report(timeoutMs, status);
  }

  void getSubsystemAndOffset(std::uint8_t&, std::uint64_t&, Status&) override {}
  ContextInterface* getChild(std::uint16_t, std::uint8_t, Status&) override { return nullptr; }
  void getChildrenByUid(std::uint16_t, std::vector<ContextInterface*>&, Status&) override {}
  void getAllChildren(std::vector<ContextInterface*>&, Status&) override {}
  void readArray(const ktifw::ReadInstruction*, std::uint32_t, std::uint64_t*, std::uint32_t, Status&) override {}
  void reset(Status&) override {}

 private:
  static std::string text(const ktifw::WriteInstruction& write) {
    return std::to_string(write.offset) + "=" + std::to_string(write.value);
  }
  void report(std::uint32_t timeoutMs, Status& status) const {
    EXPECT_EQ(timeoutMs, 1000u);
    if (busError != 0) kterr::mergeCode(status, busError, "bus", "bus.c", 1);
  }
};

class CommandControlTest : public testing::Test {
 protected:
  CommandControl open() {
    status = kterr::makeLocatedStatus();
    return CommandControl(registers, registers, status);
  }

  FakeRegisters registers;
  Status status = kterr::makeLocatedStatus();
};

TEST_F(CommandControlTest, OpenChecksTheBlockAndReadsItsTraits) {
  CommandControl control = open();
  EXPECT_EQ(registers.takeLog(), "info version4.2 r17 r0 r2 r3 r4 r5 r1 r27 version4.3 ");
  HWTraits t;
  control.getHWTraits(t, status, false);
  EXPECT_EQ(registers.takeLog(), "") << "known traits need no bus";
  // The divisor of the waveform memory size is one more than the bytes of a memory word.
  EXPECT_THAT((std::vector<std::uint32_t>{t.downloadFifoNumber, t.minFetchSamplesByte, t.minFetchSamples,
                                          t.memoryWordBits, t.memorySizeBytes, t.sequenceMemoryWords, t.maxPrimingWords,
                                          t.sampleWidthBits, t.downloadElementBits, t.waveformMemorySize,
                                          t.samplesPerMemoryWord, t.alignmentQuantum, t.hasStreamingRegisters}),
              testing::ElementsAre(3, 8, 8, 64, 4096, 128, 512, 16, 32, 4096 / 9, 4, 1, true));
}

TEST_F(CommandControlTest, OpenRefuses) {
  struct Case {
    void (*spoil)(FakeRegisters&);
    std::int32_t code;
    std::uint32_t line;
  };
  const Case cases[] = {
      {[](FakeRegisters& r) { r.type = 102; }, -1074101587, 208},
      {[](FakeRegisters& r) { r.tooOldFor = r.tooNewFor = "4.2"; }, -1074101621, 217},
      {[](FakeRegisters& r) { r.tooNewFor = "4.2"; }, -1074101622, 222},
      {[](FakeRegisters& r) { r.values[1] = 0x100; }, -1074097783, 261},
  };
  for (const Case& c : cases) {
    registers = {};
    c.spoil(registers);
    open();
    EXPECT_EQ(status.code, c.code);
    EXPECT_EQ(status.line, c.line);
    EXPECT_STREQ(status.component, "ktorbau");
    EXPECT_STREQ(status.file, R"(includes\ktorba\commandControl\CommandControl)");
  }
}

TEST_F(CommandControlTest, FailedRefreshKeepsTheTraitsAndReadsAgainNextTime) {
  CommandControl control = open();
  registers.values[3] = 8192;
  registers.busError = -9;
  registers.failingRead = "r27";
  HWTraits traits;
  control.getHWTraits(traits, status, true);
  EXPECT_EQ(status.code, -9);
  EXPECT_EQ(traits.memorySizeBytes, 4096u);
  registers.busError = 0;
  status = kterr::makeLocatedStatus();
  control.getHWTraits(traits, status, false);
  EXPECT_EQ(traits.memorySizeBytes, 8192u);
}

TEST_F(CommandControlTest, SettingsAreSentWhenTheyChangedOrFailedOrByForce) {
  registers.tooOldFor = "4.3";
  CommandControl plain = open();
  registers.tooOldFor = "";
  CommandControl streaming = open();
  registers.takeLog();

  constexpr char kDefaults[] = "[14=60 13=30 12=199] ";
  plain.writeSettings(status, false);
  EXPECT_EQ(registers.takeLog(), kDefaults);
  plain.writeSettings(status, false);
  EXPECT_EQ(registers.takeLog(), "");
  plain.writeSettings(status, true);
  EXPECT_EQ(registers.takeLog(), kDefaults);

  registers.busError = -9;
  plain.writeSettings(status, true);
  EXPECT_EQ(status.code, -9);
  registers.busError = 0;
  registers.takeLog();
  status = kterr::makeLocatedStatus();
  plain.writeSettings(status, false);
  EXPECT_EQ(registers.takeLog(), kDefaults) << "nobody knows what a failed transfer left";

  streaming.setSettings({1, 2, 0, true, 11, 12, 13, 14, 15, 16}, status);
  streaming.writeSettings(status, false);
  EXPECT_EQ(registers.takeLog(), "[14=1 13=2 12=4294967295 18=11 19=12 20=13 21=14 22=1 26=15 23=16 24=1] ");
}

TEST_F(CommandControlTest, MemoryWritesArePutIntoWordsOfTheRegisterBlock) {
  CommandControl control = open();
  registers.takeLog();
  MemoryWriteRequest request;
  request.memoryAddress = 64;
  request.transferElements = 5;
  request.maskedWrite = 1;
  request.firstWordByteMask = 0xF0;
  request.lastWordByteMask = 0x0F;
  control.announceMemoryWrite(request, status);
  request.maskedWrite = 0;
  control.announceMemoryWrite(request, status);
  control.resetStreamingWritePointer(status);
  EXPECT_EQ(registers.log,
            "[10=64 11=5 15=240 16=15 9=1 7=8] "
            "[10=64 11=5 15=65535 16=65535 9=0 7=8] "
            "[23=0 24=1] ");
  EXPECT_EQ(control.readStreamingSpace(status), 1ull << 40);
}

TEST_F(CommandControlTest, AnErrorInTheStatusStopsEveryOperation) {
  CommandControl control = open();
  registers.takeLog();
  status.code = -1;
  HWTraits traits;
  bool flag = true;
  control.getHWTraits(traits, status, true);
  control.setSettings({9, 9, 9}, status);
  control.writeSettings(status, true);
  control.commandInitiate(status);
  control.commandReset(status);
  control.commandAbort(status);
  control.readGenerationDone(flag, status);
  control.readDataUnderflow(flag, status);
  control.announceMemoryWrite({}, status);
  control.readMemoryWriteComplete(flag, status);
  control.resetStreamingWritePointer(status);
  EXPECT_EQ(control.readStreamingSpace(status), 0u);
  CommandControl(registers, registers, status);
  EXPECT_EQ(registers.log, "");
  EXPECT_TRUE(flag);
  status = kterr::makeLocatedStatus();
  control.writeSettings(status, true);
  EXPECT_EQ(registers.log.substr(0, 7), "[14=60 ") << "the settings were not taken";
}

TEST_F(CommandControlTest, TransitionsWriteTheirCommandsAndRaise) {
  CommandControl control = open();
  registers.takeLog();
  TransitionableCommandControl transitions(control);
  transitions.initiate();
  transitions.prepare();
  transitions.reset();
  transitions.abort();
  EXPECT_EQ(registers.takeLog(), "7=2; 7=1; 7=4; ");
  registers.busError = -9;
  try {
    transitions.initiate();
    FAIL() << "the bus failed";
  } catch (const kterr::Exception& e) {
    EXPECT_EQ(e.code(), -9);
    EXPECT_STREQ(e.getJson(), R"({"file":"bus.c","line":1,"component":"bus"})");
  }
}

}  // namespace
}  // namespace ktorba
