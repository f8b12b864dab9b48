#include "platform/system/DynamicLibrary.h"

#include <dlfcn.h>

#include <cstddef>
#include <memory>
#include <new>
#include <span>
#include <utility>
#include <vector>

namespace platform {
namespace {

std::string lastError() {
  const char* words = dlerror();
  return words != nullptr ? words : "the loader gave no reason";
}

using Handle = std::unique_ptr<void, decltype([](void* handle) { dlclose(handle); })>;

// This library, or the program that it is linked into, whose own run path counts.
[[maybe_unused]] Handle openSelf() {
  Dl_info self{};
  if (dladdr(reinterpret_cast<void*>(&openSelf), &self) == 0) return nullptr;
  Handle library(dlopen(self.dli_fname, RTLD_NOW | RTLD_NOLOAD));
  return library != nullptr ? std::move(library) : Handle(dlopen(nullptr, RTLD_NOW));
}

// ", folder" for each, in the order of the search. Empty where the C library does not tell.
std::string foldersSearched() {
  std::string folders;
#ifdef __GLIBC__
  const Handle self = openSelf();
  Dl_serinfo head{};
  if (self == nullptr || dlinfo(self.get(), RTLD_DI_SERINFOSIZE, &head) != 0) return folders;
  std::vector<std::byte> buffer(head.dls_size);
  auto* const info = new (buffer.data()) Dl_serinfo(head);
  if (dlinfo(self.get(), RTLD_DI_SERINFO, info) != 0) return folders;
  for (const Dl_serpath& path : std::span(info->dls_serpath, head.dls_cnt)) folders.append(", ").append(path.dls_name);
#endif
  return folders;
}

}  // namespace

DynamicLibrary::DynamicLibrary(const char* stem)
    : name_("lib" + std::string(stem) + ".so"), handle_(dlopen(name_.c_str(), RTLD_NOW | RTLD_LOCAL)) {
  if (handle_ == nullptr) loadError_ = lastError();
}

void* DynamicLibrary::find(const char* function, std::string& error) const {
  if (handle_ == nullptr) {
    error = loadError_;
    return nullptr;
  }
  void* address = dlsym(handle_, function);
  if (address == nullptr) error = lastError();
  return address;
}

void DynamicLibrary::searchBesideProgram(const std::string&) {}  // the program's run path says so

std::string DynamicLibrary::placesSearched() {
  return "looked for among the libraries loaded, in the loader's cache" + foldersSearched();
}

}  // namespace platform
