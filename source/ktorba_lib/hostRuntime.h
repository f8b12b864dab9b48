// The clean-up procedures of open handles: a host runtime that ends a calling program closes its sessions through
// them. Any thread may call.
#pragma once

#include <cstdint>

struct tStatus;

namespace ktorba_lib {

// What ktORBA_CloseOrbaSession does, for calls from within: two libraries of one process export that name, and a
// procedure that called it could reach the other library's sessions.
std::int32_t closeOrbaSession(std::uint32_t sessionHandle, tStatus* status);

// Asks the host runtime to close `handle` when its program ends; returns whether it agreed. What it throws is a
// refusal.
bool registerCleanUp(std::uint32_t handle) noexcept;

// Takes the request back, as far as the host runtime lets itself be told.
void withdrawCleanUp(std::uint32_t handle) noexcept;

}  // namespace ktorba_lib
