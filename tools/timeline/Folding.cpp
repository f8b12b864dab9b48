#include "tools/timeline/Folding.h"

#include <algorithm>
#include <array>
#include <utility>

#include "tools/timeline/TriggerUses.h"

namespace tools {
namespace {

using ktorba::LoopKind;
using Repeats = Stretch::Repeats;

constexpr std::uint32_t kTriggers = ktorba::kHardwareTriggerCount;

// The raised triggers, and which of them the sequencer has latched by now.
class Latches {
 public:
  explicit Latches(std::vector<RaisedTrigger> raised) : raised_(std::move(raised)) {
    std::ranges::stable_sort(raised_, {}, &RaisedTrigger::sample);
    for (const RaisedTrigger& trigger : raised_) ofTrigger_[trigger.trigger - 1].push_back(trigger.sample);
  }

  void latchUntil(std::uint64_t sample) {
    for (; next_ < raised_.size() && raised_[next_].sample <= sample; ++next_) latch(raised_[next_].trigger);
  }
  void latch(std::uint8_t trigger) { latched_ |= ktorba::clearFlagOf(trigger); }
  void clear(std::uint8_t trigger) { latched_ &= static_cast<std::uint8_t>(~ktorba::clearFlagOf(trigger)); }
  bool has(std::uint8_t trigger) const { return (latched_ & ktorba::clearFlagOf(trigger)) != 0; }

  // The sample of the next trigger that is not latched; kBeyond: none comes.
  std::uint64_t next() const { return next_ < raised_.size() ? raised_[next_].sample : kBeyond; }
  // The first of that trigger behind `sample`; likewise.
  std::uint64_t nextOf(std::uint8_t trigger, std::uint64_t sample) const {
    const auto& samples = ofTrigger_[trigger - 1];
    const auto found = std::ranges::upper_bound(samples, sample);
    return found != samples.end() ? *found : kBeyond;
  }

 private:
  std::vector<RaisedTrigger> raised_;  // by sample
  std::array<std::vector<std::uint64_t>, kTriggers> ofTrigger_;
  std::size_t next_ = 0;
  std::uint8_t latched_ = ktorba::clearFlagOf(ktorba::kStartTrigger);
};

// The first place ahead where play does not simply go on.
struct Stop {
  Spot spot;  // the wait, or the end of the body
  enum class Kind : std::uint8_t { kWait, kLoop, kScript } kind;
  std::uint8_t trigger = 0;  // that is missing; 0 for a loop or script for ever
};

class Folder {
 public:
  Folder(const StraightPlay& play, std::vector<RaisedTrigger> raised) : play_(play), latches_(std::move(raised)) {
    uses_.reserve(kTriggers);
    for (std::uint8_t trigger = 1; trigger <= kTriggers; ++trigger) uses_.emplace_back(play, trigger);
    for (std::uint32_t block = 0; block < play.blocks().size(); ++block) {
      if (play.blocks()[block].kind == LoopKind::kForever) endless_.push_back(block);
    }
  }

  Folding fold() && {
    while (!isOver_) {
      latches_.latchUntil(played_);
      if (!skipEqualPasses()) advance();
    }
    return std::move(folding_);
  }

 private:
  const TriggerUses& usesOf(std::uint8_t trigger) const { return uses_[trigger - 1]; }
  bool isAtEnd(const Spot& spot) const { return spot.step == play_.blockOf(spot).endStep; }
  std::uint64_t position() const { return play_.positionOf(spot_); }

  // ---- What lies ahead, should no further trigger come ----

  Stop nextStop() const {
    Stop stop{endOfScript(), Stop::Kind::kScript};
    const auto consider = [&](const Spot& spot, std::uint8_t trigger) {
      // The end of the last loop, where it is asked for, is the script's.
      if (stop.spot < spot || (stop.spot == spot && stop.kind != Stop::Kind::kScript)) return;
      stop = {spot, isAtEnd(spot) ? Stop::Kind::kLoop : Stop::Kind::kWait, trigger};
    };
    for (std::uint8_t trigger = 1; trigger <= kTriggers; ++trigger) {
      if (const auto spot = nextVainQuestion(trigger)) consider(*spot, trigger);
    }
    const auto endless = std::ranges::lower_bound(endless_, spot_.block);
    if (endless != endless_.end()) {
      consider({*endless, *endless == spot_.block ? spot_.pass : 0, play_.blocks()[*endless].endStep}, 0);
    }
    return stop;
  }

  Spot endOfScript() const {
    const auto last = static_cast<std::uint32_t>(play_.blocks().size() - 1);
    const Block& block = play_.blocks()[last];
    const bool isUnderWay = last == spot_.block && !block.isCounted();
    return {last, isUnderWay ? spot_.pass : block.passes - 1, block.endStep};
  }

  std::optional<Spot> nextVainQuestion(std::uint8_t trigger) const {
    if (!latches_.has(trigger)) return usesOf(trigger).nextQuestion(spot_);
    const auto clear = usesOf(trigger).nextClear(spot_);
    return clear ? usesOf(trigger).nextQuestion(*clear) : std::nullopt;
  }

  std::uint64_t endOf(const Stop& stop) const {
    const std::uint64_t start = play_.positionOf(stop.spot);
    return stop.kind == Stop::Kind::kWait ? extentSum(start, play_.steps()[stop.spot.step].sampleCount) : start;
  }

  // ---- Moving ----

  // To the next stop, or to the first step that begins as the next trigger has come.
  void advance() {
    const Stop stop = nextStop();
    const std::uint64_t end = endOf(stop);
    if (latches_.next() != kBeyond && latches_.next() - played_ < end - position()) {
      const Spot spot = firstFrom(position() + (latches_.next() - played_));
      if (play_.positionOf(spot) < end) return moveTo(spot);
    }
    if (end == kBeyond || end - position() >= kBeyond - played_) return endBeyond(stop);
    moveTo(stop.spot);
    if (stop.kind == Stop::Kind::kWait) passWait(stop);
    if (stop.kind == Stop::Kind::kLoop) passLoopEnd(stop);
    if (stop.kind == Stop::Kind::kScript) passScriptEnd();
  }

  // The first step that begins at or behind that position, which lies ahead. A loop without a count is under way in
  // the pass that it is in.
  Spot firstFrom(std::uint64_t sample) const {
    Spot spot = play_.spotAt(sample);
    if (spot.block == spot_.block && !play_.blockOf(spot).isCounted()) spot.pass = spot_.pass;
    return play_.positionOf(spot) == sample ? spot : play_.after(spot);
  }

  // Plays up to the spot.
  void moveTo(const Spot& spot) {
    clearUntil(spot);
    played_ += play_.positionOf(spot) - position();
    spot_ = spot;
  }

  void clearUntil(const Spot& spot) {
    for (std::uint8_t trigger = 1; trigger <= kTriggers; ++trigger) {
      if (!latches_.has(trigger)) continue;
      const auto clear = usesOf(trigger).nextClear(spot_);
      if (clear && *clear < spot) latches_.clear(trigger);
    }
  }

  // The step at hand is a wait: it begins, and asks for the trigger at the end of each pass.
  void passWait(const Stop& stop) {
    const Step& wait = play_.steps()[spot_.step];
    const std::uint64_t begin = played_;
    clearAtBegin();
    played_ += wait.sampleCount;
    latches_.latchUntil(played_);
    if (latches_.has(stop.trigger)) return leaveWait();
    closeStraight(begin);
    const std::uint64_t comes = latches_.nextOf(stop.trigger, played_);
    if (comes == kBeyond) {
      append(begin, kBeyond, wait.sampleCount, Repeats::kWait);
      return end(PlayLength::waiting(stop.trigger, wait.address, begin));
    }
    const std::uint64_t passes = (comes - played_ - 1) / wait.sampleCount + 1;
    played_ = extentSum(played_, extentProduct(passes, wait.sampleCount));
    if (played_ == kBeyond) {
      append(begin, kBeyond, wait.sampleCount, Repeats::kWait);
      return end(PlayLength::tooLong());
    }
    append(begin, played_ - begin, wait.sampleCount, Repeats::kWait);
    straight_ = played_;
    leaveWait();
    openStraight();
  }

  // Whatever the step at hand clears as it begins, with the loop that is entered there.
  void clearAtBegin() {
    for (std::uint8_t trigger = 1; trigger <= kTriggers; ++trigger) {
      if (latches_.has(trigger) && usesOf(trigger).nextClear(spot_) == spot_) latches_.clear(trigger);
    }
  }

  // A loop without a count asks whether it is over before what follows the wait, which may be the loop's last step.
  void leaveWait() {
    const Block& block = play_.blockOf(spot_);
    const bool isLast = spot_.step + 1 == block.endStep;
    spot_ = isLast && !block.isCounted() ? Spot{spot_.block, spot_.pass, block.endStep} : play_.after(spot_);
    if (block.isCounted() && isAtEnd(spot_)) passScriptEnd();
  }

  // At the end of a body that no count ends.
  void passLoopEnd(const Stop& stop) {
    latches_.latchUntil(played_);
    if (stop.trigger != 0 && latches_.has(stop.trigger)) {
      if (spot_.block + 1 == play_.blocks().size()) return passScriptEnd();
      spot_ = play_.startOf(spot_.block + 1);
      return;
    }
    closeStraight(played_);
    spot_ = {spot_.block, spot_.pass + 1, play_.blockOf(spot_).firstStep};
    openStraight();
  }

  void passScriptEnd() {
    closeStraight(played_);
    if (!play_.isEndless()) return end(PlayLength::exact(played_));
    spot_ = play_.startOf(StraightPlay::kFirstOfRound);
    ++round_;
    openStraight();
  }

  // ---- Folding ----

  // A pass, or a round, that begins here, goes through and leaves the latches as they are is played up to the next
  // trigger. Returns whether one was.
  bool skipEqualPasses() {
    const bool isRound = round_ > 0 && spot_ == play_.startOf(StraightPlay::kFirstOfRound);
    const bool isPass =
        !isRound && spot_.pass > 0 && !play_.blockOf(spot_).isCounted() && spot_.step == play_.blockOf(spot_).firstStep;
    if (!isRound && !isPass) return false;
    const Stop stop = nextStop();
    const bool goesThrough =
        isRound ? stop.kind == Stop::Kind::kScript : stop.kind == Stop::Kind::kLoop && stop.spot.block == spot_.block;
    if (!goesThrough || changesLatches(stop.spot)) return false;
    const std::uint64_t period = endOf(stop) - position();
    const Repeats what = isRound ? Repeats::kScript : Repeats::kLoop;
    if (latches_.next() == kBeyond) return repeatForEver(stop, period, what);
    const std::uint64_t passes = (latches_.next() - played_ - 1) / period;
    if (passes == 0) return false;
    append(played_, passes * period, period, what);
    played_ += passes * period;
    (isRound ? round_ : spot_.pass) += passes;
    openStraight();
    return true;
  }

  bool changesLatches(const Spot& end) const {
    for (std::uint8_t trigger = 1; trigger <= kTriggers; ++trigger) {
      if (!latches_.has(trigger)) continue;
      const auto clear = usesOf(trigger).nextClear(spot_);
      if (clear && *clear < end) return true;
    }
    return false;
  }

  bool repeatForEver(const Stop& stop, std::uint64_t period, Repeats what) {
    append(played_, kBeyond, period, what);
    const Block& block = play_.blockOf(stop.spot);
    end(stop.trigger == 0 ? PlayLength::endless() : PlayLength::waiting(stop.trigger, block.address, played_));
    return true;
  }

  // ---- Stretches ----

  void openStraight() {
    straight_ = played_;
    straightStart_ = position();
    straightRound_ = round_;
    straightPass_ = openPass();
  }

  void closeStraight(std::uint64_t sample) {
    if (sample == straight_) return;
    folding_.stretches.push_back({straight_, sample - straight_, straightStart_, sample - straight_, straightRound_,
                                  straightPass_, Repeats::kNothing});
  }

  // A piece that begins at the spot at hand.
  void append(std::uint64_t firstSample, std::uint64_t sampleCount, std::uint64_t period, Repeats what) {
    folding_.stretches.push_back({firstSample, sampleCount, position(), period, round_, openPass(), what});
  }

  // Of a loop without a count that is under way; at its end the next block is what comes.
  std::uint64_t openPass() const { return play_.blockOf(spot_).isCounted() || isAtEnd(spot_) ? 0 : spot_.pass; }

  // What comes next ends, or stops for a while, where no sample has a number any more.
  void endBeyond(const Stop& stop) {
    folding_.stretches.push_back(
        {straight_, kBeyond, straightStart_, kBeyond, straightRound_, straightPass_, Repeats::kNothing});
    const bool startsOver =
        stop.kind == Stop::Kind::kScript ? play_.isEndless() : stop.kind == Stop::Kind::kLoop && stop.trigger == 0;
    end(startsOver ? PlayLength::endless() : PlayLength::tooLong());
  }

  void end(PlayLength length) {
    folding_.length = length;
    isOver_ = true;
  }

  const StraightPlay& play_;
  Latches latches_;
  std::vector<TriggerUses> uses_;       // of hardware triggers 1 to 8
  std::vector<std::uint32_t> endless_;  // blocks that loop for ever

  Spot spot_{};               // about to begin
  std::uint64_t played_ = 0;  // samples
  std::uint64_t round_ = 0;
  // The straight stretch under way.
  std::uint64_t straight_ = 0;
  std::uint64_t straightStart_ = 0;
  std::uint64_t straightRound_ = 0;
  std::uint64_t straightPass_ = 0;
  Folding folding_;
  bool isOver_ = false;
};

}  // namespace

Folding fold(const StraightPlay& play, std::vector<RaisedTrigger> raised) {
  return Folder(play, std::move(raised)).fold();
}

}  // namespace tools
