// Control functions that concern a whole FPGA.
#include <cstring>

#include "ktorba/simulator.h"
#include "simulator/controlFrame.h"

using simulator::Context;
using simulator::Fpga;
using simulator::FpgaTable;
using simulator::onFpga;

const char* ktSim_DescribeCode(std::int32_t code) {
  switch (code) {
    case 0:
      return "success";
#define KTSIM_CODE_TEXT(name, value, text) \
  case name:                               \
    return text;
      KTSIM_CODES(KTSIM_CODE_TEXT)
#undef KTSIM_CODE_TEXT
    default:
      return "unknown code";
  }
}

std::int32_t ktSim_CreateFpga(ktSim_Fpga* fpga) {
  return simulator::guarded([&]() -> std::int32_t {
    if (fpga == nullptr) return KTSIM_E_ARGUMENT;
    *fpga = FpgaTable::instance().create()->numbers();
    return 0;
  });
}

std::int32_t ktSim_DestroyFpga(std::uint32_t fpgaSession) {
  return simulator::guarded(
      [&]() -> std::int32_t { return FpgaTable::instance().destroy(fpgaSession) ? 0 : KTSIM_E_SESSION; });
}

std::int32_t ktSim_AddGenerator(std::uint32_t fpgaSession, const ktSim_Traits* traits, std::uint32_t* generator) {
  ktSim_Traits defaults;
  ktSim_DefaultTraits(&defaults);
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (generator == nullptr) return KTSIM_E_ARGUMENT;
    std::uint32_t index = 0;
    if (const std::int32_t code = fpga.addGenerator(traits == nullptr ? defaults : *traits, index)) return code;
    *generator = simulator::generatorHandle(fpgaSession, index);
    return 0;
  });
}

// ---- Contexts, FIFOs and registers beside the generators' own ----

std::int32_t ktSim_AddContext(std::uint32_t fpgaSession, std::uint32_t parent, std::uint16_t type,
                              std::uint32_t* context) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (context == nullptr) return KTSIM_E_ARGUMENT;
    if (fpga.contexts.find(parent) == nullptr) return KTSIM_E_CONTEXT;
    Context added;
    added.type = added.reportedType = type;
    *context = fpga.contexts.add(parent, added);
    return 0;
  });
}

std::int32_t ktSim_ListContext(std::uint32_t fpgaSession, std::uint32_t parent, std::uint32_t context) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (fpga.contexts.find(parent) == nullptr || fpga.contexts.find(context) == nullptr) return KTSIM_E_CONTEXT;
    fpga.contexts.list(parent, context);
    return 0;
  });
}

std::int32_t ktSim_ChangeChildrenAfterCount(std::uint32_t fpgaSession, std::uint32_t context, std::int32_t change) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    Context* const found = fpga.contexts.find(context);
    if (found == nullptr) return KTSIM_E_CONTEXT;
    found->changeAfterCount = change;
    return 0;
  });
}

std::int32_t ktSim_AddLoopbackFifo(std::uint32_t fpgaSession, const char* name, std::uint32_t* fifo) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (name == nullptr || fifo == nullptr) return KTSIM_E_ARGUMENT;
    *fifo = fpga.addLoopbackFifo(name);
    return 0;
  });
}

std::int32_t ktSim_AddRegisterName(std::uint32_t fpgaSession, const char* name, std::uint32_t offset) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (name == nullptr) return KTSIM_E_ARGUMENT;
    fpga.addRegisterName(name, offset);
    return 0;
  });
}

// ---- Faults on demand and the record of calls ----

std::int32_t ktSim_FailCall(std::uint32_t fpgaSession, const char* function, std::uint64_t nth, std::int32_t code,
                            const char* elaboration) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (nth == 0) return KTSIM_E_ARGUMENT;
    fpga.calls.arm({function == nullptr ? "" : function, nth, code == 0 ? KTSIM_E_FAULT : code,
                    elaboration == nullptr ? "" : elaboration});
    return 0;
  });
}

std::int32_t ktSim_ClearFailures(std::uint32_t fpgaSession) {
  return onFpga(fpgaSession, [](Fpga& fpga) {
    fpga.calls.disarm();
    return 0;
  });
}

std::int32_t ktSim_RecordCalls(std::uint32_t fpgaSession, std::uint64_t capacityLines) {
  return onFpga(fpgaSession, [&](Fpga& fpga) {
    fpga.calls.setCapacity(capacityLines);
    return 0;
  });
}

std::int32_t ktSim_ReadCalls(std::uint32_t fpgaSession, char* text, std::uint64_t capacity, std::uint64_t* length) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (length == nullptr || (text == nullptr && capacity != 0)) return KTSIM_E_ARGUMENT;
    const std::string& lines = fpga.calls.text();
    *length = lines.size();
    if (capacity <= lines.size()) return 0;
    std::memcpy(text, lines.c_str(), lines.size() + 1);
    fpga.calls.clear();
    return 0;
  });
}

std::int32_t ktSim_GetCallCount(std::uint32_t fpgaSession, std::uint64_t* count) {
  return onFpga(fpgaSession, [&](Fpga& fpga) -> std::int32_t {
    if (count == nullptr) return KTSIM_E_ARGUMENT;
    *count = fpga.calls.callCount();
    return 0;
  });
}
