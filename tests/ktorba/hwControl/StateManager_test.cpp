#include "ktorba/hwControl/StateManager.h"

#include <gmock/gmock.h>

#include "kterr/Exception.h"

namespace ktorba {
namespace {

// Every part of a session in one, twice: logs what it is asked for.
struct Part : TransitionableInterface,
              SettingProviderInterface,
              SettingReceiverInterface,
              HWTraitProviderInterface,
              HWTraitReceiverInterface {
  Part(const char* called, std::string& into) : name(called), log(into) {}

  void configure(bool force) override { note(force ? "configure!" : "configure"); }
  void prepare() override { note("prepare"); }
  void initiate() override { note("initiate"); }
  void reset() override { note("reset"); }
  void abort() override { note("abort"); }
  void provideSettings(HWSettingsRecord& out) override { out.settings.primingDepthWords = 9; }
  void receiveSettings(const HWSettingsRecord& given) override {
    note("settings" + std::to_string(given.settings.primingDepthWords));
  }
  void getHWTraits(HWTraits& out, bool refresh) override { out.maxPrimingWords = refresh ? 0 : 8; }
  void receiveHWTraits(const HWTraits& given) override { note("traits" + std::to_string(given.maxPrimingWords)); }

  void note(const std::string& what) {
    log += name + what + " ";
    if (what == failsAt) throw kterr::Exception();
  }

  std::string name;
  std::string& log;
  std::string failsAt;
};

class StateManagerTest : public testing::Test {
 protected:
  // The calls that a transition makes, or the failure's message, and the state behind it.
  std::string attempt(void (StateManager::*transition)()) {
    log.clear();
    try {
      (manager.*transition)();
    } catch (const kterr::Exception& e) {
      if (e.getJson() != nullptr) log = std::string(e.getJson()).substr(std::string(e.getJson()).find("ktorba_debug"));
    }
    return log + "-> " + std::to_string(static_cast<int>(manager.getState()));
  }

  std::string log;
  Part a{"a.", log}, b{"b.", log};
  StateManager manager{{&a, &b}, a, {&b, &a}, b, {&a, &b}};
};

TEST_F(StateManagerTest, ConfiguringMovesSettingsAndTraitsFirst) {
  manager.configure(true);
  EXPECT_EQ(log, "b.settings9 a.settings9 a.traits8 b.traits8 a.configure! b.configure! ");
}

TEST_F(StateManagerTest, TransitionsFollowTheStates) {
  using SM = StateManager;
  EXPECT_EQ(attempt(&SM::abort), "a.abort b.abort -> 0");
  EXPECT_EQ(attempt(&SM::prepare), R"(ktorba_debug":"generation must be configured"}-> 0)");
  manager.configure(false);
  EXPECT_EQ(attempt(&SM::initiate), R"(ktorba_debug":"generation is not prepared for initiate"}-> 1)");
  b.failsAt = "prepare";
  EXPECT_EQ(attempt(&SM::prepare), "a.prepare b.prepare -> 1") << "a failing part keeps the state";
  b.failsAt = "";
  EXPECT_EQ(attempt(&SM::prepare), "a.prepare b.prepare -> 2");
  EXPECT_EQ(attempt(&SM::initiate), "a.initiate b.initiate -> 3");
  EXPECT_EQ(attempt(&SM::initiate), "a.initiate b.initiate -> 3") << "again";
  manager.checkTransition(GenerationEvent::kNeedsRunning);
  EXPECT_EQ(attempt(&SM::abort), "a.abort b.abort -> 1");
  EXPECT_THROW(manager.checkTransition(GenerationEvent::kNeedsRunning), kterr::Exception);
  EXPECT_EQ(attempt(&SM::reset), "a.reset b.reset -> 0");
  manager.checkTransition(4);
}

}  // namespace
}  // namespace ktorba
