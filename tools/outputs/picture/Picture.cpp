// The picture of a recording: samples on top, below them one lane for what plays and one for every used marker and
// trigger, all over one time axis.
#include <cairo-pdf.h>
#include <cairo-svg.h>
#include <cairo.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <set>

#include "conventions/conventions.h"
#include "tools/outputs/formats.h"
#include "tools/outputs/picture/Axis.h"
#include "tools/outputs/picture/Canvas.h"
#include "tools/outputs/picture/Envelope.h"
#include "tools/outputs/picture/Lane.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

// Sizes in points.
constexpr double kWidth = 1200;
constexpr double kLeftMargin = 92;
constexpr double kRightMargin = 60;
constexpr double kTitleHeight = 66;
constexpr double kSamplesHeight = 270;
constexpr double kGap = 10;
constexpr double kPlayingHeight = 40;
constexpr double kEventLaneHeight = 24;
constexpr double kAxisHeight = 48;
constexpr double kLegendHeight = 28;
constexpr double kBottomMargin = 10;
constexpr double kLabelGap = 10;
constexpr double kLegendNameWidth = 170;
constexpr double kPixelsPerPoint = 2;  // of a PNG

constexpr double kPlotWidth = kWidth - kLeftMargin - kRightMargin;
constexpr auto kLaneColumns = static_cast<std::size_t>(kPlotWidth);
constexpr auto kEnvelopeColumns = static_cast<std::size_t>(kPlotWidth * kPixelsPerPoint);
constexpr int kMaxTimeTicks = 11;
constexpr int kMaxLevelTicks = 7;
constexpr double kNearestBars = 0.25;          // points; pulses that come closer are one
constexpr std::size_t kMostTriggerLines = 40;  // beyond, triggers stay in their lanes

constexpr Color kInk = rgb(0x222222);
constexpr Color kPale = rgb(0x6B6B6B);
constexpr Color kFrame = rgb(0xB8B8B8);
constexpr Color kGrid = rgb(0xE9E9E9);
constexpr Color kWhite = rgb(0xFFFFFF);
constexpr Color kSamples = rgb(0x1F5A94);
constexpr Color kMarker = rgb(0x00796B);
constexpr Color kTrigger = rgb(0xC2410C);
constexpr Color kWait = rgb(0xEDEDED);
constexpr Color kWaitHatch = rgb(0xBDBDBD);
constexpr Color kWaveforms[] = {rgb(0x9CC3E6), rgb(0xF7C48F), rgb(0xA9D8A4), rgb(0xD9B8E3),
                                rgb(0xF3AFAF), rgb(0xD5CE86), rgb(0xA0D9D4), rgb(0xD6BCA4)};

constexpr TextStyle kTitleStyle = {18, kInk, true};
constexpr TextStyle kSubtitleStyle = {12.5, kPale};
constexpr TextStyle kLabelStyle = {12, kInk};
constexpr TextStyle kTickStyle = {11.5, kPale};
constexpr TextStyle kBlockStyle = {11.5, kInk, true};
constexpr TextStyle kBlockLineStyle = {10, kPale};

// The pulses of one marker, none kept twice for one place.
struct MarkerLane {
  unsigned marker = 0;
  std::uint64_t count = 0;
  std::vector<double> bars;  // where they begin, points from the left
};

class Picture {
 public:
  explicit Picture(const RecordingHeader& header)
      : header_(header),
        triggers_(usedTriggers(header)),
        envelope_(header.sampleCount, kEnvelopeColumns),
        laneBuilder_(header, kLaneColumns),
        timeAxis_(makeTimeAxis(secondsOf(header.firstSample), secondsOf(header.endSample()), kMaxTimeTicks)) {
    for (const unsigned marker : usedMarkers(header)) markers_.push_back({marker, 0, {}});
  }

  void take(const RecordingBlock& block) {
    envelope_.take(block.samples);
    for (const SegmentStart& segment : block.segments) laneBuilder_.begin(segment);
    for (const MarkerEvent& event : block.markers) addMarkers(event);
  }
  // Call it once, before it is drawn.
  void finish() { lane_ = laneBuilder_.finish(); }

  double height() const { return lanesBottom() + kAxisHeight + kLegendHeight + kBottomMargin; }

  void draw(Canvas canvas) const {
    canvas.fill(Rectangle{0, 0, kWidth, height()}, kWhite);
    drawTitle(canvas);
    drawTimeGrid(canvas);
    drawSamples(canvas);
    drawPlaying(canvas);
    drawMarkers(canvas);
    drawTriggers(canvas);
    drawTimeAxis(canvas);
    drawLegend(canvas);
  }

 private:
  // Where things are.
  static Rectangle samplesArea() { return {kLeftMargin, kTitleHeight, kPlotWidth, kSamplesHeight}; }
  static Rectangle playingArea() { return {kLeftMargin, samplesArea().bottom() + kGap, kPlotWidth, kPlayingHeight}; }
  static Rectangle eventArea(std::size_t index) {
    return {kLeftMargin, playingArea().bottom() + kGap + static_cast<double>(index) * kEventLaneHeight, kPlotWidth,
            kEventLaneHeight};
  }
  double lanesBottom() const {
    const std::size_t count = markers_.size() + triggers_.size();
    return count == 0 ? playingArea().bottom() : eventArea(count - 1).bottom();
  }
  double xOfSample(std::uint64_t sample) const {
    const auto passed = static_cast<double>(sample - header_.firstSample);
    return kLeftMargin + kPlotWidth * passed / static_cast<double>(header_.sampleCount);
  }
  double secondsOf(std::uint64_t sample) const { return static_cast<double>(sample) / header_.sampleRateHz; }

  void addMarkers(const MarkerEvent& event) {
    const double x = std::min(xOfSample(event.sample), kLeftMargin + kPlotWidth - barWidth());
    for (MarkerLane& lane : markers_) {
      if ((event.mask & ktorba::markerBitOf(lane.marker)) == 0) continue;
      ++lane.count;
      if (lane.bars.empty() || x >= lane.bars.back() + kNearestBars) lane.bars.push_back(x);
    }
  }

  std::string describe() const {
    const std::uint64_t count = header_.sampleCount;
    return std::to_string(header_.sampleWidthBits) + "-bit samples at " + formatQuantity(header_.sampleRateHz, "S/s") +
           "  \u00b7  " + formatCount(count) + (count == 1 ? " sample" : " samples") + "  \u00b7  " +
           formatQuantity(secondsOf(count), "s");
  }

  void drawTitle(Canvas& canvas) const {
    const double width = kPlotWidth + kRightMargin / 2;
    canvas.text({kLeftMargin, 30}, canvas.elide(header_.title, width, kTitleStyle), kTitleStyle);
    canvas.text({kLeftMargin, 50}, describe(), kSubtitleStyle);
  }

  void drawTimeGrid(Canvas& canvas) const {
    for (const Tick& tick : timeAxis_.ticks) {
      const double x = kLeftMargin + kPlotWidth * timeAxis_.place(tick.value);
      canvas.line({x, kTitleHeight}, {x, lanesBottom()}, kGrid);
    }
  }

  void drawTimeAxis(Canvas& canvas) const {
    const double y = lanesBottom();
    canvas.line({kLeftMargin, y}, {kLeftMargin + kPlotWidth, y}, kFrame);
    for (const Tick& tick : timeAxis_.ticks) {
      const double x = kLeftMargin + kPlotWidth * timeAxis_.place(tick.value);
      canvas.line({x, y}, {x, y + 5}, kFrame);
      canvas.text({x, y + 19}, tick.label, kTickStyle, Align::kCentre);
    }
    canvas.text({kLeftMargin + kPlotWidth / 2, y + 39}, "time (" + timeAxis_.unit + ")", kLabelStyle, Align::kCentre);
  }

  // Samples.

  void drawSamples(Canvas& canvas) const {
    const Rectangle area = samplesArea();
    const auto fullScale = static_cast<double>(std::uint64_t{1} << (header_.sampleWidthBits - 1));
    const EnvelopeColumn extremes = envelope_.extremes();
    const Axis axis = makeLevelAxis(extremes.least / fullScale, extremes.greatest / fullScale, kMaxLevelTicks);
    const auto yOf = [&](double level) { return area.bottom() - area.height * axis.place(level); };
    for (const Tick& tick : axis.ticks) {
      const double y = yOf(tick.value);
      canvas.line({area.left, y}, {area.right(), y}, tick.value == 0 ? kFrame : kGrid);
      canvas.text({area.left - kLabelGap, y + 4}, tick.label, kTickStyle, Align::kRight);
    }
    canvas.verticalText({24, area.middle()}, "level (full scale = 1)", kLabelStyle);
    canvas.clip(area);
    drawCurve(canvas, [&](double value) { return yOf(value / fullScale); });
    canvas.unclip();
    canvas.stroke({{area.left, area.top},
                   {area.right(), area.top},
                   {area.right(), area.bottom()},
                   {area.left, area.bottom()},
                   {area.left, area.top}},
                  kFrame, 1);
  }

  template <typename YOf>
  void drawCurve(Canvas& canvas, YOf yOf) const {
    envelope_.isReduced() ? drawEnvelope(canvas, envelope_.columns(), yOf) : drawSteps(canvas, yOf);
  }

  template <typename YOf>
  void drawEnvelope(Canvas& canvas, const std::vector<EnvelopeColumn>& envelope, YOf yOf) const {
    const double columnWidth = kPlotWidth / static_cast<double>(envelope.size());
    const auto xOf = [columnWidth](std::size_t column) {
      return kLeftMargin + (static_cast<double>(column) + 0.5) * columnWidth;
    };
    std::vector<Point> outline;
    for (std::size_t c = 0; c < envelope.size(); ++c) outline.push_back({xOf(c), yOf(envelope[c].greatest)});
    for (std::size_t c = envelope.size(); c-- > 0;) outline.push_back({xOf(c), yOf(envelope[c].least)});
    canvas.fill(outline, kSamples);
    canvas.stroke(outline, kSamples, 1);
  }

  // Every sample holds its level until the next one.
  template <typename YOf>
  void drawSteps(Canvas& canvas, YOf yOf) const {
    std::vector<Point> path;
    std::uint64_t sample = header_.firstSample;
    for (const std::int32_t value : envelope_.samples()) {
      const double y = yOf(value);
      path.push_back({xOfSample(sample), y});
      path.push_back({xOfSample(++sample), y});
    }
    canvas.stroke(path, kSamples, 1.5);
  }

  // What plays.

  Color colorOf(std::size_t item) const {
    if (lane_.items[item].kind != SegmentKind::kWaveform) return kWait;
    std::size_t waveform = 0;
    for (std::size_t i = 0; i < item; ++i) waveform += lane_.items[i].kind == SegmentKind::kWaveform ? 1 : 0;
    return kWaveforms[waveform % std::size(kWaveforms)];
  }

  void paintItem(Canvas& canvas, const Rectangle& area, std::size_t item) const {
    canvas.fill(area, colorOf(item));
    if (lane_.items[item].kind == SegmentKind::kWaitForTrigger) canvas.hatch(area, kWaitHatch);
  }

  void drawPlaying(Canvas& canvas) const {
    const Rectangle area = playingArea();
    canvas.text({area.left - kLabelGap, area.middle() + 4}, "playing", kLabelStyle, Align::kRight);
    for (const LaneMixture& mixture : lane_.mixtures) drawMixture(canvas, mixture);
    for (const LaneBlock& block : lane_.blocks) drawBlock(canvas, block);
  }

  void drawBlock(Canvas& canvas, const LaneBlock& block) const {
    const Rectangle lane = playingArea();
    const double width = block.last - block.first;
    const Rectangle area = {lane.left + block.first, lane.top, width > 4 ? width - 1 : std::max(width, 0.6),
                            lane.height};
    paintItem(canvas, area, block.item);
    drawBlockText(canvas, area, block);
  }

  void drawBlockText(Canvas& canvas, const Rectangle& area, const LaneBlock& block) const {
    const double room = area.width - 8;
    const std::string name = canvas.elide(blockName(block), room, kBlockStyle);
    if (name.empty()) return;
    const std::string line = lineText(block);
    const bool hasLine = !line.empty() && canvas.textWidth(line, kBlockLineStyle) <= room;
    const double x = area.left + area.width / 2;
    const double halfWidth = canvas.textWidth(name, kBlockStyle) / 2 + 4;
    canvas.fill(Rectangle{x - halfWidth, area.top + 4, 2 * halfWidth, area.height - 8}, colorOf(block.item));
    canvas.text({x, area.middle() + (hasLine ? -2 : 4)}, name, kBlockStyle, Align::kCentre);
    if (hasLine) canvas.text({x, area.middle() + 13}, line, kBlockLineStyle, Align::kCentre);
  }

  std::string blockName(const LaneBlock& block) const {
    const PlayedInstruction& played = header_.program[block.address];
    std::string name = played.name;
    if (played.kind == SegmentKind::kWait) name = "wait";
    if (played.kind == SegmentKind::kWaitForTrigger) name = "until " + played.name;
    return block.playCount > 1 ? name + " \u00d7 " + formatCount(block.playCount) : name;
  }

  std::string lineText(const LaneBlock& block) const {
    const std::uint32_t line = header_.program[block.address].line;
    return line == 0 ? "" : "line " + std::to_string(line);
  }

  void drawMixture(Canvas& canvas, const LaneMixture& mixture) const {
    const Rectangle lane = playingArea();
    for (std::size_t column = 0; column < mixture.shares.size(); ++column) {
      double top = lane.top;
      const double x = lane.left + static_cast<double>(mixture.firstColumn + column);
      for (std::size_t item = 0; item < lane_.items.size(); ++item) {
        const double height = lane.height * mixture.shares[column][item];
        if (height > 0) canvas.fill(Rectangle{x, top, 1.05, height}, colorOf(item));
        top += height;
      }
    }
    const std::string text = formatCount(mixture.segmentCount) + " alternating";
    const auto width = static_cast<double>(mixture.shares.size());
    if (canvas.textWidth(text, kBlockStyle) + 20 > width) return;
    const double x = lane.left + static_cast<double>(mixture.firstColumn) + width / 2;
    canvas.text({x, lane.middle() + 4}, text, kBlockStyle, Align::kCentre);
  }

  // Markers and triggers.

  void drawEventLane(Canvas& canvas, const Rectangle& area, const std::string& name, std::uint64_t count) const {
    canvas.text({area.left - kLabelGap, area.middle() + 4}, name, kLabelStyle, Align::kRight);
    canvas.text({area.right() + kLabelGap, area.middle() + 4}, "\u00d7 " + formatCount(count), kTickStyle);
    canvas.line({area.left, area.bottom() - 5}, {area.right(), area.bottom() - 5}, kFrame);
  }

  double barWidth() const { return std::max(1.5, xOfSample(header_.firstSample + 1) - xOfSample(header_.firstSample)); }

  void drawMarkers(Canvas& canvas) const {
    for (std::size_t index = 0; index < markers_.size(); ++index) {
      const Rectangle area = eventArea(index);
      for (const double x : markers_[index].bars) {
        canvas.fill(Rectangle{x, area.top + 4, barWidth(), area.height - 9}, kMarker);
      }
      drawEventLane(canvas, area, ktorba::markerName(markers_[index].marker), markers_[index].count);
    }
  }

  void drawTriggers(Canvas& canvas) const {
    for (std::size_t index = 0; index < triggers_.size(); ++index) {
      const Rectangle area = eventArea(markers_.size() + index);
      std::size_t count = 0;
      for (const TriggerEvent& event : header_.triggers) {
        if (event.trigger != triggers_[index]) continue;
        ++count;
        drawTrigger(canvas, area, xOfSample(event.sample));
      }
      drawEventLane(canvas, area, ktorba::triggerName(triggers_[index]), count);
    }
  }

  void drawTrigger(Canvas& canvas, const Rectangle& area, double x) const {
    if (header_.triggers.size() <= kMostTriggerLines) {
      canvas.stroke({{x, samplesArea().top}, {x, samplesArea().bottom()}}, kTrigger, 1, true);
      canvas.stroke({{x, playingArea().bottom()}, {x, area.top + 4}}, kTrigger, 1, true);
    }
    canvas.fill({{x - 5, area.top + 4}, {x + 5, area.top + 4}, {x, area.bottom() - 5}}, kTrigger);
  }

  // The legend.

  static std::string itemName(const LaneItem& item) {
    if (item.kind == SegmentKind::kWait) return "wait";
    if (item.kind == SegmentKind::kWaitForTrigger) return "wait until a trigger";
    return item.name;
  }

  void drawLegend(Canvas& canvas) const {
    const double top = lanesBottom() + kAxisHeight + 6;
    double x = kLeftMargin;
    for (std::size_t item = 0; item < lane_.items.size(); ++item) {
      const std::string name = canvas.elide(itemName(lane_.items[item]), kLegendNameWidth, kTickStyle);
      const double width = 20 + canvas.textWidth(name, kTickStyle) + 22;
      const bool isLast = item + 1 == lane_.items.size();
      if (x + width + (isLast ? 0 : 60) > kLeftMargin + kPlotWidth) {
        canvas.text({x, top + 11}, "and " + std::to_string(lane_.items.size() - item) + " more", kTickStyle);
        return;
      }
      paintItem(canvas, {x, top, 14, 14}, item);
      canvas.text({x + 20, top + 11}, name, kTickStyle);
      x += width;
    }
  }

  const RecordingHeader& header_;
  std::vector<MarkerLane> markers_;  // those used
  std::vector<unsigned> triggers_;   // numbers of those raised
  Envelope envelope_;
  LaneBuilder laneBuilder_;
  Lane lane_;
  Axis timeAxis_;
};

cairo_status_t writeToTarget(void* target, const unsigned char* bytes, unsigned count) {
  return static_cast<ByteTarget*>(target)->tryWrite(bytes, count) == count ? CAIRO_STATUS_SUCCESS
                                                                           : CAIRO_STATUS_WRITE_ERROR;
}

cairo_surface_t* createSurface(ByteTarget& target, PictureFormat format, double height) {
  if (format == PictureFormat::kSvg) return cairo_svg_surface_create_for_stream(writeToTarget, &target, kWidth, height);
  if (format == PictureFormat::kPdf) return cairo_pdf_surface_create_for_stream(writeToTarget, &target, kWidth, height);
  cairo_surface_t* surface =
      cairo_image_surface_create(CAIRO_FORMAT_RGB24, static_cast<int>(std::lround(kWidth * kPixelsPerPoint)),
                                 static_cast<int>(std::lround(height * kPixelsPerPoint)));
  cairo_surface_set_device_scale(surface, kPixelsPerPoint, kPixelsPerPoint);
  return surface;
}

void check(ByteTarget& target, cairo_status_t status) {
  if (status == CAIRO_STATUS_SUCCESS) return;
  if (target.hasFailed()) target.fail();
  throw Refusal(target.path() + ": cannot be written: " + cairo_status_to_string(status));
}

// Draws all at once, when everything has come.
class PictureWriter final : public OutputWriter {
 public:
  PictureWriter(ByteTarget& target, PictureFormat format, const RecordingHeader& header)
      : target_(target), format_(format), picture_(header) {}

  void take(const RecordingBlock& block) override { picture_.take(block); }

  void finish() override {
    picture_.finish();
    const std::unique_ptr<cairo_surface_t, decltype(&cairo_surface_destroy)> surface(
        createSurface(target_, format_, std::ceil(picture_.height())), &cairo_surface_destroy);
    const std::unique_ptr<cairo_t, decltype(&cairo_destroy)> context(cairo_create(surface.get()), &cairo_destroy);
    picture_.draw(Canvas(context.get()));
    check(target_, cairo_status(context.get()));
    if (format_ == PictureFormat::kPng) {
      check(target_, cairo_surface_write_to_png_stream(surface.get(), writeToTarget, &target_));
    }
    cairo_surface_finish(surface.get());
    check(target_, cairo_surface_status(surface.get()));
  }

 private:
  ByteTarget& target_;
  PictureFormat format_;
  Picture picture_;
};

}  // namespace

void checkPicture(const std::string&) {}

std::unique_ptr<OutputWriter> writePicture(ByteTarget& target, PictureFormat format, const RecordingHeader& header) {
  if (header.sampleCount == 0) throw Refusal(target.path() + ": there are no samples to draw");
  return std::make_unique<PictureWriter>(target, format, header);
}

}  // namespace tools
