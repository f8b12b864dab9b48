// Where sessions come from: the one place at which the registry meets the session's class. Linked from outside this
// module, so that tests put a double in its place. Any thread may call.
#pragma once

#include <cstdint>

#include "source/ktorba_lib/SessionInterface.h"

namespace ktorba_lib {

// One generator, by the handles and numbers that the host knows it by.
struct GeneratorAddress {
  std::uint32_t fpgaSession;
  std::uint32_t ifwTarget;
  std::uint32_t ifwSession;
  std::uint32_t parentContext;
  std::uint8_t instance;
};

// Builds a session to the generator, or raises. Talks to the hardware and takes a while.
SessionPtr openSession(const GeneratorAddress& generator);

}  // namespace ktorba_lib
