#include "platform/HostRuntime.h"

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <pthread.h>

namespace {

using platform::HostRuntime;

// The modules answer 11 and 12; no runtime at all answers 1.
std::int32_t ask(HostRuntime& runtime) { return runtime.registerCleanUp(nullptr, 1, HostRuntime::Mode::kRegister); }

class HostRuntimeSearch : public testing::Test {
 protected:
  HostRuntimeSearch() { pthread_key_create(&slot, nullptr); }
  ~HostRuntimeSearch() override { pthread_key_delete(slot); }

  void* const first = dlopen(KTORBA_FIRST_MODULE, RTLD_NOW | RTLD_LOCAL);
  void* const second = dlopen(KTORBA_SECOND_MODULE, RTLD_NOW | RTLD_LOCAL);
  void* const withoutRuntime = dlopen("libc.so.6", RTLD_NOW);
  pthread_key_t slot = 0;
  HostRuntime runtime;
};

TEST_F(HostRuntimeSearch, LooksAtTheThreadSlotThenAtTheModuleGiven) {
  HostRuntime bySlot;
  for (HostRuntime* each : {&bySlot, &runtime}) {
    each->setModule(first);
    each->setThreadSlot(slot);
  }
  EXPECT_EQ(ask(runtime), 11);  // the slot is empty
  pthread_setspecific(slot, second);
  EXPECT_EQ(ask(bySlot), 12);
  EXPECT_EQ(ask(runtime), 11);  // found once and kept
}

TEST_F(HostRuntimeSearch, PassesPlacesThatDoNotHaveIt) {
  pthread_setspecific(slot, withoutRuntime);
  runtime.setThreadSlot(slot);
  EXPECT_EQ(ask(runtime), 1);
  runtime.setModule(withoutRuntime);
  EXPECT_EQ(ask(runtime), 1);
  runtime.setModule(second);  // a search that found nothing is made again
  EXPECT_EQ(ask(runtime), 12);
}

}  // namespace
