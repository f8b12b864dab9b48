// unload PATH: a program that loads the host runtime as a plug-in would, registers three procedures, and unloads it.
#include <cstdint>
#include <cstdio>

#include "platform/system/LoadedModule.h"

namespace {

using Registration = std::int32_t (*)(std::int32_t (*procedure)(std::uint32_t), std::uint32_t, std::int32_t);

std::int32_t print(std::uint32_t handle) { return std::printf("%u ", static_cast<unsigned>(handle)); }

}  // namespace

int main(int, char** argv) {
  {
    const platform::LoadedModule runtime(argv[1]);
    const auto registration = reinterpret_cast<Registration>(runtime.find("PDRNRegisterCleanUpProc"));
    if (registration == nullptr) return 1;
    for (std::uint32_t handle = 1; handle <= 3; ++handle) registration(print, handle, 2);
  }
  std::puts("unloaded");
}
