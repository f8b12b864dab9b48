// The session behind a handle: wires the whole engine for one generator of an opened FPGA, keeps the settings that
// the host asked for, and carries out the operations that are more than a call of the facade. Everything it builds
// lives as long as the session; the FPGA session and the framework session stay the host's.
//
// It takes no lock: one session is used from one thread at a time. Different sessions are independent.
#pragma once

#include <memory>

#include "ktifw_lib_client/FIFORegBusLib.h"
#include "ktifw_lib_client/SubsystemMapLib.h"
#include "ktisl/BitfileLumShared.h"
#include "ktisl/Fifo.h"
#include "ktorba/commandControl/CommandControlInterface.h"
#include "ktorba/script/ScriptTable.h"
#include "ktorba/settings/SettingsCalculator.h"
#include "ktorba/waveform/WaveformTable.h"
#include "source/ktorba_lib/SessionInterface.h"
#include "source/ktorba_lib/openSession.h"

namespace ktorba_lib {

class WaveformGenerationSession : public SessionInterface {
 public:
  // Finds the generator, reads its traits and starts its download FIFO; configures nothing (applySettings does).
  // Raises what the platform reports, the refusals of the command layer and of HWControl, and -1 for an FPGA session
  // with the flag bit 0x2000.
  explicit WaveformGenerationSession(const GeneratorAddress& generator);
  // Sends nothing to the hardware: a generator that runs goes on.
  ~WaveformGenerationSession() override;

  ktorba::HWControlInterface& getHWControl() override { return *hwControl_; }
  ktorba::GenerationSettings getRequestedSettings() const override { return requestedSettings_; }

  // A request that the calculation accepted and the hardware refused has reached the facade all the same; the next
  // one that succeeds replaces it.
  void applySettings(const ktorba::GenerationSettings& requested) override;
  void configureStreamingWaveform(const std::string& name) override;

  // Raise ktorba_errors::kErrorInternalSWError for samples of another width than the generator's.
  void writeWaveform(const char* waveformName, const std::uint32_t* data, std::uint32_t numSamples,
                     std::int32_t timeoutMs) override;
  void writeWaveform(const char* waveformName, const std::int16_t* data, std::uint32_t numSamples,
                     std::int32_t timeoutMs) override;

 private:
  void connectCommandControl(const GeneratorAddress& generator);
  void connectDownloadFifo(std::uint32_t fpgaSession, const ktisl::BitfileLumShared& bitfile);
  template <typename Sample>
  void writeSamples(const char* waveformName, const Sample* data, std::uint32_t numSamples, std::int32_t timeoutMs);

  // In the order of construction: each stands on those before it.
  ktifw_lib_client::SubsystemMapLib subsystemMap_;
  ktifw_lib_client::FIFORegBusLib registerBus_;
  ktorba::WaveformTable<ktorba::WaveformEntry> waveformTable_;
  ktorba::ScriptTable scriptTable_;
  std::unique_ptr<ktisl::Fifo<unsigned char>> downloadFifo_;
  std::unique_ptr<ktorba::CommandControlInterface> commandControl_;
  std::unique_ptr<ktorba::HWControlInterface> hwControl_;
  ktorba::GenerationSettings requestedSettings_;
  ktorba::AdjustedSettings calculatedSettings_;  // what became of the last accepted request
  std::unique_ptr<ktorba::SettingsCalculator> settingsCalculator_;
};

}  // namespace ktorba_lib
