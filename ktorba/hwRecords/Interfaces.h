// The one-operation interfaces through which traits and settings are provided and received, and the interface of
// every part that takes part in generation state changes. Failures are kterr::Exception; one thread at a time.
#pragma once

#include "ktorba/hwRecords/HWSettings.h"
#include "ktorba/hwRecords/HWTraits.h"

namespace ktorba {

class SettingProviderInterface {
 public:
  // Gives the settings that hold.
  virtual void provideSettings(HWSettingsRecord& out) = 0;
  virtual ~SettingProviderInterface() = default;
};

class SettingReceiverInterface {
 public:
  // Takes a copy of the settings that are about to be written to the generator.
  virtual void receiveSettings(const HWSettingsRecord& settings) = 0;
  virtual ~SettingReceiverInterface() = default;
};

class HWTraitProviderInterface {
 public:
  // Gives the traits known; with `refresh` reads them from the generator first.
  virtual void getHWTraits(HWTraits& out, bool refresh) = 0;
  virtual ~HWTraitProviderInterface() = default;
};

class HWTraitReceiverInterface {
 public:
  // Takes a copy of the traits, which replace those received before.
  virtual void receiveHWTraits(const HWTraits& traits) = 0;
  virtual ~HWTraitReceiverInterface() = default;
};

// What a part does when generation changes its state. Who calls sees to the order, and keeps its state when one throws.
class TransitionableInterface {
 public:
  virtual void configure(bool force) = 0;  // takes the settings over; with `force` also those that it has already
  virtual void prepare() = 0;              // makes ready for initiate()
  virtual void initiate() = 0;             // starts generating
  virtual void reset() = 0;                // goes back to the beginning, unconfigured
  virtual void abort() = 0;                // stops generating and stays configured
  virtual ~TransitionableInterface() = default;
};

}  // namespace ktorba
