// Pictures as .png and .pdf. One thread.
#pragma once

#include <functional>
#include <string>

#include "tools/outputs/ByteTarget.h"
#include "tools/outputs/Output.h"
#include "tools/outputs/picture/Canvas.h"

namespace tools {

struct PictureSize {
  double width, height;  // points
};

// Throws Refusal, naming `path`, in a build that has no cairo, which draws .svg alone.
void requireCairo(const std::string& path);

// Has `draw` draw into the file, as any format but .svg. Throws Refusal where it has no room in memory, and what the
// target throws.
void drawByCairo(ByteTarget& target, PictureFormat format, PictureSize size, const std::function<void(Canvas&)>& draw);

}  // namespace tools
