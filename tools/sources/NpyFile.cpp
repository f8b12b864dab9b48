#include "tools/sources/NpyFile.h"

#include <algorithm>
#include <bit>

#include "tools/sources/ByteStream.h"
#include "tools/sources/NpyHeader.h"
#include "tools/sources/SampleScaler.h"
#include "tools/text/Refusal.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr std::size_t kBlockBytes = 1 << 16;
constexpr std::string_view kEnding = ".npy";

// Which elements are taken, of all in the order of the file.
struct Pick {
  std::uint64_t first = 0;
  std::uint64_t step = 1;
  std::uint64_t count = 0;
};

std::uint64_t readBits(const char* bytes, const NpyHeader& header) {
  std::uint64_t bits = 0;
  for (unsigned i = 0; i < header.bytes; ++i) {
    bits = bits << 8 | static_cast<unsigned char>(bytes[header.isBigEndian ? i : header.bytes - 1 - i]);
  }
  return bits;
}

double toNumber(std::uint64_t bits, const NpyHeader& header) {
  if (header.kind == 'f' && header.bytes == 8) return std::bit_cast<double>(bits);
  if (header.kind == 'f') return static_cast<double>(std::bit_cast<float>(static_cast<std::uint32_t>(bits)));
  if (header.kind == 'u') return static_cast<double>(bits);
  return header.bytes == 2 ? static_cast<std::int16_t>(bits) : static_cast<std::int32_t>(bits);
}

// A column of a 2-D array, by its number from 1.
class ArrayFile {
 public:
  ArrayFile(Parameters& parameters, const SourceFormat& format, std::string name, ByteStream& stream)
      : parameters_(parameters),
        format_(format),
        name_(std::move(name)),
        stream_(stream),
        scale_(readScale(parameters)),
        header_(readNpyHeader(parameters.source(), stream)) {}

  LoadedWaveform load(const std::string& column) {
    decideUnit();
    const Pick pick = choose(column);
    if (!scale_.resample) checkFits(parameters_.source(), pick.count, format_.maxSamples);
    SampleScaler scaler(parameters_.source(), format_, scale_);
    readElements(pick, scaler);
    return scaler.finish(describe(column));
  }

 private:
  void decideUnit() {
    if (header_.kind == 'f' || scale_.isSaid) return;
    const bool areSamples = header_.kind == 'i' && header_.bytes * 8 == format_.sampleWidthBits;
    if (!areSamples) {
      parameters_.refuse("holds " + header_.typeName() + ", and what of it is full scale is not said",
                         "Say full-scale=VALUE, normalise, or codes if they are " +
                             std::to_string(format_.sampleWidthBits) + "-bit samples already.");
    }
    scale_.areCodes = true;
  }

  Pick choose(const std::string& column) const {
    if (header_.shape.size() == 1 && column.empty()) return {0, 1, header_.shape[0]};
    if (header_.shape.size() == 1) parameters_.refuse("has no columns: it is an array of one dimension");
    if (header_.shape.size() != 2) refuseShape("Arrays of one or two dimensions are taken.");
    const std::uint64_t rows = header_.shape[0];
    const std::uint64_t columns = header_.shape[1];
    const std::uint64_t chosen = chooseColumn(column, columns);
    return header_.isFortranOrder ? Pick{chosen * rows, 1, rows} : Pick{chosen, columns, rows};
  }

  std::uint64_t chooseColumn(const std::string& column, std::uint64_t columns) const {
    const std::string help = "Choose a column, from 1 to " + formatCount(columns) + ": column=NUMBER";
    if (column.empty() && columns != 1) refuseShape(help);
    const auto number = column.empty() ? 1 : parseInteger<std::uint64_t>(column).value_or(0);
    if (number >= 1 && number <= columns) return number - 1;
    parameters_.refuse("there is no column \"" + column + "\" in " + header_.shapeText() + " numbers", help);
  }

  [[noreturn]] void refuseShape(const std::string& help) const {
    parameters_.refuse("is " + header_.shapeText() + ", not one column of samples", help);
  }

  // Reads to the very end, so that an archive checks its sum.
  void readElements(const Pick& pick, SampleScaler& scaler) {
    std::string block(kBlockBytes, '\0');
    std::uint64_t next = pick.first;
    std::uint64_t left = pick.count;
    std::uint64_t index = 0;
    std::uint64_t allBytes = header_.headerBytes;
    while (const std::size_t bytes = stream_.read(block.data(), block.size())) {
      allBytes += bytes;
      const std::uint64_t end = index + bytes / header_.bytes;
      for (; left > 0 && next < end; next += pick.step, --left) {
        scaler.add(toNumber(readBits(block.data() + (next - index) * header_.bytes, header_), header_));
      }
      index = end;
    }
    if (allBytes != stream_.size()) parameters_.refuse("is not as long as it says");
  }

  std::string describe(const std::string& column) const {
    std::string text = name_.empty() ? "" : "array \"" + name_ + "\", ";
    if (header_.shape.size() == 2)
      text += "column " + (column.empty() ? "1" : column) + " of " + header_.shapeText() + ", ";
    return text + header_.typeName() + (scale_.areCodes ? " as sample codes" : "");
  }

  Parameters& parameters_;
  const SourceFormat& format_;
  std::string name_;  // within an archive
  ByteStream& stream_;
  Scale scale_;
  NpyHeader header_;
};

std::string withoutEnding(std::string name) {
  if (name.ends_with(kEnding)) name.resize(name.size() - kEnding.size());
  return name;
}

std::size_t findMember(const Parameters& parameters, const std::vector<std::string>& names, const std::string& member) {
  if (names.empty()) parameters.refuse("is an archive without files");
  if (member.empty() && names.size() == 1) return 0;
  const std::string help = "It holds " + join(names) + ".";
  if (member.empty()) parameters.refuse("holds several arrays, and which is meant is not said", help);
  const auto found = std::ranges::find(names, withoutEnding(member));
  if (found != names.end()) return static_cast<std::size_t>(found - names.begin());
  const std::string hint = tellSimilar("array", member, names);
  parameters.refuse("there is no array \"" + member + "\"", hint.empty() ? help : hint);
}

}  // namespace

LoadedWaveform loadNpyFile(const std::string& path, Parameters& parameters, const SourceFormat& format) {
  const std::string column = parameters.choice("column");
  const auto stream = openFile(parameters.source(), path);
  ArrayFile array(parameters, format, "", *stream);
  parameters.checkAllUsed();
  return array.load(column);
}

LoadedWaveform loadNpzFile(const std::string& path, Parameters& parameters, const SourceFormat& format) {
  const std::string member = parameters.choice("member");
  const std::string column = parameters.text("column").value_or("");
  const Archive archive(parameters.source(), path);
  std::vector<std::string> names = archive.names();
  std::ranges::transform(names, names.begin(), withoutEnding);
  const std::size_t index = findMember(parameters, names, member);
  const auto stream = archive.open(index);
  ArrayFile array(parameters, format, names[index], *stream);
  parameters.checkAllUsed();
  return array.load(column);
}

}  // namespace tools
