// The known name that a mistyped one most likely stands for.
#pragma once

#include <span>
#include <string>
#include <string_view>

namespace tools {

// The number of letters to insert, remove, replace or swap with their neighbour to turn `a` into `b`; ASCII letter
// case does not count. Gives up, returning `limit` + 1, once it is above `limit`.
unsigned editDistance(std::string_view a, std::string_view b, unsigned limit);

struct NearMiss {
  std::string text;       // empty: there is none
  unsigned distance = 0;  // 0: but for letter case the same
  bool isAlone = true;    // no other candidate is as near
};

// As findNearMiss, with how near it is.
NearMiss findNearest(std::string_view word, std::span<const std::string> candidates);

// The candidate nearest to `word` within a third of its length (and at least one letter), the first of equals;
// empty when there is none, and for a word of one letter.
std::string findNearMiss(std::string_view word, std::span<const std::string> candidates);

// "A similar waveform: `pulse`." for the near miss of `word` among what is called a `kind`; empty when there is none.
std::string tellSimilar(std::string_view kind, std::string_view word, std::span<const std::string> candidates);

}  // namespace tools
