#include "ktifw_lib_client/ContextLib.h"

#include <new>

#include "ktifw_lib_client/ContextNumbers.h"
#include "ktifw_lib_client/FrameworkStatus.h"
#include "platform/fpga/KtifwuLibrary.h"

namespace ktifw_lib_client {

using ktifw::ContextInterface;
using platform::Ktifwu;

namespace {

// Appends the contexts behind `numbers`, up to the first that the map does not know.
void appendContexts(ContextNumbers numbers, ktifw::SubsystemMapInterface& map, std::vector<ContextInterface*>& contexts,
                    Status& status) {
  try {
    while (const auto number = numbers.next(status)) {
      ContextInterface* const context = map.getContext(*number, status);
      if (context == nullptr) return;
      contexts.push_back(context);
    }
  } catch (const std::bad_alloc&) {
    setOutOfMemory(status);
  }
}

}  // namespace

ktifw::ReadInstruction ContextLib::contextualize(std::uint64_t localOffset, Status& status) {
  ktifw::ReadInstruction instruction;
  callFramework(status, status.code, [&](tStatus* framework) {
    Ktifwu().Context_Contextualize(session_, context_, localOffset, &instruction.subsystem, &instruction.offset,
                                   framework);
  });
  return instruction;
}

ktifw::WriteInstruction ContextLib::contextualizeWrite(std::uint64_t localOffset, std::uint64_t value, Status& status) {
  const ktifw::ReadInstruction address = contextualize(localOffset, status);
  return {address.subsystem, address.offset, value};
}

ktifw::ContextInfo ContextLib::getInfo(Status& status) {
  ktifw::ContextInfo info;
  if (failed(status)) return info;
  callFramework(status, status.code, [&](tStatus* framework) {
    auto& values = info.values;
    Ktifwu().Context_GetInfo(session_, context_, &values[0], &values[1], &values[2], &values[3], framework);
  });
  return info;
}

void ContextLib::getSubsystemAndOffset(std::uint8_t& subsystem, std::uint64_t& baseOffset, Status& status) {
  subsystem = 0;
  baseOffset = 0;
  if (failed(status)) return;
  callFramework(status, status.code, [&](tStatus* framework) {
    Ktifwu().Context_GetSubsystemAndOffset(session_, context_, &subsystem, &baseOffset, framework);
  });
}

void ContextLib::checkVersion(std::uint16_t major, std::uint16_t minor, bool flag, bool* first, bool* second,
                              Status& status) {
  std::uint8_t firstResult = 0;
  std::uint8_t secondResult = 0;
  callFramework(status, status.code, [&](tStatus* framework) {
    Ktifwu().Context_CheckVersion(session_, context_, major, minor, flag, &firstResult, &secondResult, framework);
  });
  if (failed(status)) return;
  if (first != nullptr) *first = firstResult != 0;
  if (second != nullptr) *second = secondResult != 0;
}

ContextInterface* ContextLib::getChild(std::uint16_t childType, std::uint8_t flag, Status& status) {
  if (failed(status)) return nullptr;
  std::uint32_t child = 0;
  callFramework(status, status.code, [&](tStatus* framework) {
    Ktifwu().Context_GetChild(session_, childType, flag, context_, &child, framework);
  });
  return failed(status) ? nullptr : map_->getContext(child, status);
}

void ContextLib::getChildrenByUid(std::uint16_t uid, std::vector<ContextInterface*>& children, Status& status) {
  if (failed(status)) return;
  appendContexts({session_, context_, uid}, *map_, children, status);
}

void ContextLib::getAllChildren(std::vector<ContextInterface*>& children, Status& status) {
  if (failed(status)) return;
  appendContexts({session_, context_}, *map_, children, status);
}

}  // namespace ktifw_lib_client
