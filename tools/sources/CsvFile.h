// Columns of numbers in text files as sources.
//
// Nothing is guessed: what can be read in two ways is refused, with the parameter that says which is meant.
//   separators  tabs, else semicolons, else commas, else blanks, as the first row of numbers has them; "sep=;" in the
//               first row says it
//   decimals    points or, where the separator leaves no other reading, commas; decimal=. and decimal=, say it
//   names       the last row before the numbers, if none of its fields looks like a number; a row of units may follow
//               it, and any text precede it. header=ROW and header=none say it, skip=ROWS leaves out rows
//   column      by its name or number; without a choice the only one, or the only one besides times and indices
// Blank rows and rows that begin with '#' or '%' are skipped. Rows are counted from 1, as editors do.
#pragma once

#include "tools/sources/Parameters.h"
#include "tools/sources/Source.h"

namespace tools {

LoadedWaveform loadCsvColumn(const std::string& path, Parameters& parameters, const SourceFormat& format);

}  // namespace tools
