#include "tests/tools/sourceOutcome.h"

#include "tools/text/Refusal.h"
#include "tools/text/words.h"

namespace tools {
namespace {

std::vector<std::int32_t> values(const SampleBuffer& samples) {
  std::vector<std::int32_t> all;
  for (std::size_t i = 0; i < samples.size(); ++i) all.push_back(samples[i]);
  return all;
}

}  // namespace

std::vector<std::int32_t> load(const std::string& source, const SourceFormat& format) {
  return values(loadSource(source, format).samples);
}

std::string refusal(const std::string& source, const SourceFormat& format) {
  try {
    loadSource(source, format);
    return "accepted";
  } catch (const Refusal& error) {
    return std::string(error.what()) + " / " + error.help;
  }
}

std::string unescape(std::string_view text) {
  std::string bytes;
  for (std::size_t i = 0; i < text.size(); ++i) {
    if (text[i] != '\\') {
      bytes += text[i];
    } else if (text[++i] == 'x') {
      bytes += static_cast<char>(*parseInteger<int>(text.substr(i + 1, 2), 16));
      i += 2;
    } else {
      bytes += text[i] == 'n' ? '\n' : text[i] == 'r' ? '\r' : '\t';
    }
  }
  return bytes;
}

std::string unescapeArray(const std::string& text) {
  const std::size_t end = text.find(" | ");
  if (!text.starts_with('v') || end == std::string::npos) return unescape(text);
  const char version = static_cast<char>(text[1] - '0');
  const std::string header = text.substr(3, end - 3);
  const std::string length = {static_cast<char>(header.size()), 0};
  return "\x93NUMPY" + std::string{version, 0} + length + std::string(version == 1 ? 0 : 2, '\0') + header +
         unescape(text.substr(end + 3));
}

std::string outcome(const std::string& source, const std::string& path) {
  std::string text;
  try {
    const LoadedWaveform waveform = loadSource(source, k16);
    text = join(waveform.notes, "; ") + " =";
    for (std::size_t i = 0; i < waveform.samples.size(); ++i) text += " " + std::to_string(waveform.samples[i]);
    if (waveform.clippedSamples > 0) text += ", clipped " + std::to_string(waveform.clippedSamples);
  } catch (const Refusal& refusal) {
    text = std::string(refusal.what()) + (refusal.help.empty() ? "" : " / ") + refusal.help;
  }
  for (std::size_t i = text.find(path); i != std::string::npos; i = text.find(path))
    text.replace(i, path.size(), "FILE");
  return text;
}

}  // namespace tools
