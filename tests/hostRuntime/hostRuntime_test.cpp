// The host runtime for programs whose host brings none: whom it calls, in which order and when.
#include <gmock/gmock.h>

#include <cstdio>
#include <cstdlib>
#include <vector>

#include "ktorba/host_runtime.h"
#include "platform/system/LoadedModule.h"

namespace {

using testing::ElementsAre;

constexpr std::int32_t kWithdraw = 0;
constexpr std::int32_t kRegister = 2;

using Registration = decltype(&PDRNRegisterCleanUpProc);

std::vector<std::uint32_t> called;

std::int32_t note(std::uint32_t handle) {
  called.push_back(handle);
  return 0;
}
std::int32_t noteAndRegisterAnother(std::uint32_t handle) {
  PDRNRegisterCleanUpProc(note, handle + 100, kRegister);
  PDRNRegisterCleanUpProc(noteAndRegisterAnother, handle, kWithdraw);  // as a session does that is closed
  return note(handle);
}
std::int32_t print(std::uint32_t handle) { return std::fprintf(stderr, "%u ", static_cast<unsigned>(handle)); }

void registerThree(Registration registration) {
  for (std::uint32_t handle = 1; handle <= 3; ++handle) registration(print, handle, kRegister);
}

TEST(HostRuntime, CallsTheLatestFirstAndEachOnce) {
  called.clear();
  for (std::uint32_t handle : {1, 2, 3, 2}) EXPECT_EQ(PDRNRegisterCleanUpProc(note, handle, kRegister), 1);
  EXPECT_EQ(PDRNRegisterCleanUpProc(note, 1, kWithdraw), 1);
  EXPECT_EQ(PDRNRegisterCleanUpProc(note, 1, kWithdraw), 0) << "it was withdrawn";
  EXPECT_EQ(PDRNRegisterCleanUpProc(noteAndRegisterAnother, 2, kWithdraw), 0) << "another procedure";
  EXPECT_EQ(PDRNRegisterCleanUpProc(note, 9, 1), 0);
  EXPECT_EQ(PDRNRegisterCleanUpProc(nullptr, 9, kRegister), 0);
  EXPECT_EQ(PDRNRegisterCleanUpProc(noteAndRegisterAnother, 4, kRegister), 1);
  ktHostRuntime_CleanUp();
  ktHostRuntime_CleanUp();
  EXPECT_THAT(called, ElementsAre(4, 104, 3, 2));
}

void* announced = nullptr;

TEST(HostRuntime, AnnouncesTheModuleThatExportsTheRegistration) {
  EXPECT_EQ(ktHostRuntime_Announce([](void* module) { announced = module; }, nullptr), 1);
  const platform::LoadedModule runtime(KTORBA_HOST_RUNTIME);
  EXPECT_EQ(announced, runtime.handle());
  const auto registration = reinterpret_cast<Registration>(runtime.find("PDRNRegisterCleanUpProc"));
  ASSERT_TRUE(registration != nullptr);
  called.clear();
  registration(note, 7, kRegister);
  ktHostRuntime_CleanUp();
  EXPECT_THAT(called, ElementsAre(7));
}

void endProgram(int (*atExit)(void (*)())) {
  ktHostRuntime_Announce([](void*) {}, atExit);
  registerThree(PDRNRegisterCleanUpProc);
  std::exit(0);
}

TEST(HostRuntime, CallsAtTheEndOfTheProgram) {
  EXPECT_EXIT(endProgram(std::atexit), testing::ExitedWithCode(0), "^3 2 1 $");
  EXPECT_EXIT(endProgram(nullptr), testing::ExitedWithCode(0), "^3 2 1 $");
}

}  // namespace
