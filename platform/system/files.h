// What the standard library does not say about files. Any thread may call.
#pragma once

#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>

namespace platform {

// fopen(), of a name in UTF-8.
std::FILE* openFile(const std::string& path, const char* mode);

// A file without a name for reading and writing, which goes when it is closed. Null, with errno, when it cannot be
// made.
std::FILE* makeTemporaryFile();

// Makes a file for reading and writing that can be removed while it is open. Null, with errno, when it is there already
// or cannot be made.
std::FILE* createNewFile(const std::string& path);

// Gives an open file the owner and the mode of another one. False when the system does not let this user.
bool takeOwnerAndMode(std::FILE* file, const std::string& from);

// Whether the path leads to where the standard output goes.
bool isStandardOutput(const std::string& path);

// As std::fseek, in files of any length on every system. The position from the beginning after it; -1, with errno, when
// the file cannot seek there.
std::int64_t seekFile(std::FILE* file, std::int64_t offset, int whence);

struct Disk {
  std::uint64_t id = 0;         // the same for all folders of one disk
  std::uint64_t freeBytes = 0;  // that this user may take
};

// The disk of a folder, "" for the present one; nothing where the system does not tell.
std::optional<Disk> findDisk(const std::string& folder);

}  // namespace platform
