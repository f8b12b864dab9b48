#include "tools/text/nearMiss.h"

#include <algorithm>
#include <vector>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr std::size_t kLongestWord = 128;  // longer words are hardly mistyped keywords, and cost quadratic time

bool same(char a, char b) { return toLower(a) == toLower(b); }

}  // namespace

unsigned editDistance(std::string_view a, std::string_view b, unsigned limit) {
  if (a.size() > kLongestWord || b.size() > kLongestWord) return limit + 1;
  std::vector<unsigned> beforePrevious(b.size() + 1);
  std::vector<unsigned> previous(b.size() + 1);
  std::vector<unsigned> row(b.size() + 1);
  for (std::size_t j = 0; j <= b.size(); ++j) row[j] = static_cast<unsigned>(j);
  for (std::size_t i = 1; i <= a.size(); ++i) {
    std::swap(beforePrevious, previous);
    std::swap(previous, row);
    row[0] = static_cast<unsigned>(i);
    for (std::size_t j = 1; j <= b.size(); ++j) {
      row[j] = std::min({previous[j] + 1, row[j - 1] + 1, previous[j - 1] + (same(a[i - 1], b[j - 1]) ? 0u : 1u)});
      const bool swapped = i > 1 && j > 1 && same(a[i - 1], b[j - 2]) && same(a[i - 2], b[j - 1]);
      if (swapped) row[j] = std::min(row[j], beforePrevious[j - 2] + 1);
    }
  }
  return std::min(row[b.size()], limit + 1);
}

NearMiss findNearest(std::string_view word, std::span<const std::string> candidates) {
  if (word.size() < 2) return {};
  const unsigned limit = std::max(1u, static_cast<unsigned>(word.size() / 3));
  NearMiss nearest = {{}, limit + 1, true};
  for (const std::string& candidate : candidates) {
    if (candidate == nearest.text) continue;
    const unsigned distance = editDistance(word, candidate, limit);
    if (distance == nearest.distance && !nearest.text.empty()) nearest.isAlone = false;
    if (distance < nearest.distance) nearest = {candidate, distance, true};
  }
  return nearest;
}

std::string findNearMiss(std::string_view word, std::span<const std::string> candidates) {
  return findNearest(word, candidates).text;
}

std::string tellSimilar(std::string_view kind, std::string_view word, std::span<const std::string> candidates) {
  const std::string nearMiss = findNearMiss(word, candidates);
  return nearMiss.empty() ? "" : "A similar " + std::string(kind) + ": `" + nearMiss + "`.";
}

}  // namespace tools
