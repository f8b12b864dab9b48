// The lane for what plays in a window of a timeline, as a LaneBuilder makes it from all that plays: by arithmetic where
// that is too much. A pure function; any thread may call.
#pragma once

#include "tools/outputs/picture/Lane.h"
#include "tools/timeline/Timeline.h"

namespace tools {

inline constexpr std::uint64_t kMostVisitedRuns = 100'000;  // of a window; beyond, they are counted

Lane summariseLane(const RecordingHeader& header, const Timeline& timeline, std::size_t columns,
                   std::uint64_t mostVisitedRuns = kMostVisitedRuns);

}  // namespace tools
