#include "tools/outputs/Output.h"

#include <algorithm>
#include <array>
#include <map>

#include "platform/system/files.h"
#include "platform/system/paths.h"
#include "tools/outputs/OutputFile.h"
#include "tools/outputs/formats.h"
#include "tools/outputs/picture/drawByCairo.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr RecordingParts kSamples = {.samples = true};
constexpr RecordingParts kAll = {.samples = true, .markers = true, .segments = true};

struct Format {
  std::string_view name;
  RecordingParts wanted;
  std::unique_ptr<OutputWriter> (*open)(ByteTarget& target, const RecordingHeader& header);
  SizeBounds (*bound)(const RecordingHeader& header) = [](const RecordingHeader&) { return SizeBounds(); };
  void (*check)(const std::string& path, unsigned sampleWidthBits, double sampleRateHz) = nullptr;  // may be null
  bool needsSeeking = false;
  std::optional<PictureFormat> picture = {};
};

template <SoundFormat format>
constexpr Format soundAs(std::string_view name) {
  return {.name = name,
          .wanted = kSamples,
          .open = [](ByteTarget& target, const RecordingHeader& header) { return writeSound(target, format, header); },
          .bound = [](const RecordingHeader& header) { return boundSound(format, header); },
          .check = [](const std::string& path, unsigned width, double rate) { checkSound(path, format, width, rate); },
          .needsSeeking = true};
}
template <PictureFormat format>
constexpr Format pictureAs(std::string_view name) {
  return {
      .name = name,
      .wanted = kAll,
      .open = [](ByteTarget& target, const RecordingHeader& header) { return writePicture(target, format, header); },
      .check =
          [](const std::string& path, unsigned, double) {
            if (format != PictureFormat::kSvg) requireCairo(path);
          },
      .picture = format};
}

// Pictures stand last.
constexpr Format kFormats[] = {
    soundAs<SoundFormat::kWav>("wav"),
    soundAs<SoundFormat::kFlac>("flac"),
    {.name = "csv", .wanted = kAll, .open = writeCsv, .bound = boundCsv},
    {.name = "npy", .wanted = kSamples, .open = writeNpy, .bound = boundNpy},
    {.name = "vcd", .wanted = kAll, .open = writeVcd, .bound = boundVcd},
    pictureAs<PictureFormat::kSvg>("svg"),
    pictureAs<PictureFormat::kPng>("png"),
    pictureAs<PictureFormat::kPdf>("pdf"),
};

constexpr auto kFormatNames = [] {
  std::array<std::string_view, std::size(kFormats)> names;
  std::ranges::transform(kFormats, names.begin(), &Format::name);
  return names;
}();

const Format* findByName(std::string_view name) {
  const Format* const found = std::ranges::find(kFormats, name, &Format::name);
  return found == std::end(kFormats) ? nullptr : found;
}

const Format* findByEnding(const std::string& path) {
  std::string ending = platform::toText(platform::toPath(path).extension());
  std::ranges::transform(ending, ending.begin(), toLower);
  return ending.empty() ? nullptr : findByName(std::string_view(ending).substr(1));
}

const Format& findFormat(const OutputPlace& output) {
  if (const Format* format = findByEnding(output.path)) return *format;
  if (const Format* format = findByName(output.fallbackFormat)) return *format;
  const bool isStream = output.path == kStandardOutput;
  throw Refusal(isStream ? "the standard output has no ending that names a format"
                         : output.path + ": the ending names no known kind of output",
                (isStream ? "Known formats: " : "Known endings: .") + join(kFormatNames, isStream ? " " : " .") + ".",
                Setting::kOutputFormat);
}

}  // namespace

std::span<const std::string_view> outputFormats() { return kFormatNames; }
std::span<const std::string_view> pictureFormats() {
  constexpr std::size_t kPictures =
      std::ranges::count_if(kFormats, [](const Format& f) { return f.picture.has_value(); });
  return std::span(kFormatNames).last(kPictures);
}

void checkOutput(const OutputPlace& output, unsigned sampleWidthBits, double sampleRateHz) {
  const Format& format = findFormat(output);
  checkPlace(output.path);
  if (format.check != nullptr) format.check(output.path, sampleWidthBits, sampleRateHz);
}

PictureFormat checkPicture(const OutputPlace& output) {
  const Format& format = findFormat(output);
  checkPlace(output.path);
  if (format.picture && *format.picture != PictureFormat::kSvg) requireCairo(output.path);
  if (format.picture) return *format.picture;
  throw Refusal(output.path + ": " + std::string(format.name) + " is no picture",
                "Pictures: " + join(pictureFormats(), " ") + ".", Setting::kOutputFormat);
}

std::uint64_t saturatedBytes(std::uint64_t perSample, std::uint64_t count, std::uint64_t more) {
  const bool fits = count == 0 || perSample <= (UINT64_MAX - more) / count;
  return fits ? perSample * count + more : UINT64_MAX;
}

struct Outputs::Entry {
  OutputPlace place;
  const Format* format;
  std::optional<platform::Disk> disk;
  std::unique_ptr<OutputFile> file = {};  // null while it is not open, and once it is finished or dropped
  std::unique_ptr<OutputWriter> writer = {};

  bool isDropped = false;

  // The writer goes first: it may write as it goes.
  void close() {
    writer.reset();
    file.reset();
  }
  template <typename Work>
  void unlessDropped(Work work) {
    if (isDropped) return;
    try {
      work();
    } catch (const ReaderGone&) {
      isDropped = true;
      close();
    }
  }
};

Outputs::Outputs(const std::vector<OutputPlace>& places) {
  for (const OutputPlace& place : places) {
    const auto folder = folderOf(place.path);
    entries_.push_back({place, &findFormat(place), folder ? platform::findDisk(*folder) : std::nullopt});
  }
}

Outputs::~Outputs() {
  for (Entry& entry : entries_) entry.close();
}

RecordingParts Outputs::wanted() const {
  RecordingParts wanted;
  for (const Entry& entry : entries_) {
    if (!entry.isDropped) wanted |= entry.format->wanted;
  }
  return wanted;
}

void Outputs::requireRoom(const RecordingHeader& header) const {
  std::map<std::uint64_t, std::uint64_t> needed;  // bytes by disk
  for (const Entry& entry : entries_) {
    const std::uint64_t least = entry.format->bound(header).least;
    if (!entry.disk) continue;
    std::uint64_t& sum = needed[entry.disk->id];
    sum = saturatedBytes(1, least, sum);
    if (sum <= entry.disk->freeBytes) continue;
    throw Refusal(entry.place.path + ": takes at least " + formatQuantity(static_cast<double>(least), "B") +
                      (sum == least ? "" : " beside the other outputs") + ", and its disk has " +
                      formatQuantity(static_cast<double>(entry.disk->freeBytes), "B") + " free",
                  "Play less, or write where there is more room.");
  }
}

std::vector<OutputSize> Outputs::sizes(const RecordingHeader& header) const {
  std::vector<OutputSize> sizes;
  for (const Entry& entry : entries_) {
    const SizeBounds bounds = entry.format->bound(header);
    const auto freeBytes = entry.disk ? std::optional(entry.disk->freeBytes) : std::nullopt;
    sizes.push_back({entry.place.path, bounds.least, bounds.greatest, freeBytes});
  }
  return sizes;
}

void Outputs::open(const RecordingHeader& header) {
  for (Entry& entry : entries_) {
    entry.unlessDropped([&] {
      entry.file = std::make_unique<OutputFile>(entry.place.path, entry.format->needsSeeking);
      entry.writer = entry.format->open(*entry.file, header);
    });
  }
}

void Outputs::take(const RecordingBlock& block) {
  for (Entry& entry : entries_) {
    entry.unlessDropped([&] { entry.writer->take(block); });
  }
}

// No file gets its name before all are written.
void Outputs::finish() {
  for (Entry& entry : entries_) {
    entry.unlessDropped([&] {
      entry.writer->finish();
      entry.file->flush();
    });
  }
  for (Entry& entry : entries_) {
    entry.unlessDropped([&] { entry.file->commit(); });
    entry.close();
  }
}

}  // namespace tools
