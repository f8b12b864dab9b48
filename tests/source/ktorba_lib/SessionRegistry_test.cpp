#include "source/ktorba_lib/SessionRegistry.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <stdexcept>
#include <string>
#include <thread>

namespace {

using ktorba_lib::GeneratorAddress;
using ktorba_lib::SessionPtr;
using ktorba_lib::SessionRegistry;

// A session that has a name and does nothing.
struct NamedSession : ktorba_lib::SessionInterface {
  explicit NamedSession(const char* name) : SessionInterface(name) { ++alive; }
  ~NamedSession() override { --alive; }
  ktorba::HWControlInterface& getHWControl() override { throw std::logic_error("no engine"); }
  ktorba::GenerationSettings getRequestedSettings() const override { return {1, 2, 3, 4, "stream"}; }
  void applySettings(const ktorba::GenerationSettings&) override {}
  void configureStreamingWaveform(const std::string&) override {}
  void writeWaveform(const char*, const std::uint32_t*, std::uint32_t, std::int32_t) override {}
  void writeWaveform(const char*, const std::int16_t*, std::uint32_t, std::int32_t) override {}

  static inline std::atomic<int> alive = 0;
};

SessionPtr noSession(const GeneratorAddress&) { return {}; }

std::uint32_t add(SessionRegistry& registry, const char* name) {
  return registry.addSession(SessionPtr(new NamedSession(name)));
}

TEST(SessionRegistry, CountsHandlesUpPastZeroAndNeverReusesThem) {
  SessionRegistry registry(noSession, 0xFFFFFFFE);
  EXPECT_EQ(add(registry, "3, 0"), 0xFFFFFFFEu);
  EXPECT_EQ(add(registry, "dev, 1"), 0xFFFFFFFFu);
  const SessionPtr removed = registry.removeSession(0xFFFFFFFE);
  EXPECT_STREQ(removed->getName(), "3, 0");
  EXPECT_EQ(registry.removeSession(0xFFFFFFFE), nullptr);
  EXPECT_EQ(registry.findSession(0xFFFFFFFE), nullptr);
  EXPECT_EQ(registry.addSession(removed), 1u);
  EXPECT_STREQ(registry.findSession(0xFFFFFFFF)->getName(), "dev, 1");
  EXPECT_EQ(add(registry, "DEV, 1"), 0u) << "a second one, whatever its case";
  EXPECT_EQ(add(registry, "dev, 01"), 2u);
}

TEST(SessionRegistry, AddsNothingWhenBuildingFails) {
  SessionRegistry registry([](const GeneratorAddress& generator) {
    if (generator.instance == 9) throw std::runtime_error("no generator");
    return SessionPtr(new NamedSession("3, 0"));
  });
  EXPECT_THROW(registry.openSession({3, 0, 0, 0, 9}), std::runtime_error);
  EXPECT_EQ(registry.openSession({3, 0, 0, 0, 0}), 1u);
  EXPECT_EQ(registry.openSession({3, 0, 0, 0, 0}), 0u);
  EXPECT_EQ(NamedSession::alive, 1);
}

// Of threads that open one generator at once, one wins; what it opened is looked up while it is closed and opened
// again.
TEST(SessionRegistry, KeepsSessionsAliveForTheThreadsThatUseThem) {
  std::atomic<int> built = 0, opened = 0, used = 0;
  SessionRegistry registry([&built](const GeneratorAddress&) {
    ++built;
    return SessionPtr(new NamedSession("3, 0"));
  });
  std::atomic<std::uint32_t> current = 0;
  const auto openAndClose = [&] {
    for (int i = 0; i < 2000; ++i) {
      const std::uint32_t handle = registry.openSession({3, 0, 0, 0, 0});
      if (handle == 0) continue;
      ++opened;
      current = handle;
      EXPECT_NE(registry.removeSession(handle), nullptr);
      EXPECT_EQ(registry.removeSession(handle), nullptr);
    }
  };
  std::thread first(openAndClose), second(openAndClose);
  while (built < 4000) {
    const SessionPtr session = registry.findSession(current);
    if (session != nullptr) used += session->getRequestedSettings().streamingWaveformName == "stream";
  }
  first.join();
  second.join();
  EXPECT_GT(opened, 0);
  EXPECT_EQ(registry.findSession(current), nullptr);
}

}  // namespace
