// The generation state of one session. Every state change calls the parts that take part in it, in list order, and
// changes the state only after the last has returned; a part that throws stops the walk and leaves the state alone.
// Configuring also moves the settings and the traits from their providers to their receivers. One thread at a time.
#pragma once

#include <cstdint>
#include <vector>

#include "ktorba/hwRecords/Interfaces.h"

namespace ktorba {

// The values of getState(), in the order in which a generation runs through them.
struct GenerationState {
  enum : std::uint32_t { kUnconfigured, kConfigured, kPrepared, kInitiated };
};

// What checkTransition() knows; any other value is allowed in every state.
struct GenerationEvent {
  enum : std::uint32_t { kPrepare = 1, kInitiate = 2, kNeedsRunning = 3 };
};

class StateManagerInterface {
 public:
  // Raises when the present state does not allow `event`, a GenerationEvent:
  // ktorba_errors::kErrorGenerationUnconfigured, or kErrorInitiateNotCalled.
  virtual void checkTransition(std::uint32_t event) = 0;
  virtual std::uint32_t getState() = 0;  // a GenerationState
  virtual ~StateManagerInterface() = default;
};

class StateManager : public StateManagerInterface, public TransitionableInterface {
 public:
  // Borrows everything for the life of this object. Begins unconfigured.
  StateManager(std::vector<TransitionableInterface*> participants, SettingProviderInterface& settingProvider,
               std::vector<SettingReceiverInterface*> settingReceivers, HWTraitProviderInterface& traitProvider,
               std::vector<HWTraitReceiverInterface*> traitReceivers);

  void checkTransition(std::uint32_t event) override;
  std::uint32_t getState() override { return state_; }
  virtual void distributeHWTraits(const HWTraits& traits);

  void configure(bool force) override;  // from any state
  void prepare() override;
  void initiate() override;
  void reset() override;  // from any state
  void abort() override;  // from any state; one that is neither prepared nor initiated stays

 private:
  std::vector<TransitionableInterface*> participants_;
  SettingProviderInterface* settingProvider_;
  std::vector<SettingReceiverInterface*> settingReceivers_;
  HWTraitProviderInterface* traitProvider_;
  std::vector<HWTraitReceiverInterface*> traitReceivers_;
  std::uint32_t state_ = GenerationState::kUnconfigured;
};

}  // namespace ktorba
