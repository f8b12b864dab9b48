// The vocabulary of the interface framework as the engine sees it: contexts, the map that resolves their numbers, and
// the bus that carries register accesses. Every operation takes the caller's located status last and merges into it
// what the framework reports; nothing throws, except that a missing platform library or function raises.
#pragma once

#include <cstdint>
#include <vector>

#include "kterr/Status.h"

namespace ktifw {

using Status = kterr::tLocatedStatus;

// Where a register is, as the bus counts.
struct ReadInstruction {
  std::uint8_t subsystem = 0;
  std::uint64_t offset = 0;
};

// The same, with what shall be written there.
struct WriteInstruction {
  std::uint8_t subsystem = 0;
  std::uint64_t offset = 0;
  std::uint64_t value = 0;
};

// The four values of a context's information, in the framework's order; the first is the context's type.
struct ContextInfo {
  std::uint16_t values[4] = {};
};

// One node of the tree that describes the FPGA design. Contexts belong to the subsystem map: pointers to them stay
// valid as long as it.
class ContextInterface {
 public:
  virtual ~ContextInterface() = default;

  // Turn an offset within the context into a place on the bus. Ask the framework also when the status holds an error.
  virtual ReadInstruction contextualize(std::uint64_t localOffset, Status& status) = 0;
  virtual WriteInstruction contextualizeWrite(std::uint64_t localOffset, std::uint64_t value, Status& status) = 0;

  // All zero when the status already holds an error.
  virtual ContextInfo getInfo(Status& status) = 0;

  // Gives the context's own place on the bus; 0 and 0 when the status already holds an error.
  virtual void getSubsystemAndOffset(std::uint8_t& subsystem, std::uint64_t& baseOffset, Status& status) = 0;

  // Compares the context's version with `major`.`minor`: `first` tells whether it is older, `second` whether it is too
  // new for who asks. Either may be null; both are left alone on an error. `flag` is the framework's own. Asks the
  // framework also when the status holds an error.
  virtual void checkVersion(std::uint16_t major, std::uint16_t minor, bool flag, bool* first, bool* second,
                            Status& status) = 0;

  // Returns the child of a type with that number among its like; null, with an error in the status, when there is none.
  virtual ContextInterface* getChild(std::uint16_t childType, std::uint8_t flag, Status& status) = 0;

  // Append the children, those of one kind or all, to `children`, in the framework's order. An error leaves those in
  // front of it appended; ktorba_codes::kNoMemory is one.
  virtual void getChildrenByUid(std::uint16_t uid, std::vector<ContextInterface*>& children, Status& status) = 0;
  virtual void getAllChildren(std::vector<ContextInterface*>& children, Status& status) = 0;
};

// The contexts of one framework session, by number.
class SubsystemMapInterface {
 public:
  virtual ~SubsystemMapInterface() = default;

  // Null, with nKTAPALS100_tStatus_kInvalidParameter in the status, for a number that the session does not have.
  virtual ContextInterface* getContext(std::uint32_t contextNumber, Status& status) = 0;

  // A second look-up form that this client does not support: null, with ktorba_codes::kUnsupportedLookup in the status.
  virtual ContextInterface* getContextUnsupported(std::uint32_t contextNumber, Status& status) = 0;
};

// What carries register accesses to the hardware. Each operation blocks until the access is done or `timeoutMs`
// milliseconds are over, and does nothing when the status already holds an error. `flag` is the framework's own.
class InstructionTarget {
 public:
  virtual ~InstructionTarget() = default;

  // The array forms make `count` accesses in one transfer, in their order. ktorba_codes::kNoMemory: none was made.
  virtual void read(const ReadInstruction& instruction, std::uint64_t& value, std::uint32_t timeoutMs,
                    Status& status) = 0;
  virtual void readArray(const ReadInstruction* instructions, std::uint32_t count, std::uint64_t* values,
                         std::uint32_t timeoutMs, Status& status) = 0;
  virtual void write(const WriteInstruction& instruction, bool flag, std::uint32_t timeoutMs, Status& status) = 0;
  virtual void writeArray(const WriteInstruction* instructions, std::uint32_t count, bool flag, std::uint32_t timeoutMs,
                          Status& status) = 0;

  // Resets the framework's target.
  virtual void reset(Status& status) = 0;
};

}  // namespace ktifw
