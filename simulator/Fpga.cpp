#include "simulator/Fpga.h"

#include <new>
#include <utility>

namespace simulator {
namespace {

constexpr std::uint32_t kIfwSessionBase = 0x40000000;
constexpr std::uint32_t kIfwTargetBase = 0x80000000;
// Hosts refuse FPGA sessions with this bit.
constexpr std::uint32_t kRefusedSessionBit = 0x2000;
constexpr std::uint32_t kLastNumber = 0xFFFFFF;
constexpr std::size_t kMostFpgas = kLastNumber / 2;  // the numbers without that bit

constexpr std::uint32_t kMostGenerators = 255;
constexpr std::uint64_t kBlockSpacing = 0x10000;
constexpr std::uint16_t kParentContextType = 1;

RegisterBlock blockOf(std::uint32_t index) {
  return {static_cast<std::uint8_t>(index + 1), (index + 1) * kBlockSpacing};
}

}  // namespace

Fpga::Fpga(std::uint32_t number) : number_(number) {
  Context parent;
  parent.type = parent.reportedType = kParentContextType;
  parentContext_ = contexts.add(0, parent);
}

ktSim_Fpga Fpga::numbers() const {
  return {number_, kIfwSessionBase | number_, kIfwTargetBase | number_, parentContext_};
}

std::int32_t Fpga::addGenerator(const ktSim_Traits& requested, std::uint32_t& index) {
  if (!Generator::areAcceptable(requested) || generators_.size() == kMostGenerators) return KTSIM_E_ARGUMENT;
  index = static_cast<std::uint32_t>(generators_.size());
  ktSim_Traits traits = requested;
  if (traits.instance < 0) traits.instance = static_cast<std::int32_t>(index);
  if (traits.downloadFifoNumber < 0) traits.downloadFifoNumber = static_cast<std::int32_t>(index);
  generators_.push_back(std::make_unique<Generator>(traits));
  addFifo({&generators_.back()->fifo(), generators_.back().get()});
  contexts.add(parentContext_, {traits.contextType, traits.reportedType, traits.versionMajor, traits.versionMinor,
                                static_cast<std::uint8_t>(traits.instance), blockOf(index)});
  return 0;
}

std::uint32_t Fpga::addLoopbackFifo(const std::string& name) {
  loopbackFifos_.push_back(std::make_unique<Fifo>(name, nullptr));
  addFifo({loopbackFifos_.back().get(), nullptr});
  return static_cast<std::uint32_t>(fifos_.size() - 1);
}

// The first of a name keeps it.
void Fpga::addFifo(const FifoEnd& end) {
  fifoNumbers_.try_emplace(end.fifo->name(), static_cast<std::uint32_t>(fifos_.size()));
  fifos_.push_back(end);
}

const std::uint32_t* Fpga::find(const NumbersByName& numbers, std::string_view name) {
  const auto found = numbers.find(name);
  return found == numbers.end() ? nullptr : &found->second;
}

Fpga::RegisterPlace Fpga::locate(std::uint8_t subsystem, std::uint64_t offset) {
  const std::uint32_t index = subsystem - 1u;
  Generator* const found = subsystem == 0 ? nullptr : generator(index);
  const std::uint64_t base = blockOf(index).baseOffset;
  if (found == nullptr || offset < base || offset - base >= kBlockSpacing) return {nullptr, 0, 0};
  return {found, index, offset - base};
}

FpgaTable& FpgaTable::instance() {
  static FpgaTable* const table = new FpgaTable;
  return *table;
}

std::shared_ptr<Fpga> FpgaTable::create() {
  const platform::MutexLock lock(mutex_);
  if (fpgas_.size() == kMostFpgas) throw std::bad_alloc();
  std::uint32_t number = lastNumber_;
  do {
    number = number % kLastNumber + 1;
  } while ((number & kRefusedSessionBit) != 0 || fpgas_.contains(number));
  auto fpga = std::make_shared<Fpga>(number);
  fpgas_.emplace(number, fpga);
  lastNumber_ = number;
  return fpga;
}

bool FpgaTable::destroy(std::uint32_t fpgaSession) {
  std::shared_ptr<Fpga> fpga;  // outlives the lock, so that memories are given back outside it
  const platform::MutexLock lock(mutex_);
  const auto found = fpgas_.find(fpgaSession);
  if (found == fpgas_.end()) return false;
  fpga = std::move(found->second);
  fpgas_.erase(found);
  return true;
}

std::shared_ptr<Fpga> FpgaTable::find(std::uint32_t number) {
  const platform::MutexLock lock(mutex_);
  const auto found = fpgas_.find(number);
  return found == fpgas_.end() ? nullptr : found->second;
}

std::shared_ptr<Fpga> FpgaTable::bySession(std::uint32_t fpgaSession) { return find(fpgaSession); }
std::shared_ptr<Fpga> FpgaTable::byIfwSession(std::uint32_t ifwSession) { return find(ifwSession ^ kIfwSessionBase); }
std::shared_ptr<Fpga> FpgaTable::byIfwTarget(std::uint32_t ifwTarget) { return find(ifwTarget ^ kIfwTargetBase); }
std::shared_ptr<Fpga> FpgaTable::byGenerator(std::uint32_t generator) { return find(generator >> 8); }

}  // namespace simulator
