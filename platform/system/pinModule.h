// Keeps a library in the process for good, where others hold pointers into it that they never give back. Any thread may
// call.
#pragma once

namespace platform {

// From now on the library or program that holds `address` stays loaded however often it is unloaded. Where the system
// does not know the address, nothing happens.
void pinModule(const void* address);

}  // namespace platform
