#include "tools/sources/RawFile.h"

#include <array>
#include <fstream>

#include "platform/system/paths.h"
#include "tools/sources/SampleScaler.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

// Raw samples are codes unless normalising makes that no matter.
Scale readRawScale(Parameters& parameters) {
  Scale scale = readScale(parameters);
  parameters.checkAllUsed();
  if (parameters.has("full-scale")) parameters.refuse("raw samples are codes: full-scale does not go with them");
  scale.areCodes = !scale.normalise;
  return scale;
}

}  // namespace

LoadedWaveform loadRawSamples(const std::string& path, Parameters& parameters, const SourceFormat& format) {
  const std::string& source = parameters.source();
  std::ifstream stream(platform::toPath(path), std::ios::binary);
  if (!stream) throw Refusal(source + ": cannot be opened for reading");
  const std::size_t bytesPerSample = format.sampleWidthBits / 8;
  std::array<unsigned char, 65536> block;
  SampleScaler scaler(source, format, readRawScale(parameters));
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
      scaler.add(bytesPerSample == 2 ? static_cast<std::int16_t>(bits) : static_cast<std::int32_t>(bits));
    }
  }
  if (stream.bad()) throw Refusal(source + ": cannot be read");
  return scaler.finish();
}

}  // namespace tools
