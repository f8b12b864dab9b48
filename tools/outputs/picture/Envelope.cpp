#include "tools/outputs/picture/Envelope.h"

#include <algorithm>

namespace tools {
namespace {

void widen(EnvelopeColumn& column, EnvelopeColumn by) {
  column = {std::min(column.least, by.least), std::max(column.greatest, by.greatest)};
}

}  // namespace

Envelope::Envelope(std::uint64_t sampleCount, std::size_t columns) : sampleCount_(sampleCount), columnCount_(columns) {
  isReduced() ? columns_.reserve(columns) : samples_.reserve(sampleCount);
}

// In parts, since the product may be too large.
std::uint64_t Envelope::endOf(std::size_t column) const {
  const std::uint64_t next = column + 1;
  return sampleCount_ / columnCount_ * next + sampleCount_ % columnCount_ * next / columnCount_;
}

void Envelope::take(const SampleSpan& samples) {
  samples.visit([this](const auto& values) { reduce(values); });
}

// Column by column; the first sample of each takes in the one before it.
template <typename Samples>
void Envelope::reduce(const Samples& samples) {
  if (!isReduced()) samples_.insert(samples_.end(), samples.begin(), samples.end());
  for (auto rest = samples; !rest.empty();) {
    if (taken_ == 0) extremes_ = {rest.front(), rest.front()};
    if (isReduced() && taken_ == columnEnd_) {
      const std::int32_t joint = taken_ == 0 ? rest.front() : last_;
      columnEnd_ = endOf(columns_.size());
      columns_.push_back({joint, joint});
    }
    const std::uint64_t room = isReduced() ? columnEnd_ - taken_ : rest.size();
    const auto part = rest.first(static_cast<std::size_t>(std::min<std::uint64_t>(room, rest.size())));
    const auto [least, greatest] = std::minmax_element(part.begin(), part.end());
    const EnvelopeColumn found = {*least, *greatest};
    widen(extremes_, found);
    if (isReduced()) widen(columns_.back(), found);
    last_ = part.back();
    taken_ += part.size();
    rest = rest.subspan(part.size());
  }
}

}  // namespace tools
