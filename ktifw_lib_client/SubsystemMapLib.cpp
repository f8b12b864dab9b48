#include "ktifw_lib_client/SubsystemMapLib.h"

#include <optional>
#include <vector>

#include "kterr/ErrorConstant.h"
#include "kterr/Exception.h"
#include "ktifw_lib_client/ContextNumbers.h"

namespace ktifw_lib_client {
namespace {

constexpr char kSource[] = R"(ktifw_lib_client\SubsystemMapLib)";
constexpr std::uint32_t kRoot = 0;

void merge(Status& status, std::int32_t code, std::uint32_t line = __builtin_LINE()) {
  kterr::mergeCode(status, code, kterr::kComponent, kSource, line);
}

std::optional<std::uint32_t> nextOf(ContextNumbers& numbers) {
  auto status = kterr::makeLocatedStatus();
  const std::optional<std::uint32_t> number = numbers.next(status);
  kterr::raiseLocated(status);
  return number;
}

}  // namespace

SubsystemMapLib::SubsystemMapLib(std::uint32_t frameworkSession) : session_(frameworkSession) {
  add(kRoot);
  std::vector<ContextNumbers> lists;  // being read, the innermost last: a tree may be as deep as it likes
  lists.emplace_back(session_, kRoot);
  while (!lists.empty()) {
    const std::optional<std::uint32_t> child = nextOf(lists.back());
    if (!child) {
      lists.pop_back();
    } else if (add(*child)) {
      lists.emplace_back(session_, *child);
    }
  }
}

bool SubsystemMapLib::add(std::uint32_t contextNumber) {
  return contexts_.try_emplace(contextNumber, session_, contextNumber, *this).second;
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
