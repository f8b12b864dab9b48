#include "platform/system/files.h"

#include <sys/stat.h>
#include <unistd.h>

namespace platform {

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

}  // namespace platform
