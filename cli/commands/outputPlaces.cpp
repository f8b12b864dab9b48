#include "cli/commands/outputPlaces.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "cli/commands/page.h"
#include "cli/console.h"
#include "tools/outputs/OutputFile.h"
#include "tools/text/Refusal.h"

namespace tools::cli {
std::vector<OutputPlace> placesOf(const OutputOptions& options) {
  std::vector<OutputPlace> places;
  for (const std::string& path : options.paths) places.push_back({path, options.format});
  return places;
}

std::vector<OutputPlace> takePages(const std::vector<OutputPlace>& outputs) {
  std::vector<OutputPlace> pages;
  std::ranges::copy_if(outputs, std::back_inserter(pages), isPage, &OutputPlace::path);
  return pages;
}

std::vector<OutputPlace> takeOthers(const std::vector<OutputPlace>& outputs) {
  std::vector<OutputPlace> others;
  std::ranges::remove_copy_if(outputs, std::back_inserter(others), isPage, &OutputPlace::path);
  return others;
}

void takeStandardOutput(const std::vector<OutputPlace>& outputs) {
  bool isTaken = false;
  for (const OutputPlace& output : outputs) {
    if (!isStandardOutput(output.path)) continue;
    if (std::exchange(isTaken, true)) throw Refusal("the standard output can take one output only");
    leaveOutputToData();
  }
}

}  // namespace tools::cli
