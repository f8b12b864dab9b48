// Rows of exported calls on two sessions, their arguments chosen by the input, beside the model of the soak.
#include <fuzzer/FuzzedDataProvider.h>

#include "testing/ModelledSession.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzedDataProvider input(data, size);
  const auto choose = [&](std::uint32_t count) { return input.ConsumeIntegralInRange<std::uint32_t>(0, count - 1); };
  soak::ModelledSession sessions[] = {soak::ModelledSession(choose), soak::ModelledSession(choose)};
  while (input.remaining_bytes() != 0) sessions[choose(2)].operate();
  return 0;
}
