// The vocabulary of the interface framework as the engine sees it: contexts, the map that resolves their numbers, and
// the bus that carries register accesses. Every operation takes the caller's located status last; nothing throws,
// except that a missing platform library or function raises.
#pragma once

#include <cstdint>
#include <vector>

#include "kterr/Status.h"

namespace ktifw {

using Status = kterr::tLocatedStatus;

struct ReadInstruction {
  std::uint8_t subsystem = 0;
  std::uint64_t offset = 0;
};

struct WriteInstruction {
  std::uint8_t subsystem = 0;
  std::uint64_t offset = 0;
  std::uint64_t value = 0;
};

// The four values of a context's information, in the framework's order; the first is the context's type.
struct ContextInfo {
  std::uint16_t values[4] = {};
};

class ContextInterface {
 public:
  virtual ~ContextInterface() = default;
  virtual ReadInstruction contextualize(std::uint64_t localOffset, Status& status) = 0;
  virtual WriteInstruction contextualizeWrite(std::uint64_t localOffset, std::uint64_t value, Status& status) = 0;
  virtual ContextInfo getInfo(Status& status) = 0;
  virtual void getSubsystemAndOffset(std::uint8_t& subsystem, std::uint64_t& baseOffset, Status& status) = 0;
  // Either result pointer may be null.
  virtual void checkVersion(std::uint16_t major, std::uint16_t minor, bool flag, bool* first, bool* second,
                            Status& status) = 0;
  // Null when there is none; the context belongs to the subsystem map.
  virtual ContextInterface* getChild(std::uint16_t childType, std::uint8_t flag, Status& status) = 0;
  virtual void getChildrenByUid(std::uint16_t uid, std::vector<ContextInterface*>& children, Status& status) = 0;
  virtual void getAllChildren(std::vector<ContextInterface*>& children, Status& status) = 0;
};

class SubsystemMapInterface {
 public:
  virtual ~SubsystemMapInterface() = default;
  // Null, with -52005 in the status, for a number that the session does not have.
  virtual ContextInterface* getContext(std::uint32_t contextNumber, Status& status) = 0;
  // A second look-up form that this client does not support: null, with -52002 in the status.
  virtual ContextInterface* getContextUnsupported(std::uint32_t contextNumber, Status& status) = 0;
};

class InstructionTarget {
 public:
  virtual ~InstructionTarget() = default;
  virtual void read(const ReadInstruction& instruction, std::uint64_t& value, std::uint32_t timeoutMs,
                    Status& status) = 0;
  virtual void readArray(const ReadInstruction* instructions, std::uint32_t count, std::uint64_t* values,
                         std::uint32_t timeoutMs, Status& status) = 0;
  virtual void write(const WriteInstruction& instruction, bool flag, std::uint32_t timeoutMs, Status& status) = 0;
  virtual void writeArray(const WriteInstruction* instructions, std::uint32_t count, bool flag, std::uint32_t timeoutMs,
                          Status& status) = 0;
  virtual void reset(Status& status) = 0;
};

}  // namespace ktifw
