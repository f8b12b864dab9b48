#include "ktorba/script/InstructionWordsBuilder.h"

#include <algorithm>
#include <bit>
#include <functional>
#include <limits>

#include "conventions/conventions.h"
#include "kterr/Failure.h"
#include "ktorba/script/fetchPieces.h"
#include "ktorba/script/instructionFormat.h"
#include "ktorba/script/scriptProcessorSource.h"

namespace ktorba {
namespace {

constexpr std::uint32_t kMax32 = std::numeric_limits<std::uint32_t>::max();
constexpr std::uint64_t kMax64 = std::numeric_limits<std::uint64_t>::max();

// An endless script starts over behind its start instruction, which waits for the start trigger.
constexpr std::uint32_t kFirstBodyAddress = 1;

constexpr std::size_t kMostFound = 512;  // waveforms kept at hand

std::uint64_t saturatingSum(std::uint64_t a, std::uint64_t b) { return a > kMax64 - b ? kMax64 : a + b; }

std::uint64_t saturatingProduct(std::uint64_t a, std::uint64_t b) { return b != 0 && a > kMax64 / b ? kMax64 : a * b; }

LoopKind loopKindOf(const SequenceBlock& block) {
  if (block.loopKind > LoopKind::kUntilTrigger) {
    kterr::Failure(ktorba_errors::kErrorInternalSWError).at(kScriptProcessorSource).raise();
  }
  return block.loopKind;
}

std::uint32_t hardwareTrigger(std::uint8_t triggerNumber) {
  if (triggerNumber > kHardwareTriggerCount) {
    kterr::Failure(ktorba_errors::kErrorInternalSWError).at(kScriptProcessorSource).raise();
  }
  return triggerNumber;
}

[[noreturn]] void refuse(const std::string& reason, std::uint32_t line = __builtin_LINE()) {
  kterr::Failure(ktorba_errors::kErrorInternalSWError)
      .at(kScriptProcessorSource, line)
      .message("ktorba::ScriptProcessor", reason.c_str())
      .raise();
}

// Start and end of every script are such a fetch, so that no script at all can be written.
[[noreturn]] void refuseGenerator(std::uint32_t minFetchSamples, const std::string& misfit) {
  refuse("No script can be written for this generator: each begins and ends with a wait of its shortest fetch, " +
         std::to_string(minFetchSamples) + " samples, and there " + misfit);
}

// A value that what holds it has no room for.
struct Bounded {
  const char* name;
  std::uint64_t value;
  std::uint64_t min;
  std::uint64_t max;

  bool fits() const { return value >= min && value <= max; }
  std::string describeMisfit() const {
    return std::string(name) + " " + std::to_string(value) +
           (value < min ? " is below its limit " + std::to_string(min) : " is above its limit " + std::to_string(max));
  }
};

Bounded inField(const InstructionField& field, std::uint64_t value) {
  return {field.name, value, field.min(), field.max()};
}

LoopDescriptor loopOf(const SequenceBlock& block) {
  return {loopKindOf(block), block.iterationCount, hardwareTrigger(block.triggerNumber), block.clearFlag};
}

FetchDescriptor descriptorOf(const FetchRecord& fetch, std::uint32_t address, std::uint32_t length) {
  FetchDescriptor descriptor;
  descriptor.sampleCount = length;
  descriptor.waveformAddress = address;
  descriptor.startOffset = fetch.startOffset;
  descriptor.clearFlag = fetch.clearFlag;
  descriptor.triggerNumber = hardwareTrigger(fetch.triggerNumber);
  descriptor.isWait = fetch.isWait;
  return descriptor;
}

}  // namespace

InstructionWordsBuilder::InstructionWordsBuilder(SequenceInstructionsGeneratorInterface& encoder,
                                                 std::uint32_t minFetchSamples, const WaveformFinderInterface& finder,
                                                 ScriptEntry& entry, std::vector<InstructionOrigin>* origins)
    : encoder_(encoder), minFetchSamples_(minFetchSamples), finder_(finder), entry_(entry), origins_(origins) {}

void InstructionWordsBuilder::build(const CompiledScript& script) {
  prepareEntry(script);
  appendScriptStart();
  for (const SequenceBlock& block : script.blocks) {
    appendBlock(block);
    ++block_;
  }
  block_ = 0;
  appendScriptEnd(script.isEndless);
  entry_.isEndless = script.isEndless;
  const bool isFinite = !entry_.hasUnboundedLoop && !entry_.isEndless;
  entry_.finiteMemoryWords =
      isFinite ? static_cast<std::uint32_t>(std::min<std::uint64_t>(entry_.totalMemoryWords, kMax32)) : kMax32;
}

void InstructionWordsBuilder::prepareEntry(const CompiledScript& script) {
  entry_.totalMemoryWords = 0;
  entry_.hasUnboundedLoop = false;
  entry_.isEndless = false;
  entry_.instructionWords.clear();
  entry_.instructionWords.reserve(script.mostInstructions);
  found_.assign(std::bit_ceil(std::clamp<std::size_t>(script.mostInstructions, 2, kMostFound)), {});
  if (origins_ != nullptr) origins_->clear();
}

void InstructionWordsBuilder::appendScriptStart() {
  FetchDescriptor wait;
  wait.sampleCount = minFetchSamples_;
  if (const auto misfit = findMisfit(wait)) refuseGenerator(minFetchSamples_, *misfit);
  entry_.totalMemoryWords += encoder_.encodeScriptStart(appendWords(Part::kScriptStart));
}

void InstructionWordsBuilder::appendScriptEnd(bool isEndless) {
  const std::uint32_t memoryWords = isEndless ? encoder_.encodeJump(kFirstBodyAddress, appendWords(Part::kJump))
                                              : encoder_.encodeScriptEnd(appendWords(Part::kScriptEnd));
  entry_.totalMemoryWords = saturatingSum(entry_.totalMemoryWords, memoryWords);
}

void InstructionWordsBuilder::appendBlock(const SequenceBlock& block) {
  const LoopDescriptor loop = loopOf(block);
  const auto bodyAddress = static_cast<std::uint32_t>(entry_.instructionWords.size() + 1);
  encoder_.encodeLoopStart(bodyAddress, loop, appendWords(Part::kLoopStart));
  std::uint64_t bodyWords = 0;
  for (const FetchRecord& fetch : block.fetches) {
    bodyWords = saturatingSum(bodyWords, appendFetch(fetch));
    ++fetch_;
  }
  fetch_ = 0;
  const bool isCounted = loop.loopKind == LoopKind::kCounted;
  const std::uint64_t passes = isCounted ? loop.iterationCount : 1;
  entry_.totalMemoryWords = saturatingSum(entry_.totalMemoryWords, saturatingProduct(bodyWords, passes));
  encoder_.encodeLoopEnd(bodyAddress, loop, appendWords(Part::kLoopEnd));
  entry_.hasUnboundedLoop |= !isCounted;
}

std::uint64_t InstructionWordsBuilder::appendFetch(const FetchRecord& fetch) {
  const Source source = resolve(fetch);
  if (!fetch.markers.empty()) return appendPieces(fetch, source);
  return appendChecked(descriptorOf(fetch, source.address, source.length));
}

std::uint64_t InstructionWordsBuilder::appendPieces(const FetchRecord& fetch, const Source& source) {
  checkMarkers(fetch.markers, source.length, minFetchSamples_);
  std::uint64_t memoryWords = 0;
  const FetchPieces pieces = splitAtMarkers(fetch.markers, source.length, minFetchSamples_);
  for (auto piece = pieces.rbegin(); piece != pieces.rend(); ++piece) {
    FetchDescriptor descriptor = descriptorOf(fetch, source.address, piece->length);
    descriptor.startOffset += piece->start;
    descriptor.markerOffset = piece->markerOffset;
    descriptor.markerMask = piece->markerMask;
    if (piece->start > 0) descriptor.triggerNumber = descriptor.clearFlag = 0;
    memoryWords += appendChecked(descriptor);
  }
  return memoryWords;
}

std::uint32_t InstructionWordsBuilder::appendChecked(const FetchDescriptor& fetch) {
  if (const auto misfit = findMisfit(fetch)) refuse(*misfit);
  return encoder_.encodeFetch(fetch, appendWords(Part::kFetch));
}

SequenceInstructionWords& InstructionWordsBuilder::appendWords(Part part) {
  if (origins_ != nullptr) origins_->push_back({part, block_, fetch_});
  return entry_.instructionWords.emplace_back();
}

// The encoder cuts what is too large for its field, and sums that leave 32 bits; here that is found first. The other
// fields are as wide as what is written to them.
std::optional<std::string> InstructionWordsBuilder::findMisfit(const FetchDescriptor& fetch) const {
  const ExactFetchGeometry geometry = encoder_.measureFetch(fetch);
  for (const Bounded& bounded :
       {Bounded{"firstSample", geometry.firstSample, 0, kMax32}, Bounded{"span", geometry.span, 0, kMax32},
        inField(fetch_field::kFirstWord, geometry.firstWord), inField(fetch_field::kWordCount, geometry.wordCount),
        inField(fetch_field::kHeadSkip, geometry.headSkip), inField(fetch_field::kTailSkip, geometry.tailSkip),
        inField(fetch_field::kMarkerOffset, fetch.markerOffset)}) {
    if (!bounded.fits()) return bounded.describeMisfit();
  }
  return std::nullopt;
}

InstructionWordsBuilder::Source InstructionWordsBuilder::resolve(const FetchRecord& fetch) {
  if (!fetch.isWait) return resolveGenerate(fetch);
  const auto length = static_cast<std::int32_t>(fetch.sampleCount);
  if (length < 0) {
    kterr::Failure(ktorba_errors::kErrorInvalidWaveformLengthToIgnore)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeWaveformLength, length)
        .raise();
  }
  return {0, fetch.sampleCount};
}

InstructionWordsBuilder::Source InstructionWordsBuilder::resolveGenerate(const FetchRecord& fetch) {
  const WaveformEntry& waveform = find(fetch.waveformName);
  const std::uint32_t available = waveform.allocatedLength;
  if (fetch.startOffset > available) {
    kterr::Failure(ktorba_errors::kErrorStartPositionExceedsWaveformLength)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeWaveformLength, available)
        .usage(kterr::kUsageTypeWaveformName, waveform.name)
        .usage(kterr::kUsageTypeStartOffset, fetch.startOffset)
        .raise();
  }
  const bool isWhole = fetch.sampleCount == kWholeWaveform;
  if (isWhole && fetch.startOffset == 0) return {waveform.memoryOffset, available};
  const auto length = static_cast<std::int32_t>(fetch.sampleCount);
  if (!isWhole && (length < 0 || fetch.sampleCount < minFetchSamples_)) {
    kterr::Failure(ktorba_errors::kErrorRequestedWaveformLengthIsTooSmall)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeMinSubsetLength, minFetchSamples_)
        .usage(kterr::kUsageTypeSubsetLength, length)
        .raise();
  }
  if (!isWhole && fetch.sampleCount > available) {
    kterr::Failure(ktorba_errors::kErrorRequestedWaveformLengthExceedsAllocatedLength)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeWaveformLength, available)
        .usage(kterr::kUsageTypeWaveformName, waveform.name)
        .usage(kterr::kUsageTypeSubsetLength, fetch.sampleCount)
        .raise();
  }
  // An offset without a length is refused as well: the whole waveform from there would run past its end.
  if (isWhole || std::uint64_t{fetch.sampleCount} + fetch.startOffset > available) {
    kterr::Failure(ktorba_errors::kErrorInvalidStartPositionAndWaveformLengthCombination)
        .at(kScriptProcessorSource)
        .usage(kterr::kUsageTypeWaveformLength, available)
        .usage(kterr::kUsageTypeWaveformName, waveform.name)
        .usage(kterr::kUsageTypeSubsetLength, fetch.sampleCount)
        .usage(kterr::kUsageTypeSubsetStartOffset, fetch.startOffset)
        .raise();
  }
  return {waveform.memoryOffset, fetch.sampleCount};
}

// Scripts play few waveforms often, mostly spelled alike.
const WaveformEntry& InstructionWordsBuilder::find(std::string_view name) {
  const std::size_t place = std::hash<std::string_view>()(name) & (found_.size() - 1);
  for (const Found& found : {found_[place], found_[place ^ 1]}) {
    if (found.waveform != nullptr && found.name == name) return *found.waveform;
  }
  const WaveformEntry& waveform = finder_.getWaveform(std::string(name));
  found_[found_[place].waveform == nullptr ? place : place ^ 1] = {name, &waveform};
  return waveform;
}

}  // namespace ktorba
