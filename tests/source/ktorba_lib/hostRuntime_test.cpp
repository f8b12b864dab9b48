// The ways in which a host runtime tells the library where it is. What it finds it keeps, hence a process each.
#include <dlfcn.h>
#include <gtest/gtest.h>
#include <pthread.h>

#include <cstdlib>
#include <optional>
#include <vector>

#include "testing/SimulatedGenerator.h"

namespace {

void* load(const char* module) { return dlopen(module, RTLD_NOW | RTLD_LOCAL); }

// Two modules with a host runtime, of which one takes every session and one refuses it, and one without.
void* const taking = load(KTORBA_TAKING_RUNTIME);
void* const refusing = load(KTORBA_REFUSING_RUNTIME);
void* const without = load("libc.so.6");

void giveThreadSlot(const void* module) {
  pthread_key_t slot = 0;
  pthread_key_create(&slot, nullptr);
  pthread_setspecific(slot, module);
  SetPDRNTLSIndex(slot);
}

// Also where nobody is there to refuse it, a session opens: 0.
std::int32_t openAndClose() {
  const SimulatedGenerator generator;
  std::uint32_t session = 0;
  const std::int32_t code = generator.open(session);
  ktORBA_CloseOrbaSession(session, nullptr);
  return code;
}

constexpr int kOpened = 0;
constexpr int kRefused = 1;

void exitWith(std::int32_t code) { std::exit(code == 0 ? kOpened : code == -52003 ? kRefused : 2); }

TEST(HostRuntime, IsSearchedInTheThreadSlotOrElseInTheModuleGivenUntilItIsFound) {
  ASSERT_TRUE(taking != nullptr && refusing != nullptr && without != nullptr) << dlerror();
  const struct {
    const char* what;
    std::optional<void*> inSlot;
    std::vector<void*> modules;  // given one after the other
    int result;
  } cases[] = {
      {"nothing given", {}, {nullptr}, kOpened},
      {"a module", {}, {refusing}, kRefused},
      {"a module without a runtime", {}, {without}, kOpened},
      {"and then one with", {}, {without, refusing}, kRefused},
      {"the first that is found is kept", {}, {taking, refusing}, kOpened},
      {"the slot comes first", refusing, {taking}, kRefused},
      {"an empty slot", nullptr, {refusing}, kRefused},
      {"a slot without a runtime", without, {refusing}, kRefused},
  };
  for (const auto& c : cases) {
    const auto open = [&] {
      if (c.inSlot) giveThreadSlot(*c.inSlot);
      std::int32_t code = 0;
      for (void* const module : c.modules) {
        SetPDRNModule(module);
        code = openAndClose();
      }
      exitWith(code);
    };
    EXPECT_EXIT(open(), testing::ExitedWithCode(c.result), "") << c.what;
  }
}

}  // namespace
