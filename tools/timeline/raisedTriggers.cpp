#include "tools/timeline/raisedTriggers.h"

#include <algorithm>

#include "conventions/conventions.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

// The hardware trigger that scripts know by that name; 0 when there is none.
std::uint8_t findTrigger(std::string_view name) {
  for (std::uint32_t number = 0; number < ktorba::kTriggerCount; ++number) {
    const std::uint8_t trigger = ktorba::hardwareTriggerOf(number);
    if (name == ktorba::triggerName(trigger)) return trigger;
  }
  return 0;
}

std::string describe(CountFault fault) {
  switch (fault) {
    case CountFault::kNegative:
      return "is before the start";
    case CountFault::kFraction:
      return "is no whole number of samples";
    case CountFault::kTooLarge:
      return "is more than the 2^64 - 2 samples that can be counted";
    default:
      return "is not of the form TRIGGER@WHEN";
  }
}

RaisedTrigger readTrigger(const std::string& argument, double sampleRateHz) {
  const std::size_t at = std::min(argument.find('@'), argument.size());
  const std::uint8_t trigger = findTrigger(std::string_view(argument).substr(0, at));
  SampleCount count{0, CountFault::kNoNumber};
  if (trigger != 0 && at < argument.size()) {
    count = readSampleCount(std::string_view(argument).substr(at + 1), sampleRateHz);
  }
  if (count.fault == CountFault::kNone) return {count.samples, trigger};
  throw Refusal("\"" + argument + "\" " + describe(count.fault),
                "TRIGGER is trigger1 to trigger7, WHEN a number of samples or a time after the start: trigger3@20ms");
}

}  // namespace

std::vector<RaisedTrigger> readTriggers(const std::vector<std::string>& arguments, double sampleRateHz) {
  std::vector<RaisedTrigger> triggers;
  triggers.reserve(arguments.size());
  for (const std::string& argument : arguments) triggers.push_back(readTrigger(argument, sampleRateHz));
  std::ranges::stable_sort(triggers, {}, &RaisedTrigger::sample);
  return triggers;
}

std::uint8_t awaitedTriggers(const StraightPlay& play) {
  std::uint32_t mask = 0;
  const auto add = [&mask](std::uint8_t trigger) {
    if (trigger != 0 && trigger != ktorba::kStartTrigger) mask |= ktorba::clearFlagOf(trigger);
  };
  for (const Step& step : play.steps()) add(step.trigger);
  for (const Block& block : play.blocks()) add(block.trigger);
  return static_cast<std::uint8_t>(mask);
}

}  // namespace tools
