// One page of HTML to walk through what a script plays: the script, its waveforms once, the folded timeline as inert
// data, and a program that computes from these whatever is looked at. It opens from disk and asks for nothing else; its
// size does not grow with the length of the play. Pure functions; any thread may call.
#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>

#include "tools/diagnostics/ScriptFile.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace tools {

struct PageContent {
  // All samples together, in bytes, that a page carries as they are.
  static constexpr std::uint64_t kMostSampleBytes = 20'000'000;

  std::string title;
  std::string_view script;  // the text
  double sampleRateHz = 1e6;
  unsigned sampleWidthBits = 16;  // of the generator, 16 or 32
  const Timeline& timeline;
  TimelineWaveforms waveforms;
  std::span<const RaisedTrigger> raised;  // those that the timeline was made with, in any order
  std::span<const Place> places;          // of the program's words, by address
  std::uint64_t mostSampleBytes = kMostSampleBytes;
};

enum class PageSamples {
  kWhole,
  kEnveloped,  // the waveforms were too long: the page has the least and the greatest of each few samples
};

// Takes the page piece by piece.
using PageSink = std::function<void(std::string_view text)>;

// Throws what the sink throws.
PageSamples writePage(const PageSink& sink, const PageContent& content);

// The data alone, JSON in which no `<` stands.
PageSamples writePageData(const PageSink& sink, const PageContent& content);

}  // namespace tools
