// What stands for pictures in a build without cairo.
#include "tools/outputs/formats.h"
#include "tools/text/Refusal.h"

namespace tools {

void checkPicture(const std::string& path) {
  throw Refusal(path + ": this build draws no pictures: it was made without cairo", "Use .vcd or .csv.");
}

std::unique_ptr<OutputWriter> writePicture(ByteTarget& target, PictureFormat, const RecordingHeader&) {
  checkPicture(target.path());
  return nullptr;
}

}  // namespace tools
