#include "platform/system/hostRuntimeSystem.h"

#include <dlfcn.h>
#include <pthread.h>

namespace platform {

void* threadSlotValue(std::uint32_t index) { return pthread_getspecific(static_cast<pthread_key_t>(index)); }

// A null handle means the whole process to dlsym, hence the check.
void* findInModule(void* module, const char* function) { return module != nullptr ? dlsym(module, function) : nullptr; }

void* findInProcess(const char* function) { return dlsym(RTLD_DEFAULT, function); }

std::int32_t withoutHostRuntime() { return 1; }

}  // namespace platform
