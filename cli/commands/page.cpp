#include "cli/commands/page.h"

#include <algorithm>
#include <filesystem>

#include "cli/console.h"
#include "ktcheckname/compareNames.h"
#include "tools/outputs/OutputFile.h"
#include "tools/page/Page.h"
#include "tools/text/characters.h"

namespace tools::cli {
namespace {

SampleSpan samplesOf(const LoadedScript& loaded, const std::string& name) {
  const auto isIt = [&](const NamedWaveform& named) { return ktcheckname::compareNames(named.name, name) == 0; };
  return std::ranges::find_if(loaded.waveforms, isIt)->waveform.samples;
}

}  // namespace

bool isPage(const std::string& path) {
  std::string ending = std::filesystem::path(path).extension().string();
  std::ranges::transform(ending, ending.begin(), toLower);
  return ending == ".html";
}

void writePageFile(const std::string& path, const std::string& title, const LoadedScript& loaded,
                   const Program& program, const GeneratorOptions& generator,
                   const std::vector<RaisedTrigger>& raised) {
  const Timeline timeline(StraightPlay(program, loaded.builder), raised);
  TimelineWaveforms waveforms;
  for (const std::string& name : timeline.play().waveforms()) waveforms.push_back(samplesOf(loaded, name));
  OutputFile file(path);
  const PageSamples samples = writePage([&file](std::string_view text) { file.write(text.data(), text.size()); },
                                        {.title = title,
                                         .script = loaded.file.text(),
                                         .sampleRateHz = generator.sampleRateHz,
                                         .sampleWidthBits = generator.sampleWidthBits,
                                         .timeline = timeline,
                                         .waveforms = waveforms,
                                         .raised = raised,
                                         .places = program.places});
  file.commit();
  if (samples == PageSamples::kWhole) return;
  printError("ktorba: note: " + path + " shows waveforms as envelopes: their samples are too many for a page\n");
}

}  // namespace tools::cli
