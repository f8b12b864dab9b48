#include "testing/RandomScript.h"

#include <algorithm>

#include "conventions/conventions.h"

namespace scripts {
namespace {

struct Writer {
  std::string write() {
    text = "script main\n";
    const bool isEndless = chance(4);
    if (isEndless) text += "repeat forever\n";
    writeBody(true);
    if (isEndless) text += "end repeat\n";
    return text + "end script\n";
  }

  bool chance(std::uint32_t oneIn) { return pick(random, 1, oneIn) == 1; }

  // A body generates something and does not end in a clear.
  void writeBody(bool mayLoop) {
    for (std::uint32_t left = pick(random, 0, 4); left > 0; --left) writeInstruction(mayLoop);
    if (chance(4)) {
      writeCountedWait();
    } else {
      writeGenerate();
    }
  }

  void writeInstruction(bool mayLoop) {
    const std::uint32_t kind = pick(random, 0, mayLoop ? 6 : 4);
    if (kind == 0) return writeCountedWait();
    if (kind == 1) return writeClear();
    if (kind == 2) return void(text += "wait until " + trigger() + '\n');
    if (kind <= 4) return writeGenerate();
    writeRepeat();
  }

  void writeRepeat() {
    const std::uint32_t kind = pick(random, 0, 9);
    text += "repeat " + (kind == 0 ? "forever" : kind < 3 ? "until " + trigger() : number(pick(random, 1, 4))) + '\n';
    writeBody(false);
    text += "end repeat\n";
  }

  void writeClear() {
    text += "clear";
    for (std::uint32_t left = pick(random, 1, 3); left > 0; --left) text += ' ' + trigger();
    text += '\n';
  }

  void writeCountedWait() {
    const std::uint32_t length = pick(random, minFetchSamples, 5 * minFetchSamples);
    text += "wait " + number(length);
    writeMarkers(length);
  }

  void writeGenerate() {
    auto waveform = waveforms.begin();
    std::advance(waveform, pick(random, 0, static_cast<std::uint32_t>(waveforms.size()) - 1));
    const auto whole = static_cast<std::uint32_t>(waveform->second.size());
    std::uint32_t length = whole;
    text += "generate " + waveform->first;
    if (chance(2)) {
      length = pick(random, minFetchSamples, whole);
      text += " subset(" + number(pick(random, 0, whole - length)) + ", " + number(length) + ")";
    }
    writeMarkers(length);
  }

  // Distinct positions at least a minimum fetch apart, handed out to markers in any order.
  void writeMarkers(std::uint32_t length) {
    const std::uint32_t most = length / minFetchSamples;
    std::uint32_t position = chance(2) ? 0 : pick(random, 0, length - 1);
    for (std::uint32_t left = pick(random, 0, std::min(most, 5u)); left > 0 && position < length; --left) {
      for (std::uint32_t same = pick(random, 1, 2); same > 0; --same) {
        text += ' ' + ktorba::markerName(pick(random, 0, ktorba::kMarkerCount - 1)) + '(' + number(position) + ')';
      }
      position += minFetchSamples + pick(random, 0, minFetchSamples);
    }
    text += '\n';
  }

  std::string trigger() {
    return ktorba::triggerName(ktorba::hardwareTriggerOf(pick(random, 0, ktorba::kTriggerCount - 1)));
  }
  static std::string number(std::uint32_t value) { return std::to_string(value); }

  Random& random;
  const Waveforms& waveforms;
  std::uint32_t minFetchSamples;
  std::string text{};
};

}  // namespace

Waveforms randomWaveforms(Random& random, std::uint32_t minLength, std::uint32_t maxLength, unsigned sampleWidthBits) {
  Waveforms waveforms;
  for (std::uint32_t left = pick(random, 1, 5); left > 0; --left) {
    Samples samples(pick(random, minLength, maxLength));
    for (std::uint32_t& sample : samples) sample = pick(random, 0, 0xFFFFFFFF >> (32 - sampleWidthBits));
    waveforms["w" + std::to_string(left)] = std::move(samples);
  }
  return waveforms;
}

std::string randomScript(Random& random, const Waveforms& waveforms, std::uint32_t minFetchSamples) {
  return Writer{random, waveforms, minFetchSamples}.write();
}

}  // namespace scripts
