// The frame of every control function: finding the FPGA or generator, the FPGA's lock, and no exception beyond it.
#pragma once

#include <memory>
#include <mutex>
#include <new>

#include "simulator/Fpga.h"

namespace simulator {

template <typename Body>
std::int32_t guarded(Body body) noexcept {
  try {
    return body();
  } catch (const std::bad_alloc&) {
    return KTSIM_E_MEMORY;
  } catch (...) {
    return KTSIM_E_INTERNAL;
  }
}

// `body` returns a code.
template <typename Body>
std::int32_t onFpga(std::uint32_t fpgaSession, Body body) noexcept {
  return guarded([&]() -> std::int32_t {
    const std::shared_ptr<Fpga> fpga = FpgaTable::instance().bySession(fpgaSession);
    if (fpga == nullptr) return KTSIM_E_SESSION;
    const std::lock_guard lock(fpga->mutex);
    return body(*fpga);
  });
}

// The generator has caught up with the wall clock, where it follows it.
template <typename Body>
std::int32_t onGenerator(std::uint32_t handle, Body body) noexcept {
  return guarded([&]() -> std::int32_t {
    const std::shared_ptr<Fpga> fpga = FpgaTable::instance().byGenerator(handle);
    if (fpga == nullptr) return KTSIM_E_GENERATOR;
    const std::lock_guard lock(fpga->mutex);
    Generator* const generator = fpga->generator(generatorIndex(handle));
    if (generator == nullptr) return KTSIM_E_GENERATOR;
    generator->catchUp();
    return body(*generator);
  });
}

}  // namespace simulator
