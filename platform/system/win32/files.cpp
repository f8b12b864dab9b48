#include "platform/system/files.h"

#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include <cerrno>
#include <cstring>
#include <functional>
#include <string_view>

#include "platform/system/paths.h"

namespace platform {
namespace {

bool readIdentity(HANDLE file, BY_HANDLE_FILE_INFORMATION& identity) {
  return GetFileType(file) == FILE_TYPE_DISK && GetFileInformationByHandle(file, &identity) != 0;
}

}  // namespace

std::FILE* openFile(const std::string& path, const char* mode) {
  return _wfopen(toPath(path).c_str(), std::wstring(mode, mode + std::strlen(mode)).c_str());
}

// The standard library's own would lie in the root of the drive, where few users may write.
std::FILE* makeTemporaryFile() {
  wchar_t folder[MAX_PATH + 1] = {};
  wchar_t path[MAX_PATH + 1] = {};
  if (GetTempPathW(MAX_PATH, folder) == 0 || GetTempFileNameW(folder, L"kt", 0, path) == 0) {
    errno = EACCES;
    return nullptr;
  }
  return _wfopen(path, L"w+bTD");
}

std::FILE* createNewFile(const std::string& path) {
  const HANDLE file = CreateFileW(toPath(path).c_str(), GENERIC_READ | GENERIC_WRITE,
                                  FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr, CREATE_NEW,
                                  FILE_ATTRIBUTE_NORMAL, nullptr);
  if (file == INVALID_HANDLE_VALUE) {
    errno = GetLastError() == ERROR_FILE_EXISTS ? EEXIST : EACCES;
    return nullptr;
  }
  return _fdopen(_open_osfhandle(reinterpret_cast<intptr_t>(file), _O_BINARY), "w+b");
}

// Owners and rights are a list that belongs to the file: only its own content can be changed without losing them.
bool takeOwnerAndMode(std::FILE*, const std::string&) { return false; }

bool isStandardOutput(const std::string& path) {
  const HANDLE file = CreateFileW(toPath(path).c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                  nullptr, OPEN_EXISTING, 0, nullptr);
  if (file == INVALID_HANDLE_VALUE) return false;
  BY_HANDLE_FILE_INFORMATION named = {};
  BY_HANDLE_FILE_INFORMATION output = {};
  const bool areKnown = readIdentity(file, named) && readIdentity(GetStdHandle(STD_OUTPUT_HANDLE), output);
  CloseHandle(file);
  return areKnown && named.dwVolumeSerialNumber == output.dwVolumeSerialNumber &&
         named.nFileIndexHigh == output.nFileIndexHigh && named.nFileIndexLow == output.nFileIndexLow;
}

std::int64_t seekFile(std::FILE* file, std::int64_t offset, int whence) {
  return _fseeki64(file, offset, whence) == 0 ? _ftelli64(file) : -1;
}

std::optional<Disk> findDisk(const std::string& folder) {
  const std::filesystem::path path = toPath(folder.empty() ? "." : folder);
  wchar_t root[MAX_PATH] = L"";
  ULARGE_INTEGER freeBytes = {};
  const bool isKnown = GetVolumePathNameW(path.c_str(), root, MAX_PATH) != 0 &&
                       GetDiskFreeSpaceExW(path.c_str(), &freeBytes, nullptr, nullptr) != 0;
  return isKnown ? std::optional(Disk{std::hash<std::wstring_view>()(root), freeBytes.QuadPart}) : std::nullopt;
}

}  // namespace platform
