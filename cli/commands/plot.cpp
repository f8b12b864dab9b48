#include <algorithm>
#include <memory>

#include "cli/LoadedScript.h"
#include "cli/commands/ComputedPlay.h"
#include "cli/commands/commands.h"
#include "cli/commands/outputPlaces.h"
#include "cli/commands/page.h"
#include "cli/console.h"
#include "conventions/conventions.h"
#include "ktcheckname/compareNames.h"
#include "platform/system/paths.h"
#include "tools/outputs/OutputFile.h"
#include "tools/outputs/picture/Picture.h"
#include "tools/player/simulatedGenerator.h"
#include "tools/plot/TimelineView.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

void checkSize(const std::string& option, double points, double least) {
  if (points >= least && points <= PictureOptions::kMostPoints) return;
  throw Refusal(option + ": " + formatNumber(points) + " points are not drawn",
                "From " + formatCount(static_cast<std::uint64_t>(least)) + " to " +
                    formatCount(static_cast<std::uint64_t>(PictureOptions::kMostPoints)) + " are.");
}

PictureOptions pictureOptionsOf(const PlotOptions& options) {
  PictureOptions picture;
  picture.style = options.isDark ? PictureStyle::kDark : PictureStyle::kLight;
  const auto shows = [&](const char* lane) {
    return options.lanes.empty() || std::ranges::find(options.lanes, lane) != options.lanes.end();
  };
  picture.lanes = {shows("samples"), shows("playing"), shows("markers"), shows("triggers")};
  checkSize("--width", options.width, PictureOptions::kLeastWidth);
  picture.width = options.width;
  if (options.height) {
    checkSize("--height", *options.height, PictureOptions::kLeastHeight);
    picture.height = options.height;
  }
  return picture;
}

// Those that are named, each once; or all, in the order of the text.
std::vector<const Program*> choosePrograms(const LoadedScript& loaded, const std::vector<std::string>& names) {
  std::vector<std::string> wanted = names;
  if (wanted.empty()) {
    for (const Program& program : loaded.programs) wanted.push_back(program.entry.script.name);
  }
  std::vector<const Program*> chosen;
  for (const std::string& name : wanted) {
    const Program* const program = &findProgram(loaded, name);
    if (std::ranges::find(chosen, program) == chosen.end()) chosen.push_back(program);
  }
  return chosen;
}

// Says what is shown of a play that has no end.
void announceWindow(const ComputedPlay& play) {
  const PlayLength& length = play.timeline().length();
  std::string why;
  switch (length.kind()) {
    case PlayLength::Kind::kExact:
      return;
    case PlayLength::Kind::kTooLong:
      why = "plays more than 2^64 samples";
      break;
    case PlayLength::Kind::kEndless:
      why = "plays without end";
      break;
    case PlayLength::Kind::kWaiting:
      why = "waits for " + ktorba::triggerName(length.trigger()) + " without end, from sample " +
            formatCount(length.waitingSince()) + " on";
      break;
  }
  const Place& place = play.program().places[length.kind() == PlayLength::Kind::kWaiting ? length.address() : 0];
  const std::string line = length.kind() == PlayLength::Kind::kWaiting && place.isKnown()
                               ? " (line " + std::to_string(place.line) + ")"
                               : "";
  printError("ktorba: note: " + toPrintable(play.scriptName()) + " " + why + line + "; " +
             formatCount(play.header().sampleCount) + " samples are shown, see --length\n");
}

std::vector<std::unique_ptr<ComputedPlay>> computePlays(const PlotOptions& options, const LoadedScript& loaded) {
  std::vector<std::unique_ptr<ComputedPlay>> plays;
  unsigned used = 0;
  for (const Program* program : choosePrograms(loaded, options.names)) {
    plays.push_back(std::make_unique<ComputedPlay>(options.window, options.generator, loaded, *program,
                                                   ComputedPlay::Unlimited::kWhatMatters));
    used |= triggersUsedBy(plays.back()->timeline().play());
  }
  requireUse(plays.front()->triggers(), used);
  for (const auto& play : plays) {
    if (options.window.length.empty()) announceWindow(*play);
    if (plays.size() > 1) play->setTitle(play->scriptName());
  }
  if (plays.size() == 1 && !options.title.empty()) plays.front()->setTitle(options.title);
  return plays;
}

void draw(const std::vector<OutputPlace>& places, const std::vector<std::unique_ptr<ComputedPlay>>& plays,
          const PictureOptions& picture) {
  std::vector<std::unique_ptr<PlayView>> views;
  std::vector<const PlayView*> shown;
  for (const auto& play : plays) {
    views.push_back(
        std::make_unique<TimelineView>(play->header(), play->timeline(), play->waveforms(), scaleOf(picture)));
    shown.push_back(views.back().get());
  }
  std::vector<std::unique_ptr<OutputFile>> files;
  for (const OutputPlace& place : places) {
    try {
      files.push_back(std::make_unique<OutputFile>(place.path));
      drawPicture(*files.back(), checkPicture(place), shown, picture);
      files.back()->flush();
    } catch (const ReaderGone&) {
      files.pop_back();
    }
  }
  // No file gets its name before all are written.
  for (const auto& file : files) file->commit();
}

}  // namespace

int plot(const PlotOptions& options) {
  checkOptions(options.generator);
  const std::vector<OutputPlace> all = placesOf(options.outputs);
  const std::vector<OutputPlace> pages = takePages(all);
  const std::vector<OutputPlace> places = takeOthers(all);
  for (const OutputPlace& page : pages) checkPlace(page.path);
  for (const OutputPlace& place : places) checkPicture(place);
  takeStandardOutput(all);
  PictureOptions picture = pictureOptionsOf(options);
  const auto loaded =
      loadScript(options.script, options.waveforms, options.generator, options.generator.memorySamples());
  if (!loaded) return kFailure;
  refuseSources(options.outputs.paths, options.script, options.waveforms, *loaded);
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  if (!buildPrograms(*loaded)) return kFailure;
  picture.title =
      options.title.empty() ? platform::toText(platform::toPath(loaded->file.name()).filename()) : options.title;
  const auto plays = computePlays(options, *loaded);
  if (!pages.empty() && plays.size() > 1) {
    throw Refusal(pages.front().path + ": a page shows one script", "Choose it.", Setting::kScriptName);
  }
  if (!places.empty()) draw(places, plays, picture);
  for (const OutputPlace& page : pages) {
    writePageFile(page.path, plays.front()->header().title, *loaded, plays.front()->program(), options.generator,
                  plays.front()->triggers());
  }
  return kSuccess;
}

}  // namespace tools::cli
