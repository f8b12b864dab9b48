// The register bus: carries register accesses to one target of the interface framework. See Interfaces.h for its
// operations. No lock: one thread at a time.
#pragma once

#include <cstdint>

#include "ktifw_lib_client/Interfaces.h"

namespace ktifw_lib_client {

class FIFORegBusLib : public ktifw::InstructionTarget {
 public:
  explicit FIFORegBusLib(std::uint32_t frameworkTarget) : target_(frameworkTarget) {}

  void read(const ktifw::ReadInstruction& instruction, std::uint64_t& value, std::uint32_t timeoutMs,
            ktifw::Status& status) override;
  void readArray(const ktifw::ReadInstruction* instructions, std::uint32_t count, std::uint64_t* values,
                 std::uint32_t timeoutMs, ktifw::Status& status) override;
  void write(const ktifw::WriteInstruction& instruction, bool flag, std::uint32_t timeoutMs,
             ktifw::Status& status) override;
  void writeArray(const ktifw::WriteInstruction* instructions, std::uint32_t count, bool flag, std::uint32_t timeoutMs,
                  ktifw::Status& status) override;
  void reset(ktifw::Status& status) override;

 private:
  std::uint32_t target_;
};

}  // namespace ktifw_lib_client
