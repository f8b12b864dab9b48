#include "testing/ScriptScene.h"

#include <algorithm>

#include "conventions/conventions.h"
#include "ktorba/script/instructionDecoder.h"

namespace ktorba {
namespace {

ktwfmscriptcompiler::ScriptTraits scriptTraitsOf(const SceneNumbers& numbers) {
  ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  traits.alignmentQuantum = numbers.alignmentQuantum;
  traits.minWaitLength = numbers.minFetchSamples;
  return traits;
}

// Reads a program from its first instruction to its last and compares it with the script; throws the first fault.
class ProgramReader {
 public:
  ProgramReader(const BuiltScript& built, ScriptScene& scene) : built_(built), scene_(scene) {}

  void read() {
    const auto min = scene_.numbers.minFetchSamples;
    DecodedInstruction start = next(Opcode::kFetch);
    expect(
        samplesOf(start) == min && start[fetch_field::kTriggerNumber] == kStartTrigger && start[fetch_field::kIsWait],
        "start");
    total_ += start[fetch_field::kWordCount];
    for (const SequenceBlock& block : built_.script.blocks) readBlock(block);
    if (built_.script.isEndless) {
      expect(next(Opcode::kJump)[jump_field::kTargetAddress] == 1, "jump");
    } else {
      const DecodedInstruction end = next(Opcode::kScriptEnd);
      expect(samplesOf(end) == min && end[fetch_field::kIsFinal] && end[fetch_field::kIsWait], "end");
      total_ += end[fetch_field::kWordCount];
    }
    const ScriptEntry& entry = built_.entry;
    expect(address_ == entry.instructionWords.size() && address_ == built_.origins.size(), "length");
    expect(total_ == entry.totalMemoryWords, "totalMemoryWords");
    const bool finite = !entry.isEndless && !entry.hasUnboundedLoop;
    expect(entry.finiteMemoryWords == (finite ? std::min(total_, std::uint64_t{0xFFFFFFFF}) : 0xFFFFFFFF), "finite");
  }

 private:
  void readBlock(const SequenceBlock& block) {
    const DecodedInstruction start = next(Opcode::kLoopStart);
    const std::uint64_t bodyAddress = address_;
    std::uint64_t body = 0;
    for (const FetchRecord& fetch : block.fetches) body += readFetch(fetch);
    const DecodedInstruction end = next(Opcode::kLoopEnd);
    for (const DecodedInstruction& loop : {start, end}) {
      expect(loop[loop_field::kBodyAddress] == bodyAddress && loop[loop_field::kClearFlag] == block.clearFlag &&
                 loop[loop_field::kIterationCount] == block.iterationCount &&
                 loop[loop_field::kIsCounted] == (block.loopKind == LoopKind::kCounted) &&
                 loop[loop_field::kIsUntil] == (block.loopKind == LoopKind::kUntilTrigger) &&
                 (block.loopKind != LoopKind::kUntilTrigger || loop[loop_field::kTriggerNumber] == block.triggerNumber),
             "loop");
    }
    expect(block.loopKind == LoopKind::kCounted || built_.entry.hasUnboundedLoop, "hasUnboundedLoop");
    total_ += body * (block.loopKind == LoopKind::kCounted ? block.iterationCount : 1);
  }

  // Returns the memory words of the fetch's pieces.
  std::uint64_t readFetch(const FetchRecord& fetch) {
    const std::uint64_t bytesPerSample = scene_.numbers.sampleWidthBits / 8;
    std::uint64_t base = fetch.startOffset, length = fetch.sampleCount, memoryWords = 0;
    if (!fetch.isWait) {
      const WaveformEntry& waveform = scene_.waveforms.getWaveform(std::string(fetch.waveformName));
      base += waveform.memoryOffset / bytesPerSample;
      length = fetch.sampleCount == kWholeWaveform ? waveform.allocatedLength : fetch.sampleCount;
      expect(fetch.startOffset + length <= waveform.allocatedLength, "samples outside the waveform");
    }
    auto marker = fetch.markers.begin();
    for (std::uint64_t done = 0, piece = 0; done < length; done += piece) {
      const DecodedInstruction words = next(Opcode::kFetch);
      const bool first = done == 0;
      piece = samplesOf(words);
      memoryWords += words[fetch_field::kWordCount];
      expect(firstSampleOf(words) == base + done && done + piece <= length, "samples");
      expect(fetch.markers.empty() ? piece == length : piece >= scene_.numbers.minFetchSamples, "piece length");
      expect(words[fetch_field::kIsWait] == fetch.isWait && !words[fetch_field::kIsFinal], "kind");
      expect(words[fetch_field::kTriggerNumber] == (first ? fetch.triggerNumber : 0), "trigger");
      expect(words[fetch_field::kClearFlag] == (first ? fetch.clearFlag : 0), "clear flag");
      if (words[fetch_field::kMarkerMask] == 0) continue;
      expect(marker != fetch.markers.end() && words[fetch_field::kMarkerMask] == marker->markerMask &&
                 done + words[fetch_field::kMarkerOffset] == marker->position &&
                 words[fetch_field::kMarkerOffset] < piece,
             "marker");
      ++marker;
    }
    expect(marker == fetch.markers.end(), "markers left over");
    return memoryWords;
  }

  DecodedInstruction next(Opcode opcode) {
    expect(address_ < built_.entry.instructionWords.size(), "length");
    const DecodedInstruction decoded = decodeInstruction(built_.entry.instructionWords[address_++]);
    expect(decoded.is(opcode), "opcode");
    return decoded;
  }

  std::uint64_t firstSampleOf(const DecodedInstruction& fetch) const {
    return fetch[fetch_field::kFirstWord] * scene_.numbers.samplesPerMemoryWord + fetch[fetch_field::kHeadSkip];
  }

  std::uint64_t samplesOf(const DecodedInstruction& fetch) const {
    return fetch[fetch_field::kWordCount] * scene_.numbers.samplesPerMemoryWord - fetch[fetch_field::kHeadSkip] -
           fetch[fetch_field::kTailSkip];
  }

  void expect(bool holds, const char* what) const {
    if (!holds) throw std::string(what) + " is wrong at instruction " + std::to_string(address_ - 1);
  }

  const BuiltScript& built_;
  ScriptScene& scene_;
  std::size_t address_ = 0;
  std::uint64_t total_ = 0;
};

}  // namespace

ScriptScene::ScriptScene(const SceneNumbers& given)
    : numbers(given),
      scriptTraits(scriptTraitsOf(given)),
      processor(scriptTraits, &encoder, given.minFetchSamples),
      memory(1u << 28, std::max(1u, given.samplesPerMemoryWord * (given.sampleWidthBits / 8))) {
  HWTraits traits;
  traits.sampleWidthBits = given.sampleWidthBits;
  traits.samplesPerMemoryWord = given.samplesPerMemoryWord;
  traits.minFetchSamples = given.minFetchSamples;
  encoder.receiveHWTraits(traits);
}

WaveformEntry& ScriptScene::addWaveform(const std::string& name, std::uint32_t samples) {
  WaveformEntry& waveform = waveforms.addWaveform(name, samples);
  const std::uint32_t granularity = memory.getBlockGranularity();
  const std::uint32_t bytes = samples * (numbers.sampleWidthBits / 8);
  if (bytes > 0) waveform.memoryOffset = memory.allocateBlock((bytes + granularity - 1) / granularity * granularity);
  return waveform;
}

BuiltScript ScriptScene::build(const CompiledScript& script) {
  latest_.script = script;  // what was built before has to go
  processor.buildInstructionWords(script, waveforms, latest_.entry, &latest_.origins);
  return latest_;
}

std::vector<BuiltScript> ScriptScene::build(const std::string& text) {
  std::vector<CompiledScript> scripts;
  processor.compileScripts(text, scripts);
  std::vector<BuiltScript> all;
  for (const CompiledScript& script : scripts) all.push_back(build(script));
  return all;
}

std::string findFault(const BuiltScript& built, ScriptScene& scene) {
  try {
    ProgramReader(built, scene).read();
  } catch (const std::string& fault) {
    return built.script.name + ": " + fault;
  }
  return {};
}

}  // namespace ktorba
