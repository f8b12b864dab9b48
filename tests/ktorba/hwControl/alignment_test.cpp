// Generators of today have an alignment quantum of 1, which never refuses; here one has 8.
#include <gmock/gmock.h>

#include "ktisl/FifoFpgaHw.h"
#include "ktorba/hwControl/HWControl.h"
#include "ktorba/script/ScriptTable.h"
#include "ktorba/waveform/WaveformTable.h"
#include "testing/SimulatedControl.h"
#include "testing/caught.h"

namespace ktorba {
namespace {

class AligningCommandControl : public CommandControl {
 public:
  using CommandControl::CommandControl;
  void getHWTraits(HWTraits& out, Status& status, bool refresh) override {
    CommandControl::getHWTraits(out, status, refresh);
    out.alignmentQuantum = 8;
  }
};

TEST(HWControl, WhatIsNotAlignedIsRefused) {
  SimulatedControl<AligningCommandControl> on;
  ktisl::FifoFpgaHw<unsigned char> fifo(on.generator.fpga.fpgaSession, 0);
  WaveformTable<WaveformEntry> waveforms;
  ScriptTable scripts;
  HWControl engine(on.control, fifo, ktwfmscriptcompiler::standardScriptTraits(), waveforms, scripts);

  EXPECT_THAT(failureOf([&] { engine.allocateWaveform("w", 12); }),
              testing::HasSubstr(R"(kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum")"));
  EXPECT_EQ(failureOf([&] { engine.allocateWaveform("w", 16); }), "");
  EXPECT_THAT(failureOf([&] { engine.setWaveformNextWritePosition("nobody", 0, 4); }),
              testing::HasSubstr(R"(kErrorWritePositionIsNotMultipleOfAlignmentQuantum")"));
  EXPECT_EQ(failureOf([&] { engine.setWaveformNextWritePosition("w", 0, 16); }), "");
  EXPECT_EQ(failureOf([&] { engine.setWaveformNextWritePosition("w", 1, 0u - 8); }), "");
  EXPECT_THAT(failureOf([&] { engine.writeScript("script s wait 12 end script"); }),
              testing::HasSubstr(R"(kErrorNumSamplesToWaitNotMultipleOfQuantum")"));
  EXPECT_EQ(failureOf([&] { engine.writeScript("script s wait 16 end script"); }), "");
}

}  // namespace
}  // namespace ktorba
