// Linked into programs that open sessions: before main() begins, the host runtime is announced to the library that they
// link. A program that exports a runtime of its own keeps it.
#include <cstdint>
#include <cstdlib>

#include "ktorba/host_runtime.h"
#include "ktorba/ktorba.h"

namespace {

[[maybe_unused]] const std::int32_t isAnnounced = ktHostRuntime_Announce(SetPDRNModule, std::atexit);

}  // namespace
