// The two ways in which a host runtime tells the library where it is. What it finds it keeps, hence a process each.
#include <dlfcn.h>
#include <pthread.h>

#include <cstdlib>

#include "source/ktorba_lib/SimulatedGenerator.h"

namespace {

void* const runtime = dlopen(KTORBA_REFUSING_RUNTIME, RTLD_NOW | RTLD_LOCAL);

void giveModule() { SetPDRNModule(runtime); }

void giveThreadSlot() {
  pthread_key_t slot = 0;
  pthread_key_create(&slot, nullptr);
  pthread_setspecific(slot, runtime);
  SetPDRNTLSIndex(slot);
}

// Ends the process with 1 when nobody is there to refuse the session, with 0 when the runtime is there.
void open(void (*give)()) {
  const SimulatedGenerator generator(SimulatedGenerator::smallTraits());
  give();
  std::uint32_t session = 0;
  std::exit(generator.open(session) == -52003 ? 0 : 1);
}

TEST(HostRuntime, IsFoundWhereItSaysThatItIs) {
  ASSERT_NE(runtime, nullptr) << dlerror();
  EXPECT_EXIT(open([] {}), testing::ExitedWithCode(1), "");
  EXPECT_EXIT(open(giveModule), testing::ExitedWithCode(0), "");
  EXPECT_EXIT(open(giveThreadSlot), testing::ExitedWithCode(0), "");
}

}  // namespace
