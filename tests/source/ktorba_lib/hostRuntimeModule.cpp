// A module that exports what a host runtime does, and always gives the same answer.
#include <cstdint>

extern "C" KTORBA_EXPORTED std::int32_t PDRNRegisterCleanUpProc(std::int32_t (*)(std::uint32_t), std::uint32_t,
                                                                std::int32_t) {
  return KTORBA_ANSWER;
}
