// What the names of a table's columns tell about them.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace tools {

// Whether a column of that name holds times or counts samples: "Time (s)", "t", "time_ms", "index". No such column is
// played unless somebody chooses it.
bool namesTime(std::string_view name);

// Whether each name is a unit or empty, and not all are empty: what instruments write below the names.
bool areUnits(const std::vector<std::string>& names);

// `text` in UTF-8: as it is where it is valid, else read as Latin-1.
std::string toUtf8(std::string_view text);

}  // namespace tools
