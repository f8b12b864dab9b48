#include "tools/outputs/picture/Envelope.h"

#include <algorithm>

namespace tools {
void widen(EnvelopeColumn& column, EnvelopeColumn by) {
  column = {std::min(column.least, by.least), std::max(column.greatest, by.greatest)};
}

// In parts, since the product may be too large.
std::uint64_t endOfColumn(std::size_t column, std::uint64_t sampleCount, std::size_t columns) {
  const std::uint64_t next = column + 1;
  return sampleCount / columns * next + sampleCount % columns * next / columns;
}

Envelope::Envelope(std::uint64_t sampleCount, std::size_t columns) : sampleCount_(sampleCount), columnCount_(columns) {
  levels_.isReduced = sampleCount > columns;
  levels_.isReduced ? levels_.columns.reserve(columns) : levels_.samples.reserve(sampleCount);
}

void Envelope::take(const SampleSpan& samples) {
  samples.visit([this](const auto& values) { reduce(values); });
}

// Column by column; the first sample of each takes in the one before it.
template <typename Samples>
void Envelope::reduce(const Samples& samples) {
  if (!levels_.isReduced) levels_.samples.insert(levels_.samples.end(), samples.begin(), samples.end());
  for (auto rest = samples; !rest.empty();) {
    if (taken_ == 0) levels_.extremes = {rest.front(), rest.front()};
    if (levels_.isReduced && taken_ == columnEnd_) {
      const std::int32_t joint = taken_ == 0 ? rest.front() : last_;
      columnEnd_ = endOfColumn(levels_.columns.size(), sampleCount_, columnCount_);
      levels_.columns.push_back({joint, joint});
    }
    const std::uint64_t room = levels_.isReduced ? columnEnd_ - taken_ : rest.size();
    const auto part = rest.first(static_cast<std::size_t>(std::min<std::uint64_t>(room, rest.size())));
    const auto [least, greatest] = std::minmax_element(part.begin(), part.end());
    const EnvelopeColumn found = {*least, *greatest};
    widen(levels_.extremes, found);
    if (levels_.isReduced) widen(levels_.columns.back(), found);
    last_ = part.back();
    taken_ += part.size();
    rest = rest.subspan(part.size());
  }
}

}  // namespace tools
