// The clean-up procedures of open handles: a host runtime that ends a calling program closes its sessions through
// them. Any thread may call.
#pragma once

#include <cstdint>

namespace ktorba_lib {

// Asks the host runtime to close `handle` when its program ends; returns whether it agreed. What it throws is a
// refusal.
bool registerCleanUp(std::uint32_t handle) noexcept;

// Takes the request back, as far as the host runtime lets itself be told.
void withdrawCleanUp(std::uint32_t handle) noexcept;

}  // namespace ktorba_lib
