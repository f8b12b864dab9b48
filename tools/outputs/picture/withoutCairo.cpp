// What stands for .png and .pdf in a build without cairo.
#include "tools/outputs/picture/drawByCairo.h"
#include "tools/text/Refusal.h"

namespace tools {

void requireCairo(const std::string& path) {
  throw Refusal(path + ": this build draws no such pictures: it was made without cairo", "Use .svg.");
}

void drawByCairo(ByteTarget& target, PictureFormat, PictureSize, const std::function<void(Canvas&)>&) {
  requireCairo(target.path());
}

}  // namespace tools
