#include "ModelledSession.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <stdexcept>

#include "kterr/ErrorConstant.h"
#include "source/ktorba_lib/SessionRegistry.h"

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

void require(bool holds, const std::string& what) {
  if (!holds) throw std::logic_error(what);
}

ktSim_Traits smallTraits() {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  traits.memoryWordBytes = kMemoryWordBytes;
  traits.memorySizeBytes = kMemoryBytes;
  traits.minFetchSamples = kMinSamples;
  traits.sequenceWords = 64;
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

ModelledSession::ModelledSession(Choose choose)
    : choose_(std::move(choose)), allocator_(kMemoryBytes, kMemoryWordBytes), sampleMemory_(kMemoryBytes) {
  const ktSim_Traits traits = smallTraits();
  require(ktSim_CreateFpga(&fpga_) == 0 && ktSim_AddGenerator(fpga_.fpgaSession, &traits, &generator_) == 0, "device");
  require(ktORBA_OpenOrbaSession(fpga_.fpgaSession, fpga_.ifwTarget, fpga_.ifwSession, &fpga_.parentContext, 0,
                                 &session_, nullptr) == 0,
          "open");
}

ModelledSession::~ModelledSession() {
  ktORBA_CloseOrbaSession(session_, nullptr);
  ktSim_DestroyFpga(fpga_.fpgaSession);
}

const std::vector<ModelledSession::Operation>& ModelledSession::operations() {
  using S = ModelledSession;
  static const std::vector<Operation> all{&S::allocate,
                                          &S::allocate,
                                          &S::allocate,
                                          &S::write,
                                          &S::write,
                                          &S::write,
                                          &S::write,
                                          &S::setPosition,
                                          &S::clear,
                                          &S::clear,
                                          static_cast<Operation>(&S::writeScript),
                                          static_cast<Operation>(&S::select),
                                          &S::start,
                                          &S::play,
                                          &S::abort,
                                          &S::checkStatus,
                                          &S::checkSpace,
                                          &S::setDepths,
                                          &S::deleteScript,
                                          static_cast<Operation>(&S::configureStreaming),
                                          &S::getMemorySize,
                                          &S::openAgain,
                                          &S::writeAnyText,
                                          &S::setGrantTimes,
                                          &S::writeOtherWidth,
                                          &S::startStreaming,
                                          &S::startStreaming};
  return all;
}

// The calls that empty the memory come seldom, so that it fills up between them.
void ModelledSession::operate() {
  entryCode_ = choose_(32) == 0 ? kErrorOnEntry : choose_(8) == 0 ? 5 : 0;
  handle_ = choose_(64) == 0 ? ~session_ : session_;
  const std::uint32_t chosen = choose_(1000);
  const auto& all = operations();
  (this->*(chosen == 0   ? &ModelledSession::clearAll
           : chosen == 1 ? &ModelledSession::reset
                         : all[chosen % all.size()]))();
  checkAllocator();
}

// Calls with a record, or with none, and holds the result against what the model expects. Returns whether the call was
// carried out. An error on entry and an unknown handle stop every call.
template <typename Call>
bool ModelledSession::succeeds(Outcome expected, Call call) {
  const tStatus before{entryCode_, 0, refuseToGrow, nullptr};
  tStatus record = before;
  const std::int32_t code = call(entryCode_ == 0 ? nullptr : &record);
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

void ModelledSession::checkAllocator() {
  ktorba::HWControlInterface& control = ktorba_lib::getSessionPtr(session_)->getHWControl();
  require(control.getLargestAllocatableLength() == allocator_.largest.size / kSampleBytes, "largest free block");
  const std::string name = chooseName();
  require(control.waveformExists(name) == waveforms_.contains(name), "waveform " + name);
}

// `isKnown`: the model knows what the memory holds; else it learns it.
void ModelledSession::checkSampleMemory(bool isKnown) {
  std::vector<std::uint8_t> actual(kMemoryBytes);
  require(ktSim_ReadSampleMemory(generator_, 0, actual.data(), kMemoryBytes) == 0, "sample memory");
  require(!isKnown || actual == sampleMemory_, "a byte of sample memory");
  sampleMemory_ = std::move(actual);
}

// ---- Arguments ----

std::string ModelledSession::chooseName() {
  static constexpr const char* kPrefixes[] = {"w", "W", "stra\u00DFe-", "STRASSE-", "\u00FC", "\u00DC"};
  if (choose_(4) == 0) return streamingName_;
  if (choose_(32) != 0) return kPrefixes[choose_(6)] + std::to_string(choose_(kNumbers));
  std::string bytes(choose_(16), '\0');
  for (char& byte : bytes) byte = static_cast<char>(1 + choose_(255));
  return bytes;
}

std::string ModelledSession::chooseScript() { return (choose_(2) == 0 ? "s" : "S") + std::to_string(choose_(6)); }

std::uint32_t ModelledSession::chooseNumber() { return choose_(65536) << 16 | choose_(65536); }

std::uint32_t ModelledSession::chooseLength() { return choose_(32) == 0 ? chooseNumber() : choose_(kMostSamples); }

// ---- The model ----

ModelledSession::Outcome ModelledSession::outcomeOfAllocation(const std::string& name, std::uint32_t numSamples) const {
  const bool fits = numSamples >= kMinSamples && blockBytes(numSamples) <= allocator_.getLargestAvailableBlockSize();
  if (waveforms_.contains(name) || !fits) return Outcome::kFailure;
  const bool isPlain = std::ranges::all_of(name, [](char c) { return c >= 0 && (std::isalnum(c) != 0 || c == '-'); });
  return isPlain && !name.empty() ? Outcome::kSuccess : Outcome::kOpen;
}

void ModelledSession::addWaveform(const std::string& name, std::uint32_t length) {
  const auto start = allocator_.allocateBlock(static_cast<std::uint32_t>(blockBytes(length)));
  require(waveforms_.insert({name, {length, start}}).second, "a name was given twice");
}

void ModelledSession::storeSamples(Waveform& waveform, const std::vector<std::int16_t>& samples, bool wraps) {
  for (const std::int16_t sample : samples) {
    if (wraps) waveform.position %= waveform.length;
    std::memcpy(&sampleMemory_[waveform.start + waveform.position * kSampleBytes], &sample, kSampleBytes);
    ++waveform.position;
  }
}

bool ModelledSession::isStreaming(const std::string& name) const {
  return ktcheckname::compareNames(name, streamingName_) == 0;
}

void ModelledSession::forgetEverything() {
  waveforms_.clear();
  scripts_.clear();
  allocator_.freeAllBlocks();
}

// ---- Operations ----

void ModelledSession::allocate() {
  const std::string name = chooseName();
  const std::uint32_t length = chooseLength();
  if (succeeds(outcomeOfAllocation(name, length),
               [&](tStatus* s) { return ktORBA_AllocateWaveform(handle_, name.c_str(), length, s); })) {
    addWaveform(name, length);
  }
}

void ModelledSession::write() {
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
  if (succeeds(expected, [&](tStatus* s) {
        return ktORBA_WriteWaveformI16(handle_, name.c_str(), samples.data(), count, timeoutMs, s);
      })) {
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

void ModelledSession::writeOtherWidth() {
  const std::uint32_t sample = 1;
  const std::string name = chooseName();
  const bool missing = choose_(2) == 0;
  succeeds(Outcome::kFailure, [&](tStatus* s) {
    return ktORBA_WriteWaveformU32(handle_, name.c_str(), missing ? nullptr : &sample, 1, 0, s);
  });
}

void ModelledSession::setPosition() {
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
  if (succeeds(expected, [&](tStatus* s) {
        return ktORBA_SetWaveformNextWritePosition(handle_, name.c_str(), static_cast<std::uint32_t>(offset), mode, s);
      })) {
    found->second.position = static_cast<std::uint32_t>(position);
  }
}

// A streaming waveform that is cleared turns streaming off, and that applies settings, which may be refused; the
// waveform is gone all the same.
void ModelledSession::clear() {
  const std::string name = chooseName();
  const auto found = waveforms_.find(name);
  const bool streams = isStreaming(name);
  const bool isGone = found != waveforms_.end() && entryCode_ >= 0 && handle_ == session_;
  const Outcome expected = !isGone ? Outcome::kFailure : streams ? Outcome::kOpen : Outcome::kSuccess;
  const bool succeeded = succeeds(expected, [&](tStatus* s) { return ktORBA_ClearWaveform(handle_, name.c_str(), s); });
  if (isGone) {
    allocator_.freeBlock(found->second.start);
    waveforms_.erase(found);
  }
  if (succeeded && streams) {
    streamingName_.clear();
    isInitiated_ = false;
  }
}

void ModelledSession::clearAll() {
  const bool succeeded = succeeds(Outcome::kOpen, [&](tStatus* s) { return ktORBA_ClearAllWaveforms(handle_, s); });
  if (entryCode_ >= 0 && handle_ == session_) forgetEverything();
  if (!succeeded) return;
  streamingName_.clear();
  isInitiated_ = false;
}

void ModelledSession::writeScript() { writeScript(chooseScript(), "w" + std::to_string(choose_(kNumbers))); }

void ModelledSession::writeScript(const std::string& name, const std::string& waveform) {
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
  if (succeeds(waveforms_.contains(waveform) ? Outcome::kOpen : Outcome::kFailure,
               [&](tStatus* s) { return ktORBA_WriteScript(handle_, text.c_str(), s); })) {
    scripts_.insert(name);
  }
}

void ModelledSession::writeAnyText() {
  const std::string text = chooseName() + "\n" + chooseName();
  succeeds(Outcome::kFailure, [&](tStatus* s) { return ktORBA_WriteScript(handle_, text.c_str(), s); });
}

void ModelledSession::select() { select(choose_(16) == 0 ? "" : chooseScript()); }

void ModelledSession::select(const std::string& name) {
  const bool mayBeSelected = name.empty() || scripts_.contains(name);
  if (succeeds(mayBeSelected ? Outcome::kOpen : Outcome::kFailure,
               [&](tStatus* s) { return ktORBA_SelectActiveScript(handle_, name.c_str(), s); })) {
    isInitiated_ = false;
  }
}

void ModelledSession::deleteScript() {
  const std::string name = chooseScript();
  if (succeeds(scripts_.contains(name) ? Outcome::kSuccess : Outcome::kFailure,
               [&](tStatus* s) { return ktORBA_DeleteScript(handle_, name.c_str(), s); })) {
    scripts_.erase(name);
  }
}

void ModelledSession::start() {
  if (succeeds(Outcome::kOpen, [&](tStatus* s) { return ktORBA_StartGeneration(handle_, s); })) isInitiated_ = true;
}

void ModelledSession::abort() {
  if (!succeeds(Outcome::kSuccess, [&](tStatus* s) { return ktORBA_AbortGeneration(handle_, s); })) return;
  if (isInitiated_ && !streamingName_.empty()) waveforms_.at(streamingName_).position = 0;
  isInitiated_ = false;
}

void ModelledSession::checkStatus() {
  std::uint8_t isDone = 2;
  const bool missing = choose_(8) == 0;
  const bool succeeded = succeeds(missing ? Outcome::kFailure : Outcome::kOpen, [&](tStatus* s) {
    return ktORBA_CheckGenerationStatus(handle_, missing ? nullptr : &isDone, s);
  });
  require(succeeded == (isDone <= 1), "the result is written on success only");
}

void ModelledSession::checkSpace() {
  std::uint64_t space = UINT64_MAX;
  const bool succeeded = succeeds(streamingName_.empty() ? Outcome::kFailure : Outcome::kOpen,
                                  [&](tStatus* s) { return ktORBA_CheckStreamingWaveformSpace(handle_, &space, s); });
  require(succeeded == (space <= kMemoryBytes), "the result is written on success only");
}

void ModelledSession::reset() {
  if (!succeeds(Outcome::kSuccess, [&](tStatus* s) { return ktORBA_Reset(handle_, s); })) return;
  forgetEverything();
  isInitiated_ = false;
}

void ModelledSession::setDepths() {
  const std::uint32_t chunkBytes = 1 + chooseLength();  // with 0 a selection waits until its time is up
  succeeds(Outcome::kSuccess, [&](tStatus* s) { return ktORBA_SetWaveformWriteChunkSize(handle_, chunkBytes, s); });
  succeeds(Outcome::kOpen, [&](tStatus* s) { return ktORBA_SetDownloadFifoDepth(handle_, 64u << choose_(10), s); });
  const std::uint32_t primingDepth = chooseLength();
  if (succeeds(Outcome::kOpen, [&](tStatus* s) { return ktORBA_SetPrimingDepth(handle_, primingDepth, s); })) {
    isInitiated_ = false;
  }
}

void ModelledSession::setGrantTimes() {
  const auto time = static_cast<std::uint16_t>(choose_(8) == 0 ? choose_(65536) : choose_(64));
  const bool isRead = choose_(2) == 0;
  if (succeeds(Outcome::kOpen, [&](tStatus* s) {
        return (isRead ? ktORBA_SetMemoryReadGrantTime : ktORBA_SetMemoryWriteGrantTime)(handle_, time, s);
      })) {
    isInitiated_ = false;
  }
}

void ModelledSession::configureStreaming() { configureStreaming(choose_(3) == 0 ? "" : chooseName()); }

void ModelledSession::configureStreaming(const std::string& name) {
  const bool mayStream = name.empty() || waveforms_.contains(name);
  if (succeeds(mayStream ? Outcome::kOpen : Outcome::kFailure,
               [&](tStatus* s) { return ktORBA_ConfigureStreamingWaveform(handle_, name.c_str(), s); })) {
    streamingName_ = name;
    isInitiated_ = false;
  }
}

// What takes many steps and would seldom come about one by one.
void ModelledSession::startStreaming() {
  const std::string name = "w" + std::to_string(choose_(kNumbers));
  const std::string script = chooseScript();
  configureStreaming(name);
  writeScript(script, name);
  select(script);
  start();
}

void ModelledSession::getMemorySize() {
  std::uint64_t bytes = 0;
  if (succeeds(Outcome::kSuccess, [&](tStatus* s) { return ktORBA_GetWaveformMemorySize(handle_, &bytes, s); })) {
    require(bytes == kMemoryBytes / (kMemoryWordBytes + 1), "memory size");
  }
}

// A generator has one session, and what is no generator has none.
void ModelledSession::openAgain() {
  const auto instance = static_cast<std::uint8_t>(choose_(3));
  const std::uint32_t fpgaSession = choose_(2) == 0 ? fpga_.fpgaSession : chooseNumber();
  std::uint32_t opened = 0;
  succeeds(Outcome::kFailure, [&](tStatus* s) {
    return ktORBA_OpenOrbaSession(fpgaSession, fpga_.ifwTarget, fpga_.ifwSession, &fpga_.parentContext, instance,
                                  &opened, s);
  });
  require(opened == 0, "a session too many");
}

void ModelledSession::play() {
  ktSim_RaiseTrigger(generator_, 1 + choose_(8));
  ktSim_Advance(generator_, choose_(2048), nullptr);
}

}  // namespace soak
