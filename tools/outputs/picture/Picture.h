// The picture of plays, one below the other: for each its samples, a lane for what plays, and one for every marker that
// fires and every trigger that is raised, over a time axis of its own. One thread.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "tools/outputs/ByteTarget.h"
#include "tools/outputs/formats.h"
#include "tools/outputs/picture/PlayView.h"
#include "tools/outputs/picture/Style.h"

namespace tools {

struct PictureLanes {
  bool samples = true;
  bool playing = true;
  bool markers = true;
  bool triggers = true;
};

// Sizes in points; a .png has kPixelsPerPoint pixels to each, along and across.
struct PictureOptions {
  static constexpr double kLeastWidth = 300;
  static constexpr double kLeastHeight = 100;
  static constexpr double kMostPoints = 16000;  // of either side
  static constexpr double kPixelsPerPoint = 2;

  PictureStyle style = PictureStyle::kLight;
  PictureLanes lanes;
  double width = 1200;           // from kLeastWidth to kMostPoints
  std::optional<double> height;  // nothing: what the lanes take
  std::string title;             // above several plays; one alone has that of its recording
};

// How finely a picture of that width shows plays.
PictureScale scaleOf(const PictureOptions& options);

// Draws into the file; what is shown of each view is as fine as scaleOf() says. Throws Refusal where all this is higher
// than the given height or than any picture may be, and what the target throws.
void drawPicture(ByteTarget& target, PictureFormat format, std::span<const PlayView* const> plays,
                 const PictureOptions& options);

}  // namespace tools
