#include "ktorba/hwControl/StateManager.h"

#include <utility>

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba\hwControl\StateManager)";

struct TransitionRule {
  std::uint32_t event;
  std::uint32_t lowestState;  // states below it do not allow the event
  const kterr::ErrorConstant& error;
  const char* message;
};

constexpr TransitionRule kTransitionRules[] = {
    {GenerationEvent::kPrepare, GenerationState::kConfigured, ktorba_errors::kErrorGenerationUnconfigured,
     "generation must be configured"},
    {GenerationEvent::kInitiate, GenerationState::kPrepared, ktorba_errors::kErrorInitiateNotCalled,
     "generation is not prepared for initiate"},
    {GenerationEvent::kNeedsRunning, GenerationState::kInitiated, ktorba_errors::kErrorInitiateNotCalled,
     "generation is not initiated"},
};

}  // namespace

StateManager::StateManager(std::vector<TransitionableInterface*> participants,
                           SettingProviderInterface& settingProvider,
                           std::vector<SettingReceiverInterface*> settingReceivers,
                           HWTraitProviderInterface& traitProvider,
                           std::vector<HWTraitReceiverInterface*> traitReceivers)
    : participants_(std::move(participants)),
      settingProvider_(&settingProvider),
      settingReceivers_(std::move(settingReceivers)),
      traitProvider_(&traitProvider),
      traitReceivers_(std::move(traitReceivers)) {}

void StateManager::checkTransition(std::uint32_t event) {
  for (const TransitionRule& rule : kTransitionRules) {
    if (rule.event == event && state_ < rule.lowestState) {
      kterr::Failure(rule.error).at(kSource).message("ktorba_debug", rule.message).raise();
    }
  }
}

void StateManager::distributeHWTraits(const HWTraits& traits) {
  for (HWTraitReceiverInterface* receiver : traitReceivers_) receiver->receiveHWTraits(traits);
}

void StateManager::configure(bool force) {
  HWSettingsRecord settings;
  settingProvider_->provideSettings(settings);
  for (SettingReceiverInterface* receiver : settingReceivers_) receiver->receiveSettings(settings);
  HWTraits traits;
  traitProvider_->getHWTraits(traits, false);
  distributeHWTraits(traits);
  for (TransitionableInterface* participant : participants_) participant->configure(force);
  state_ = GenerationState::kConfigured;
}

void StateManager::prepare() {
  checkTransition(GenerationEvent::kPrepare);
  for (TransitionableInterface* participant : participants_) participant->prepare();
  state_ = GenerationState::kPrepared;
}

void StateManager::initiate() {
  checkTransition(GenerationEvent::kInitiate);
  for (TransitionableInterface* participant : participants_) participant->initiate();
  state_ = GenerationState::kInitiated;
}

void StateManager::reset() {
  for (TransitionableInterface* participant : participants_) participant->reset();
  state_ = GenerationState::kUnconfigured;
}

void StateManager::abort() {
  for (TransitionableInterface* participant : participants_) participant->abort();
  if (state_ > GenerationState::kConfigured) state_ = GenerationState::kConfigured;
}

}  // namespace ktorba
