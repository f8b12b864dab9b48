#include "testing/ModelledSession.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <map>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "conventions/conventions.h"
#include "ktcheckname/compareNames.h"
#include "kterr/ErrorConstant.h"
#include "source/ktorba_lib/SessionRegistry.h"
#include "testing/SimulatedGenerator.h"
#include "testing/WalkingMemoryBlockManager.h"
#include "testing/require.h"

namespace soak {
namespace {

constexpr std::uint32_t kMemoryBytes = 16384;
constexpr std::uint32_t kMemoryWordBytes = 8;
constexpr std::uint32_t kSampleBytes = 2;
constexpr std::uint32_t kMinSamples = 8;
constexpr std::uint32_t kNumbers = 12;       // behind the letters of names
constexpr std::uint32_t kMostSamples = 512;  // of a write, and of most waveforms
constexpr std::int32_t kTimeoutsMs[] = {20000, -1, 20000, 0};
constexpr std::int32_t kErrorOnEntry = -12345;

ktSim_Traits modelledTraits() {
  ktSim_Traits traits = smallTraits();
  traits.memoryWordBytes = kMemoryWordBytes;
  traits.memorySizeBytes = kMemoryBytes;
  traits.minFetchSamples = kMinSamples;
  return traits;
}

bool isFromTheTables(std::int32_t code) {
  static const std::set<std::int32_t> known = [] {
    std::set<std::int32_t> codes{0};
    for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) codes.insert(constant.code);
#define INSERT_CODE(name, code, text) codes.insert(code);
    KTSIM_CODES(INSERT_CODE)
#undef INSERT_CODE
    return codes;
  }();
  return known.contains(code);
}

std::uint64_t blockBytes(std::uint64_t numSamples) {
  return (numSamples * kSampleBytes + kMemoryWordBytes - 1) / kMemoryWordBytes * kMemoryWordBytes;
}

// The record is not the library's to grow.
bool refuseToGrow(tStatus*, std::uint32_t) { throw std::logic_error("the caller's callback was called"); }

}  // namespace

class ModelledSession::Modelled {
 public:
  explicit Modelled(Choose choose)
      : choose_(std::move(choose)), allocator_(kMemoryBytes, kMemoryWordBytes), sampleMemory_(kMemoryBytes) {
    require(generator_.open(session_) == 0, "open");
  }
  ~Modelled() { ktORBA_CloseOrbaSession(session_, nullptr); }
  Modelled(const Modelled&) = delete;
  Modelled& operator=(const Modelled&) = delete;

  // What is to come more often stands in the list more often. The calls that empty the memory come seldom, so that it
  // fills up between them.
  void operate() {
    using Operation = void (Modelled::*)();
    static constexpr Operation kOperations[] = {
        &Modelled::allocate,        &Modelled::allocate,       &Modelled::allocate,      &Modelled::write,
        &Modelled::write,           &Modelled::write,          &Modelled::write,         &Modelled::setPosition,
        &Modelled::clear,           &Modelled::clear,          &Modelled::writeScript,   &Modelled::select,
        &Modelled::start,           &Modelled::play,           &Modelled::abort,         &Modelled::checkStatus,
        &Modelled::checkSpace,      &Modelled::setDepths,      &Modelled::deleteScript,  &Modelled::configureStreaming,
        &Modelled::getMemorySize,   &Modelled::openAgain,      &Modelled::writeAnyText,  &Modelled::setGrantTimes,
        &Modelled::writeOtherWidth, &Modelled::startStreaming, &Modelled::startStreaming};
    entryCode_ = choose_(32) == 0 ? kErrorOnEntry : choose_(8) == 0 ? 5 : 0;
    handle_ = choose_(64) == 0 ? ~session_ : session_;
    const std::uint32_t chosen = choose_(1000);
    (this->*(chosen == 0   ? &Modelled::clearAll
             : chosen == 1 ? &Modelled::reset
                           : kOperations[chosen % std::size(kOperations)]))();
    checkAllocator();
  }

 private:
  enum class Outcome { kSuccess, kFailure, kOpen };
  struct Waveform {
    std::uint32_t length;        // samples
    std::uint32_t start;         // byte in sample memory
    std::uint32_t position = 0;  // samples
  };

  // Calls with a record, or with none, and holds the result against what the model expects. Returns whether the call
  // was carried out. An error on entry and an unknown handle stop every call.
  template <typename Function, typename... Arguments>
  bool succeeds(Outcome expected, Function function, Arguments... arguments) {
    const tStatus before{entryCode_, 0, refuseToGrow, nullptr};
    tStatus record = before;
    const std::int32_t code = function(handle_, arguments..., entryCode_ == 0 ? nullptr : &record);
    require(std::memcmp(&record, &before, sizeof record) == 0, "the caller's record was written");
    if (entryCode_ < 0) {
      require(code == entryCode_, "an error on entry is returned");
      return false;
    }
    require(isFromTheTables(code), "code " + std::to_string(code) + " is in no table");
    if (handle_ != session_) expected = Outcome::kFailure;
    require(expected == Outcome::kOpen || (expected == Outcome::kSuccess) == (code == 0),
            "unexpected code " + std::to_string(code));
    return code == 0;
  }

  void checkAllocator() {
    ktorba::HWControlInterface& control = ktorba_lib::getSessionPtr(session_)->getHWControl();
    require(control.getLargestAllocatableLength() == allocator_.largest.size / kSampleBytes, "largest free block");
    const std::string name = chooseName();
    require(control.waveformExists(name) == waveforms_.contains(name), "waveform " + name);
  }

  // `isKnown`: the model knows what the memory holds; else it learns it.
  void checkSampleMemory(bool isKnown) {
    std::vector<std::uint8_t> actual = generator_.sampleMemory(0, kMemoryBytes);
    require(!isKnown || actual == sampleMemory_, "a byte of sample memory");
    sampleMemory_ = std::move(actual);
  }

  // ---- Arguments ----

  std::string chooseName() {
    static constexpr const char* kPrefixes[] = {"w", "W", "stra\u00DFe-", "STRASSE-", "\u00FC", "\u00DC"};
    if (choose_(4) == 0) return streamingName_;
    if (choose_(32) != 0) return kPrefixes[choose_(6)] + std::to_string(choose_(kNumbers));
    std::string bytes(choose_(16), '\0');
    for (char& byte : bytes) byte = static_cast<char>(1 + choose_(255));
    return bytes;
  }

  std::string chooseScript() { return (choose_(2) == 0 ? "s" : "S") + std::to_string(choose_(6)); }

  std::uint32_t chooseNumber() { return choose_(65536) << 16 | choose_(65536); }

  std::uint32_t chooseLength() { return choose_(32) == 0 ? chooseNumber() : choose_(kMostSamples); }

  // ---- The model ----

  Outcome outcomeOfAllocation(const std::string& name, std::uint32_t numSamples) const {
    const bool fits = numSamples >= kMinSamples && blockBytes(numSamples) <= allocator_.getLargestAvailableBlockSize();
    if (waveforms_.contains(name) || !fits) return Outcome::kFailure;
    const bool isPlain = std::ranges::all_of(name, [](char c) { return c >= 0 && (std::isalnum(c) != 0 || c == '-'); });
    return isPlain && !name.empty() ? Outcome::kSuccess : Outcome::kOpen;
  }

  void addWaveform(const std::string& name, std::uint32_t length) {
    const auto start = allocator_.allocateBlock(static_cast<std::uint32_t>(blockBytes(length)));
    require(waveforms_.insert({name, {length, start}}).second, "a name was given twice");
  }

  void storeSamples(Waveform& waveform, const std::vector<std::int16_t>& samples, bool wraps) {
    for (const std::int16_t sample : samples) {
      if (wraps) waveform.position %= waveform.length;
      std::memcpy(&sampleMemory_[waveform.start + waveform.position * kSampleBytes], &sample, kSampleBytes);
      ++waveform.position;
    }
  }

  bool isStreaming(const std::string& name) const { return ktcheckname::compareNames(name, streamingName_) == 0; }

  void forgetEverything() {
    waveforms_.clear();
    scripts_.clear();
    allocator_.freeAllBlocks();
  }

  static Outcome failureUnless(bool mayGoWell) { return mayGoWell ? Outcome::kOpen : Outcome::kFailure; }

  // ---- Operations ----

  void allocate() {
    const std::string name = chooseName();
    const std::uint32_t length = chooseLength();
    if (succeeds(outcomeOfAllocation(name, length), ktORBA_AllocateWaveform, name.c_str(), length)) {
      addWaveform(name, length);
    }
  }

  void write() {
    const std::string name = chooseName();
    std::vector<std::int16_t> samples(choose_(kMostSamples));
    for (std::int16_t& sample : samples) sample = static_cast<std::int16_t>(choose_(256));
    const auto count = static_cast<std::uint32_t>(samples.size());
    const std::int32_t timeoutMs = kTimeoutsMs[choose_(4)];
    const auto found = waveforms_.find(name);
    const bool wraps = isInitiated_ && isStreaming(name);
    Outcome expected = outcomeOfAllocation(name, count);
    if (found != waveforms_.end()) {
      const bool fits = count != 0 && (wraps ? 0 : found->second.position) + count <= found->second.length;
      expected = fits ? Outcome::kSuccess : Outcome::kFailure;
    }
    if (timeoutMs == 0 && expected == Outcome::kSuccess) expected = Outcome::kOpen;
    if (succeeds(expected, ktORBA_WriteWaveformI16, name.c_str(), samples.data(), count, timeoutMs)) {
      if (found == waveforms_.end()) addWaveform(name, count);
      storeSamples(waveforms_.at(name), samples, wraps);
      checkSampleMemory(true);
    } else if (timeoutMs == 0) {
      // It may have been cut short: nothing but a reset ends it then.
      handle_ = session_;
      entryCode_ = 0;
      checkSampleMemory(false);
      reset();
    }
  }

  void writeOtherWidth() {
    const std::uint32_t sample = 1;
    const std::string name = chooseName();
    const bool missing = choose_(2) == 0;
    succeeds(Outcome::kFailure, ktORBA_WriteWaveformU32, name.c_str(), missing ? nullptr : &sample, 1u, 0);
  }

  void setPosition() {
    const std::string name = chooseName();
    const auto found = waveforms_.find(name);
    const auto mode = static_cast<std::uint8_t>(choose_(16) == 0 ? choose_(256) : choose_(2));
    const auto offset = static_cast<std::int32_t>(choose_(2 * kMostSamples)) - (mode == 1 ? 512 : 0);
    Outcome expected = Outcome::kFailure;
    std::int64_t position = offset;
    if (found != waveforms_.end() && mode <= 1) {
      if (mode == 1) position += found->second.position;
      if (position >= 0 && position <= found->second.length) expected = Outcome::kSuccess;
    }
    if (succeeds(expected, ktORBA_SetWaveformNextWritePosition, name.c_str(), static_cast<std::uint32_t>(offset),
                 mode)) {
      found->second.position = static_cast<std::uint32_t>(position);
    }
  }

  // A streaming waveform that is cleared turns streaming off, and that applies settings, which may be refused; the
  // waveform is gone all the same.
  void clear() {
    const std::string name = chooseName();
    const auto found = waveforms_.find(name);
    const bool streams = isStreaming(name);
    const bool isGone = found != waveforms_.end() && entryCode_ >= 0 && handle_ == session_;
    const Outcome expected = !isGone ? Outcome::kFailure : streams ? Outcome::kOpen : Outcome::kSuccess;
    const bool succeeded = succeeds(expected, ktORBA_ClearWaveform, name.c_str());
    if (isGone) {
      allocator_.freeBlock(found->second.start);
      waveforms_.erase(found);
    }
    if (succeeded && streams) {
      streamingName_.clear();
      isInitiated_ = false;
    }
  }

  void clearAll() {
    const bool succeeded = succeeds(Outcome::kOpen, ktORBA_ClearAllWaveforms);
    if (entryCode_ >= 0 && handle_ == session_) forgetEverything();
    if (!succeeded) return;
    streamingName_.clear();
    isInitiated_ = false;
  }

  void writeScript() { writeScript(chooseScript(), "w" + std::to_string(choose_(kNumbers))); }

  void writeScript(const std::string& name, const std::string& waveform) {
    static constexpr const char* kLoops[][2] = {{"", ""},
                                                {"repeat 3\n", "end repeat\n"},
                                                {"repeat forever\n", "end repeat\n"},
                                                {"repeat until trigger0\n", "end repeat\n"}};
    const std::string subset = "subset(" + std::to_string(choose_(64)) + "," + std::to_string(choose_(256)) + ")";
    const std::string marker = "marker0(" + std::to_string(choose_(64)) + ")";
    const auto& loop = kLoops[choose_(4)];
    const std::string text = "script " + name + "\n" + loop[0] + "generate " + waveform + " " +
                             (choose_(2) == 0 ? "" : subset) + (choose_(4) != 0 ? "" : marker) + "\n" + loop[1] +
                             "end script\n";
    if (succeeds(failureUnless(waveforms_.contains(waveform)), ktORBA_WriteScript, text.c_str())) scripts_.insert(name);
  }

  void writeAnyText() {
    const std::string text = chooseName() + "\n" + chooseName();
    succeeds(Outcome::kFailure, ktORBA_WriteScript, text.c_str());
  }

  void select() { select(choose_(16) == 0 ? "" : chooseScript()); }

  void select(const std::string& name) {
    const Outcome expected = failureUnless(name.empty() || scripts_.contains(name));
    if (succeeds(expected, ktORBA_SelectActiveScript, name.c_str())) isInitiated_ = false;
  }

  void deleteScript() {
    const std::string name = chooseScript();
    if (succeeds(scripts_.contains(name) ? Outcome::kSuccess : Outcome::kFailure, ktORBA_DeleteScript, name.c_str())) {
      scripts_.erase(name);
    }
  }

  void start() {
    if (succeeds(Outcome::kOpen, ktORBA_StartGeneration)) isInitiated_ = true;
  }

  void abort() {
    if (!succeeds(Outcome::kSuccess, ktORBA_AbortGeneration)) return;
    if (isInitiated_ && !streamingName_.empty()) waveforms_.at(streamingName_).position = 0;
    isInitiated_ = false;
  }

  void checkStatus() {
    std::uint8_t isDone = 2;
    const bool missing = choose_(8) == 0;
    const bool succeeded = succeeds(failureUnless(!missing), ktORBA_CheckGenerationStatus, missing ? nullptr : &isDone);
    require(succeeded == (isDone <= 1), "the result is written on success only");
  }

  void checkSpace() {
    std::uint64_t space = UINT64_MAX;
    const bool succeeded = succeeds(failureUnless(!streamingName_.empty()), ktORBA_CheckStreamingWaveformSpace, &space);
    require(succeeded == (space <= kMemoryBytes), "the result is written on success only");
  }

  void reset() {
    if (!succeeds(Outcome::kSuccess, ktORBA_Reset)) return;
    forgetEverything();
    isInitiated_ = false;
  }

  void setDepths() {
    const std::uint32_t chunkBytes = 1 + chooseLength();  // with 0 a selection waits until its time is up
    succeeds(Outcome::kSuccess, ktORBA_SetWaveformWriteChunkSize, chunkBytes);
    succeeds(Outcome::kOpen, ktORBA_SetDownloadFifoDepth, 64u << choose_(10));
    const std::uint32_t primingDepth = chooseLength();
    if (succeeds(Outcome::kOpen, ktORBA_SetPrimingDepth, primingDepth)) isInitiated_ = false;
  }

  void setGrantTimes() {
    const auto time = static_cast<std::uint16_t>(choose_(8) == 0 ? choose_(65536) : choose_(64));
    const auto set = choose_(2) == 0 ? ktORBA_SetMemoryReadGrantTime : ktORBA_SetMemoryWriteGrantTime;
    if (succeeds(Outcome::kOpen, set, time)) isInitiated_ = false;
  }

  void configureStreaming() { configureStreaming(choose_(3) == 0 ? "" : chooseName()); }

  void configureStreaming(const std::string& name) {
    const Outcome expected = failureUnless(name.empty() || waveforms_.contains(name));
    if (succeeds(expected, ktORBA_ConfigureStreamingWaveform, name.c_str())) {
      streamingName_ = name;
      isInitiated_ = false;
    }
  }

  // What takes many steps and would seldom come about one by one.
  void startStreaming() {
    const std::string name = "w" + std::to_string(choose_(kNumbers));
    const std::string script = chooseScript();
    configureStreaming(name);
    writeScript(script, name);
    select(script);
    start();
  }

  void getMemorySize() {
    std::uint64_t bytes = 0;
    if (succeeds(Outcome::kSuccess, ktORBA_GetWaveformMemorySize, &bytes)) {
      require(bytes == kMemoryBytes / (kMemoryWordBytes + 1), "memory size");
    }
  }

  // A generator has one session, and what is no generator has none.
  void openAgain() {
    const auto instance = static_cast<std::uint8_t>(choose_(3));
    const ktSim_Fpga& fpga = generator_.fpga;
    const std::uint32_t fpgaSession = choose_(2) == 0 ? fpga.fpgaSession : chooseNumber();
    std::uint32_t opened = 0;
    succeeds(Outcome::kFailure, [&](std::uint32_t, tStatus* record) {
      return ktORBA_OpenOrbaSession(fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, instance,
                                    &opened, record);
    });
    require(opened == 0, "a session too many");
  }

  void play() {
    ktSim_RaiseTrigger(generator_.number, 1 + choose_(ktorba::kHardwareTriggerCount));
    ktSim_Advance(generator_.number, choose_(2048), nullptr);
  }

  Choose choose_;
  SimulatedGenerator generator_{modelledTraits()};
  std::uint32_t session_ = 0;

  // Of the operation under way: what the status record holds on entry, and the handle that is given.
  std::int32_t entryCode_ = 0;
  std::uint32_t handle_ = 0;

  ktorba::WalkingMemoryBlockManager allocator_;
  std::vector<std::uint8_t> sampleMemory_;
  std::map<std::string, Waveform, ktcheckname::NameLess> waveforms_;
  std::set<std::string, ktcheckname::NameLess> scripts_;
  std::string streamingName_;  // in the settings
  bool isInitiated_ = false;   // started, and not configured, aborted or reset since
};

ModelledSession::ModelledSession(Choose choose) : modelled_(std::make_unique<Modelled>(std::move(choose))) {}
ModelledSession::~ModelledSession() = default;
void ModelledSession::operate() { modelled_->operate(); }

}  // namespace soak
