// The engine of one generator: see HWControlInterface.h for its operations. It owns the parts that do the work and
// lends them to one another; the session owns it, and the tables, the command layer and the FIFO that it borrows.
// One thread at a time.
#pragma once

#include <memory>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktorba/commandControl/TransitionableCommandControl.h"
#include "ktorba/download/DownloadManager.h"
#include "ktorba/hwControl/HWControlInterface.h"
#include "ktorba/hwControl/StateManager.h"
#include "ktorba/script/ScriptProcessor.h"
#include "ktorba/script/ScriptTableInterface.h"
#include "ktorba/script/SequenceInstructionsGenerator.h"
#include "ktorba/waveform/MemoryBlockManagerInterface.h"
#include "ktorba/waveform/WaveformStore.h"
#include "ktorba/waveform/WaveformTableInterface.h"

namespace ktorba {

class HWControl : public HWControlInterface,
                  public SettingProviderInterface,
                  public SettingReceiverInterface,
                  public HWTraitProviderInterface {
 public:
  // Starts the FIFO, reads the generator's traits and hands them to the parts. Raises
  // ktorba_errors::kErrorInternalSWError for traits that it cannot work with.
  HWControl(CommandControlInterface& commandControl, ktisl::Fifo<unsigned char>& downloadFifo,
            const ktwfmscriptcompiler::ScriptTraits& scriptTraits, WaveformTableInterface& waveformTable,
            ScriptTableInterface& scriptTable);

  void getHWTraits(HWTraits& out, bool refresh) override;
  std::uint32_t getWaveformMemorySize() override { return traits_.waveformMemorySize; }
  std::uint32_t getLargestAllocatableLength() override { return waveformStore_->largestLength(); }
  void receiveSettings(const HWSettingsRecord& settings) override;
  void provideSettings(HWSettingsRecord& out) override { out = settings_; }
  void configureGeneration(bool force) override { stateManager_->configure(force); }
  void setAuxiliarySize(std::uint32_t value, bool refresh) override;
  void startGeneration() override;
  void resetGeneration() override { stateManager_->reset(); }
  void abortGeneration() override;
  void readGenerationDone(bool& out) override;
  void readDataUnderflow(bool& out) override;
  bool checkGenerationStatus() override;
  void setDownloadFifoDepth(std::uint32_t depth) override { downloadManager_.configureFifoDepth(depth); }
  void allocateWaveform(const std::string& name, std::uint32_t numSamples) override {
    waveformStore_->allocate(name, numSamples);
  }
  void setWaveformNextWritePosition(const std::string& name, std::uint32_t mode, std::uint32_t offset) override;
  bool waveformExists(const std::string& name) override { return waveformTable_.containsWaveform(name); }
  void writeWaveform(const std::string& name, const DataWrapperInterface& data, std::uint32_t timeoutMs,
                     bool allocateIfMissing) override;
  void setWaveformWriteChunkSize(std::uint32_t chunkBytes) override { writeChunkSize_ = chunkBytes; }
  void clearWaveform(const std::string& name) override { waveformStore_->clear(name); }
  void clearAllWaveforms() override;
  void clearAllScripts() override { scriptTable_.deleteAllScripts(); }
  void writeScript(const std::string& text) override;
  void deleteScript(const std::string& name) override { scriptTable_.deleteScript(name); }
  void selectActiveScript(const std::string& name, std::uint32_t& activeScriptLength) override;
  ScriptTableInterface* getScriptTable() override { return &scriptTable_; }
  bool isStreamingWaveform(const std::string& name) override;
  std::uint64_t checkStreamingWaveformSpace() override;

 private:
  std::uint64_t lengthBytes(const WaveformEntry& waveform) const;
  WaveformEntry& streamingWaveform();

  void refreshTraits();
  void writeSamples(WaveformEntry& waveform, const DataWrapperInterface& data, std::int32_t timeoutMs);
  void checkWriteFits(const WaveformEntry& waveform, std::uint64_t numSamples, bool streaming) const;
  // Sends `byteCount` bytes of `data`, from `dataOffset` on, to the waveform's byte `position`.
  void writePiece(const WaveformEntry& waveform, std::uint64_t position, const DataWrapperInterface& data,
                  std::uint64_t dataOffset, std::uint64_t byteCount, const Deadline& deadline);
  bool isLoadedAndActive(const std::string& name, const ScriptEntry& script) const;
  // From the moment that it is announced until all of it is there, sequence memory counts as holding no script.
  void downloadScript(ScriptEntry& script);
  void sendScript(const std::vector<SequenceInstructionWords>& words);
  void forgetLoadedScript();

  TransitionableCommandControl commandControl_;
  HWTraits traits_;
  HWSettingsRecord settings_;
  ktisl::Fifo<unsigned char>& downloadFifo_;
  std::uint32_t auxiliarySize_;
  DownloadManager downloadManager_;
  SequenceInstructionsGenerator encoder_;
  std::unique_ptr<StateManager> stateManager_;
  std::unique_ptr<MemoryBlockManagerInterface> memoryBlockManager_;
  std::unique_ptr<WaveformStore> waveformStore_;
  ktwfmscriptcompiler::ScriptTraits scriptTraits_;
  WaveformTableInterface& waveformTable_;
  ScriptTableInterface& scriptTable_;
  std::unique_ptr<ScriptProcessor> scriptProcessor_;
  std::uint32_t writeChunkSize_;  // bytes
};

}  // namespace ktorba
