// Libraries by an address within them: which one it is, and keeping it in the process for good, where others hold
// pointers into it that they never give back. Any thread may call.
#pragma once

namespace platform {

// From now on the library or program that holds `address` stays loaded however often it is unloaded. Where the system
// does not know the address, nothing happens.
void pinModule(const void* address);

// The loader's handle (dlopen handle, HMODULE) of the library that holds `address`, valid for as long as the library
// stays loaded; null where the system does not know the address.
void* moduleOf(const void* address);

}  // namespace platform
