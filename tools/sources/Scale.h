// What becomes of the numbers of a file: of which unit they are, and what is done to them.
#pragma once

#include <string>

#include "tools/sources/Parameters.h"

namespace tools {

struct Scale {
  bool areCodes = false;   // samples as the generator holds them, else fractions of full scale
  double fullScale = 1;    // the number that becomes full scale, where they are no codes
  bool normalise = false;  // the greatest magnitude becomes full scale
  double gain = 1;
  double offset = 0;          // of full scale, behind the gain
  double recordedRateHz = 0;  // 0: unknown
  bool resample = false;      // from that rate to the generator's

  // Whether anybody said what the numbers of a file are, which integers do not tell.
  bool isSaid = false;
};

// Reads codes, full-scale, normalise, gain, offset, rate and resample. `fileRateHz` is what the file says of its rate,
// 0 for nothing. Throws Refusal.
Scale readScale(Parameters& parameters, double fileRateHz = 0);

// "5V", "500mV" or "5" as a number: a unit may stand behind it, with a prefix where that is one beyond doubt.
std::optional<double> parseWithAnyUnit(std::string_view text);

}  // namespace tools
