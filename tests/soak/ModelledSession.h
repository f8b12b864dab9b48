// A session on a small simulated generator that is operated at random and compared with a plain model after every
// operation: which calls succeed, how much memory is free, which waveforms there are, and every byte of sample memory.
// What the soak does for hours and the fuzzer with inputs of its choice. One thread at a time.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "ktcheckname/compareNames.h"
#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"
#include "ktorba/waveform/WalkingMemoryBlockManager.h"

namespace soak {

// Returns one of the numbers 0 to count - 1. Where the numbers come from is the user's to say.
using Choose = std::function<std::uint32_t(std::uint32_t count)>;

class ModelledSession {
 public:
  explicit ModelledSession(Choose choose);
  ~ModelledSession();
  ModelledSession(const ModelledSession&) = delete;
  ModelledSession& operator=(const ModelledSession&) = delete;

  // Makes one call with chosen arguments, good or bad. Throws std::logic_error where library and model differ.
  void operate();

 private:
  using Operation = void (ModelledSession::*)();
  static const std::vector<Operation>& operations();

  struct Waveform {
    std::uint32_t length;        // samples
    std::uint32_t start;         // byte in sample memory
    std::uint32_t position = 0;  // samples
  };
  using Waveforms = std::map<std::string, Waveform, ktcheckname::NameLess>;
  enum class Outcome { kSuccess, kFailure, kOpen };

  template <typename Call>
  bool succeeds(Outcome expected, Call call);
  void checkAllocator();
  void checkSampleMemory(bool isKnown);

  std::string chooseName();
  std::string chooseScript();
  std::uint32_t chooseLength();
  std::uint32_t chooseNumber();  // any
  Outcome outcomeOfAllocation(const std::string& name, std::uint32_t numSamples) const;
  void addWaveform(const std::string& name, std::uint32_t length);
  void storeSamples(Waveform& waveform, const std::vector<std::int16_t>& samples, bool wraps);
  bool isStreaming(const std::string& name) const;
  void forgetEverything();

  void allocate();
  void write();
  void writeOtherWidth();
  void setPosition();
  void clear();
  void clearAll();
  void writeScript();
  void writeScript(const std::string& name, const std::string& waveform);
  void writeAnyText();
  void select();
  void select(const std::string& name);
  void deleteScript();
  void start();
  void abort();
  void checkStatus();
  void checkSpace();
  void reset();
  void setDepths();
  void setGrantTimes();
  void configureStreaming();
  void configureStreaming(const std::string& name);
  void startStreaming();
  void getMemorySize();
  void openAgain();
  void play();

  Choose choose_;
  ktSim_Fpga fpga_{};
  std::uint32_t generator_ = 0;
  std::uint32_t session_ = 0;

  // Of the operation under way: what the status record holds on entry, and the handle that is given.
  std::int32_t entryCode_ = 0;
  std::uint32_t handle_ = 0;

  ktorba::WalkingMemoryBlockManager allocator_;
  std::vector<std::uint8_t> sampleMemory_;
  Waveforms waveforms_;
  std::set<std::string, ktcheckname::NameLess> scripts_;
  std::string streamingName_;  // in the settings
  bool isInitiated_ = false;   // started, and not configured, aborted or reset since
};

}  // namespace soak
