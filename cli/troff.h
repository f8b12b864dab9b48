// Text for the pages of the manual.
#pragma once

#include <string>
#include <string_view>

namespace tools::cli {

// `text` as it stands: dashes that can be copied, no escapes, no requests.
std::string toTroff(std::string_view text);

}  // namespace tools::cli
