#include "tools/page/Page.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>
#include <nlohmann/json.hpp>
#include <vector>

#include "tools/page/base64.h"
#include "tools/page/program.h"
#include "tools/text/characters.h"
#include "tools/timeline/WaveformSummary.h"

namespace tools {
namespace {

using nlohmann::ordered_json;

// `text` as a JSON string in which no `<` stands, so that nothing in it can end the element that holds it.
std::string quote(std::string_view text) {
  const std::string quoted = ordered_json(toValidUtf8(text)).dump();
  std::string escaped;
  for (const char c : quoted) c == '<' ? escaped += "\\u003c" : escaped += c;
  return escaped;
}

std::string escapeForHtml(std::string_view text) {
  std::string escaped;
  for (const char c : toPrintable(text)) {
    switch (c) {
      case '<':
        escaped += "&lt;";
        break;
      case '&':
        escaped += "&amp;";
        break;
      default:
        escaped += c;
    }
  }
  return escaped;
}

// Writes one JSON object. What may pass 2^53 is a string, since readers take numbers for doubles.
class DataWriter {
 public:
  explicit DataWriter(const PageSink& sink) : sink_(sink) {}

  void member(std::string_view key, std::string_view json) {
    sink_(isFirst_ ? "\"" : ",\"");
    isFirst_ = false;
    sink_(key);
    sink_("\":");
    sink_(json);
  }
  void open(std::string_view key) {
    key.empty() ? sink_("{") : member(key, "{");
    isFirst_ = true;
  }
  void close() {
    sink_("}");
    isFirst_ = false;
  }

  // An array with what `valueOf` makes of each item.
  template <typename Items, typename ValueOf>
  void column(std::string_view key, const Items& items, ValueOf valueOf) {
    std::string json = "[";
    for (const auto& item : items) {
      if (json.size() > 1) json += ',';
      append(json, valueOf(item));
    }
    member(key, json + "]");
  }

 private:
  static void append(std::string& json, std::uint64_t value) { json += '"' + std::to_string(value) + '"'; }
  static void append(std::string& json, std::int64_t value) { json += std::to_string(value); }

  const PageSink& sink_;
  bool isFirst_ = true;
};

constexpr std::int64_t small(std::uint64_t value) { return static_cast<std::int64_t>(value); }

// What is played of a waveform's samples that are written as `bucket` samples each.
struct Buckets {
  std::uint64_t size = 1;

  bool isWhole() const { return size == 1; }
  std::uint64_t countOf(const SampleSpan& samples) const { return (samples.size() + size - 1) / size; }
};

std::uint64_t bytesOf(const PageContent& content, Buckets buckets) {
  std::uint64_t count = 0;
  for (const SampleSpan& waveform : content.waveforms) count += buckets.countOf(waveform);
  return count * (content.sampleWidthBits / 8) * (buckets.isWhole() ? 1 : 2);
}

// The smallest that keep the page in bounds; a waveform has at least one.
Buckets chooseBuckets(const PageContent& content) {
  const std::uint64_t most = std::max<std::uint64_t>(content.mostSampleBytes, content.waveforms.size() * 8);
  Buckets buckets;
  while (bytesOf(content, buckets) > most) buckets.size *= 2;
  return buckets;
}

// As the page reads them, on whatever machine it was written.
void pushLittleEndian(std::vector<std::byte>& bytes, std::int32_t level, unsigned widthBits) {
  for (unsigned shift = 0; shift < widthBits; shift += 8) {
    bytes.push_back(static_cast<std::byte>(static_cast<std::uint32_t>(level) >> shift & 0xFF));
  }
}

std::vector<std::byte> wholeBytes(const SampleSpan& samples, unsigned widthBits) {
  std::vector<std::byte> bytes;
  bytes.reserve(samples.size() * widthBits / 8);
  for (std::size_t index = 0; index < samples.size(); ++index) pushLittleEndian(bytes, samples[index], widthBits);
  return bytes;
}

std::vector<std::byte> envelopeBytes(const SampleSpan& samples, unsigned widthBits, Buckets buckets) {
  const WaveformSummary summary(samples);
  std::vector<std::byte> bytes;
  for (std::uint64_t begin = 0; begin < samples.size(); begin += buckets.size) {
    const LevelRange range = summary.over(begin, std::min<std::uint64_t>(begin + buckets.size, samples.size()));
    pushLittleEndian(bytes, range.low, widthBits);
    pushLittleEndian(bytes, range.high, widthBits);
  }
  return bytes;
}

class PageData {
 public:
  PageData(const PageSink& sink, const PageContent& content)
      : sink_(sink), content_(content), writer_(sink), buckets_(chooseBuckets(content)) {}

  PageSamples write() {
    writer_.open({});
    writer_.member("title", quote(content_.title));
    writer_.member("script", quote(content_.script));
    writer_.member("width", std::to_string(content_.sampleWidthBits));
    writeRate();
    writeLength();
    writeSteps();
    writeBlocks();
    writeStretches();
    writeTriggers();
    writeWaveforms();
    writer_.close();
    return buckets_.isWhole() ? PageSamples::kWhole : PageSamples::kEnveloped;
  }

 private:
  const StraightPlay& play() const { return content_.timeline.play(); }
  Place placeOf(std::uint32_t address) const {
    return address < content_.places.size() ? content_.places[address] : Place{};
  }

  // Every double is a whole number times a power of two.
  void writeRate() {
    int exponent = 0;
    double mantissa = std::frexp(content_.sampleRateHz, &exponent);
    while (mantissa != std::floor(mantissa)) {
      mantissa *= 2;
      --exponent;
    }
    writer_.open("rate");
    writer_.member("mantissa", quote(std::to_string(static_cast<std::uint64_t>(mantissa))));
    writer_.member("exponent", std::to_string(exponent));
    writer_.close();
  }

  void writeLength() {
    static constexpr const char* kKinds[] = {"exact", "tooLong", "endless", "waiting"};
    const PlayLength& length = content_.timeline.length();
    writer_.open("length");
    writer_.member("kind", quote(kKinds[static_cast<std::size_t>(length.kind())]));
    if (length.samples()) writer_.member("samples", quote(std::to_string(*length.samples())));
    if (length.kind() == PlayLength::Kind::kWaiting) {
      writer_.member("trigger", std::to_string(length.trigger()));
      writer_.member("line", std::to_string(placeOf(length.address()).line));
      writer_.member("since", quote(std::to_string(length.waitingSince())));
    }
    writer_.close();
  }

  void writeSteps() {
    const auto& steps = play().steps();
    writer_.open("steps");
    writer_.column("samples", steps, [](const Step& step) { return step.sampleCount; });
    writer_.column("first", steps, [](const Step& step) { return small(step.firstInWaveform); });
    writer_.column("waveform", steps, [](const Step& step) {
      return step.waveform == Step::kNone ? std::int64_t{-1} : small(step.waveform);
    });
    writer_.column("address", steps, [](const Step& step) { return small(step.address); });
    writer_.column("markers", steps, [](const Step& step) { return small(step.markerMask); });
    writer_.column("offset", steps, [](const Step& step) { return small(step.markerOffset); });
    writer_.column("trigger", steps, [](const Step& step) { return small(step.trigger); });
    writer_.column("line", steps, [this](const Step& step) { return small(placeOf(step.address).line); });
    writer_.column("column", steps, [this](const Step& step) { return small(placeOf(step.address).position); });
    if (!buckets_.isWhole()) writer_.column("last", steps, [this](const Step& step) { return lastLevelOf(step); });
    writer_.close();
  }

  // Waits hold it, and no envelope tells it.
  std::int64_t lastLevelOf(const Step& step) const {
    if (step.waveform == Step::kNone) return 0;
    return content_.waveforms[step.waveform][step.firstInWaveform + step.sampleCount - 1];
  }

  void writeBlocks() {
    const auto& blocks = play().blocks();
    writer_.open("blocks");
    writer_.column("passes", blocks, [](const Block& block) { return block.passes; });
    writer_.column("end", blocks, [](const Block& block) { return small(block.endStep); });
    writer_.column("kind", blocks, [](const Block& block) { return static_cast<std::int64_t>(block.kind); });
    writer_.column("trigger", blocks, [](const Block& block) { return small(block.trigger); });
    writer_.column("line", blocks, [this](const Block& block) { return small(placeOf(block.address).line); });
    writer_.close();
  }

  void writeStretches() {
    const auto stretches = content_.timeline.stretches();
    writer_.open("stretches");
    writer_.column("first", stretches, [](const Stretch& stretch) { return stretch.firstSample; });
    writer_.column("samples", stretches, [](const Stretch& stretch) { return stretch.sampleCount; });
    writer_.column("start", stretches, [](const Stretch& stretch) { return stretch.start; });
    writer_.column("period", stretches, [](const Stretch& stretch) { return stretch.period; });
    writer_.column("round", stretches, [](const Stretch& stretch) { return stretch.round; });
    writer_.column("pass", stretches, [](const Stretch& stretch) { return stretch.pass; });
    writer_.column("repeats", stretches,
                   [](const Stretch& stretch) { return static_cast<std::int64_t>(stretch.repeats); });
    writer_.close();
  }

  void writeTriggers() {
    std::vector<RaisedTrigger> raised(content_.raised.begin(), content_.raised.end());
    std::ranges::stable_sort(raised, {}, &RaisedTrigger::sample);
    writer_.open("triggers");
    writer_.column("sample", raised, [](const RaisedTrigger& trigger) { return trigger.sample; });
    writer_.column("trigger", raised, [](const RaisedTrigger& trigger) { return small(trigger.trigger); });
    writer_.close();
  }

  void writeWaveforms() {
    writer_.member("waveforms", "[");
    for (std::size_t index = 0; index < content_.waveforms.size(); ++index) {
      if (index > 0) sink_(",");
      writeWaveform(play().waveforms()[index], content_.waveforms[index]);
    }
    sink_("]");
  }

  void writeWaveform(const std::string& name, const SampleSpan& samples) {
    writer_.open({});
    writer_.member("name", quote(name));
    if (!buckets_.isWhole()) writer_.member("bucket", std::to_string(buckets_.size));
    writer_.member("data", "\"");
    const unsigned width = content_.sampleWidthBits;
    sink_(encodeBase64(buckets_.isWhole() ? wholeBytes(samples, width) : envelopeBytes(samples, width, buckets_)));
    sink_("\"");
    writer_.close();
  }

  const PageSink& sink_;
  const PageContent& content_;
  DataWriter writer_;
  Buckets buckets_;
};

// Takes what stands in front of `mark` off the frame.
std::string_view frameUpTo(std::string_view mark, std::string_view& frame) {
  const std::size_t at = frame.find(mark);
  const std::string_view before = frame.substr(0, at);
  frame.remove_prefix(at + mark.size());
  return before;
}

}  // namespace

PageSamples writePageData(const PageSink& sink, const PageContent& content) { return PageData(sink, content).write(); }

PageSamples writePage(const PageSink& sink, const PageContent& content) {
  std::string_view frame = kPageFrame;
  sink(frameUpTo("@TITLE@", frame));
  sink(escapeForHtml(content.title));
  sink(frameUpTo("@STYLE@", frame));
  sink(kPageStyle);
  sink(frameUpTo("@DATA@", frame));
  const PageSamples samples = writePageData(sink, content);
  sink(frameUpTo("@PROGRAM@", frame));
  sink(kPageProgram);
  sink(frame);
  return samples;
}

}  // namespace tools
