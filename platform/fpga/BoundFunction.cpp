#include "platform/fpga/BoundFunction.h"

#include <string>

#include "kterr/Failure.h"
#include "platform/system/DynamicLibrary.h"

namespace platform {
namespace {

constexpr char kSource[] = R"(platform\BoundFunction)";

}  // namespace

void* bindFunction(const char* libraryStem, const char* function) {
  std::string loaderWords;
  void* const address = DynamicLibrary(libraryStem).find(function, loaderWords);
  if (address == nullptr) {
    kterr::Failure(nKTAPALS100_tStatus_kSoftwareFault).at(kSource).message(function, loaderWords.c_str()).raise();
  }
  return address;
}

}  // namespace platform
