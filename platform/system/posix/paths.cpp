#include "platform/system/paths.h"

namespace platform {

std::filesystem::path toPath(const std::string& utf8) { return utf8; }

std::string toText(const std::filesystem::path& path) { return path.string(); }

}  // namespace platform
