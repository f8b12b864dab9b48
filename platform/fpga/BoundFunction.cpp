#include "platform/fpga/BoundFunction.h"

#include <string>

#include "kterr/Failure.h"
#include "platform/system/DynamicLibrary.h"

namespace platform {
namespace {

constexpr char kSource[] = R"(platform\BoundFunction)";

[[noreturn]] void raiseMissing(const DynamicLibrary& library, const char* function, const std::string& loaderWords) {
  kterr::Failure failure(nKTAPALS100_tStatus_kSoftwareFault);
  failure.at(kSource).message(function, loaderWords.c_str());
  if (!library.isLoaded()) failure.message(library.name().c_str(), DynamicLibrary::placesSearched().c_str());
  failure.raise();
}

}  // namespace

void* bindFunction(const char* libraryStem, const char* function) {
  const DynamicLibrary library(libraryStem);
  std::string loaderWords;
  void* const address = library.find(function, loaderWords);
  if (address == nullptr) raiseMissing(library, function, loaderWords);
  return address;
}

}  // namespace platform
