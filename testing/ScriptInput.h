// One fuzz input for the way from script text to instruction words: a text, and behind it five letters that choose
// the generator's traits and its waveforms, so that inputs can be written by hand:
//
//   script s generate a end script
//   aaaaa
//
// The letters a to h are, in this order, the bits of a sample, the samples of a memory word, the shortest fetch, the
// alignment quantum and the length of the waveforms "a", "b" and "c"; any other byte counts as one of them.
#pragma once

#include <cstdint>
#include <string_view>

// Compiles and builds the text. Returns the code of the failure, 0 when the text was accepted. Throws std::logic_error
// when an accepted script is not played as it says, or when a failure has no well-formed elaboration.
std::int32_t runScriptInput(std::string_view input);
