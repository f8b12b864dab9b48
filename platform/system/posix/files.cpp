#include "platform/system/files.h"

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

namespace platform {

std::FILE* openFile(const std::string& path, const char* mode) { return std::fopen(path.c_str(), mode); }

std::FILE* makeTemporaryFile() { return std::tmpfile(); }

std::FILE* createNewFile(const std::string& path) { return std::fopen(path.c_str(), "w+bx"); }

// The owner goes first, since a change of it takes the set-user bits away.
bool takeOwnerAndMode(std::FILE* file, const std::string& from) {
  constexpr mode_t kModeBits = 07777;
  const int descriptor = fileno(file);
  struct stat own = {};
  struct stat wanted = {};
  if (fstat(descriptor, &own) != 0 || stat(from.c_str(), &wanted) != 0) return false;
  const bool isOwned = own.st_uid == wanted.st_uid && own.st_gid == wanted.st_gid;
  if (!isOwned && fchown(descriptor, wanted.st_uid, wanted.st_gid) != 0) return false;
  return fchmod(descriptor, wanted.st_mode & kModeBits) == 0;
}

bool isStandardOutput(const std::string& path) {
  struct stat output = {};
  struct stat named = {};
  return fstat(STDOUT_FILENO, &output) == 0 && stat(path.c_str(), &named) == 0 && output.st_dev == named.st_dev &&
         output.st_ino == named.st_ino;
}

std::int64_t seekFile(std::FILE* file, std::int64_t offset, int whence) {
  static_assert(sizeof(off_t) == sizeof offset, "files may be longer than 2 GiB");
  return fseeko(file, offset, whence) == 0 ? ftello(file) : -1;
}

std::optional<Disk> findDisk(const std::string& folder) {
  const char* const path = folder.empty() ? "." : folder.c_str();
  struct stat identity = {};
  struct statvfs space = {};
  if (stat(path, &identity) != 0 || statvfs(path, &space) != 0) return std::nullopt;
  return Disk{identity.st_dev, std::uint64_t{space.f_bavail} * space.f_frsize};
}

}  // namespace platform
