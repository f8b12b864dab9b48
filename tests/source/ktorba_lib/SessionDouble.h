// A session that keeps a log of what it is asked and does nothing else, save what a test hooks into it.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "source/ktorba_lib/openSession.h"

struct CallLog {
  std::vector<std::string> calls;
  std::function<void()> onCall = [] {};  // runs in each logged call; may throw
  int sessionsAlive = 0;

  void add(std::string call) {
    calls.push_back(std::move(call));
    onCall();
  }
};

class HWControlDouble : public ktorba::HWControlInterface {
 public:
  explicit HWControlDouble(CallLog& log) : log_(log) {}

  void getHWTraits(ktorba::HWTraits&, bool) override { log_.add("getHWTraits"); }
  std::uint32_t getWaveformMemorySize() override { return log_.add("getWaveformMemorySize"), 0xFEDCBA98; }
  std::uint32_t getLargestAllocatableLength() override { return 0; }
  void receiveSettings(const ktorba::HWSettingsRecord&) override { log_.add("receiveSettings"); }
  void provideSettings(ktorba::HWSettingsRecord&) override {}
  void configureGeneration(bool) override { log_.add("configureGeneration"); }
  void setAuxiliarySize(std::uint32_t, bool) override {}
  void startGeneration() override { log_.add("startGeneration"); }
  void resetGeneration() override { log_.add("resetGeneration"); }
  void abortGeneration() override { log_.add("abortGeneration"); }
  void readGenerationDone(bool&) override {}
  void readDataUnderflow(bool&) override {}
  bool checkGenerationStatus() override { return log_.add("checkGenerationStatus"), true; }
  void setDownloadFifoDepth(std::uint32_t depth) override { log_.add("setDownloadFifoDepth " + std::to_string(depth)); }
  void allocateWaveform(const std::string& name, std::uint32_t numSamples) override {
    log_.add("allocateWaveform " + shortened(name) + " " + std::to_string(numSamples));
  }
  void setWaveformNextWritePosition(const std::string& name, std::uint32_t mode, std::uint32_t offset) override {
    log_.add("setWaveformNextWritePosition " + name + " " + std::to_string(mode) + " " + std::to_string(offset));
  }
  bool waveformExists(const std::string&) override { return false; }
  void writeWaveform(const std::string&, const ktorba::DataWrapperInterface&, std::uint32_t, bool) override {}
  void setWaveformWriteChunkSize(std::uint32_t bytes) override {
    log_.add("setWaveformWriteChunkSize " + std::to_string(bytes));
  }
  void clearWaveform(const std::string& name) override { log_.add("clearWaveform " + name); }
  void clearAllWaveforms() override { log_.add("clearAllWaveforms"); }
  void clearAllScripts() override {}
  void writeScript(const std::string& text) override { log_.add("writeScript " + text); }
  void deleteScript(const std::string& name) override { log_.add("deleteScript " + name); }
  void selectActiveScript(const std::string& name, std::uint32_t& activeScriptLength) override {
    log_.add("selectActiveScript '" + name + "'");
    activeScriptLength = 77;
  }
  ktorba::ScriptTableInterface* getScriptTable() override { return nullptr; }
  bool isStreamingWaveform(const std::string& name) override {
    return log_.add("isStreamingWaveform " + name), name == "stream";
  }
  std::uint64_t checkStreamingWaveformSpace() override {
    return log_.add("checkStreamingWaveformSpace"), 0x123456789ABCDEF0;
  }

 private:
  static std::string shortened(const std::string& name) {
    return name.size() < 100 ? name : std::to_string(name.size()) + " bytes";
  }

  CallLog& log_;
};

class SessionDouble : public ktorba_lib::SessionInterface {
 public:
  SessionDouble(std::string name, CallLog& log) : SessionInterface(std::move(name)), log_(log), hwControl_(log) {
    ++log_.sessionsAlive;
  }
  ~SessionDouble() override { --log_.sessionsAlive; }

  ktorba::HWControlInterface& getHWControl() override { return hwControl_; }
  ktorba::GenerationSettings getRequestedSettings() const override { return {1, 2, 3, 4, "stream"}; }
  void applySettings(const ktorba::GenerationSettings& s) override {
    log_.add("applySettings " + std::to_string(s.memoryReadGrantTime) + " " + std::to_string(s.memoryWriteGrantTime) +
             " " + std::to_string(s.primingDepth) + " " + std::to_string(s.activeScriptLength) + " '" +
             s.streamingWaveformName + "'");
  }
  void configureStreamingWaveform(const std::string& name) override { log_.add("configureStreamingWaveform " + name); }
  void writeWaveform(const char* name, const std::uint32_t*, std::uint32_t n, std::int32_t timeoutMs) override {
    log_.add("writeU32 " + std::string(name) + " " + std::to_string(n) + " " + std::to_string(timeoutMs));
  }
  void writeWaveform(const char* name, const std::int16_t*, std::uint32_t n, std::int32_t timeoutMs) override {
    log_.add("writeI16 " + std::string(name) + " " + std::to_string(n) + " " + std::to_string(timeoutMs));
  }

 private:
  CallLog& log_;
  HWControlDouble hwControl_;
};
