#include "RandomScript.h"

#include <algorithm>

namespace endToEnd {
namespace {

class Writer {
 public:
  Writer(Random& random, const Waveforms& waveforms, std::uint32_t minFetchSamples)
      : random_(random), waveforms_(waveforms), minFetchSamples_(minFetchSamples) {}

  std::string write() {
    text_ = "script main\n";
    const bool isEndless = chance(4);
    if (isEndless) text_ += "repeat forever\n";
    writeBody(true);
    if (isEndless) text_ += "end repeat\n";
    return text_ + "end script\n";
  }

 private:
  bool chance(std::uint32_t oneIn) { return pick(random_, 1, oneIn) == 1; }

  // A body generates something and does not end in a clear.
  void writeBody(bool mayLoop) {
    for (std::uint32_t left = pick(random_, 0, 4); left > 0; --left) writeInstruction(mayLoop);
    if (chance(4)) {
      writeCountedWait();
    } else {
      writeGenerate();
    }
  }

  void writeInstruction(bool mayLoop) {
    switch (pick(random_, 0, mayLoop ? 6 : 4)) {
      case 0:
        return writeCountedWait();
      case 1:
        return writeClear();
      case 2:
        text_ += "wait until " + trigger() + '\n';
        return;
      case 3:
      case 4:
        return writeGenerate();
      default:
        return writeRepeat();
    }
  }

  void writeRepeat() {
    const std::uint32_t kind = pick(random_, 0, 9);
    text_ += "repeat " + (kind == 0 ? "forever" : kind < 3 ? "until " + trigger() : number(pick(random_, 1, 4))) + '\n';
    writeBody(false);
    text_ += "end repeat\n";
  }

  void writeClear() {
    text_ += "clear";
    for (std::uint32_t left = pick(random_, 1, 3); left > 0; --left) text_ += ' ' + trigger();
    text_ += '\n';
  }

  void writeCountedWait() {
    const std::uint32_t length = pick(random_, minFetchSamples_, 5 * minFetchSamples_);
    text_ += "wait " + number(length);
    writeMarkers(length);
  }

  void writeGenerate() {
    auto waveform = waveforms_.begin();
    std::advance(waveform, pick(random_, 0, static_cast<std::uint32_t>(waveforms_.size()) - 1));
    const auto whole = static_cast<std::uint32_t>(waveform->second.size());
    std::uint32_t length = whole;
    text_ += "generate " + waveform->first;
    if (chance(2)) {
      length = pick(random_, minFetchSamples_, whole);
      text_ += " subset(" + number(pick(random_, 0, whole - length)) + ", " + number(length) + ")";
    }
    writeMarkers(length);
  }

  // Distinct positions at least a minimum fetch apart, handed out to markers in any order.
  void writeMarkers(std::uint32_t length) {
    const std::uint32_t most = length / minFetchSamples_;
    std::uint32_t position = chance(2) ? 0 : pick(random_, 0, length - 1);
    for (std::uint32_t left = pick(random_, 0, std::min(most, 5u)); left > 0 && position < length; --left) {
      for (std::uint32_t same = pick(random_, 1, 2); same > 0; --same) {
        text_ += " marker" + number(pick(random_, 0, 7)) + '(' + number(position) + ')';
      }
      position += minFetchSamples_ + pick(random_, 0, minFetchSamples_);
    }
    text_ += '\n';
  }

  std::string trigger() { return "trigger" + number(pick(random_, 1, 7)); }
  static std::string number(std::uint32_t value) { return std::to_string(value); }

  Random& random_;
  const Waveforms& waveforms_;
  std::uint32_t minFetchSamples_;
  std::string text_;
};

}  // namespace

std::uint32_t pick(Random& random, std::uint32_t low, std::uint32_t high) {
  return std::uniform_int_distribution<std::uint32_t>(low, high)(random);
}

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
  return Writer(random, waveforms, minFetchSamples).write();
}

}  // namespace endToEnd
