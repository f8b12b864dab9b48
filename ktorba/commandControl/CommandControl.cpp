#include "ktorba/commandControl/CommandControl.h"

#include <array>

#include "conventions/conventions.h"
#include "kterr/ErrorConstant.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba\commandControl\CommandControl)";
constexpr std::uint32_t kBusTimeoutMs = 1000;

// Register lists go through a buffer of this many instructions; a full settings write needs all of it.
constexpr std::size_t kMaxRegisterWrites = 11;

// The lines are frozen: hosts see them in the record.
void refuse(kterr::tLocatedStatus& status, const kterr::ErrorConstant& reason, std::uint32_t line) {
  kterr::mergeCode(status, reason.code, kterr::kComponent, kSource, line);
}

}  // namespace

CommandControl::CommandControl(ktifw::ContextInterface& context, ktifw::InstructionTarget& registerBus, Status& status)
    : context_(context), registerBus_(registerBus) {
  if (failed(status)) return;
  checkCompatibility(status);
  if (!failed(status)) readTraits(status);
}

void CommandControl::getHWTraits(HWTraits& out, Status& status, bool refresh) {
  if (failed(status)) return;
  if (refresh || !traitsValid_) readTraits(status);
  out = traits_;
}

void CommandControl::setSettings(const HWSettings& settings, Status& status) {
  if (!failed(status)) settings_ = settings;
}

void CommandControl::writeSettings(Status& status, bool force) {
  if (failed(status)) return;
  if (!force && settingsWritten_ && settings_ == writtenSettings_) return;
  settingsWritten_ = false;
  const RegisterWrite writes[kMaxRegisterWrites] = {
      {Register::kMemoryReadGrantTime, settings_.memoryReadGrantTime},
      {Register::kMemoryWriteGrantTime, settings_.memoryWriteGrantTime},
      {Register::kPrimingDepth, settings_.primingDepthWords - 1},  // a depth of 0 wraps to 0xFFFFFFFF
      {Register::kStreamingStartWord, settings_.streamingStartWord},
      {Register::kStreamingEndWord, settings_.streamingEndWord},
      {Register::kStreamingParamA, settings_.streamingParamA},
      {Register::kStreamingParamB, settings_.streamingParamB},
      {Register::kStreamingEnabled, settings_.streamingEnabled ? 1u : 0u},
      {Register::kStreamingParamC, settings_.streamingParamC},
      {Register::kStreamingWritePointer, settings_.streamingWritePointerWord},
      {Register::kStreamingLoadPointer, 1},
  };
  constexpr std::size_t kWritesWithoutStreaming = 3;
  writeRegisters({writes, traits_.hasStreamingRegisters ? kMaxRegisterWrites : kWritesWithoutStreaming}, status);
  if (failed(status)) return;
  writtenSettings_ = settings_;
  settingsWritten_ = true;
}

void CommandControl::commandInitiate(Status& status) { writeCommand(Command::kInitiate, status); }

void CommandControl::commandReset(Status& status) { writeCommand(Command::kReset, status); }

void CommandControl::commandAbort(Status& status) { writeCommand(Command::kAbort, status); }

void CommandControl::readGenerationDone(bool& out, Status& status) { readStatusBit(kStatusDone, out, status); }

void CommandControl::readDataUnderflow(bool& out, Status& status) { readStatusBit(kStatusUnderflow, out, status); }

void CommandControl::announceMemoryWrite(const MemoryWriteRequest& request, Status& status) {
  const bool masked = request.maskedWrite != 0;
  const RegisterWrite writes[] = {
      {Register::kWriteAddress, request.memoryAddress},
      {Register::kWriteElements, request.transferElements},
      {Register::kWriteFirstWordMask, masked ? request.firstWordByteMask : kNoByteMask},
      {Register::kWriteLastWordMask, masked ? request.lastWordByteMask : kNoByteMask},
      {Register::kWriteMasked, masked ? 1u : 0u},
      {Register::kCommand, static_cast<std::uint64_t>(Command::kStartMemoryWrite)},
  };
  writeRegisters(writes, status);
}

void CommandControl::readMemoryWriteComplete(bool& out, Status& status) {
  readStatusBit(kStatusWriteComplete, out, status);
}

void CommandControl::resetStreamingWritePointer(Status& status) {
  const RegisterWrite writes[] = {{Register::kStreamingWritePointer, 0}, {Register::kStreamingLoadPointer, 1}};
  writeRegisters(writes, status);
}

std::uint64_t CommandControl::readStreamingSpace(Status& status) {
  return failed(status) ? 0 : readRegister(Register::kStreamingFreeSpace, status);
}

void CommandControl::checkCompatibility(Status& status) {
  if (context_.getInfo(status).values[0] != kGeneratorContextType) refuse(status, ktorba_codes::kNotAGenerator, 208);
  bool tooOld = false;
  bool tooNew = false;
  context_.checkVersion(kOldestGeneratorVersion.major, kOldestGeneratorVersion.minor, false, &tooOld, &tooNew, status);
  if (tooOld) {
    refuse(status, ktorba_codes::kGeneratorTooOld, 217);
  } else if (tooNew) {
    refuse(status, ktorba_codes::kGeneratorTooNew, 222);
  }
}

void CommandControl::readTraits(Status& status) {
  traitsValid_ = false;
  HWTraits traits = traits_;
  traits.downloadFifoNumber = static_cast<std::uint8_t>(readRegister(Register::kDownloadFifoNumber, status));
  traits.minFetchSamplesByte = static_cast<std::uint8_t>(readRegister(Register::kMinFetchSamples, status));
  traits.memoryWordBits = static_cast<std::uint16_t>(readRegister(Register::kMemoryWordBits, status));
  traits.memorySizeBytes = static_cast<std::uint32_t>(readRegister(Register::kMemorySizeBytes, status));
  traits.sequenceMemoryWords = static_cast<std::uint32_t>(readRegister(Register::kSequenceMemoryWords, status));
  traits.maxPrimingWords = static_cast<std::uint16_t>(readRegister(Register::kMaxPrimingWords, status));
  traits.sampleWidthBits = static_cast<std::uint8_t>(readRegister(Register::kSampleWidthBits, status));
  if (traits.sampleWidthBits == 0) return refuse(status, ktorba_codes::kSampleWidthIsZero, 261);

  traits.downloadElementBits = static_cast<std::uint32_t>(readRegister(Register::kDownloadElementBits, status));
  if (traits.downloadElementBits == 0) traits.downloadElementBits = kDefaultDownloadElementBits;
  bool lacksStreaming = false;
  bool isNewer = false;  // which says nothing on streaming
  context_.checkVersion(kStreamingGeneratorVersion.major, kStreamingGeneratorVersion.minor, false, &lacksStreaming,
                        &isNewer, status);
  traits.hasStreamingRegisters = !failed(status) && !lacksStreaming;
  deriveTraits(traits);
  if (failed(status)) return;
  traits_ = traits;
  traitsValid_ = true;
}

std::uint64_t CommandControl::readRegister(Register number, Status& status) {
  std::uint64_t value = 0;
  registerBus_.read(context_.contextualize(static_cast<std::uint64_t>(number), status), value, kBusTimeoutMs, status);
  return failed(status) ? 0 : value;
}

void CommandControl::readStatusBit(std::uint64_t mask, bool& out, Status& status) {
  if (!failed(status)) out = (readRegister(Register::kGenerationStatus, status) & mask) != 0;
}

void CommandControl::writeCommand(Command command, Status& status) {
  if (failed(status)) return;
  const ktifw::WriteInstruction instruction = context_.contextualizeWrite(
      static_cast<std::uint64_t>(Register::kCommand), static_cast<std::uint64_t>(command), status);
  registerBus_.write(instruction, true, kBusTimeoutMs, status);
}

void CommandControl::writeRegisters(std::span<const RegisterWrite> writes, Status& status) {
  if (failed(status)) return;
  std::array<ktifw::WriteInstruction, kMaxRegisterWrites> instructions;
  std::size_t count = 0;
  for (const RegisterWrite& write : writes) {
    instructions[count++] = context_.contextualizeWrite(static_cast<std::uint64_t>(write.number), write.value, status);
  }
  registerBus_.writeArray(instructions.data(), static_cast<std::uint32_t>(count), true, kBusTimeoutMs, status);
}

}  // namespace ktorba
