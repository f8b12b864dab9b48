#include <algorithm>
#include <memory>
#include <optional>

#include "tools/difference/compareScripts.h"
#include "tools/script_tools/CompiledText.h"
#include "tools/script_tools/boundary.h"
#include "tools/script_tools/documents.h"
#include "tools/text/Refusal.h"
#include "tools/timeline/LevelRanges.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

using tools::atBoundary;
using tools::require;
using tools::view;

struct ktTools_Timeline {
  ktTools_Timeline(std::shared_ptr<const tools::CompiledText> text, std::size_t script,
                   std::vector<tools::RaisedTrigger> raised)
      : compiled(std::move(text)),
        program(compiled->programs[script]),
        timeline(tools::StraightPlay(program, compiled->builder), std::move(raised)),
        sampleWidthBits(compiled->generator.sampleWidthBits) {
    for (const std::string& name : timeline.play().waveforms()) {
      const auto found = compiled->samples.find(name);
      lent.push_back(found == compiled->samples.end() ? tools::SampleSpan() : found->second);
    }
  }

  std::shared_ptr<const tools::CompiledText> compiled;
  const tools::Program& program;
  tools::Timeline timeline;
  unsigned sampleWidthBits;
  tools::TimelineWaveforms lent;             // empty ones have not been
  std::optional<tools::Renderer> renderer;   // once samples have been asked for
  std::optional<tools::LevelRanges> ranges;  // once levels have
};

namespace tools {
namespace {

std::vector<RaisedTrigger> toRaised(const ktTools_Trigger* triggers, std::uint64_t count) {
  require(triggers != nullptr || count == 0);
  std::vector<RaisedTrigger> raised;
  for (std::uint64_t i = 0; i < count; ++i) {
    require(triggers[i].trigger >= 1 && triggers[i].trigger <= static_cast<std::int32_t>(ktorba::kTriggerCount));
    const auto number = static_cast<std::uint32_t>(triggers[i].trigger - 1);
    raised.push_back({triggers[i].sample, ktorba::hardwareTriggerOf(number)});
  }
  return raised;
}

// As scripts number it; 0 for none and for the one that starts generation.
std::int32_t toTrigger(std::uint8_t hardwareTrigger) {
  return hardwareTrigger > ktorba::kStartTrigger ? hardwareTrigger - ktorba::kStartTrigger : 0;
}

std::int32_t toKind(PlayLength::Kind kind) {
  switch (kind) {
    case PlayLength::Kind::kExact:
      return KTTOOLS_LENGTH_EXACT;
    case PlayLength::Kind::kTooLong:
      return KTTOOLS_LENGTH_TOO_LONG;
    case PlayLength::Kind::kEndless:
      return KTTOOLS_LENGTH_ENDLESS;
    case PlayLength::Kind::kWaiting:
      break;
  }
  return KTTOOLS_LENGTH_WAITING;
}

std::int32_t toKind(StepKind kind) {
  switch (kind) {
    case StepKind::kWaveform:
      return KTTOOLS_RUN_WAVEFORM;
    case StepKind::kWait:
      return KTTOOLS_RUN_WAIT;
    case StepKind::kWaitForTrigger:
      break;
  }
  return KTTOOLS_RUN_WAIT_FOR_TRIGGER;
}

ktTools_Run toRun(const Run& run, const ktTools_Timeline& timeline) {
  const Step& step = timeline.timeline.play().steps()[run.step];
  const Place place = timeline.program.places[step.address];
  ktTools_Run made = {};
  made.firstSample = run.firstSample;
  made.sampleCount = run.sampleCount;
  made.firstInWaveform = step.firstInWaveform;
  made.pass = run.pass;
  made.round = run.round;
  made.kind = toKind(step.kind);
  made.waveform = step.waveform == Step::kNone ? KTTOOLS_NO_WAVEFORM : step.waveform;
  made.trigger = toTrigger(step.trigger);
  made.address = step.address;
  made.line = place.line;
  made.column = place.position;
  made.markers = step.markerMask;
  made.markerOffset = step.markerOffset;
  return made;
}

void requireSamples(const ktTools_Timeline& timeline) {
  if (std::ranges::any_of(timeline.lent, [](const SampleSpan& samples) { return samples.size() == 0; })) {
    throw MissingSamples();
  }
}

Renderer& rendererOf(ktTools_Timeline& timeline) {
  requireSamples(timeline);
  if (!timeline.renderer) timeline.renderer.emplace(timeline.timeline, timeline.lent, timeline.sampleWidthBits);
  return *timeline.renderer;
}

LevelRanges& rangesOf(ktTools_Timeline& timeline) {
  requireSamples(timeline);
  if (!timeline.ranges) timeline.ranges.emplace(timeline.timeline, timeline.lent, timeline.sampleWidthBits);
  return *timeline.ranges;
}

SampleSpan toSpan(const void* samples, std::uint64_t count, unsigned widthBits) {
  if (widthBits == 16) return std::span(static_cast<const std::int16_t*>(samples), count);
  return std::span(static_cast<const std::int32_t*>(samples), count);
}

ComparedFile sideOf(const CompiledText& compiled) {
  return {compiled.file, compiled.builder, compiled.programs, [&compiled](const std::string& name) {
            const auto found = compiled.samples.find(name);
            return found != compiled.samples.end() ? found->second : throw MissingSamples();
          }};
}

}  // namespace
}  // namespace tools

void ktTools_FreeTimeline(ktTools_Timeline* timeline) { delete timeline; }

std::int32_t ktTools_LendSamples(ktTools_Program* program, const char* name, std::uint64_t nameLength,
                                 const void* samples, std::uint64_t count) {
  return atBoundary(nullptr, [&] {
    require(program != nullptr && samples != nullptr);
    tools::CompiledText& compiled = *program->compiled;
    const std::string waveform(view(name, nameLength));
    require(compiled.builder.waveforms().containsWaveform(waveform) &&
            compiled.builder.waveforms().getWaveform(waveform).allocatedLength == count);
    compiled.samples[waveform] = tools::toSpan(samples, count, compiled.generator.sampleWidthBits);
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_MakeTimeline(const ktTools_Program* program, std::uint64_t script, const ktTools_Trigger* triggers,
                                  std::uint64_t count, ktTools_Timeline** timeline) {
  return atBoundary(nullptr, [&] {
    require(script < ktTools_ScriptCount(program) && timeline != nullptr);
    *timeline =
        std::make_unique<ktTools_Timeline>(program->compiled, script, tools::toRaised(triggers, count)).release();
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_PlayLength(const ktTools_Timeline* timeline, ktTools_Length* length) {
  return atBoundary(nullptr, [&] {
    require(timeline != nullptr && length != nullptr);
    const tools::PlayLength& played = timeline->timeline.length();
    *length = {};
    length->kind = tools::toKind(played.kind());
    length->samples = played.samples().value_or(0);
    if (played.kind() != tools::PlayLength::Kind::kWaiting) return KTTOOLS_SUCCESS;
    const tools::Place place = timeline->program.places[played.address()];
    length->waitingSince = played.waitingSince();
    length->trigger = tools::toTrigger(played.trigger());
    length->address = played.address();
    length->line = place.line;
    length->column = place.position;
    return KTTOOLS_SUCCESS;
  });
}

std::uint64_t ktTools_WaveformCount(const ktTools_Timeline* timeline) {
  return timeline == nullptr ? 0 : timeline->timeline.play().waveforms().size();
}

std::int32_t ktTools_WaveformName(const ktTools_Timeline* timeline, std::uint64_t waveform, const char** name,
                                  std::uint64_t* length) {
  return atBoundary(nullptr, [&] {
    require(waveform < ktTools_WaveformCount(timeline) && name != nullptr && length != nullptr);
    const std::string& known = timeline->timeline.play().waveforms()[waveform];
    *name = known.c_str();
    *length = known.size();
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Runs(const ktTools_Timeline* timeline, std::uint64_t begin, std::uint64_t capacity,
                          ktTools_Run* runs, std::uint64_t* count) {
  return atBoundary(nullptr, [&] {
    require(timeline != nullptr && (runs != nullptr || capacity == 0) && count != nullptr);
    *count = 0;
    for (tools::RunCursor cursor(timeline->timeline, begin); !cursor.isAtEnd() && *count < capacity; cursor.next()) {
      runs[(*count)++] = tools::toRun(cursor.run(), *timeline);
    }
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_MarkerCount(const ktTools_Timeline* timeline, std::uint32_t marker, std::uint64_t begin,
                                 std::uint64_t end, std::uint64_t* count) {
  return atBoundary(nullptr, [&] {
    require(timeline != nullptr && marker < ktorba::kMarkerCount && count != nullptr);
    *count = timeline->timeline.markerCount(marker, begin, end);
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_MarkerPulse(const ktTools_Timeline* timeline, std::uint32_t marker, std::uint64_t n,
                                 std::uint64_t* sample) {
  return atBoundary(nullptr, [&] {
    require(timeline != nullptr && marker < ktorba::kMarkerCount && sample != nullptr);
    *sample = timeline->timeline.markerPulse(marker, n).value_or(KTTOOLS_NO_SAMPLE);
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Samples(ktTools_Timeline* timeline, std::uint64_t begin, std::uint64_t capacity, void* samples,
                             std::uint8_t* markers, std::uint64_t* count) {
  return atBoundary(nullptr, [&] {
    require(timeline != nullptr && count != nullptr);
    // Markers alone need no samples of waveforms.
    if (samples == nullptr) {
      const tools::Renderer renderer(timeline->timeline, {}, timeline->sampleWidthBits);
      *count = renderer.render(begin, capacity, nullptr, markers);
    } else {
      *count = tools::rendererOf(*timeline).render(begin, capacity, samples, markers);
    }
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Envelope(ktTools_Timeline* timeline, std::uint64_t begin, std::uint64_t width,
                              std::uint64_t columns, std::int32_t* lows, std::int32_t* highs, std::uint64_t* count) {
  return atBoundary(nullptr, [&] {
    require(timeline != nullptr && width > 0 && count != nullptr);
    require(columns == 0 || (lows != nullptr && highs != nullptr));
    const tools::LevelRanges& ranges = tools::rangesOf(*timeline);
    *count = 0;
    for (; *count < columns && begin < timeline->timeline.sampleCount(); ++*count) {
      const std::uint64_t end = tools::extentSum(begin, width);
      const tools::LevelRange range = ranges.over(begin, end);
      lows[*count] = range.low;
      highs[*count] = range.high;
      begin = end;
    }
    return KTTOOLS_SUCCESS;
  });
}

std::int32_t ktTools_Compare(const ktTools_Program* first, const ktTools_Program* second, const char* name,
                             std::uint64_t nameLength, ktTools_Document* document) {
  return atBoundary(document, [&]() -> std::int32_t {
    require(first != nullptr && second != nullptr && document != nullptr);
    require(first->compiled->generator.sampleWidthBits == second->compiled->generator.sampleWidthBits);
    try {
      const auto scripts = tools::compareScripts(tools::sideOf(*first->compiled), tools::sideOf(*second->compiled),
                                                 std::string(view(name, nameLength)));
      tools::give(tools::makeDifferenceDocument(scripts), document);
      return KTTOOLS_SUCCESS;
    } catch (const tools::Refusal& refusal) {
      return tools::failWith(KTTOOLS_E_ARGUMENT, refusal.what(), document);
    }
  });
}
