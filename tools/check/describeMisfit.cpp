#include "tools/check/describeMisfit.h"

#include <algorithm>

#include "kterr/usageTags.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"

namespace tools {
namespace {

using Kind = MessageKind;

// The value of a tag; 0 where there is none.
std::int64_t numberOf(const ElaborationRecord& record, std::string_view tag) {
  const auto found = std::ranges::find(record.values, tag, &ElaborationRecord::Value::tag);
  return found == record.values.end() ? 0 : found->number.value_or(0);
}

std::string textOf(const ElaborationRecord& record, std::string_view tag) {
  const auto found = std::ranges::find(record.values, tag, &ElaborationRecord::Value::tag);
  return found == record.values.end() ? "" : found->text;
}

}  // namespace

Diagnostic MisfitDescriber::describe(Place place, const kterr::Exception& failure) const {
  Diagnostic diagnostic = diagnoseFailure(failure.code(), failure.getJson());
  diagnostic.place = place;
  const ElaborationRecord record = readElaboration(failure.getJson());
  const std::uint32_t node = instructionAt(place);
  if (node == kNoIndex) return diagnostic;
  const bool hasNoRoom = failure.code() == ktorba_errors::kErrorInternalSWError.code && !record.messages.empty();
  if (hasNoRoom) say(diagnostic, Kind::kNoRoom, {record.messages.front()});
  describeSubset(node, record, diagnostic);
  describeMarkers(node, record, diagnostic);
  return diagnostic;
}

void MisfitDescriber::describeSubset(std::uint32_t node, const ElaborationRecord& record,
                                     Diagnostic& diagnostic) const {
  using namespace ktorba_errors;
  const std::vector<Number> numbers = numbersOf(node, NodeKind::kSubset);
  if (numbers.size() != 2) return;
  const auto [start, length] = std::pair(numbers[0], numbers[1]);
  const std::string waveform = quoteWord(textOf(record, kterr::kUsageTypeWaveformName));
  const std::string available = textOf(record, kterr::kUsageTypeWaveformLength);
  if (diagnostic.code == kErrorStartPositionExceedsWaveformLength.code) {
    pointAt(start.token, diagnostic);
    say(diagnostic, Kind::kSubsetStartsBehind, {std::to_string(start.value), waveform, available});
  } else if (diagnostic.code == kErrorRequestedWaveformLengthIsTooSmall.code) {
    pointAt(length.token, diagnostic);
    say(diagnostic, Kind::kShortSubset, {std::to_string(length.value), std::to_string(minFetchSamples_)});
  } else if (diagnostic.code == kErrorRequestedWaveformLengthExceedsAllocatedLength.code) {
    pointAt(length.token, diagnostic);
    say(diagnostic, Kind::kLongSubset, {std::to_string(length.value), waveform, available});
  } else if (diagnostic.code == kErrorInvalidStartPositionAndWaveformLengthCombination.code) {
    pointAt(length.token, diagnostic);
    const std::uint64_t end = std::uint64_t{start.value} + length.value;
    say(diagnostic, Kind::kSubsetPastEnd, {std::to_string(end), waveform, available});
  }
}

void MisfitDescriber::describeMarkers(std::uint32_t node, const ElaborationRecord& record,
                                      Diagnostic& diagnostic) const {
  using namespace ktorba_errors;
  const std::vector<Number> positions = numbersOf(node, NodeKind::kMarker);
  if (positions.empty()) return;
  if (diagnostic.code == kErrorMarkerPositionExceedsLastElementInWaveform.code) {
    const std::int64_t length = numberOf(record, kterr::kUsageTypeWaveformLength);
    const std::int64_t position = numberOf(record, kterr::kUsageTypeMarkerPosition);
    const auto behind = std::ranges::find(positions, position, &Number::value);
    pointAt(behind == positions.end() ? positions.front().token : behind->token, diagnostic);
    say(diagnostic, Kind::kMarkerBehindEnd,
        {std::to_string(position), std::to_string(length), std::to_string(length - 1)});
  } else if (diagnostic.code == kErrorInvalidNumberOfMarkersOnAWaveform.code) {
    pointAt(positions.front().token, diagnostic);
    say(diagnostic, Kind::kManyMarkers,
        {textOf(record, "Number of markers"), textOf(record, "Maximum number of markers"),
         std::to_string(minFetchSamples_)});
  } else if (diagnostic.code == kErrorInvalidDistanceBetweenTwoMarkerPositions.code) {
    describeCloseMarkers(positions, diagnostic);
  }
}

// The first two that are too close, as the sequencer meets them; of those the later in the text is to blame.
void MisfitDescriber::describeCloseMarkers(const std::vector<Number>& positions, Diagnostic& diagnostic) const {
  std::vector<Number> sorted = positions;
  std::ranges::stable_sort(sorted, {}, &Number::value);
  const auto close = std::ranges::adjacent_find(sorted, [this](const Number& a, const Number& b) {
    return a.value != b.value && b.value - a.value < minFetchSamples_;
  });
  if (close == sorted.end()) return;
  const auto [before, behind] = std::minmax(close->token, std::next(close)->token);
  pointAt(behind, diagnostic);
  say(diagnostic, Kind::kCloseMarkers,
      {std::to_string(close->value), std::to_string(std::next(close)->value), std::to_string(minFetchSamples_)});
  diagnostic.related.push_back({placeOf(before), "The earlier one stands here"});
}

Diagnostic MisfitDescriber::describeUnknownWaveform(Place generate, std::string_view name,
                                                    std::span<const std::string> onOffer) const {
  const kterr::ErrorConstant& constant = ktorba_errors::kErrorSpecifiedWaveformNotFound;
  Diagnostic diagnostic;
  diagnostic.place = generate;
  diagnostic.constant = constant.text;
  diagnostic.code = constant.code;
  const std::string nearMiss = findNearMiss(name, onOffer);
  say(diagnostic, Kind::kUnknownWaveform, {quoteWord(name), tellSimilar("waveform", name, onOffer)});
  if (nearMiss.empty()) diagnostic.setting = Setting::kWaveform;
  const std::uint32_t node = instructionAt(generate);
  if (node == kNoIndex) return diagnostic;
  const std::uint32_t token = tree_.nodes()[node].firstToken + 1;
  pointAt(token, diagnostic);
  // It may be the waveform that is misnamed.
  if (!nearMiss.empty()) diagnostic.fixes.push_back({tree_.tokens()[token].offset(), name.size(), nearMiss, false});
  return diagnostic;
}

std::vector<MisfitDescriber::Number> MisfitDescriber::numbersOf(std::uint32_t instruction, NodeKind part) const {
  std::vector<Number> numbers;
  for (std::uint32_t node = instruction + 1; node < tree_.nodes()[instruction].endNode; ++node) {
    const SyntaxNode& at = tree_.nodes()[node];
    if (at.kind != part) continue;
    for (std::uint32_t token = at.firstToken; token < at.endToken; ++token) {
      if (tree_.tokens()[token].type() == TokenType::kInteger) numbers.push_back({tree_.valueOf(token), token});
    }
  }
  return numbers;
}

// The generate or wait whose keyword stands there, kNoIndex for what is another.
std::uint32_t MisfitDescriber::instructionAt(Place place) const {
  const std::size_t offset = file_.offsetOf(place);
  const auto offsetOf = [this](const SyntaxNode& node) {
    return std::size_t{tree_.tokens()[node.firstToken].offset()};
  };
  const auto found = std::ranges::lower_bound(tree_.nodes(), offset, {}, offsetOf);
  if (found == tree_.nodes().end() || offsetOf(*found) != offset) return kNoIndex;
  const bool isPlayed = found->kind == NodeKind::kGenerate || found->kind == NodeKind::kWait;
  return isPlayed ? static_cast<std::uint32_t>(found - tree_.nodes().begin()) : kNoIndex;
}

void MisfitDescriber::pointAt(std::uint32_t token, Diagnostic& diagnostic) const {
  diagnostic.place = placeOf(token);
  diagnostic.length = static_cast<std::uint32_t>(tree_.textOf(token).size());
}

}  // namespace tools
