// One simulated FPGA, and the table of all of them. Everything in an FPGA is guarded by its lock, which callers hold
// for the whole of a call; the table has a lock of its own, held only while it is searched or changed.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "ktorba/simulator.h"
#include "platform/system/Mutex.h"
#include "simulator/CallLog.h"
#include "simulator/ContextTree.h"
#include "simulator/Fifo.h"
#include "simulator/Generator.h"

namespace simulator {

class Fpga {
 public:
  explicit Fpga(std::uint32_t number);

  // The numbers that hosts know this FPGA by, each in a range of its own so that none passes for another.
  ktSim_Fpga numbers() const;

  // Returns a code.
  std::int32_t addGenerator(const ktSim_Traits& traits, std::uint32_t& index);
  Generator* generator(std::uint32_t index) { return index < generators_.size() ? generators_[index].get() : nullptr; }

  std::uint32_t addLoopbackFifo(const std::string& name);
  // A FIFO with the generator whose time passes at access to it; null for a loop-back FIFO.
  struct FifoEnd {
    Fifo* fifo;
    Generator* generator;
  };
  FifoEnd* fifo(std::uint32_t number) { return number < fifos_.size() ? &fifos_[number] : nullptr; }
  // The results below are null when there is none of this name.
  const std::uint32_t* findFifo(std::string_view name) const { return find(fifoNumbers_, name); }
  const std::uint32_t* findRegister(std::string_view name) const { return find(registerOffsets_, name); }
  void addRegisterName(const std::string& name, std::uint32_t offset) { registerOffsets_[name] = offset; }

  struct RegisterPlace {
    Generator* generator;  // null when nothing is there
    std::uint32_t generatorIndex;
    std::uint64_t number;
  };
  RegisterPlace locate(std::uint8_t subsystem, std::uint64_t offset);

  std::mutex mutex;
  ContextTree contexts;
  CallLog calls;

 private:
  using NumbersByName = std::map<std::string, std::uint32_t, std::less<>>;
  static const std::uint32_t* find(const NumbersByName& numbers, std::string_view name);
  void addFifo(const FifoEnd& end);

  std::uint32_t number_;
  std::uint32_t parentContext_;
  std::vector<std::unique_ptr<Generator>> generators_;
  std::vector<std::unique_ptr<Fifo>> loopbackFifos_;
  std::vector<FifoEnd> fifos_;  // by number; owned by the two above
  NumbersByName fifoNumbers_;
  NumbersByName registerOffsets_;
};

class FpgaTable {
 public:
  // Numbers are given upwards from behind `lastNumber`, round and round, those in use passed over.
  explicit FpgaTable(std::uint32_t lastNumber = 0) : lastNumber_(lastNumber) {}

  // Never destroyed, so that hosts may call until the process is gone.
  static FpgaTable& instance();

  std::shared_ptr<Fpga> create();
  bool destroy(std::uint32_t fpgaSession);
  // Null when there is none.
  std::shared_ptr<Fpga> bySession(std::uint32_t fpgaSession);
  std::shared_ptr<Fpga> byIfwSession(std::uint32_t ifwSession);
  std::shared_ptr<Fpga> byIfwTarget(std::uint32_t ifwTarget);
  std::shared_ptr<Fpga> byGenerator(std::uint32_t generator);

 private:
  std::shared_ptr<Fpga> find(std::uint32_t number);

  platform::Mutex<std::mutex> mutex_;
  std::uint32_t lastNumber_ KTORBA_GUARDED_BY(mutex_);
  std::unordered_map<std::uint32_t, std::shared_ptr<Fpga>> fpgas_ KTORBA_GUARDED_BY(mutex_);
};

// A generator's number for the outside holds its FPGA's number and its index there.
constexpr std::uint32_t generatorHandle(std::uint32_t fpga, std::uint32_t index) { return fpga << 8 | index; }
constexpr std::uint32_t generatorIndex(std::uint32_t handle) { return handle & 0xFF; }

}  // namespace simulator
