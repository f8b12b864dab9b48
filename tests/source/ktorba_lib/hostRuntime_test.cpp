// The ways in which a host runtime tells the library where it is. What it finds it keeps, hence a process each.
#include <gtest/gtest.h>

#include <cstdlib>
#include <optional>
#include <vector>

#include "platform/system/LoadedModule.h"
#include "testing/SimulatedGenerator.h"

namespace {

// Modules with a host runtime, of which one takes every session, one refuses it and one is that which comes with the
// library, and a module without.
const platform::LoadedModule takingModule(KTORBA_TAKING_RUNTIME);
const platform::LoadedModule refusingModule(KTORBA_REFUSING_RUNTIME);
const platform::LoadedModule providedModule(KTORBA_PROVIDED_RUNTIME);
const platform::LoadedModule moduleWithout(KTORBA_MODULE_WITHOUT);

std::int32_t openAndClose() {
  const SimulatedGenerator generator;
  std::uint32_t session = 0;
  const std::int32_t code = generator.open(session);
  ktORBA_CloseOrbaSession(session, nullptr);
  return code;
}

constexpr int kOpened = 0;
constexpr int kRefused = 3;
// Where a host runtime is not needed a session opens; elsewhere the program ends.
constexpr int kMissing = KTORBA_NEEDS_RUNTIME ? 1 : kOpened;
constexpr const char* kMessage =
    KTORBA_NEEDS_RUNTIME ? "neither the module given .* takes ktorba_host_runtime.dll" : "";

void exitWith(std::int32_t code) { std::exit(code == 0 ? kOpened : code == -52003 ? kRefused : 2); }

TEST(HostRuntime, IsSearchedInTheThreadSlotOrElseInTheModuleGivenUntilItIsFound) {
  void* const taking = takingModule.handle();
  void* const refusing = refusingModule.handle();
  void* const provided = providedModule.handle();
  void* const without = moduleWithout.handle();
  ASSERT_TRUE(taking != nullptr && refusing != nullptr && provided != nullptr && without != nullptr);
  const struct {
    const char* what;
    std::optional<void*> inSlot;
    std::vector<void*> modules;  // given one after the other
    int result;
  } cases[] = {
      {"nothing given", {}, {nullptr}, kMissing},
      {"a module", {}, {refusing}, kRefused},
      {"that which comes with the library", {}, {provided}, kOpened},
      {"a module without a runtime", {}, {without}, kMissing},
      {"and then one with", {}, {without, refusing}, KTORBA_NEEDS_RUNTIME ? kMissing : kRefused},
      {"the first that is found is kept", {}, {taking, refusing}, kOpened},
      {"the slot comes first", refusing, {taking}, kRefused},
      {"an empty slot", nullptr, {refusing}, kRefused},
      {"a slot without a runtime", without, {refusing}, kRefused},
  };
  for (const auto& c : cases) {
    const auto open = [&] {
      if (c.inSlot) SetPDRNTLSIndex(platform::makeThreadSlot(*c.inSlot));
      std::int32_t code = 0;
      for (void* const module : c.modules) {
        SetPDRNModule(module);
        code = openAndClose();
      }
      exitWith(code);
    };
    EXPECT_EXIT(open(), testing::ExitedWithCode(c.result), c.result == kMissing ? kMessage : "") << c.what;
  }
}

}  // namespace
