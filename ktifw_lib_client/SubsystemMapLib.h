// All contexts of a framework session, by number: asked of the framework once, at construction, fixed from then on.
// Look-ups may come from any thread. Contexts point back at their map, so a map stays where it was built.
#pragma once

#include <cstdint>
#include <map>

#include "ktifw_lib_client/ContextLib.h"

namespace ktifw_lib_client {

class SubsystemMapLib : public ktifw::SubsystemMapInterface {
 public:
  // Maps context 0, the root, and every context that can be reached from it, depth first; one that is listed again, in
  // a cycle or otherwise, is passed over. Raises the framework's errors, and nKTAPALS100_tStatus_kSoftwareFault when
  // the framework announces a list that it does not give.
  explicit SubsystemMapLib(std::uint32_t frameworkSession);
  SubsystemMapLib(const SubsystemMapLib&) = delete;
  SubsystemMapLib& operator=(const SubsystemMapLib&) = delete;

  ktifw::ContextInterface* getContext(std::uint32_t contextNumber, ktifw::Status& status) override;
  ktifw::ContextInterface* getContextUnsupported(std::uint32_t contextNumber, ktifw::Status& status) override;

 private:
  bool add(std::uint32_t contextNumber);  // whether it was not there yet

  std::uint32_t session_;
  std::map<std::uint32_t, ContextLib> contexts_;
};

}  // namespace ktifw_lib_client
