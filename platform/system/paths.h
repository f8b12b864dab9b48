// Names of files, which are UTF-8 in this system, to and from those of the operating system. Any thread may call.
#pragma once

#include <filesystem>
#include <string>

namespace platform {

// The path as the standard library takes it, for its streams too. On Windows long ones come as the system wants them.
std::filesystem::path toPath(const std::string& utf8);

// The name of a path, as a user gave or would give it.
std::string toText(const std::filesystem::path& path);

}  // namespace platform
