#include "tools/outputs/picture/Panel.h"

#include <algorithm>
#include <cmath>

#include "conventions/conventions.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

// Points.
constexpr double kTitleHeight = 66;
constexpr double kHeadingHeight = 52;
constexpr double kGap = 10;
constexpr double kPlayingHeight = 40;
constexpr double kEventHeight = 24;
constexpr double kAxisHeight = 48;
constexpr double kLegendHeight = 28;
constexpr double kBottomMargin = 10;
constexpr double kLabelGap = 10;
constexpr double kLegendNameWidth = 170;
constexpr double kPointsPerTimeTick = 95;
constexpr double kPointsPerLevelTick = 38;
constexpr double kLeastTriggerDistance = 1;

constexpr std::size_t kLongestTimeLabel = 9;   // characters; longer ones count from the first sample on
constexpr std::size_t kMostTriggerLines = 40;  // beyond, triggers stay in their lanes
constexpr std::uint64_t kMostCountedOut = 9'999'999;

// What fits behind a lane.
std::string shortCount(std::uint64_t count) {
  std::string text = count <= kMostCountedOut ? formatCount(count) : formatQuantity(static_cast<double>(count), "");
  while (text.ends_with(' ')) text.pop_back();
  return text;
}

std::size_t longestLabel(const Axis& axis) {
  std::size_t longest = 0;
  for (const Tick& tick : axis.ticks) longest = std::max(longest, tick.label.size());
  return longest;
}

std::string itemName(const LaneItem& item) {
  if (item.kind == SegmentKind::kWait) return "wait";
  if (item.kind == SegmentKind::kWaitForTrigger) return "wait until a trigger";
  return item.name;
}

}  // namespace

Panel::Panel(const PlayView& play, const PictureOptions& options, Heading heading)
    : play_(play), header_(play.header()), options_(options), palette_(paletteOf(options.style)), heading_(heading) {
  const auto seconds = [this](std::uint64_t samples) { return static_cast<double>(samples) / header_.sampleRateHz; };
  const int maxTicks = std::max(2, static_cast<int>(plotWidth() / kPointsPerTimeTick));
  timeAxis_ = makeTimeAxis(seconds(header_.firstSample), seconds(header_.endSample()), maxTicks);
  isTimeRelative_ = header_.firstSample > 0 && longestLabel(timeAxis_) > kLongestTimeLabel;
  if (isTimeRelative_) timeAxis_ = makeTimeAxis(0, seconds(header_.sampleCount), maxTicks);
  if (options.lanes.samples) rows_.push_back({Kind::kSamples});
  if (options.lanes.playing) rows_.push_back({Kind::kPlaying});
  if (options.lanes.markers) {
    for (const unsigned marker : usedMarkers(header_)) rows_.push_back({Kind::kMarker, marker});
  }
  if (options.lanes.triggers) {
    for (const unsigned trigger : usedTriggers(header_)) rows_.push_back({Kind::kTrigger, trigger});
  }
  place(0);
}

double Panel::heightOf(Kind kind) const {
  if (kind == Kind::kSamples) return samplesHeight_ + kGap;
  return kind == Kind::kPlaying ? kPlayingHeight + kGap : kEventHeight;
}

double Panel::headingHeight() const { return heading_ == Heading::kTitle ? kTitleHeight : kHeadingHeight; }

void Panel::place(double top) {
  top_ = top;
  lanesBottom_ = lanesTop();
  for (Row& row : rows_) {
    const bool isEvent = row.kind == Kind::kMarker || row.kind == Kind::kTrigger;
    const double height = heightOf(row.kind);
    row.area = {kLeftMargin, lanesBottom_, plotWidth(), isEvent ? height : height - kGap};
    lanesBottom_ += height;
  }
}

double Panel::height(double samplesHeight) {
  samplesHeight_ = samplesHeight;
  place(0);
  const double legend = options_.lanes.playing ? kLegendHeight : 0;
  return lanesBottom_ + kAxisHeight + legend + kBottomMargin;
}

double Panel::xOf(std::uint64_t sample) const {
  return kLeftMargin +
         plotWidth() * static_cast<double>(sample - header_.firstSample) / static_cast<double>(header_.sampleCount);
}

std::string Panel::describe() const {
  const std::uint64_t count = header_.sampleCount;
  const std::string from = header_.firstSample == 0 ? "" : " from sample " + formatCount(header_.firstSample) + " on";
  return std::to_string(header_.sampleWidthBits) + "-bit samples at " + formatQuantity(header_.sampleRateHz, "S/s") +
         "  \u00b7  " + formatCount(count) + (count == 1 ? " sample" : " samples") + from + "  \u00b7  " +
         formatQuantity(static_cast<double>(count) / header_.sampleRateHz, "s");
}

std::string Panel::timeTitle() const {
  const std::string unit = " (" + timeAxis_.unit + ")";
  return (isTimeRelative_ ? "time from sample " + formatCount(header_.firstSample) + " on" : "time") + unit;
}

void Panel::draw(Canvas& canvas, double top, double samplesHeight) {
  samplesHeight_ = samplesHeight;
  place(top);
  drawHeading(canvas);
  drawTimeGrid(canvas);
  for (const Row& row : rows_) drawRow(canvas, row);
  drawTimeAxis(canvas);
  if (options_.lanes.playing) drawLegend(canvas);
}

void Panel::drawHeading(Canvas& canvas) const {
  const double room = plotWidth() + kRightMargin / 2;
  const bool isTitle = heading_ == Heading::kTitle;
  const TextStyle style = isTitle ? titleStyle() : headingStyle();
  canvas.text({kLeftMargin, top_ + (isTitle ? 30 : 20)}, canvas.elide(header_.title, room, style), style);
  canvas.text({kLeftMargin, top_ + (isTitle ? 50 : 38)}, canvas.elide(describe(), room, subtitleStyle()),
              subtitleStyle());
}

void Panel::drawTimeGrid(Canvas& canvas) const {
  for (const Tick& tick : timeAxis_.ticks) {
    canvas.line({xOf(tick), lanesTop()}, {xOf(tick), lanesBottom_}, {palette_.grid});
  }
}

void Panel::drawTimeAxis(Canvas& canvas) const {
  const double y = lanesBottom_;
  canvas.line({kLeftMargin, y}, {plotRight(), y}, frame());
  for (const Tick& tick : timeAxis_.ticks) {
    canvas.line({xOf(tick), y}, {xOf(tick), y + 5}, frame());
    canvas.text({xOf(tick), y + 19}, tick.label, tickStyle(), Align::kCentre);
  }
  canvas.text({kLeftMargin + plotWidth() / 2, y + 39}, timeTitle(), labelStyle(), Align::kCentre);
}

void Panel::drawRow(Canvas& canvas, const Row& row) const {
  switch (row.kind) {
    case Kind::kSamples:
      return drawSamples(canvas, row.area);
    case Kind::kPlaying:
      return drawPlaying(canvas, row.area);
    case Kind::kMarker:
      return drawMarkers(canvas, row.area, row.number);
    case Kind::kTrigger:
      return drawTriggers(canvas, row.area, row.number);
  }
}

// ---- Samples ----

double Panel::yOf(std::int32_t value, const Axis& axis, const Rectangle& area) const {
  const auto fullScale = static_cast<double>(std::uint64_t{1} << (header_.sampleWidthBits - 1));
  return area.bottom() - area.height * axis.place(value / fullScale);
}

void Panel::drawSamples(Canvas& canvas, const Rectangle& area) const {
  const auto fullScale = static_cast<double>(std::uint64_t{1} << (header_.sampleWidthBits - 1));
  const Levels& levels = play_.levels();
  const int maxTicks = std::max(2, static_cast<int>(area.height / kPointsPerLevelTick));
  const Axis axis = makeLevelAxis(levels.extremes.least / fullScale, levels.extremes.greatest / fullScale, maxTicks);
  for (const Tick& tick : axis.ticks) {
    const double y = area.bottom() - area.height * axis.place(tick.value);
    canvas.line({area.left, y}, {area.right(), y}, {tick.value == 0 ? palette_.frame : palette_.grid});
    canvas.text({area.left - kLabelGap, y + 4}, tick.label, tickStyle(), Align::kRight);
  }
  const bool isHigh = area.height >= 130;
  canvas.verticalText({24, area.middle()}, isHigh ? "level (full scale = 1)" : "level", labelStyle());
  canvas.clip(area);
  levels.isReduced ? drawEnvelope(canvas, axis, area) : drawSteps(canvas, axis, area);
  canvas.unclip();
  const Path border = {{area.left, area.top},
                       {area.right(), area.top},
                       {area.right(), area.bottom()},
                       {area.left, area.bottom()},
                       {area.left, area.top}};
  canvas.stroke({&border, 1}, frame());
}

void Panel::drawEnvelope(Canvas& canvas, const Axis& axis, const Rectangle& area) const {
  const std::vector<EnvelopeColumn>& columns = play_.levels().columns;
  const double columnWidth = area.width / static_cast<double>(columns.size());
  const auto xOfColumn = [&](std::size_t c) { return area.left + (static_cast<double>(c) + 0.5) * columnWidth; };
  Path outline;
  for (std::size_t c = 0; c < columns.size(); ++c) {
    outline.push_back({xOfColumn(c), yOf(columns[c].greatest, axis, area)});
  }
  for (std::size_t c = columns.size(); c-- > 0;) {
    outline.push_back({xOfColumn(c), yOf(columns[c].least, axis, area)});
  }
  canvas.fill(outline, palette_.samples);
  canvas.stroke({&outline, 1}, {palette_.samples});
}

// Every sample holds its level until the next one.
void Panel::drawSteps(Canvas& canvas, const Axis& axis, const Rectangle& area) const {
  Path path;
  std::uint64_t sample = header_.firstSample;
  for (const std::int32_t value : play_.levels().samples) {
    const double y = yOf(value, axis, area);
    path.push_back({xOf(sample), y});
    path.push_back({xOf(++sample), y});
  }
  canvas.stroke({&path, 1}, {palette_.samples, 1.5});
}

// ---- What plays ----

Color Panel::colorOf(std::size_t item) const {
  const std::vector<LaneItem>& items = play_.playing().items;
  if (items[item].kind != SegmentKind::kWaveform) return palette_.wait;
  const auto isWaveform = [](const LaneItem& other) { return other.kind == SegmentKind::kWaveform; };
  const auto waveform = std::count_if(items.begin(), items.begin() + static_cast<std::ptrdiff_t>(item), isWaveform);
  return palette_.waveforms[static_cast<std::size_t>(waveform) % std::size(palette_.waveforms)];
}

void Panel::paintItem(Canvas& canvas, const Rectangle& area, std::size_t item) const {
  canvas.fill(area, colorOf(item));
  if (play_.playing().items[item].kind == SegmentKind::kWaitForTrigger) canvas.hatch(area, palette_.waitHatch);
}

void Panel::drawPlaying(Canvas& canvas, const Rectangle& area) const {
  canvas.text({area.left - kLabelGap, area.middle() + 4}, "playing", labelStyle(), Align::kRight);
  for (const LaneMixture& mixture : play_.playing().mixtures) drawMixture(canvas, area, mixture);
  for (const LaneBlock& block : play_.playing().blocks) drawBlock(canvas, area, block);
}

void Panel::drawBlock(Canvas& canvas, const Rectangle& lane, const LaneBlock& block) const {
  const double columnWidth = lane.width / static_cast<double>(scaleOf(options_).laneColumns);
  const double width = (block.last - block.first) * columnWidth;
  const Rectangle area = {lane.left + block.first * columnWidth, lane.top, width > 4 ? width - 1 : std::max(width, 0.6),
                          lane.height};
  paintItem(canvas, area, block.item);
  drawBlockText(canvas, area, block);
}

void Panel::drawBlockText(Canvas& canvas, const Rectangle& area, const LaneBlock& block) const {
  const double room = area.width - 8;
  const std::string name = canvas.elide(blockName(block), room, blockStyle());
  if (name.empty()) return;
  const std::string line = lineText(block);
  const bool hasLine = !line.empty() && canvas.textWidth(line, blockLineStyle()) <= room;
  const double x = area.left + area.width / 2;
  const double halfWidth = std::min(area.width / 2, canvas.textWidth(name, blockStyle()) / 2 + 4);
  if (play_.playing().items[block.item].kind == SegmentKind::kWaitForTrigger) {
    canvas.fill(Rectangle{x - halfWidth, area.top + 4, 2 * halfWidth, area.height - 8}, colorOf(block.item));
  }
  canvas.text({x, area.middle() + (hasLine ? -2 : 4)}, name, blockStyle(), Align::kCentre);
  if (hasLine) canvas.text({x, area.middle() + 13}, line, blockLineStyle(), Align::kCentre);
}

std::string Panel::blockName(const LaneBlock& block) const {
  const PlayedInstruction& played = header_.program[block.address];
  std::string name = played.name;
  if (played.kind == SegmentKind::kWait) name = "wait";
  if (played.kind == SegmentKind::kWaitForTrigger) name = "until " + played.name;
  return block.playCount > 1 ? name + " \u00d7 " + formatCount(block.playCount) : name;
}

std::string Panel::lineText(const LaneBlock& block) const {
  const std::uint32_t line = header_.program[block.address].line;
  return line == 0 ? "" : "line " + std::to_string(line);
}

// Each item is one band across the columns, as high in each as its share.
void Panel::drawMixture(Canvas& canvas, const Rectangle& lane, const LaneMixture& mixture) const {
  const double columnWidth = lane.width / static_cast<double>(scaleOf(options_).laneColumns);
  const double left = lane.left + static_cast<double>(mixture.firstColumn) * columnWidth;
  const double width = static_cast<double>(mixture.shares.size()) * columnWidth;
  std::vector<double> tops(mixture.shares.size(), lane.top);
  for (std::size_t item = 0; item < play_.playing().items.size(); ++item) {
    Path upper;
    Path lower;
    bool isThere = false;
    for (std::size_t column = 0; column < tops.size(); ++column) {
      const double height = lane.height * mixture.shares[column][item];
      isThere = isThere || height > 0;
      const double x = left + static_cast<double>(column) * columnWidth;
      for (const double end : {x, x + columnWidth}) {
        upper.push_back({end, tops[column]});
        lower.push_back({end, tops[column] + height});
      }
      tops[column] += height;
    }
    upper.insert(upper.end(), lower.rbegin(), lower.rend());
    if (isThere) canvas.fill(upper, colorOf(item));
  }
  const std::string text = formatCount(mixture.segmentCount) + " alternating";
  if (canvas.textWidth(text, blockStyle()) + 8 > width) return;
  canvas.text({left + width / 2, lane.middle() + 4}, text, blockStyle(), Align::kCentre);
}

// ---- Markers and triggers ----

void Panel::drawEventLane(Canvas& canvas, const Rectangle& area, const std::string& name, std::uint64_t count) const {
  canvas.text({area.left - kLabelGap, area.middle() + 4}, name, labelStyle(), Align::kRight);
  canvas.text({area.right() + kLabelGap, area.middle() + 4}, "\u00d7 " + shortCount(count), tickStyle());
  canvas.line({area.left, area.bottom() - 5}, {area.right(), area.bottom() - 5}, frame());
}

// Bars that touch are one.
void Panel::drawMarkers(Canvas& canvas, const Rectangle& area, unsigned marker) const {
  const MarkerPulses& pulses = play_.pulses(marker);
  const double barWidth = std::max(1.5, plotWidth() / static_cast<double>(header_.sampleCount));
  const auto leftOf = [&](std::uint64_t sample) { return std::min(xOf(sample), area.right() - barWidth); };
  for (std::size_t i = 0; i < pulses.samples.size();) {
    const double left = leftOf(pulses.samples[i]);
    double right = left + barWidth;
    for (++i; i < pulses.samples.size() && leftOf(pulses.samples[i]) <= right; ++i) {
      right = leftOf(pulses.samples[i]) + barWidth;
    }
    canvas.fill(Rectangle{left, area.top + 4, right - left, area.height - 9}, palette_.marker);
  }
  drawEventLane(canvas, area, ktorba::markerName(marker), pulses.count);
}

void Panel::drawTriggers(Canvas& canvas, const Rectangle& area, unsigned trigger) const {
  std::size_t count = 0;
  double last = 0;
  for (const TriggerEvent& event : header_.triggers) {
    if (event.trigger != trigger) continue;
    const double x = xOf(event.sample);
    if (count == 0 || x >= last + kLeastTriggerDistance) drawTrigger(canvas, area, x);
    if (count == 0 || x >= last + kLeastTriggerDistance) last = x;
    ++count;
  }
  drawEventLane(canvas, area, ktorba::triggerName(trigger), count);
}

void Panel::drawTrigger(Canvas& canvas, const Rectangle& area, double x) const {
  const bool hasLines = header_.triggers.size() <= kMostTriggerLines;
  for (const Row& row : rows_) {
    if (!hasLines || row.kind == Kind::kPlaying || row.area.top >= area.top) continue;
    canvas.line({x, row.area.top}, {x, row.area.bottom()}, {palette_.trigger, 1, true});
  }
  canvas.fill(Path{{x - 5, area.top + 4}, {x + 5, area.top + 4}, {x, area.bottom() - 5}}, palette_.trigger);
}

// ---- The legend ----

void Panel::drawLegend(Canvas& canvas) const {
  const std::vector<LaneItem>& items = play_.playing().items;
  const double top = lanesBottom_ + kAxisHeight + 6;
  const double roomForRest = 76;
  double x = kLeftMargin;
  for (std::size_t item = 0; item < items.size(); ++item) {
    const std::string name = canvas.elide(itemName(items[item]), kLegendNameWidth, tickStyle());
    const double width = 20 + canvas.textWidth(name, tickStyle()) + 22;
    const bool isLast = item + 1 == items.size();
    if (x + width + (isLast ? 0 : roomForRest) > options_.width) {
      canvas.text({x, top + 11}, "and " + std::to_string(items.size() - item) + " more", tickStyle());
      return;
    }
    paintItem(canvas, {x, top, 14, 14}, item);
    canvas.text({x + 20, top + 11}, name, tickStyle());
    x += width;
  }
}

}  // namespace tools
