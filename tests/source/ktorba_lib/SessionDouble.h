// A session that keeps a log of what it is asked and does nothing else, save what a test hooks into it.
#pragma once

#include <functional>
#include <sstream>
#include <string>

#include "source/ktorba_lib/openSession.h"

struct CallLog {
  std::string calls;                     // "name argument...; name argument..."
  std::function<void()> onCall = [] {};  // runs in each logged call; may throw
  int sessionsAlive = 0;

  template <typename... Arguments>
  void add(const char* name, const Arguments&... arguments) {
    std::ostringstream call;
    call << (calls.empty() ? "" : "; ") << name;
    ((call << ' ' << arguments), ...);
    calls += call.str();
    onCall();
  }
};

class HWControlDouble : public ktorba::HWControlInterface {
 public:
  explicit HWControlDouble(CallLog& log) : log_(log) {}

  std::uint32_t getWaveformMemorySize() override { return log_.add("memorySize"), 0xFEDCBA98; }
  void startGeneration() override { log_.add("start"); }
  void resetGeneration() override { log_.add("reset"); }
  void abortGeneration() override { log_.add("abort"); }
  bool checkGenerationStatus() override { return log_.add("check"), true; }
  void setDownloadFifoDepth(std::uint32_t depth) override { log_.add("fifoDepth", depth); }
  void setWaveformWriteChunkSize(std::uint32_t bytes) override { log_.add("chunkSize", bytes); }
  void allocateWaveform(const std::string& name, std::uint32_t n) override {
    log_.add("allocate", name.size() < 100 ? name : std::to_string(name.size()) + " bytes", n);
  }
  void setWaveformNextWritePosition(const std::string& name, std::uint32_t mode, std::uint32_t offset) override {
    log_.add("position", name, mode, offset);
  }
  void clearWaveform(const std::string& name) override { log_.add("clear", name); }
  void clearAllWaveforms() override { log_.add("clearAll"); }
  void writeScript(const std::string& text) override { log_.add("script", text); }
  void deleteScript(const std::string& name) override { log_.add("delete", name); }
  void selectActiveScript(const std::string& name, std::uint32_t& length) override {
    log_.add("select", "'" + name + "'");
    length = 77;
  }
  bool isStreamingWaveform(const std::string& name) override { return log_.add("streams", name), name == "stream"; }
  std::uint64_t checkStreamingWaveformSpace() override { return log_.add("space"), 0x123456789ABCDEF0; }

  // What no exported function calls on the facade.
  void getHWTraits(ktorba::HWTraits&, bool) override {}
  std::uint32_t getLargestAllocatableLength() override { return 0; }
  void receiveSettings(const ktorba::HWSettingsRecord&) override {}
  void provideSettings(ktorba::HWSettingsRecord&) override {}
  void configureGeneration(bool) override {}
  void setAuxiliarySize(std::uint32_t, bool) override {}
  void readGenerationDone(bool&) override {}
  void readDataUnderflow(bool&) override {}
  bool waveformExists(const std::string&) override { return false; }
  void writeWaveform(const std::string&, const ktorba::DataWrapperInterface&, std::uint32_t, bool) override {}
  void clearAllScripts() override {}
  ktorba::ScriptTableInterface* getScriptTable() override { return nullptr; }

 private:
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
    log_.add("apply", s.memoryReadGrantTime, s.memoryWriteGrantTime, s.primingDepth, s.activeScriptLength,
             s.streamingWaveformName);
  }
  void configureStreamingWaveform(const std::string& name) override { log_.add("stream", name); }
  void writeWaveform(const char* name, const std::uint32_t*, std::uint32_t n, std::int32_t timeoutMs) override {
    log_.add("writeU32", name, n, timeoutMs);
  }
  void writeWaveform(const char* name, const std::int16_t*, std::uint32_t n, std::int32_t timeoutMs) override {
    log_.add("writeI16", name, n, timeoutMs);
  }

 private:
  CallLog& log_;
  HWControlDouble hwControl_;
};
