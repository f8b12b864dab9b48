#include "cli/Recording.h"

namespace cli {

std::uint8_t usedMarkers(const Recording& recording) {
  unsigned used = 0;
  for (const MarkerEvent& event : recording.markers) used |= event.mask;
  return static_cast<std::uint8_t>(used);
}

std::uint8_t usedTriggers(const Recording& recording) {
  unsigned used = 0;
  for (const TriggerEvent& event : recording.triggers) used |= 1u << event.number;
  return static_cast<std::uint8_t>(used);
}

}  // namespace cli
