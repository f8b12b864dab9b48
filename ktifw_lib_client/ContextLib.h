// One context of the interface framework: a number, seen through the framework's functions. A value without state of
// its own; see Interfaces.h for its operations. Like the framework record behind them, an operation belongs to one
// thread at a time.
#pragma once

#include <cstdint>
#include <vector>

#include "ktifw_lib_client/Interfaces.h"

namespace ktifw_lib_client {

class ContextLib : public ktifw::ContextInterface {
 public:
  // `map` turns the numbers of children into contexts; it must outlive this object.
  ContextLib(std::uint32_t frameworkSession, std::uint32_t contextNumber, ktifw::SubsystemMapInterface& map)
      : session_(frameworkSession), context_(contextNumber), map_(&map) {}

  ktifw::ReadInstruction contextualize(std::uint64_t localOffset, ktifw::Status& status) override;
  ktifw::WriteInstruction contextualizeWrite(std::uint64_t localOffset, std::uint64_t value,
                                             ktifw::Status& status) override;
  ktifw::ContextInfo getInfo(ktifw::Status& status) override;
  void getSubsystemAndOffset(std::uint8_t& subsystem, std::uint64_t& baseOffset, ktifw::Status& status) override;
  void checkVersion(std::uint16_t major, std::uint16_t minor, bool flag, bool* first, bool* second,
                    ktifw::Status& status) override;
  ktifw::ContextInterface* getChild(std::uint16_t childType, std::uint8_t flag, ktifw::Status& status) override;
  void getChildrenByUid(std::uint16_t uid, std::vector<ktifw::ContextInterface*>& children,
                        ktifw::Status& status) override;
  void getAllChildren(std::vector<ktifw::ContextInterface*>& children, ktifw::Status& status) override;

 private:
  std::uint32_t session_;
  std::uint32_t context_;
  ktifw::SubsystemMapInterface* map_;  // not owned, never null
};

}  // namespace ktifw_lib_client
