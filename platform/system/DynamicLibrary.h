// A shared library bound at run time by its bare name, so that one which the host has loaded already is the one found.
// Never unloaded: pointers into it stay valid to the end of the process. Any thread may load and look up.
#pragma once

#include <string>

namespace platform {

class DynamicLibrary {
 public:
  // `stem` is the name without the system's prefix and ending: "KtFpga" is libKtFpga.so or KtFpga.dll.
  explicit DynamicLibrary(const char* stem);

  // The function's address, or null with the loader's own words in `error`, also when the library itself is missing.
  void* find(const char* function, std::string& error) const;

  bool isLoaded() const { return handle_ != nullptr; }
  const std::string& name() const { return name_; }  // of its file, as the loader was asked for it

  // From now on libraries are looked for in this folder below the program's own as well, for the systems where a
  // program does not say so itself.
  static void searchBesideProgram(const std::string& folder);

  // Where the loader looks for libraries that this one asks for by name, in words.
  static std::string placesSearched();

 private:
  std::string name_;
  void* handle_;           // null when the library could not be loaded
  std::string loadError_;  // then: why
};

}  // namespace platform
