// The interface framework's functions, on the simulated device.
#include <algorithm>
#include <cstdio>
#include <vector>

#include "kterr/Status.h"
#include "simulator/platformCalls.h"
#include "simulator/platformFrame.h"

namespace {

using simulator::Argument;
using simulator::Context;
using simulator::Fpga;
using simulator::FpgaTable;
using simulator::Generator;
using simulator::Outcome;

void report(tStatus* status, const Outcome& outcome) {
  if (status == nullptr || outcome.code == 0 || !kterr::setCode(*status, outcome.code)) return;
  if (!outcome.elaboration.empty()) {
    kterr::setJson(*status, outcome.elaboration.c_str());
    return;
  }
  char text[256];
  std::snprintf(text, sizeof text,
                R"({"error_constant": "%d", "file": "simulator", "line": 0, "component": "ktsim", "reason": "%s"})",
                outcome.code, ktSim_DescribeCode(outcome.code));
  kterr::setJson(*status, text);
}

// What a status that already holds an error lets a call do: be counted and written down, no more.
template <typename Describe, typename Body>
void call(const std::shared_ptr<Fpga>& fpga, const char* function, Describe describe, Body body, tStatus* status) {
  const bool isRefused = status != nullptr && status->code < 0;
  const auto unlessRefused = [&](Fpga& on) { return isRefused ? 0 : body(on); };
  report(status, simulator::runPlatformCall(fpga, function, describe, unlessRefused));
}

// `arguments` are those behind the context's number; `body` gets the FPGA and the context.
template <typename Body>
void contextCall(std::uint32_t session, const char* function, std::uint32_t context,
                 std::initializer_list<Argument> arguments, Body body, tStatus* status) {
  const auto describe = [&](Fpga&) {
    std::string line = simulator::describeCall(function, {{"context", context}});
    return line += simulator::describeCall("", arguments);
  };
  const auto onContext = [&](Fpga& fpga) {
    Context* const found = fpga.contexts.find(context);
    return found == nullptr ? static_cast<std::int32_t>(KTSIM_E_CONTEXT) : body(fpga, *found);
  };
  call(FpgaTable::instance().byIfwSession(session), function, describe, onContext, status);
}

template <typename Value>
void give(Value* result, Value value) {
  if (result != nullptr) *result = value;
}

// Writes at most `capacity` of the children that `isMeant` picks, and their true number.
template <typename IsMeant>
std::int32_t giveChildren(Fpga& fpga, std::uint32_t context, IsMeant isMeant, std::uint32_t* children,
                          std::uint32_t capacity, std::uint32_t* count) {
  if (count == nullptr || (children == nullptr && capacity != 0)) return KTSIM_E_ARGUMENT;
  *count = 0;
  for (const std::uint32_t child : fpga.contexts.find(context)->children) {
    if (!isMeant(*fpga.contexts.find(child))) continue;
    if (*count < capacity) children[*count] = child;
    ++*count;
  }
  if (capacity == 0) fpga.contexts.changeChildren(context);
  return 0;
}

// "17", or "1:17" for the second generator.
std::string registerText(Fpga& fpga, std::uint8_t subsystem, std::uint64_t offset) {
  const Fpga::RegisterPlace place = fpga.locate(subsystem, offset);
  if (place.generator == nullptr) return std::to_string(subsystem) + "/" + std::to_string(offset);
  const std::string number = std::to_string(place.number);
  return place.generatorIndex == 0 ? number : std::to_string(place.generatorIndex) + ":" + number;
}

struct RegisterList {
  const std::uint8_t* subsystems;
  const std::uint64_t* offsets;
  std::uint32_t count;
};

std::string describeReads(Fpga& fpga, const RegisterList& list) {
  std::string line = "read ";
  for (std::uint32_t i = 0; i < list.count; ++i) {
    line += (i == 0 ? "" : ", ") + registerText(fpga, list.subsystems[i], list.offsets[i]);
  }
  return line;
}

std::string describeWrites(Fpga& fpga, const RegisterList& list, const std::uint64_t* values) {
  std::string line = "write ";
  for (std::uint32_t i = 0; i < list.count; ++i) {
    line += (i == 0 ? "" : ", ") + registerText(fpga, list.subsystems[i], list.offsets[i]);
    line += " <- " + std::to_string(values[i]);
  }
  return line;
}

// Calls access(generator, register number, i) for each of the list until one fails. Time passes once for each
// generator that the list names.
template <typename Access>
std::int32_t accessRegisters(Fpga& fpga, const RegisterList& list, Access access) {
  const Generator* begun = nullptr;
  for (std::uint32_t i = 0; i < list.count; ++i) {
    const Fpga::RegisterPlace place = fpga.locate(list.subsystems[i], list.offsets[i]);
    if (place.generator == nullptr) return KTSIM_E_REGISTER;
    if (place.generator != begun) place.generator->beginAccess();
    begun = place.generator;
    if (const std::int32_t code = access(*place.generator, place.number, i)) return code;
  }
  return 0;
}

void readRegisters(std::uint32_t target, const char* function, const RegisterList& list, std::uint64_t* values,
                   tStatus* status) {
  const auto read = [&](Fpga& fpga) {
    return accessRegisters(fpga, list, [&](Generator& generator, std::uint64_t number, std::uint32_t i) {
      return generator.readRegister(number, values[i]);
    });
  };
  call(
      FpgaTable::instance().byIfwTarget(target), function, [&](Fpga& fpga) { return describeReads(fpga, list); }, read,
      status);
}

void writeRegisters(std::uint32_t target, const char* function, const RegisterList& list, const std::uint64_t* values,
                    tStatus* status) {
  const auto write = [&](Fpga& fpga) {
    return accessRegisters(fpga, list, [&](Generator& generator, std::uint64_t number, std::uint32_t i) {
      return generator.writeRegister(number, values[i]);
    });
  };
  call(
      FpgaTable::instance().byIfwTarget(target), function,
      [&](Fpga& fpga) { return describeWrites(fpga, list, values); }, write, status);
}

}  // namespace

void ktSimDevice_Context_Contextualize(std::uint32_t session, std::uint32_t context, std::uint64_t localOffset,
                                       std::uint8_t* subsystem, std::uint64_t* busOffset, tStatus* status) {
  const auto body = [&](Fpga&, const Context& on) -> std::int32_t {
    if (!on.registers) return KTSIM_E_CONTEXT;
    give(subsystem, on.registers->subsystem);
    give(busOffset, on.registers->baseOffset + localOffset);
    return 0;
  };
  contextCall(session, "ktIFW_Context_Contextualize", context, {{"offset", localOffset}}, body, status);
}

void ktSimDevice_Context_GetInfo(std::uint32_t session, std::uint32_t context, std::uint16_t* first,
                                 std::uint16_t* second, std::uint16_t* third, std::uint16_t* fourth, tStatus* status) {
  const auto body = [&](Fpga&, const Context& on) {
    give(first, on.reportedType);
    give(second, on.versionMajor);
    give(third, on.versionMinor);
    give(fourth, std::uint16_t{on.instance});
    return 0;
  };
  contextCall(session, "ktIFW_Context_GetInfo", context, {}, body, status);
}

void ktSimDevice_Context_GetSubsystemAndOffset(std::uint32_t session, std::uint32_t context, std::uint8_t* subsystem,
                                               std::uint64_t* baseOffset, tStatus* status) {
  const auto body = [&](Fpga&, const Context& on) -> std::int32_t {
    if (!on.registers) return KTSIM_E_CONTEXT;
    give(subsystem, on.registers->subsystem);
    give(baseOffset, on.registers->baseOffset);
    return 0;
  };
  contextCall(session, "ktIFW_Context_GetSubsystemAndOffset", context, {}, body, status);
}

// A block serves a host that was made for the same major version and no later minor one. First result: the block is
// older than the host asks for; second: it is of a later major version, which the host cannot know.
void ktSimDevice_Context_CheckVersion(std::uint32_t session, std::uint32_t context, std::uint16_t major,
                                      std::uint16_t minor, bool flag, std::uint8_t* first, std::uint8_t* second,
                                      tStatus* status) {
  const auto body = [&](Fpga&, const Context& on) {
    const bool isOlder = on.versionMajor < major || (on.versionMajor == major && on.versionMinor < minor);
    give(first, std::uint8_t{isOlder});
    give(second, std::uint8_t{on.versionMajor > major});
    return 0;
  };
  contextCall(session, "ktIFW_Context_CheckVersion", context, {{"major", major}, {"minor", minor}, {"flag", flag}},
              body, status);
}

void ktSimDevice_Context_GetChild(std::uint32_t session, std::uint16_t childType, std::uint8_t flag,
                                  std::uint32_t context, std::uint32_t* child, tStatus* status) {
  const auto body = [&](Fpga& fpga, const Context&) -> std::int32_t {
    const std::uint32_t* const found = fpga.contexts.findChild(context, childType, flag);
    if (found == nullptr) return KTSIM_E_CHILD;
    give(child, *found);
    return 0;
  };
  contextCall(session, "ktIFW_Context_GetChild", context, {{"childType", childType}, {"flag", flag}}, body, status);
}

void ktSimDevice_Context_GetChildrenByUid(std::uint32_t session, std::uint32_t context, std::uint16_t uid,
                                          std::uint32_t* children, std::uint32_t capacity, std::uint32_t* count,
                                          tStatus* status) {
  const auto body = [&](Fpga& fpga, const Context&) {
    const auto isMeant = [&](const Context& child) { return child.type == uid; };
    return giveChildren(fpga, context, isMeant, children, capacity, count);
  };
  contextCall(session, "ktIFW_Context_GetChildrenByUid", context, {{"uid", uid}, {"capacity", capacity}}, body, status);
}

void ktSimDevice_Context_GetAllChildren(std::uint32_t session, std::uint32_t context, std::uint32_t* children,
                                        std::uint32_t capacity, std::uint32_t* count, tStatus* status) {
  const auto body = [&](Fpga& fpga, const Context&) {
    const auto isMeant = [](const Context&) { return true; };
    return giveChildren(fpga, context, isMeant, children, capacity, count);
  };
  contextCall(session, "ktIFW_Context_GetAllChildren", context, {{"capacity", capacity}}, body, status);
}

void ktSimDevice_Target_Read(std::uint32_t target, std::uint8_t subsystem, std::uint64_t offset, std::uint64_t* value,
                             std::uint32_t, tStatus* status) {
  std::uint64_t unwanted = 0;
  readRegisters(target, "ktIFW_Target_Read", {&subsystem, &offset, 1}, value == nullptr ? &unwanted : value, status);
}

void ktSimDevice_Target_ReadArray(std::uint32_t target, const std::uint8_t* subsystems, const std::uint64_t* offsets,
                                  std::uint32_t count, std::uint64_t* values, std::uint32_t, tStatus* status) {
  if (count != 0 && (subsystems == nullptr || offsets == nullptr || values == nullptr)) {
    return report(status, {KTSIM_E_ARGUMENT, {}});
  }
  readRegisters(target, "ktIFW_Target_ReadArray", {subsystems, offsets, count}, values, status);
}

void ktSimDevice_Target_Write(std::uint32_t target, std::uint8_t subsystem, std::uint64_t offset, std::uint64_t value,
                              bool, std::uint32_t, tStatus* status) {
  writeRegisters(target, "ktIFW_Target_Write", {&subsystem, &offset, 1}, &value, status);
}

void ktSimDevice_Target_WriteArray(std::uint32_t target, const std::uint8_t* subsystems, const std::uint64_t* offsets,
                                   const std::uint64_t* values, std::uint32_t count, bool, std::uint32_t,
                                   tStatus* status) {
  if (count != 0 && (subsystems == nullptr || offsets == nullptr || values == nullptr)) {
    return report(status, {KTSIM_E_ARGUMENT, {}});
  }
  writeRegisters(target, "ktIFW_Target_WriteArray", {subsystems, offsets, count}, values, status);
}

// The bus has nothing to forget; the generators behind it are reset by their own command.
void ktSimDevice_Target_Reset(std::uint32_t target, tStatus* status) {
  constexpr const char* kFunction = "ktIFW_Target_Reset";
  call(
      FpgaTable::instance().byIfwTarget(target), kFunction, [&](Fpga&) { return std::string(kFunction); },
      [](Fpga&) { return 0; }, status);
}
