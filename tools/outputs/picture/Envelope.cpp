#include "tools/outputs/picture/Envelope.h"

#include <algorithm>

namespace tools {
namespace {

template <typename Iterator>
EnvelopeColumn extremes(Iterator first, Iterator last) {
  const auto [least, greatest] = std::minmax_element(first, last);
  return {*least, *greatest};
}

}  // namespace

std::vector<EnvelopeColumn> makeEnvelope(const SampleBuffer& samples, std::size_t columns) {
  return samples.visit([columns](const auto& values) {
    std::vector<EnvelopeColumn> envelope(columns);
    const auto boundary = [&](std::size_t column) {
      return values.begin() + static_cast<std::ptrdiff_t>(column * values.size() / columns);
    };
    for (std::size_t column = 0; column < columns; ++column) {
      const auto first = boundary(column);
      envelope[column] = extremes(column == 0 ? first : first - 1, boundary(column + 1));
    }
    return envelope;
  });
}

EnvelopeColumn findExtremes(const SampleBuffer& samples) {
  if (samples.empty()) return {};
  return samples.visit([](const auto& values) { return extremes(values.begin(), values.end()); });
}

}  // namespace tools
