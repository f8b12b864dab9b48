// The FPGA interface library's functions, on the simulated device.
#include <algorithm>
#include <array>

#include "simulator/platformCalls.h"
#include "simulator/platformFrame.h"

namespace {

using simulator::Argument;
using simulator::Fifo;
using simulator::Fpga;

constexpr std::array<std::uint32_t, 4> kSignature{0x53494D55, 0x4C415445, 0x44574647, 0x454E0001};
constexpr std::uint32_t kAnyType = 0xFFFFFFFF;
constexpr std::uint32_t kFirstEndpoint = 1000;

template <typename Body>
std::int32_t call(std::uint32_t session, const char* function, std::initializer_list<Argument> arguments, Body body) {
  return simulator::runPlatformCall(
             simulator::FpgaTable::instance().bySession(session), function,
             [&](Fpga&) { return simulator::describeCall(function, arguments); }, body)
      .code;
}

// `arguments` are those behind the FIFO's number.
template <typename Body>
std::int32_t fifoCall(std::uint32_t session, const char* function, std::uint32_t fifo,
                      std::initializer_list<Argument> arguments, Body body) {
  const auto describe = [&](Fpga&) {
    std::string line = simulator::describeCall(function, {{"fifo", fifo}});
    return line += simulator::describeCall("", arguments);
  };
  const auto onFifo = [&](Fpga& fpga) {
    Fpga::FifoEnd* const end = fpga.fifo(fifo);
    if (end == nullptr) return static_cast<std::int32_t>(KTSIM_E_FIFO);
    if (end->generator != nullptr) end->generator->catchUp();
    return body(*end->fifo);
  };
  return simulator::runPlatformCall(simulator::FpgaTable::instance().bySession(session), function, describe, onFifo)
      .code;
}

std::int32_t giveFound(const std::uint32_t* found, std::uint32_t typeFilter, std::uint32_t* result) {
  if (result == nullptr) return KTSIM_E_ARGUMENT;
  if (found == nullptr || typeFilter != kAnyType) return KTSIM_E_NAME;
  *result = *found;
  return 0;
}

}  // namespace

std::int32_t ktSimDevice_GetBitfileSignature(std::uint32_t session, std::uint32_t* signature, std::uint32_t* count) {
  return call(session, "KtFpgaDll_GetBitfileSignature", {}, [&](Fpga&) -> std::int32_t {
    if (signature == nullptr || count == nullptr) return KTSIM_E_ARGUMENT;
    *count = std::min(*count, static_cast<std::uint32_t>(kSignature.size()));
    std::copy_n(kSignature.begin(), *count, signature);
    return 0;
  });
}

std::int32_t ktSimDevice_FindFifoPrivate(std::uint32_t session, const char* name, std::uint32_t typeFilter,
                                         std::uint32_t* result) {
  if (name == nullptr) return KTSIM_E_ARGUMENT;
  return call(session, "KtFpgaDll_FindFifoPrivate", {{"name", 0, name}, {"typeFilter", typeFilter}},
              [&](Fpga& fpga) { return giveFound(fpga.findFifo(name), typeFilter, result); });
}

std::int32_t ktSimDevice_FindRegisterPrivate(std::uint32_t session, const char* name, std::uint32_t typeFilter,
                                             std::uint32_t* result) {
  if (name == nullptr) return KTSIM_E_ARGUMENT;
  return call(session, "KtFpgaDll_FindRegisterPrivate", {{"name", 0, name}, {"typeFilter", typeFilter}},
              [&](Fpga& fpga) { return giveFound(fpga.findRegister(name), typeFilter, result); });
}

std::int32_t ktSimDevice_ConfigureFifo2(std::uint32_t session, std::uint32_t fifo, std::uint64_t requestedDepth,
                                        std::uint64_t* actualDepth) {
  return fifoCall(session, "KtFpgaDll_ConfigureFifo2", fifo, {{"depth", requestedDepth}},
                  [&](Fifo& on) { return on.configure(requestedDepth, actualDepth); });
}

std::int32_t ktSimDevice_StartFifo(std::uint32_t session, std::uint32_t fifo) {
  return fifoCall(session, "KtFpgaDll_StartFifo", fifo, {}, [](Fifo& on) { return on.start(); });
}

std::int32_t ktSimDevice_StopFifo(std::uint32_t session, std::uint32_t fifo) {
  return fifoCall(session, "KtFpgaDll_StopFifo", fifo, {}, [](Fifo& on) { return on.stop(); });
}

std::int32_t ktSimDevice_WriteFifoU8(std::uint32_t session, std::uint32_t fifo, const std::uint8_t* data,
                                     std::uint64_t count, std::uint32_t timeoutMs,
                                     std::uint64_t* emptyElementsRemaining) {
  return fifoCall(session, "KtFpgaDll_WriteFifoU8", fifo, {{"count", count}},
                  [&](Fifo& on) { return on.write(data, count, timeoutMs, emptyElementsRemaining); });
}

std::int32_t ktSimDevice_ReadFifoU8(std::uint32_t session, std::uint32_t fifo, std::uint8_t* data, std::uint64_t count,
                                    std::uint32_t, std::uint64_t* elementsRemaining) {
  return fifoCall(session, "KtFpgaDll_ReadFifoU8", fifo, {{"count", count}},
                  [&](Fifo& on) { return on.read(data, count, elementsRemaining); });
}

std::int32_t ktSimDevice_AcquireFifoWriteElementsU8(std::uint32_t session, std::uint32_t fifo, std::uint8_t** elements,
                                                    std::uint64_t count, std::uint32_t timeoutMs,
                                                    std::uint64_t* acquired, std::uint64_t* remaining) {
  return fifoCall(session, "KtFpgaDll_AcquireFifoWriteElementsU8", fifo, {{"count", count}},
                  [&](Fifo& on) { return on.acquireWrite(elements, count, timeoutMs, acquired, remaining); });
}

std::int32_t ktSimDevice_AcquireFifoReadElementsU8(std::uint32_t session, std::uint32_t fifo, std::uint8_t** elements,
                                                   std::uint64_t count, std::uint32_t, std::uint64_t* acquired,
                                                   std::uint64_t* remaining) {
  return fifoCall(session, "KtFpgaDll_AcquireFifoReadElementsU8", fifo, {{"count", count}},
                  [&](Fifo& on) { return on.acquireRead(elements, count, acquired, remaining); });
}

std::int32_t ktSimDevice_ReleaseFifoElements(std::uint32_t session, std::uint32_t fifo, std::uint64_t count) {
  return fifoCall(session, "KtFpgaDll_ReleaseFifoElements", fifo, {{"count", count}},
                  [&](Fifo& on) { return on.release(count); });
}

std::int32_t ktSimDevice_GetPeerToPeerFifoEndpoint(std::uint32_t session, std::uint32_t fifo, std::uint32_t* endpoint) {
  return fifoCall(session, "KtFpgaDll_GetPeerToPeerFifoEndpoint", fifo, {}, [&](Fifo&) -> std::int32_t {
    if (endpoint == nullptr) return KTSIM_E_ARGUMENT;
    *endpoint = kFirstEndpoint + fifo;
    return 0;
  });
}
