#include "tools/sources/Shape.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <numbers>
#include <random>

#include "tools/sources/Parameters.h"
#include "tools/sources/SampleScaler.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr std::uint64_t kDefaultLength = 1000;

// The parameters of one shape.
class ShapeArguments : public Parameters {
 public:
  ShapeArguments(Parameters parameters, double sampleRateHz)
      : Parameters(std::move(parameters)), sampleRateHz_(sampleRateHz) {}

  std::uint64_t sampleCount(const std::string& key, std::uint64_t otherwise);
  double frequencyHz(const std::string& key, double otherwise);
  double turns(const std::string& key);  // an angle: degrees, or with "deg" or "rad" behind it; 1 is a whole turn
  double sampleRateHz() const { return sampleRateHz_; }

 private:
  template <typename Value>
  Value require(const std::string& key, const std::optional<Value>& value, const char* what) const;

  double sampleRateHz_;
};

template <typename Value>
Value ShapeArguments::require(const std::string& key, const std::optional<Value>& value, const char* what) const {
  if (!value) refuseValue(key, what);
  return *value;
}

std::uint64_t ShapeArguments::sampleCount(const std::string& key, std::uint64_t otherwise) {
  const auto given = text(key);
  if (!given) return otherwise;
  return require(key, parseSampleCount(*given, sampleRateHz_), "a number of samples or a time");
}

double ShapeArguments::frequencyHz(const std::string& key, double otherwise) {
  const auto given = text(key);
  return given ? require(key, parseQuantity(*given, "Hz"), "a frequency") : otherwise;
}

double ShapeArguments::turns(const std::string& key) {
  const auto given = text(key);
  if (!given) return 0;
  if (given->ends_with("rad")) {
    return require(key, parseQuantity(*given, "rad", false), "an angle") / (2 * std::numbers::pi);
  }
  return require(key, parseQuantity(*given, "deg", false), "an angle") / 360;
}

double fractionOf(double x) { return x - std::floor(x); }

// The sample of each index, as a fraction of full scale before amplitude and offset.
using SampleAt = std::function<double(double index)>;
// Reads the parameters of its own and returns the samples of `length`.
using MakeSamples = SampleAt (*)(ShapeArguments& arguments, double length);

// The part of the current cycle that has passed, 0 to 1, of a periodic shape.
std::function<double(double)> readCycle(ShapeArguments& arguments, double length) {
  if (arguments.has("cycles") && arguments.has("frequency")) arguments.refuse("give cycles or frequency, not both");
  const double cycles = arguments.number("cycles", 1);
  const double frequencyHz = arguments.frequencyHz("frequency", arguments.sampleRateHz() * cycles / length);
  const double turns = arguments.turns("phase");
  if (!arguments.has("frequency")) return [=](double i) { return fractionOf(i * cycles / length + turns); };
  return [=, rate = arguments.sampleRateHz()](double i) { return fractionOf(i * frequencyHz / rate + turns); };
}

SampleAt makeSine(ShapeArguments& arguments, double length) {
  return [cycle = readCycle(arguments, length)](double i) { return std::sin(2 * std::numbers::pi * cycle(i)); };
}

SampleAt makeSquare(ShapeArguments& arguments, double length) {
  const double duty = arguments.number("duty", 0.5);
  return [cycle = readCycle(arguments, length), duty](double i) { return cycle(i) < duty ? 1.0 : -1.0; };
}

SampleAt makeRamp(ShapeArguments& arguments, double length) {
  return [cycle = readCycle(arguments, length)](double i) { return 2 * cycle(i) - 1; };
}

SampleAt makeTriangle(ShapeArguments& arguments, double length) {
  return
      [cycle = readCycle(arguments, length)](double i) { return 1 - 4 * std::abs(fractionOf(cycle(i) + 0.25) - 0.5); };
}

SampleAt makeChirp(ShapeArguments& arguments, double length) {
  const double rate = arguments.sampleRateHz();
  const double from = arguments.frequencyHz("from", 0) / rate;  // cycles per sample
  const double to = arguments.frequencyHz("to", rate / 4) / rate;
  const double turns = arguments.turns("phase");
  return [=](double i) {
    return std::sin(2 * std::numbers::pi * fractionOf(i * (from + (to - from) * i / (2 * length)) + turns));
  };
}

SampleAt makeGauss(ShapeArguments& arguments, double length) {
  const auto wanted = arguments.sampleCount("sigma", 0);
  const double sigma = wanted > 0 ? static_cast<double>(wanted) : length / 8;
  const double centre = (length - 1) / 2;
  return [=](double i) { return std::exp(-0.5 * (i - centre) * (i - centre) / (sigma * sigma)); };
}

// Uniform noise. Each sample takes one output of a 64-bit Mersenne twister seeded with `seed`; its upper 53 bits,
// over 2^53, times 2, less 1, are the value.
SampleAt makeNoise(ShapeArguments& arguments, double) {
  std::mt19937_64 bits(arguments.integer<std::uint64_t>("seed", 1));
  return [bits](double) mutable { return std::ldexp(static_cast<double>(bits() >> 11), -52) - 1; };
}

SampleAt makeDc(ShapeArguments&, double) {
  return [](double) { return 1.0; };
}

struct ShapeRow {
  std::string_view name;
  MakeSamples make;
  std::string_view help;
};
constexpr ShapeRow kShapes[] = {
    {"sine", makeSine, "cycles or frequency, phase"},
    {"square", makeSquare, "cycles or frequency, phase, duty=0.5"},
    {"ramp", makeRamp, "cycles or frequency, phase: rises from -1 to 1"},
    {"triangle", makeTriangle, "cycles or frequency, phase"},
    {"chirp", makeChirp, "from=0Hz, to=a quarter of the sample rate, phase"},
    {"gauss", makeGauss, "sigma=an eighth of the length (samples or time)"},
    {"noise", makeNoise, "seed=1: uniform noise"},
    {"dc", makeDc, "a constant, of the level amplitude + offset"},
};

const ShapeRow* findShape(std::string_view name) {
  const auto found = std::find_if(std::begin(kShapes), std::end(kShapes),
                                  [name](const ShapeRow& shape) { return shape.name == name; });
  return found == std::end(kShapes) ? nullptr : found;
}

}  // namespace

bool isShapeName(std::string_view name) { return findShape(name) != nullptr; }

std::vector<std::string> shapeNames() {
  std::vector<std::string> names;
  for (const ShapeRow& shape : kShapes) names.emplace_back(shape.name);
  return names;
}

std::string shapeHelp() {
  std::string text = "Shapes, each with length=1000 (samples or a time), amplitude=1 and offset=0 (of full scale):\n";
  for (const ShapeRow& shape : kShapes) {
    text += "  " + std::string(shape.name) + std::string(10 - shape.name.size(), ' ') + std::string(shape.help) + "\n";
  }
  return text;
}

LoadedWaveform makeShape(const std::string& source, std::string_view name, std::string_view parameters,
                         const SourceFormat& format) {
  ShapeArguments arguments(parseShapeParameters(source, parameters), format.sampleRateHz);
  const std::uint64_t length = arguments.sampleCount("length", kDefaultLength);
  const double amplitude = arguments.number("amplitude", 1);
  const double offset = arguments.number("offset", 0);
  const SampleAt sampleAt = findShape(name)->make(arguments, static_cast<double>(length));
  arguments.checkAllUsed();
  checkFits(source, length, format.maxSamples);
  SampleScaler scaler(source, format);
  for (std::uint64_t i = 0; i < length; ++i) {
    scaler.add(amplitude * sampleAt(static_cast<double>(i)) + offset);
  }
  return scaler.finish();
}

}  // namespace tools
