// The engine facade: every exported function that touches waveforms, scripts, generation or settings ends in one of
// these operations. Failures are kterr::Exception. One thread at a time per object. Names are UTF-8.
#pragma once

#include <cstdint>
#include <string>

#include "ktorba/download/DataWrapperInterface.h"
#include "ktorba/hwRecords/HWSettings.h"
#include "ktorba/hwRecords/HWTraits.h"

namespace ktorba {

class ScriptTableInterface;

class HWControlInterface {
 public:
  virtual ~HWControlInterface() = default;
  virtual void getHWTraits(HWTraits& out, bool refresh) = 0;
  virtual std::uint32_t getWaveformMemorySize() = 0;
  virtual std::uint32_t getLargestAllocatableLength() = 0;
  virtual void receiveSettings(const HWSettingsRecord& settings) = 0;
  virtual void provideSettings(HWSettingsRecord& out) = 0;
  virtual void configureGeneration(bool force) = 0;
  virtual void setAuxiliarySize(std::uint32_t value, bool refresh) = 0;
  virtual void startGeneration() = 0;
  virtual void resetGeneration() = 0;
  virtual void abortGeneration() = 0;
  virtual void readGenerationDone(bool& out) = 0;
  virtual void readDataUnderflow(bool& out) = 0;
  virtual bool checkGenerationStatus() = 0;
  virtual void setDownloadFifoDepth(std::uint32_t depth) = 0;
  virtual void allocateWaveform(const std::string& name, std::uint32_t numSamples) = 0;
  virtual void setWaveformNextWritePosition(const std::string& name, std::uint32_t mode, std::uint32_t offset) = 0;
  virtual bool waveformExists(const std::string& name) = 0;
  virtual void writeWaveform(const std::string& name, const DataWrapperInterface& data, std::uint32_t timeoutMs,
                             bool allocateIfMissing) = 0;
  virtual void setWaveformWriteChunkSize(std::uint32_t chunkBytes) = 0;
  virtual void clearWaveform(const std::string& name) = 0;
  virtual void clearAllWaveforms() = 0;
  virtual void clearAllScripts() = 0;
  virtual void writeScript(const std::string& text) = 0;
  virtual void deleteScript(const std::string& name) = 0;
  virtual void selectActiveScript(const std::string& name, std::uint32_t& activeScriptLength) = 0;
  virtual ScriptTableInterface* getScriptTable() = 0;
  virtual bool isStreamingWaveform(const std::string& name) = 0;
  virtual std::uint64_t checkStreamingWaveformSpace() = 0;
};

}  // namespace ktorba
