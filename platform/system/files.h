// What the standard library does not say about files. Any thread may call.
#pragma once

#include <cstdio>
#include <string>

namespace platform {

// Makes a file for reading and writing that can be removed while it is open. Null, with errno, when it is there already
// or cannot be made.
std::FILE* createNewFile(const std::string& path);

// Gives an open file the owner and the mode of another one. False when the system does not let this user.
bool takeOwnerAndMode(std::FILE* file, const std::string& from);

// Whether the path leads to where the standard output goes.
bool isStandardOutput(const std::string& path);

}  // namespace platform
