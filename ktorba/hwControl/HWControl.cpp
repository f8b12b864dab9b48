#include "ktorba/hwControl/HWControl.h"

#include <algorithm>
#include <limits>
#include <string_view>
#include <utility>

#include "ktcheckname/compareNames.h"
#include "kterr/Failure.h"
#include "ktorba/commandControl/raisingLocated.h"
#include "ktorba/hwControl/requireWorkableTraits.h"
#include "ktorba/waveform/MemoryBlockManager.h"
#include "ktorba/waveform/ScopeExitCleanupOperation.h"

namespace ktorba {
namespace {

using Status = kterr::tLocatedStatus;

constexpr char kSource[] = R"(includes\ktorba\hwControl\HWControl)";
constexpr char kWritePosition[] = "Write Position";
constexpr std::uint32_t kInitialAuxiliarySize = 40960;
constexpr std::uint32_t kInitialWriteChunkBytes = 32768;
constexpr std::int32_t kScriptTimeoutMs = 5000;

bool sameName(std::string_view a, std::string_view b) { return ktcheckname::compareNames(a, b) == 0; }

std::string_view streamingName(const HWSettingsRecord& settings) {
  return {settings.streamingWaveformName, settings.streamingWaveformNameLength};
}

}  // namespace

HWControl::HWControl(CommandControlInterface& commandControl, ktisl::Fifo<unsigned char>& downloadFifo,
                     const ktwfmscriptcompiler::ScriptTraits& scriptTraits, WaveformTableInterface& waveformTable,
                     ScriptTableInterface& scriptTable)
    : commandControl_(commandControl),
      downloadFifo_(downloadFifo),
      auxiliarySize_(kInitialAuxiliarySize),
      downloadManager_(commandControl_, downloadFifo_),
      scriptTraits_(scriptTraits),
      waveformTable_(waveformTable),
      scriptTable_(scriptTable),
      writeChunkSize_(kInitialWriteChunkBytes) {
  stateManager_ =
      std::make_unique<StateManager>(std::vector<TransitionableInterface*>{&commandControl_, &downloadManager_}, *this,
                                     std::vector<SettingReceiverInterface*>{&downloadManager_}, *this,
                                     std::vector<HWTraitReceiverInterface*>{&downloadManager_, &encoder_});
  setAuxiliarySize(kInitialAuxiliarySize, true);
  memoryBlockManager_ = std::make_unique<MemoryBlockManager>(traits_.memorySizeBytes, traits_.memoryWordBytes());
  waveformStore_ = std::make_unique<WaveformStore>(traits_, waveformTable_, *memoryBlockManager_);
  scriptTraits_.alignmentQuantum = traits_.alignmentQuantum;
  scriptTraits_.minWaitLength = traits_.minFetchSamplesByte;
  scriptProcessor_ = std::make_unique<ScriptProcessor>(scriptTraits_, &encoder_, traits_.minFetchSamplesByte);
}

void HWControl::getHWTraits(HWTraits& out, bool refresh) {
  if (refresh) refreshTraits();
  out = traits_;
}

void HWControl::receiveSettings(const HWSettingsRecord& settings) {
  raisingLocated([&](Status& status) { commandControl_.setSettings(settings.settings, status); });
  settings_ = settings;
}

void HWControl::setAuxiliarySize(std::uint32_t value, bool refresh) {
  if (refresh) refreshTraits();
  traits_.auxiliarySize = value;
  auxiliarySize_ = value;
  stateManager_->distributeHWTraits(traits_);
}

void HWControl::startGeneration() {
  if (scriptTable_.getActiveScript().empty()) {
    kterr::Failure(ktorba_errors::kErrorActiveSequenceNotSpecified).at(kSource).raise();
  }
  stateManager_->prepare();
  stateManager_->initiate();
}

void HWControl::abortGeneration() {
  const bool wasRunning = stateManager_->getState() == GenerationState::kInitiated;
  const std::string streaming(streamingName(settings_));  // made first: no memory must not cut an abort in two
  stateManager_->abort();
  if (!wasRunning || !settings_.settings.streamingEnabled) return;
  waveformTable_.getWaveform(streaming).writePosition = 0;
  raisingLocated([&](Status& status) { commandControl_.resetStreamingWritePointer(status); });
}

void HWControl::readGenerationDone(bool& out) {
  raisingLocated([&](Status& status) { commandControl_.readGenerationDone(out, status); });
}

void HWControl::readDataUnderflow(bool& out) {
  raisingLocated([&](Status& status) { commandControl_.readDataUnderflow(out, status); });
}

bool HWControl::checkGenerationStatus() {
  bool underflow = false;
  readDataUnderflow(underflow);
  if (underflow) kterr::Failure(ktorba_errors::kErrorDeviceDataUnderflow).at(kSource).raise();
  bool done = false;
  readGenerationDone(done);
  return done;
}

void HWControl::setWaveformNextWritePosition(const std::string& name, std::uint32_t mode, std::uint32_t offset) {
  if (offset % traits_.alignmentQuantum != 0) {
    kterr::Failure(ktorba_errors::kErrorWritePositionIsNotMultipleOfAlignmentQuantum)
        .at(kSource)
        .usage(kterr::kUsageTypeAlignmentQuantum, traits_.alignmentQuantum)
        .raise();
  }
  WaveformEntry& waveform = waveformTable_.getWaveform(name);
  // The product is a signed 32-bit one: an offset of 0xFFFFFFFF is one sample back.
  std::int64_t position = static_cast<std::int32_t>(traits_.sampleBytes() * offset);
  if (mode == 1) {
    position += waveform.writePosition;
  } else if (mode != 0) {
    kterr::Failure(nKTAPALS100_tStatus_kInvalidParameter)
        .at(kSource)
        .usage(kterr::kUsageTypeParameterName, kWritePosition)
        .raise();
  }
  if (position < 0 || position > static_cast<std::int64_t>(lengthBytes(waveform))) {
    kterr::Failure(ktorba_errors::kErrorWritePositionIsOutsideWaveformBoundary)
        .at(kSource)
        .usage(kterr::kUsageTypeAllocWaveformLength, waveform.allocatedLength)
        .usage(kWritePosition, position / static_cast<std::int64_t>(traits_.sampleBytes()))
        .raise();
  }
  waveform.writePosition = static_cast<std::uint32_t>(position);
}

void HWControl::writeWaveform(const std::string& name, const DataWrapperInterface& data, std::uint32_t timeoutMs,
                              bool allocateIfMissing) {
  const std::uint64_t numSamples = data.getElementCount();
  if (numSamples == 0) {
    kterr::Failure(ktorba_errors::kErrorNumSamplesInWaveformMustBeGreaterThanZero)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformLength, std::uint32_t{0})
        .raise();
  }
  const bool allocates = allocateIfMissing && !waveformTable_.containsWaveform(name);
  if (allocates) {
    // A longer view than a waveform can be is refused by the allocation or by the write.
    constexpr std::uint64_t kMaxSamples = std::numeric_limits<std::uint32_t>::max();
    allocateWaveform(name, static_cast<std::uint32_t>(std::min(numSamples, kMaxSamples)));
  }
  ScopeExitCleanupOperation giveBack([&] { clearWaveform(name); });
  if (!allocates) giveBack.dismiss();
  writeSamples(waveformTable_.getWaveform(name), data, static_cast<std::int32_t>(timeoutMs));
  giveBack.dismiss();
}

void HWControl::clearAllWaveforms() {
  waveformStore_->clearAll();  // alone may fail, and then nothing has changed
  clearAllScripts();           // they refer to waveforms
}

void HWControl::writeScript(const std::string& text) {
  std::vector<CompiledScript> scripts;
  scriptProcessor_->compileScripts(text, scripts);
  for (CompiledScript& script : scripts) {
    auto entry = std::make_shared<ScriptEntry>();
    scriptProcessor_->buildInstructionWords(script, waveformTable_, *entry);
    entry->script = std::move(script);
    if (entry->instructionWords.size() > traits_.sequenceMemoryWords) {
      kterr::Failure(ktorba_errors::kErrorSequenceSizeTooLarge).at(kSource).raise();
    }
    scriptTable_.addScript(entry->script.name, entry);
  }
}

void HWControl::selectActiveScript(const std::string& name, std::uint32_t& activeScriptLength) {
  std::uint32_t length = 0;
  if (!name.empty()) {
    const std::shared_ptr<ScriptEntry> script = scriptTable_.getScript(name);
    if (!isLoadedAndActive(name, *script)) downloadScript(*script);
    length = script->finiteMemoryWords;
  }
  activeScriptLength = length;
  scriptTable_.setActiveScript(name);
}

bool HWControl::isStreamingWaveform(const std::string& name) { return sameName(name, streamingName(settings_)); }

std::uint64_t HWControl::checkStreamingWaveformSpace() {
  if (streamingName(settings_).empty()) {
    kterr::Failure(ktorba_errors::kErrorSpecifiedWaveformNotFound).at(kSource).raise();
  }
  const WaveformEntry& waveform = streamingWaveform();
  std::uint64_t freeWords = 0;
  raisingLocated([&](Status& status) { freeWords = commandControl_.readStreamingSpace(status); });
  // A waveform that ends inside a memory word cannot fill that word.
  if (freeWords != 0 && lengthBytes(waveform) % traits_.memoryWordBytes() != 0) --freeWords;
  return freeWords * traits_.memoryWordBytes() / traits_.sampleBytes();
}

std::uint64_t HWControl::lengthBytes(const WaveformEntry& waveform) const {
  return std::uint64_t{traits_.sampleBytes()} * waveform.allocatedLength;
}

WaveformEntry& HWControl::streamingWaveform() {
  return waveformTable_.getWaveform(std::string(streamingName(settings_)));
}

void HWControl::refreshTraits() {
  HWTraits traits = traits_;
  raisingLocated([&](Status& status) { commandControl_.getHWTraits(traits, status, true); });
  requireWorkableTraits(traits);
  traits.auxiliarySize = auxiliarySize_;
  traits_ = traits;
}

void HWControl::writeSamples(WaveformEntry& waveform, const DataWrapperInterface& data, std::int32_t timeoutMs) {
  const bool streaming = stateManager_->getState() == GenerationState::kInitiated && isStreamingWaveform(waveform.name);
  checkWriteFits(waveform, data.getElementCount(), streaming);
  const std::uint64_t size = lengthBytes(waveform);
  const std::uint64_t total = traits_.sampleBytes() * data.getElementCount();
  std::uint64_t position = waveform.writePosition;
  const Deadline deadline(timeoutMs);
  for (std::uint64_t written = 0; written < total;) {
    if (streaming) position %= size;  // the end of the waveform is followed by its start
    const std::uint64_t piece = std::min(total - written, size - position);
    writePiece(waveform, position, data, written, piece, deadline);
    position += piece;
    written += piece;
  }
  waveform.writePosition = static_cast<std::uint32_t>(position);
}

void HWControl::checkWriteFits(const WaveformEntry& waveform, std::uint64_t numSamples, bool streaming) const {
  const std::uint64_t start = streaming ? 0 : waveform.writePosition;
  if (start + traits_.sampleBytes() * numSamples <= lengthBytes(waveform)) return;
  kterr::Failure(ktorba_errors::kErrorCannotWriteDataOutsideWaveformBoundaries)
      .at(kSource)
      .usage(kterr::kUsageTypeAllocWaveformLength, waveform.allocatedLength)
      .usage(kWritePosition, std::uint64_t{waveform.writePosition / traits_.sampleBytes()})
      .usage(kterr::kUsageTypeNumSampsToWrite, numSamples)
      .raise();
}

void HWControl::writePiece(const WaveformEntry& waveform, std::uint64_t position, const DataWrapperInterface& data,
                           std::uint64_t dataOffset, std::uint64_t byteCount, const Deadline& deadline) {
  MemoryWriteRequest request;
  request.maxChunkBytes = writeChunkSize_;
  std::uint64_t totalBytes = 0;
  downloadManager_.prepareSampleWrite(byteCount, waveform.memoryOffset, position, totalBytes, request);
  request.byteCount = byteCount;
  request.dataOffset = dataOffset;
  downloadManager_.writeData(request, data, deadline.remainingMs());
}

bool HWControl::isLoadedAndActive(const std::string& name, const ScriptEntry& script) const {
  return script.isLoaded && sameName(name, scriptTable_.getActiveScript());
}

void HWControl::downloadScript(ScriptEntry& script) {
  {
    const std::uint64_t announcedBefore = downloadManager_.announcedWrites();
    // Also where all goes well: the script is not the active one before it has become that.
    const ScopeExitCleanupOperation forget([&] {
      if (downloadManager_.announcedWrites() != announcedBefore) forgetLoadedScript();
    });
    sendScript(script.instructionWords);
  }
  script.isLoaded = true;
}

void HWControl::sendScript(const std::vector<SequenceInstructionWords>& words) {
  MemoryWriteRequest request;
  request.byteCount = words.size() * sizeof words[0];
  request.transferElements = static_cast<std::uint32_t>(request.byteCount / (traits_.downloadElementBits >> 3));
  request.maxChunkBytes = writeChunkSize_;
  downloadManager_.writeData(request, DataWrapperNoCopy(words.data(), words.size()), kScriptTimeoutMs);
}

// The active script is the only one whose mark counts.
void HWControl::forgetLoadedScript() {
  const std::string& active = scriptTable_.getActiveScript();
  if (scriptTable_.containsScript(active)) scriptTable_.getScript(active)->isLoaded = false;
}

}  // namespace ktorba
