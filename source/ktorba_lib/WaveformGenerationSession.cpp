#include "source/ktorba_lib/WaveformGenerationSession.h"

#include <string>
#include <utility>

#include "conventions/conventions.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "kterr/Failure.h"
#include "ktifw_lib_client/ContextLib.h"
#include "ktisl/FifoFpgaHw.h"
#include "ktorba/commandControl/CommandControl.h"
#include "ktorba/commandControl/raisingLocated.h"
#include "ktorba/hwControl/HWControl.h"
#include "ktsstutf8/toUtf8.h"

namespace ktorba_lib {
namespace {

using Status = kterr::tLocatedStatus;

constexpr char kSource[] = R"(source\ktorba_lib\WaveformGenerationSession)";
constexpr std::uint32_t kFlaggedSession = 0x2000;

// Decides which sessions are of the same generator.
std::string identity(const GeneratorAddress& generator) {
  return std::to_string(generator.fpgaSession) + ", " + std::to_string(generator.instance);
}

[[noreturn]] void raiseWriteFailure(const kterr::ErrorConstant& error, const char* text) {
  kterr::Failure(error).at(kSource).message("WriteWaveform", text).raise();
}

}  // namespace

WaveformGenerationSession::WaveformGenerationSession(const GeneratorAddress& generator)
    : SessionInterface(identity(generator)), subsystemMap_(generator.ifwSession), registerBus_(generator.ifwTarget) {
  if ((generator.fpgaSession & kFlaggedSession) != 0) {
    kterr::Failure(ktorba_codes::kFlaggedFpgaSession).at(kSource, 40).raise();
  }
  const ktisl::BitfileLumShared bitfile(generator.fpgaSession);
  connectCommandControl(generator);
  connectDownloadFifo(generator.fpgaSession, bitfile);
  hwControl_ = std::make_unique<ktorba::HWControl>(
      *commandControl_, *downloadFifo_, ktwfmscriptcompiler::standardScriptTraits(), waveformTable_, scriptTable_);
  ktorba::HWTraits traits;
  hwControl_->getHWTraits(traits, false);
  settingsCalculator_ = std::make_unique<ktorba::SettingsCalculator>(traits);
  requestedSettings_.primingDepth = traits.samplesPerMemoryWord * ktorba::kDefaultPrimingWords;
}

WaveformGenerationSession::~WaveformGenerationSession() = default;

void WaveformGenerationSession::connectCommandControl(const GeneratorAddress& generator) {
  ktifw_lib_client::ContextLib parent(generator.ifwSession, generator.parentContext, subsystemMap_);
  ktifw::ContextInterface* context = nullptr;
  ktorba::raisingLocated(
      [&](Status& status) { context = parent.getChild(ktorba::kGeneratorContextType, generator.instance, status); });
  if (context == nullptr) {  // without an error: a framework that answers with nothing
    kterr::Failure(nKTAPALS100_tStatus_kInvalidParameter)
        .at(kSource)
        .message("WaveformGenerationSession", "The parent context has no such generator.")
        .raise();
  }
  ktorba::raisingLocated([&](Status& status) {
    commandControl_ = std::make_unique<ktorba::CommandControl>(*context, registerBus_, status);
  });
}

void WaveformGenerationSession::connectDownloadFifo(std::uint32_t fpgaSession, const ktisl::BitfileLumShared& bitfile) {
  ktorba::HWTraits traits;
  ktorba::raisingLocated([&](Status& status) { commandControl_->getHWTraits(traits, status, false); });
  const std::string name = ktorba::downloadFifoName(traits.downloadFifoNumber);
  downloadFifo_ = std::make_unique<ktisl::FifoFpgaHw<unsigned char>>(fpgaSession, bitfile.findFifo(name.c_str()));
}

void WaveformGenerationSession::applySettings(const ktorba::GenerationSettings& requested) {
  ktorba::GenerationSettings accepted = requested;
  ktorba::AdjustedSettings adjusted;
  ktorba::HWSettingsRecord hardware;
  settingsCalculator_->calculateSettings(waveformTable_, requested, adjusted, hardware);
  hwControl_->receiveSettings(hardware);
  hwControl_->configureGeneration(false);
  requestedSettings_ = std::move(accepted);
  calculatedSettings_ = std::move(adjusted);
}

void WaveformGenerationSession::configureStreamingWaveform(const std::string& name) {
  ktorba::GenerationSettings settings = requestedSettings_;
  settings.streamingWaveformName = name;
  applySettings(settings);
}

void WaveformGenerationSession::writeWaveform(const char* waveformName, const std::uint32_t* data,
                                              std::uint32_t numSamples, std::int32_t timeoutMs) {
  writeSamples(waveformName, data, numSamples, timeoutMs);
}

void WaveformGenerationSession::writeWaveform(const char* waveformName, const std::int16_t* data,
                                              std::uint32_t numSamples, std::int32_t timeoutMs) {
  writeSamples(waveformName, data, numSamples, timeoutMs);
}

template <typename Sample>
void WaveformGenerationSession::writeSamples(const char* waveformName, const Sample* data, std::uint32_t numSamples,
                                             std::int32_t timeoutMs) {
  if (waveformName == nullptr) raiseWriteFailure(nKTAPALS100_tStatus_kInvalidParameter, "Waveform name is NULL.");
  if (data == nullptr) raiseWriteFailure(nKTAPALS100_tStatus_kInvalidParameter, "Waveform data is NULL.");
  ktorba::HWTraits traits;
  hwControl_->getHWTraits(traits, false);
  if (traits.sampleWidthBits != sizeof(Sample) * 8) {
    raiseWriteFailure(ktorba_errors::kErrorInternalSWError,
                      "Requested sample size does not match hardware configuration for sample size.");
  }
  const ktorba::DataWrapperNoCopy view(data, numSamples);
  hwControl_->writeWaveform(ktsstutf8::toUtf8(waveformName), view, static_cast<std::uint32_t>(timeoutMs), true);
}

}  // namespace ktorba_lib
