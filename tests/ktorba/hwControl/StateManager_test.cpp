#include "ktorba/hwControl/StateManager.h"

#include <gmock/gmock.h>

#include "kterr/Exception.h"

namespace ktorba {
namespace {

// Every part of a session in one, twice: logs what it is asked for.
class Part : public TransitionableInterface,
             public SettingProviderInterface,
             public SettingReceiverInterface,
             public HWTraitProviderInterface,
             public HWTraitReceiverInterface {
 public:
  Part(std::string name, std::string& log) : name_(std::move(name)), log_(log) {}

  std::string failsAt;

  void configure(bool force) override { note(force ? "configure!" : "configure"); }
  void prepare() override { note("prepare"); }
  void initiate() override { note("initiate"); }
  void reset() override { note("reset"); }
  void abort() override { note("abort"); }
  void provideSettings(HWSettingsRecord& out) override { note("provide"), out.settings.primingDepthWords = 9; }
  void receiveSettings(const HWSettingsRecord& s) override {
    note("settings" + std::to_string(s.settings.primingDepthWords));
  }
  void getHWTraits(HWTraits& out, bool refresh) override { note(refresh ? "refresh" : "get"), out.maxPrimingWords = 8; }
  void receiveHWTraits(const HWTraits& traits) override { note("traits" + std::to_string(traits.maxPrimingWords)); }

 private:
  void note(const std::string& what) {
    log_ += name_ + what + " ";
    if (what == failsAt) throw kterr::Exception();
  }

  std::string name_;
  std::string& log_;
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
  EXPECT_EQ(log, "a.provide b.settings9 a.settings9 b.get a.traits8 b.traits8 a.configure! b.configure! ");
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
  manager.checkTransition(GenerationEvent{4});
}

}  // namespace
}  // namespace ktorba
