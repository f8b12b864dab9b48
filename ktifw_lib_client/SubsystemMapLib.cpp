#include "ktifw_lib_client/SubsystemMapLib.h"

#include <iterator>
#include <string>
#include <vector>

#include "kterr/Failure.h"
#include "ktifw_lib_client/ContextNumbers.h"

namespace ktifw_lib_client {
namespace {

constexpr char kSource[] = R"(ktifw_lib_client\SubsystemMapLib)";
constexpr std::uint32_t kRoot = 0;

void merge(Status& status, std::int32_t code, std::uint32_t line = __builtin_LINE()) {
  kterr::mergeCode(status, code, kterr::kComponent, kSource, line);
}

// Puts the children of `context` on `pending`, the first on top.
void pushChildren(std::uint32_t session, std::uint32_t context, std::vector<std::uint32_t>& pending) {
  auto status = kterr::makeLocatedStatus();
  const ContextNumbers children = ContextNumbers::allChildren(session, context, status);
  kterr::raiseLocated(status);
  pending.insert(pending.end(), std::make_reverse_iterator(children.end()),
                 std::make_reverse_iterator(children.begin()));
}

}  // namespace

SubsystemMapLib::SubsystemMapLib(std::uint32_t frameworkSession) : session_(frameworkSession) {
  for (std::vector<std::uint32_t> pending{kRoot}; !pending.empty();) {
    const std::uint32_t context = pending.back();
    pending.pop_back();
    add(context);
    pushChildren(session_, context, pending);
  }
}

void SubsystemMapLib::add(std::uint32_t contextNumber) {
  const bool isNew = contexts_.try_emplace(contextNumber, session_, contextNumber, *this).second;
  if (isNew) return;
  const std::string message = "The framework lists context " + std::to_string(contextNumber) + " twice.";
  kterr::Failure(nKTAPALS100_tStatus_kSoftwareFault)
      .at(kSource)
      .message("ktifw_lib_client::SubsystemMapLib", message.c_str())
      .raise();
}

ktifw::ContextInterface* SubsystemMapLib::getContext(std::uint32_t contextNumber, Status& status) {
  const auto found = contexts_.find(contextNumber);
  if (found != contexts_.end()) return &found->second;
  merge(status, nKTAPALS100_tStatus_kInvalidParameter.code);
  return nullptr;
}

ktifw::ContextInterface* SubsystemMapLib::getContextUnsupported(std::uint32_t, Status& status) {
  merge(status, ktorba_codes::kUnsupportedLookup.code);
  return nullptr;
}

}  // namespace ktifw_lib_client
