#include "ktWfmScriptCompiler/printScript.h"

#include <algorithm>
#include <vector>

#include "conventions/conventions.h"
#include "kterr/hexText.h"

namespace ktwfmscriptcompiler {
namespace {

std::string hex(std::uint8_t bits) { return kterr::hexText(bits, 2); }

std::string clearText(std::uint8_t flags) { return flags == 0 ? "" : " clear " + hex(flags); }

// What a block's repeat is followed by, with its trigger as `trigger` names it.
template <typename NameTrigger>
std::string loopText(const SequenceBlock& block, NameTrigger trigger) {
  switch (block.loopKind) {
    case ktorba::LoopKind::kCounted:
      return std::to_string(block.iterationCount);
    case ktorba::LoopKind::kForever:
      return "forever";
    case ktorba::LoopKind::kUntilTrigger:
      break;
  }
  return "until " + trigger(block.triggerNumber);
}

std::string hardwareTrigger(std::uint8_t number) { return "hardware trigger " + std::to_string(number); }

std::string listedFetch(const FetchRecord& fetch) {
  std::string line = "    ";
  if (!fetch.isWait) {
    line += "generate " + fetch.waveformName;
    if (fetch.sampleCount == kWholeWaveform) {
      line += " whole";
    } else {
      line += " offset " + std::to_string(fetch.startOffset) + " count " + std::to_string(fetch.sampleCount);
    }
  } else {
    line += "wait " + std::to_string(fetch.sampleCount);
    if (fetch.triggerNumber != 0) line += " until " + hardwareTrigger(fetch.triggerNumber);
  }
  line += clearText(fetch.clearFlag);
  if (!fetch.markers.empty()) line += " markers";
  for (const MarkerRecord& marker : fetch.markers) {
    line += ' ' + std::to_string(marker.position) + ":" + hex(marker.markerMask);
  }
  return line + "\n";
}

// Nothing but its place tells a plain run from a loop of one pass without clears.
bool mayBePlain(const SequenceBlock& block) {
  return block.loopKind == ktorba::LoopKind::kCounted && block.iterationCount == 1 && block.clearFlag == 0;
}

// Holds nothing but waits for triggers, with which no loop would compile.
bool mustBePlain(const SequenceBlock& block) {
  return std::ranges::all_of(block.fetches, [](const FetchRecord& fetch) { return fetch.triggerNumber != 0; });
}

class ScriptWriter {
 public:
  explicit ScriptWriter(const ScriptTraits& traits) : traits_(traits) {}

  std::string write(const CompiledScript& script) {
    line("script " + script.name);
    if (script.isEndless) {
      openLoop("forever");
      writeBlocks(script);
      closeLoop();
    } else {
      writeBlocks(script);
      // A loop on its own would be taken for the whole script; a clear behind it has no other effect.
      if (isForeverLoopAlone(script)) line("clear " + traits_.triggerNames.begin()->first);
    }
    line("end script");
    return std::move(text_);
  }

 private:
  static bool isForeverLoopAlone(const CompiledScript& script) {
    return script.blocks.size() == 1 && script.blocks[0].loopKind == ktorba::LoopKind::kForever &&
           script.blocks[0].clearFlag == 0;
  }

  // Two plain runs in a row would be one: every other one that may be a loop becomes one.
  void writeBlocks(const CompiledScript& script) {
    bool isPlain = false;
    for (auto block = script.blocks.begin(); block != script.blocks.end(); ++block) {
      const bool isLoopNeeded = isPlain || (block + 1 != script.blocks.end() && mustBePlain(block[1]));
      isPlain = mustBePlain(*block) || (mayBePlain(*block) && !isLoopNeeded);
      writeBlock(*block, isPlain);
    }
  }

  void writeBlock(const SequenceBlock& block, bool isPlain) {
    if (!isPlain) {
      writeClear(block.clearFlag);
      openLoop(loopText(block, [this](std::uint8_t trigger) { return triggerName(trigger); }));
    }
    for (const FetchRecord& fetch : block.fetches) writeFetch(fetch);
    if (!isPlain) closeLoop();
  }

  void writeFetch(const FetchRecord& fetch) {
    writeClear(fetch.clearFlag);
    std::string instruction;
    if (!fetch.isWait) {
      instruction = "generate " + fetch.waveformName;
      if (fetch.sampleCount != kWholeWaveform) {
        instruction += " subset(" + std::to_string(fetch.startOffset) + ", " + std::to_string(fetch.sampleCount) + ")";
      }
    } else if (fetch.triggerNumber != 0) {
      instruction = "wait until " + triggerName(fetch.triggerNumber);
    } else {
      instruction = "wait " + std::to_string(fetch.sampleCount);
    }
    line(instruction + markersText(fetch.markers));
  }

  void writeClear(std::uint8_t flags) {
    std::string names;
    for (std::uint8_t trigger = 1; trigger <= ktorba::kHardwareTriggerCount; ++trigger) {
      if ((flags & ktorba::clearFlagOf(trigger)) != 0) names += ' ' + triggerName(trigger);
    }
    if (!names.empty()) line("clear" + names);
  }

  // One marker name after the other, each with all of its positions.
  std::string markersText(const MarkerRecords& markers) const {
    std::string text;
    for (std::uint32_t marker = 0; marker < ktorba::kMarkerCount; ++marker) {
      const std::uint8_t bit = ktorba::markerBitOf(marker);
      text += markerText(markers, bit, [=](std::uint8_t mask) { return (mask & bit) != 0; });
    }
    return text + markerText(markers, 0, [](std::uint8_t mask) { return mask == 0; });
  }

  template <typename Fires>
  std::string markerText(const MarkerRecords& markers, std::uint8_t bit, Fires fires) const {
    std::string positions;
    for (const MarkerRecord& marker : markers) {
      if (fires(marker.markerMask)) positions += (positions.empty() ? "" : ", ") + std::to_string(marker.position);
    }
    if (positions.empty()) return "";
    return ' ' + nameOf(traits_.markerNames, [=](std::uint32_t number) { return ktorba::markerBitOf(number) == bit; }) +
           "(" + positions + ")";
  }

  std::string triggerName(std::uint8_t trigger) const {
    return nameOf(traits_.triggerNames,
                  [=](std::uint32_t number) { return ktorba::hardwareTriggerOf(number) == trigger; });
  }

  template <typename IsWanted>
  static std::string nameOf(const NameMap& names, IsWanted isWanted) {
    const auto found = std::ranges::find_if(names, [&](const auto& entry) { return isWanted(entry.second); });
    return found == names.end() ? "" : found->first;
  }

  void openLoop(const std::string& argument) {
    line("repeat " + argument);
    ++depth_;
  }

  void closeLoop() {
    --depth_;
    line("end repeat");
  }

  void line(const std::string& instruction) {
    text_.append(2 * depth_, ' ');
    text_ += instruction + "\n";
  }

  const ScriptTraits& traits_;
  std::string text_;
  std::size_t depth_ = 0;
};

}  // namespace

std::string printScript(const CompiledScript& script) {
  std::string text = "script " + script.name + (script.isEndless ? " endless\n" : "\n");
  for (const SequenceBlock& block : script.blocks) {
    text += mayBePlain(block) ? "  once" : "  repeat " + loopText(block, hardwareTrigger);
    text += clearText(block.clearFlag) + "\n";
    for (const FetchRecord& fetch : block.fetches) text += listedFetch(fetch);
  }
  return text;
}

std::string printAsScript(const CompiledScript& script, const ScriptTraits& traits) {
  return ScriptWriter(traits).write(script);
}

}  // namespace ktwfmscriptcompiler
