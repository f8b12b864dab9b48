#include "tools/sources/SampleFile.h"

#include <array>
#include <charconv>
#include <fstream>
#include <limits>

#include "tools/sources/SampleScaler.h"
#include "tools/text/Refusal.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr std::string_view kBlanks = " \t\r";
constexpr std::string_view kCodesSuffix = ",codes";

std::string_view trim(std::string_view text) {
  const std::size_t first = text.find_first_not_of(kBlanks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

// Fields of one line: trimmed, without quotes.
std::vector<std::string> splitFields(std::string_view line, char separator) {
  std::vector<std::string> fields(1);
  bool quoted = false;
  for (const char c : line) {
    if (c == '"') {
      quoted = !quoted;
      continue;
    }
    if (c == separator && !quoted) {
      fields.back() = trim(fields.back());
      fields.emplace_back();
    } else {
      fields.back() += c;
    }
  }
  fields.back() = trim(fields.back());
  return fields;
}

char findSeparator(std::string_view line) {
  for (const char separator : {'\t', ';', ','}) {
    if (line.find(separator) != std::string_view::npos) return separator;
  }
  return ',';
}

// As parseNumber, but NaN and infinities are read, so that the scaler can name the sample.
std::optional<double> parseAnyNumber(std::string_view text) {
  if (text.starts_with('+')) text.remove_prefix(1);
  double value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  if (error == std::errc::result_out_of_range) {
    const bool isTiny = text.find("e-") != std::string_view::npos || text.find("E-") != std::string_view::npos;
    return isTiny ? 0 : std::numeric_limits<double>::infinity();
  }
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return value;
}

class CsvReader {
 public:
  CsvReader(const std::string& source, const std::string& path) : source_(source), stream_(path, std::ios::binary) {
    if (!stream_) throw Refusal(source + ": cannot be opened for reading");
  }

  // The next line that is neither blank nor a comment, split; false at the end.
  bool next(std::vector<std::string>& fields) {
    std::string line;
    while (std::getline(stream_, line)) {
      ++lineNumber_;
      const std::string_view text = trim(line);
      if (text.empty() || text.front() == '#') continue;
      if (separator_ == 0) separator_ = findSeparator(text);
      fields = splitFields(line, separator_);
      return true;
    }
    if (stream_.bad()) throw Refusal(source_ + ": cannot be read");
    return false;
  }

  std::uint64_t lineNumber() const { return lineNumber_; }

 private:
  const std::string& source_;
  std::ifstream stream_;
  std::uint64_t lineNumber_ = 0;
  char separator_ = 0;
};

std::size_t findColumn(const std::string& source, const std::string& selector, const std::vector<std::string>& header) {
  if (selector.empty()) return 0;
  for (std::size_t column = 0; column < header.size(); ++column) {
    if (header[column] == selector) return column;
  }
  const auto number = parseInteger<std::size_t>(selector);
  if (number && *number >= 1 && *number <= header.size()) return *number - 1;
  const std::string hint = didYouMean(selector, header);
  throw Refusal(source + ": there is no column \"" + selector + "\"",
                hint.empty() ? "The first line has " + std::to_string(header.size()) + " columns." : hint);
}

double readField(const std::string& source, const CsvReader& reader, const std::vector<std::string>& fields,
                 std::size_t column) {
  const std::string place = source + ": line " + std::to_string(reader.lineNumber());
  if (column >= fields.size()) throw Refusal(place + " has no column " + std::to_string(column + 1));
  const auto value = parseAnyNumber(fields[column]);
  if (!value) throw Refusal(place + ": \"" + fields[column] + "\" is not a number");
  return *value;
}

}  // namespace

LoadedWaveform loadCsvColumn(const std::string& source, const std::string& path, std::string selector,
                             const SourceFormat& format) {
  const bool areCodes = selector.ends_with(kCodesSuffix);
  if (areCodes) selector.resize(selector.size() - kCodesSuffix.size());
  SampleScaler scaler(source, format);
  CsvReader reader(source, path);
  std::vector<std::string> fields;
  if (!reader.next(fields)) return scaler.finish();
  const std::size_t column = findColumn(source, selector, fields);
  bool isHeader = !parseAnyNumber(fields[column]);
  do {
    if (!isHeader) {
      const double value = readField(source, reader, fields, column);
      areCodes ? scaler.addCode(value) : scaler.addFraction(value);
    }
    isHeader = false;
  } while (reader.next(fields));
  return scaler.finish();
}

LoadedWaveform loadRawSamples(const std::string& source, const std::string& path, const SourceFormat& format) {
  std::ifstream stream(path, std::ios::binary);
  if (!stream) throw Refusal(source + ": cannot be opened for reading");
  const std::size_t bytesPerSample = format.sampleWidthBits / 8;
  std::array<unsigned char, 65536> block;
  SampleScaler scaler(source, format);
  while (stream) {
    stream.read(reinterpret_cast<char*>(block.data()), block.size());
    const auto count = static_cast<std::size_t>(stream.gcount());
    if (count % bytesPerSample != 0) {
      throw Refusal(source + ": is not a whole number of " + std::to_string(format.sampleWidthBits) + "-bit samples",
                    "Raw samples have the generator's width.", Setting::kSampleWidth);
    }
    for (std::size_t i = 0; i < count; i += bytesPerSample) {
      std::uint32_t bits = 0;
      for (std::size_t byte = 0; byte < bytesPerSample; ++byte) bits |= std::uint32_t{block[i + byte]} << (8 * byte);
      scaler.addCode(bytesPerSample == 2 ? static_cast<std::int16_t>(bits) : static_cast<std::int32_t>(bits));
    }
  }
  if (stream.bad()) throw Refusal(source + ": cannot be read");
  return scaler.finish();
}

}  // namespace tools
