// Colours and texts of pictures. Constants; any thread may read them.
#pragma once

#include <span>

#include "tools/outputs/picture/Canvas.h"

namespace tools {

enum class PictureStyle { kLight, kDark };

struct Palette {
  Color background, ink, pale, frame, grid, samples, marker, trigger, wait, waitHatch;
  Color waveforms[8];
};

const Palette& paletteOf(PictureStyle style);

}  // namespace tools
