#include "tools/recording/Recording.h"

#include "conventions/conventions.h"

namespace tools {

std::vector<unsigned> usedMarkers(const RecordingHeader& header) {
  std::vector<unsigned> used;
  for (unsigned marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    if ((header.markerMask & ktorba::markerBitOf(marker)) != 0) used.push_back(marker);
  }
  return used;
}

std::vector<unsigned> usedTriggers(const RecordingHeader& header) {
  unsigned mask = 0;
  for (const TriggerEvent& event : header.triggers) mask |= ktorba::clearFlagOf(event.trigger);
  std::vector<unsigned> used;
  for (unsigned trigger = 1; trigger <= ktorba::kHardwareTriggerCount; ++trigger) {
    if ((mask & ktorba::clearFlagOf(trigger)) != 0) used.push_back(trigger);
  }
  return used;
}

}  // namespace tools
