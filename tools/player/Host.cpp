#include "tools/player/Host.h"

#include "kterr/Status.h"
#include "ktorba/error_codes.h"
#include "ktorba/ktorba.h"
#include "ktorba/script/instructionDecoder.h"
#include "platform/system/codePage.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/player/simulatedGenerator.h"

namespace tools {
namespace {

constexpr std::int32_t kWriteTimeoutMs = 60000;

void checkSimulator(std::int32_t code) {
  if (code >= 0) return;
  throw CallFailure({.place = {},
                     .message = std::string("The simulated generator refused: ") + ktSim_DescribeCode(code),
                     .code = code});
}

bool playsSamples(const ktSim_TraceEntry& entry) {
  const auto instruction =
      ktorba::decodeInstruction({{entry.words[0], entry.words[1], entry.words[2], entry.words[3]}});
  return instruction.is(ktorba::Opcode::kFetch) || instruction.is(ktorba::Opcode::kScriptEnd);
}

// The library takes texts as the system has them.
std::string toHostText(const std::string& utf8) {
  if (const auto text = platform::encodeCodePage(utf8)) return *text;
  throw CallFailure({.place = {},
                     .message = "Its names are not in this system's encoding, " + platform::codePageName(),
                     .code = ktorba_codes_kTextNotConvertible});
}

}  // namespace

// Makes one call of the library with a status record of its own.
template <typename Call>
void Host::call(Call call) const {
  kterr::OwnedStatus status;
  call(&status);
  if (status.code < 0) throw CallFailure(diagnoseFailure(status.code, status.json));
}

Host::Host(const GeneratorOptions& options) {
  const ktSim_Traits traits = toSimulatorTraits(options);
  checkSimulator(ktSim_CreateFpga(&fpga_));
  checkSimulator(ktSim_AddGenerator(fpga_.fpgaSession, &traits, &generator_));
  call([this](tStatus* status) {
    ktORBA_OpenOrbaSession(fpga_.fpgaSession, fpga_.ifwTarget, fpga_.ifwSession, &fpga_.parentContext, 0, &session_,
                           status);
  });
}

Host::~Host() {
  ktORBA_CloseOrbaSession(session_, nullptr);
  ktSim_DestroyFpga(fpga_.fpgaSession);
}

void Host::writeWaveform(const std::string& name, const SampleBuffer& samples) {
  const auto count = static_cast<std::uint32_t>(samples.size());
  const std::string hostName = toHostText(name);
  call([&](tStatus* status) {
    samples.visit([&](const auto& values) {
      if constexpr (std::is_same_v<decltype(values), const SampleBuffer::Narrow&>) {
        ktORBA_WriteWaveformI16(session_, hostName.c_str(), values.data(), count, kWriteTimeoutMs, status);
      } else {
        const auto* words = reinterpret_cast<const std::uint32_t*>(values.data());
        ktORBA_WriteWaveformU32(session_, hostName.c_str(), words, count, kWriteTimeoutMs, status);
      }
    });
  });
}

void Host::writeScript(const std::string& text) {
  const std::string script = toHostText(text);
  call([&](tStatus* status) { ktORBA_WriteScript(session_, script.c_str(), status); });
}

void Host::selectScript(const std::string& name) {
  const std::string hostName = toHostText(name);
  call([&](tStatus* status) { ktORBA_SelectActiveScript(session_, hostName.c_str(), status); });
}

void Host::start() {
  call([this](tStatus* status) { ktORBA_StartGeneration(session_, status); });
}

void Host::abort() {
  call([this](tStatus* status) { ktORBA_AbortGeneration(session_, status); });
}

void Host::raiseTrigger(unsigned trigger, std::uint64_t sample) {
  checkSimulator(ktSim_RaiseTriggerAt(generator_, trigger, sample));
}

std::uint64_t Host::play(std::uint64_t count, void* samples, std::uint8_t* markers) {
  std::uint64_t played = 0;
  checkSimulator(ktSim_AdvanceInto(generator_, count, samples, markers, &played));
  return played;
}

void Host::recordSegments(std::uint64_t capacity) { checkSimulator(ktSim_RecordTrace(generator_, capacity)); }

void Host::takeSegments(std::vector<SegmentStart>& segments) {
  std::uint64_t count = 0;
  checkSimulator(ktSim_ReadTrace(generator_, 0, nullptr, &count));
  trace_.resize(count);
  checkSimulator(ktSim_ReadTrace(generator_, count, trace_.data(), &count));
  segments.clear();
  for (const ktSim_TraceEntry& entry : trace_) {
    if (playsSamples(entry)) segments.push_back({entry.firstSample, entry.address});
  }
}

bool Host::isDone() {
  checkForDeviceFault();
  std::uint8_t isDone = 0;
  call([&](tStatus* status) { ktORBA_CheckGenerationStatus(session_, &isDone, status); });
  return isDone != 0;
}

void Host::checkForDeviceFault() const {
  ktSim_DeviceFault fault;
  if (ktSim_GetDeviceFault(generator_, 0, &fault) != 0) return;
  throw CallFailure({.message = "The generator stopped at sample " + std::to_string(fault.sample) + ": " + fault.text,
                     .code = fault.code});
}

ktSim_State Host::state() const {
  ktSim_State state;
  checkSimulator(ktSim_GetState(generator_, &state));
  return state;
}

}  // namespace tools
