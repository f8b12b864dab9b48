// The one-operation interfaces through which traits and settings are provided and received, and the interface of
// every part that takes part in generation state changes.
#pragma once

#include "ktorba/hwRecords/HWSettings.h"
#include "ktorba/hwRecords/HWTraits.h"

namespace ktorba {

class SettingProviderInterface {
 public:
  virtual void provideSettings(HWSettingsRecord& out) = 0;
  virtual ~SettingProviderInterface() = default;
};

class SettingReceiverInterface {
 public:
  virtual void receiveSettings(const HWSettingsRecord& settings) = 0;
  virtual ~SettingReceiverInterface() = default;
};

class HWTraitProviderInterface {
 public:
  virtual void getHWTraits(HWTraits& out, bool refresh) = 0;
  virtual ~HWTraitProviderInterface() = default;
};

class HWTraitReceiverInterface {
 public:
  virtual void receiveHWTraits(const HWTraits& traits) = 0;
  virtual ~HWTraitReceiverInterface() = default;
};

// A failing transition throws and leaves the caller's state as it was.
class TransitionableInterface {
 public:
  virtual void configure(bool force) = 0;
  virtual void prepare() = 0;
  virtual void initiate() = 0;
  virtual void reset() = 0;
  virtual void abort() = 0;
  virtual ~TransitionableInterface() = default;
};

}  // namespace ktorba
