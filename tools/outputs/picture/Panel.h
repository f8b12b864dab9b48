// One play in a picture: where its lanes are, and the drawing of them. One thread; what it is made from must outlive
// it.
#pragma once

#include <vector>

#include "tools/outputs/picture/Axis.h"
#include "tools/outputs/picture/Canvas.h"
#include "tools/outputs/picture/Picture.h"

namespace tools {

class Panel {
 public:
  static constexpr double kLeastSamplesHeight = 60;  // points
  static constexpr double kSamplesHeight = 270;
  // What stands beside the lanes.
  static constexpr double kLeftMargin = 92;
  static constexpr double kRightMargin = 76;

  enum class Heading { kTitle, kScript };  // of a picture of one play; of one among several

  Panel(const PlayView& play, const PictureOptions& options, Heading heading);

  const std::string& title() const { return header_.title; }
  // Points, with so high a lane of samples.
  double height(double samplesHeight);
  void draw(Canvas& canvas, double top, double samplesHeight);

 private:
  enum class Kind { kSamples, kPlaying, kMarker, kTrigger };
  struct Row {
    Kind kind;
    unsigned number = 0;  // of the marker or the trigger
    Rectangle area = {};
  };

  double heightOf(Kind kind) const;
  double headingHeight() const;
  void place(double top);
  double lanesTop() const { return top_ + headingHeight(); }
  double plotWidth() const { return options_.width - kLeftMargin - kRightMargin; }
  double plotRight() const { return kLeftMargin + plotWidth(); }
  double xOf(std::uint64_t sample) const;
  double xOf(const Tick& tick) const { return kLeftMargin + plotWidth() * timeAxis_.place(tick.value); }
  std::string describe() const;
  std::string timeTitle() const;

  void drawHeading(Canvas& canvas) const;
  void drawTimeGrid(Canvas& canvas) const;
  void drawTimeAxis(Canvas& canvas) const;
  void drawRow(Canvas& canvas, const Row& row) const;
  void drawLegend(Canvas& canvas) const;

  void drawSamples(Canvas& canvas, const Rectangle& area) const;
  void drawEnvelope(Canvas& canvas, const Axis& axis, const Rectangle& area) const;
  void drawSteps(Canvas& canvas, const Axis& axis, const Rectangle& area) const;
  double yOf(std::int32_t value, const Axis& axis, const Rectangle& area) const;

  Color colorOf(std::size_t item) const;
  void paintItem(Canvas& canvas, const Rectangle& area, std::size_t item) const;
  void drawPlaying(Canvas& canvas, const Rectangle& area) const;
  void drawBlock(Canvas& canvas, const Rectangle& lane, const LaneBlock& block) const;
  void drawBlockText(Canvas& canvas, const Rectangle& area, const LaneBlock& block) const;
  void drawMixture(Canvas& canvas, const Rectangle& lane, const LaneMixture& mixture) const;
  std::string blockName(const LaneBlock& block) const;
  std::string lineText(const LaneBlock& block) const;

  void drawEventLane(Canvas& canvas, const Rectangle& area, const std::string& name, std::uint64_t count) const;
  void drawMarkers(Canvas& canvas, const Rectangle& area, unsigned marker) const;
  void drawTriggers(Canvas& canvas, const Rectangle& area, unsigned trigger) const;
  void drawTrigger(Canvas& canvas, const Rectangle& area, double x) const;

  TextStyle titleStyle() const { return {18, palette_.ink, true}; }
  TextStyle headingStyle() const { return {14, palette_.ink, true}; }
  TextStyle subtitleStyle() const { return {12.5, palette_.pale}; }
  TextStyle labelStyle() const { return {12, palette_.ink}; }
  TextStyle tickStyle() const { return {11.5, palette_.pale}; }
  TextStyle blockStyle() const { return {11.5, palette_.ink, true}; }
  TextStyle blockLineStyle() const { return {10, palette_.pale}; }
  LineStyle frame() const { return {palette_.frame}; }

  const PlayView& play_;
  const RecordingHeader& header_;
  const PictureOptions& options_;
  const Palette& palette_;
  Heading heading_;
  std::vector<Row> rows_;
  Axis timeAxis_;
  bool isTimeRelative_ = false;  // the axis counts from the first sample on
  double samplesHeight_ = kSamplesHeight;
  double top_ = 0;
  double lanesBottom_ = 0;
};

}  // namespace tools
