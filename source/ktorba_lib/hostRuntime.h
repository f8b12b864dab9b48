// The clean-up procedures of open handles: a host runtime that ends a calling program closes its sessions through
// them. Any thread may call.
#pragma once

#include <cstdint>

namespace ktorba_lib {

// Asks the host runtime to close `handle` when its program ends; returns whether it agreed.
bool registerCleanUp(std::uint32_t handle);

// Takes the request back.
void withdrawCleanUp(std::uint32_t handle);

}  // namespace ktorba_lib
