#include "tools/difference/comparePlays.h"

#include <algorithm>
#include <set>
#include <utility>

#include "conventions/conventions.h"

namespace tools {
namespace {

using Doing = PlayDifference::Doing;
using Kind = PlayDifference::Kind;
using Region = PlayCursor::Region;

// A side with the levels that it plays.
class Player {
 public:
  explicit Player(const PlaySide& side) : cursor(side.play), side_(side) {}

  std::int32_t level(std::uint64_t ahead) const {
    if (isPlaying()) return waveform()[position() + ahead];
    const std::uint32_t held = cursor.heldStep();
    if (held == Step::kNone) return 0;
    const Step& step = side_.play.steps()[held];
    return side_.waveforms[step.waveform][step.firstInWaveform + step.sampleCount - 1];
  }

  std::uint8_t markersAt(std::uint64_t ahead) const {
    return cursor.step().markerOffset == cursor.offset() + ahead ? cursor.step().markerMask : std::uint8_t{0};
  }

  // Samples from here to the marker of the step; kBeyond: it fires none, or has fired.
  std::uint64_t untilMarker() const {
    const Step& step = cursor.step();
    return step.markerMask != 0 && step.markerOffset >= cursor.offset() ? step.markerOffset - cursor.offset() : kBeyond;
  }

  bool isPlaying() const { return cursor.step().kind == StepKind::kWaveform; }
  const SampleSpan& waveform() const { return side_.waveforms[cursor.step().waveform]; }
  std::uint64_t position() const { return cursor.step().firstInWaveform + cursor.offset(); }

  Doing doing(std::uint64_t ahead) const {
    if (cursor.isOver()) return {cursor.step().address, 0, 0, {}, true};
    return {cursor.step().address, level(ahead), markersAt(ahead), ahead == 0 ? cursor.triggerUse() : TriggerUse{},
            false};
  }

  PlayCursor cursor;

 private:
  const PlaySide& side_;
};

class Comparer {
 public:
  Comparer(const PlaySide& first, const PlaySide& second) : first_(first), second_(second) {
    findEqualWaveforms(first.waveforms, second.waveforms);
  }

  PlayComparison compare() && {
    agreeOver(kBeyond);
    return result_;
  }

 private:
  // What both sides repeat: after `proof` samples that agree, `total` do.
  struct Shortcut {
    Region first;
    Region second;
    std::uint64_t proof = 0;
    std::uint64_t total = 0;
    std::uint64_t gain() const { return total - proof; }
  };

  void findEqualWaveforms(const TimelineWaveforms& first, const TimelineWaveforms& second) {
    for (std::uint32_t one = 0; one < first.size(); ++one) {
      for (std::uint32_t other = 0; other < second.size(); ++other) {
        if (areEqual(first[one], second[other])) isEqual_.emplace(one, other);
      }
    }
  }

  static bool areEqual(const SampleSpan& one, const SampleSpan& other) {
    return one.visit([&other](const auto& levels) {
      return std::ranges::equal(levels, other.as<std::decay_t<decltype(levels)>>());
    });
  }

  // Compares that many samples, or up to the end of both; false at a difference. A shortcut's proof takes smaller
  // shortcuts, so that this calls itself no deeper than there are pairs of regions.
  bool agreeOver(std::uint64_t samples) {
    while (samples > 0 && !isDone_) {
      if (first_.cursor.isOver() || second_.cursor.isOver()) return agreeOnEnd();
      const Shortcut shortcut = bestShortcut(samples);
      std::uint64_t agreed = shortcut.total;
      if (shortcut.total == 0) {
        agreed = std::min({first_.cursor.left(), second_.cursor.left(), samples});
        if (!agreeOnRun(agreed)) return false;
      } else if (!take(shortcut)) {
        return false;
      }
      if (samples != kBeyond) samples -= agreed;
    }
    return true;
  }

  bool take(const Shortcut& shortcut) {
    if (!agreeOver(shortcut.proof)) return false;
    if (shortcut.total == kBeyond) {
      result_.isWhole = shortcut.first.isEndless && shortcut.second.isEndless;
      isDone_ = true;
      return true;
    }
    first_.cursor.leap(shortcut.first.kind, shortcut.gain());
    second_.cursor.leap(shortcut.second.kind, shortcut.gain());
    sample_ = extentSum(sample_, shortcut.gain());
    return true;
  }

  Shortcut bestShortcut(std::uint64_t samples) const {
    Shortcut best;
    for (const Region& first : first_.cursor.regions()) {
      if (first.kind == Region::Kind::kNone) continue;
      for (const Region& second : second_.cursor.regions()) {
        if (second.kind == Region::Kind::kNone) continue;
        const std::uint64_t total = std::min({first.extent, second.extent, samples});
        const std::uint64_t proof = extentSum(first.period, second.period);
        if (proof < total && total - proof > best.gain()) best = {first, second, proof, total};
      }
    }
    return best;
  }

  bool agreeOnEnd() {
    isDone_ = true;
    return (first_.cursor.isOver() && second_.cursor.isOver()) || differ(Kind::kEnd, 0);
  }

  // That many samples of the steps at hand.
  bool agreeOnRun(std::uint64_t samples) {
    if (first_.cursor.triggerUse() != second_.cursor.triggerUse()) return differ(Kind::kTriggers, 0);
    const std::uint64_t level = firstLevelApart(samples);
    const std::uint64_t markers = firstMarkersApart(samples);
    if (level < samples && level <= markers) return differ(Kind::kLevel, level);
    if (markers < samples) return differ(Kind::kMarkers, markers);
    first_.cursor.advance(samples);
    second_.cursor.advance(samples);
    sample_ = extentSum(sample_, samples);
    return true;
  }

  // The samples ahead of it, or `samples`.
  std::uint64_t firstLevelApart(std::uint64_t samples) const {
    if (!first_.isPlaying() && !second_.isPlaying()) return first_.level(0) == second_.level(0) ? samples : 0;
    const bool bothPlay = first_.isPlaying() && second_.isPlaying();
    if (bothPlay && first_.position() == second_.position() &&
        isEqual_.contains({first_.cursor.step().waveform, second_.cursor.step().waveform})) {
      return samples;
    }
    if (bothPlay) return firstApart(samples);
    const Player& playing = first_.isPlaying() ? first_ : second_;
    const std::int32_t held = (first_.isPlaying() ? second_ : first_).level(0);
    return playing.waveform().visit([&](const auto& levels) {
      const auto begin = levels.begin() + static_cast<std::ptrdiff_t>(playing.position());
      const auto end = begin + static_cast<std::ptrdiff_t>(samples);
      return static_cast<std::uint64_t>(std::find_if(begin, end, [=](auto level) { return level != held; }) - begin);
    });
  }

  std::uint64_t firstApart(std::uint64_t samples) const {
    return first_.waveform().visit([&](const auto& levels) {
      const auto others = second_.waveform().template as<std::decay_t<decltype(levels)>>();
      const auto begin = levels.begin() + static_cast<std::ptrdiff_t>(first_.position());
      const auto end = begin + static_cast<std::ptrdiff_t>(samples);
      const auto other = others.begin() + static_cast<std::ptrdiff_t>(second_.position());
      return static_cast<std::uint64_t>(std::mismatch(begin, end, other).first - begin);
    });
  }

  // Both fire at the same sample, if at all, or are apart at the first marker of either.
  std::uint64_t firstMarkersApart(std::uint64_t samples) const {
    const std::uint64_t next = std::min(first_.untilMarker(), second_.untilMarker());
    return next < samples && first_.markersAt(next) != second_.markersAt(next) ? next : samples;
  }

  bool differ(Kind kind, std::uint64_t ahead) {
    isDone_ = true;
    result_.difference = {kind, extentSum(sample_, ahead), first_.doing(ahead), second_.doing(ahead)};
    return false;
  }

  Player first_;
  Player second_;
  std::set<std::pair<std::uint32_t, std::uint32_t>> isEqual_;  // waveforms of the first side and of the second
  std::uint64_t sample_ = 0;
  bool isDone_ = false;
  PlayComparison result_;
};

std::string triggersIn(std::uint8_t mask) {
  std::string text;
  for (std::uint32_t trigger = 1; trigger <= ktorba::kHardwareTriggerCount; ++trigger) {
    if ((mask & ktorba::clearFlagOf(trigger)) != 0) text += " " + ktorba::triggerName(trigger);
  }
  return text;
}

std::string describeMarkers(std::uint8_t mask) {
  std::string text;
  for (std::uint32_t marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    if ((mask & ktorba::markerBitOf(marker)) != 0) text += (text.empty() ? "" : ", ") + ktorba::markerName(marker);
  }
  return text.empty() ? "no marker" : text;
}

std::string describeTriggers(const TriggerUse& use) {
  std::string text;
  const auto add = [&text](const std::string& what) { text += (text.empty() ? "" : ", ") + what; };
  if (use.loopEnded != 0) add("ends a loop until " + ktorba::triggerName(use.loopEnded));
  if (use.clearedAtEntry != 0) add("clears" + triggersIn(use.clearedAtEntry));
  if (use.loopBegun != 0) add("loops until " + ktorba::triggerName(use.loopBegun));
  if (use.cleared != 0) add("clears" + triggersIn(use.cleared));
  if (use.awaited != 0) add("waits until " + ktorba::triggerName(use.awaited));
  return text.empty() ? "uses no trigger" : text;
}

}  // namespace

PlayComparison comparePlays(const PlaySide& first, const PlaySide& second) { return Comparer(first, second).compare(); }

std::string describe(const Doing& doing, Kind kind) {
  if (doing.isOver) return "has ended";
  switch (kind) {
    case Kind::kLevel:
      return "level " + std::to_string(doing.level);
    case Kind::kMarkers:
      return describeMarkers(doing.markers);
    case Kind::kTriggers:
      return describeTriggers(doing.triggers);
    case Kind::kEnd:
      break;
  }
  return "goes on";
}

}  // namespace tools
