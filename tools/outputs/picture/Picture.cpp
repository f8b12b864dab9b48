#include "tools/outputs/picture/Picture.h"

#include <algorithm>
#include <cmath>
#include <memory>

#include "tools/outputs/picture/Panel.h"
#include "tools/outputs/picture/RecordedView.h"
#include "tools/outputs/picture/SvgCanvas.h"
#include "tools/outputs/picture/drawByCairo.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr double kTitleHeight = 44;  // of a picture of several plays, points
constexpr double kEventColumnsPerPoint = 4;

class Picture {
 public:
  Picture(std::span<const PlayView* const> plays, const PictureOptions& options) : options_(options) {
    const auto heading = plays.size() == 1 ? Panel::Heading::kTitle : Panel::Heading::kScript;
    for (const PlayView* play : plays) panels_.emplace_back(*play, options_, heading);
    height_ = std::ceil(heightWith(Panel::kSamplesHeight));
    if (options_.height) stretchTo(*options_.height);
    if (height_ <= PictureOptions::kMostPoints) return;
    throw Refusal("a picture of " + formatCount(panels_.size()) + " scripts would be more than " +
                      formatCount(static_cast<std::uint64_t>(PictureOptions::kMostPoints)) + " points high",
                  "Choose some of them, or fewer lanes.", Setting::kScriptName);
  }

  double width() const { return options_.width; }
  double height() const { return height_; }
  std::string title() const { return isOne() ? panels_.front().title() : options_.title; }

  void draw(Canvas& canvas) {
    const Palette& palette = paletteOf(options_.style);
    canvas.fill(Rectangle{0, 0, width(), height()}, palette.background);
    double top = 0;
    if (!isOne()) {
      const TextStyle style = {18, palette.ink, true};
      const double room = width() - Panel::kLeftMargin - 20;
      canvas.text({Panel::kLeftMargin, 30}, canvas.elide(options_.title, room, style), style);
      top = kTitleHeight;
    }
    for (Panel& panel : panels_) {
      panel.draw(canvas, top, samplesHeight_);
      top += panel.height(samplesHeight_);
    }
  }

 private:
  bool isOne() const { return panels_.size() == 1; }

  double heightWith(double samplesHeight) {
    double height = isOne() ? 0 : kTitleHeight;
    for (Panel& panel : panels_) height += panel.height(samplesHeight);
    return height;
  }

  // By the lanes of samples alone.
  void stretchTo(double height) {
    const double least = std::ceil(heightWith(Panel::kLeastSamplesHeight));
    if (height < least) {
      throw Refusal("what is shown takes at least " + formatCount(static_cast<std::uint64_t>(least)) + " points",
                    "Make the picture higher, or show less.", Setting::kPictureHeight);
    }
    if (options_.lanes.samples) {
      samplesHeight_ = Panel::kLeastSamplesHeight + (height - least) / static_cast<double>(panels_.size());
    }
    height_ = height;
  }

  const PictureOptions& options_;
  std::vector<Panel> panels_;
  double samplesHeight_ = Panel::kSamplesHeight;
  double height_ = 0;
};

// Draws all at once, when everything has come.
class PictureWriter final : public OutputWriter {
 public:
  PictureWriter(ByteTarget& target, PictureFormat format, const RecordingHeader& header)
      : target_(target), format_(format), view_(header, scaleOf({})) {}

  void take(const RecordingBlock& block) override { view_.take(block); }

  void finish() override {
    view_.finish();
    const PlayView* const view = &view_;
    drawPicture(target_, format_, {&view, 1}, {});
  }

 private:
  ByteTarget& target_;
  PictureFormat format_;
  RecordedView view_;
};

}  // namespace

PictureScale scaleOf(const PictureOptions& options) {
  const double plotWidth = options.width - Panel::kLeftMargin - Panel::kRightMargin;
  return {.levelColumns = static_cast<std::size_t>(plotWidth * PictureOptions::kPixelsPerPoint),
          .laneColumns = static_cast<std::size_t>(plotWidth),
          .eventColumns = static_cast<std::size_t>(plotWidth * kEventColumnsPerPoint)};
}

void drawPicture(ByteTarget& target, PictureFormat format, std::span<const PlayView* const> plays,
                 const PictureOptions& options) {
  Picture picture(plays, options);
  if (format != PictureFormat::kSvg) {
    return drawByCairo(target, format, {picture.width(), picture.height()},
                       [&](Canvas& canvas) { picture.draw(canvas); });
  }
  SvgCanvas canvas(picture.width(), picture.height(), picture.title());
  picture.draw(canvas);
  const std::string document = canvas.finish();
  target.write(document.data(), document.size());
}

std::unique_ptr<OutputWriter> writePicture(ByteTarget& target, PictureFormat format, const RecordingHeader& header) {
  if (header.sampleCount == 0) throw Refusal(target.path() + ": there are no samples to draw");
  return std::make_unique<PictureWriter>(target, format, header);
}

}  // namespace tools
