// Generators of today have an alignment quantum of 1, which never refuses; here one has 8.
#include <gmock/gmock.h>

#include <functional>

#include "kterr/Exception.h"
#include "ktifw_lib_client/FIFORegBusLib.h"
#include "ktifw_lib_client/SubsystemMapLib.h"
#include "ktisl/FifoFpgaHw.h"
#include "ktorba/commandControl/CommandControl.h"
#include "ktorba/hwControl/HWControl.h"
#include "ktorba/script/ScriptTable.h"
#include "ktorba/waveform/WaveformTable.h"
#include "source/ktorba_lib/SimulatedGenerator.h"

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
  SimulatedGenerator generator(SimulatedGenerator::smallTraits());
  kterr::tLocatedStatus status = kterr::makeLocatedStatus();
  ktifw_lib_client::SubsystemMapLib map(generator.fpga.ifwSession);
  ktifw_lib_client::FIFORegBusLib bus(generator.fpga.ifwTarget);
  AligningCommandControl control(*map.getContext(2, status), bus, status);
  ktisl::FifoFpgaHw<unsigned char> fifo(generator.fpga.fpgaSession, 0);
  WaveformTable<WaveformEntry> waveforms;
  ScriptTable scripts;
  HWControl engine(control, fifo, ktwfmscriptcompiler::standardScriptTraits(), waveforms, scripts);

  struct Case {
    std::function<void()> call;
    const char* failure;  // a part of the elaboration; null: none
  };
  const Case cases[] = {
      {[&] { engine.allocateWaveform("w", 12); }, R"(kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum")"},
      {[&] { engine.allocateWaveform("w", 16); }, nullptr},
      {[&] { engine.setWaveformNextWritePosition("nobody", 0, 4); },
       R"(kErrorWritePositionIsNotMultipleOfAlignmentQuantum")"},
      {[&] { engine.setWaveformNextWritePosition("w", 0, 16); }, nullptr},
      {[&] { engine.setWaveformNextWritePosition("w", 1, 0u - 8); }, nullptr},
      {[&] { engine.writeScript("script s wait 12 end script"); }, R"(kErrorNumSamplesToWaitNotMultipleOfQuantum")"},
      {[&] { engine.writeScript("script s wait 16 end script"); }, nullptr},
  };
  for (const Case& c : cases) {
    std::string failure;
    try {
      c.call();
    } catch (const kterr::Exception& e) {
      failure = e.getJson();
    }
    EXPECT_THAT(failure, testing::HasSubstr(c.failure != nullptr ? c.failure : "")) << "call " << &c - cases;
    EXPECT_EQ(failure.empty(), c.failure == nullptr) << "call " << &c - cases;
  }
}

}  // namespace
}  // namespace ktorba
