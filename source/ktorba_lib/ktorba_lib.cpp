// The exported functions. Each looks its session up through a counted reference that lives to the end of the statement
// or block; a function call's object is evaluated before its arguments, so a bad handle is reported before a text that
// cannot be converted, wherever both stand in one expression.
#include <string>

#include "ktorba/ktorba.h"
#include "ktsstutf8/toUtf8.h"
#include "source/ktorba_lib/Frame.h"
#include "source/ktorba_lib/SessionRegistry.h"
#include "source/ktorba_lib/failures.h"
#include "source/ktorba_lib/hostRuntime.h"

namespace ktorba_lib {
namespace {

using ktorba::GenerationSettings;
using ktsstutf8::toUtf8;

// Applies the session's settings with one of them changed.
template <typename Setting, typename Value>
void applySetting(std::uint32_t sessionHandle, Setting GenerationSettings::*setting, Value value) {
  const SessionPtr session = getSessionPtr(sessionHandle);
  GenerationSettings settings = session->getRequestedSettings();
  settings.*setting = value;
  session->applySettings(settings);
}

void turnStreamingOff(std::uint32_t sessionHandle) {
  applySetting(sessionHandle, &GenerationSettings::streamingWaveformName, "");
}

}  // namespace
}  // namespace ktorba_lib

using ktorba::GenerationSettings;
using ktorba_lib::applySetting;
using ktorba_lib::atBoundary;
using ktorba_lib::getRegistry;
using ktorba_lib::getSessionPtr;
using ktorba_lib::raise;
using ktorba_lib::registerCleanUp;
using ktorba_lib::requireArgument;
using ktorba_lib::SessionPtr;
using ktorba_lib::turnStreamingOff;
using ktsstutf8::toUtf8;

int32_t ktORBA_OpenOrbaSession(uint32_t fpgaSession, uint32_t ifwTarget, uint32_t ifwSession,
                               const uint32_t* parentContext, uint8_t instance, uint32_t* orbaSessionHandle,
                               tStatus* status) {
  constexpr char kFunction[] = "ktORBA_OpenOrbaSession";
  return atBoundary(status, [&] {
    const uint32_t context = parentContext != nullptr ? *parentContext : 0;
    requireArgument(orbaSessionHandle, kFunction, "orbaSessionHandleis NULL!");
    const uint32_t handle = getRegistry().openSession({fpgaSession, ifwTarget, ifwSession, context, instance});
    if (handle == 0) {
      raise(nKTAPALS100_tStatus_kInvalidParameter, kFunction,
            "Session already open to this Waveform Generation instance, on this device.");
    }
    *orbaSessionHandle = handle;
    if (!registerCleanUp(handle)) {
      raise(nKTAPALS100_tStatus_kSoftwareFault, kFunction, "callback registration failed");
    }
  });
}

std::int32_t ktorba_lib::closeOrbaSession(std::uint32_t sessionHandle, tStatus* status) {
  return atBoundary(status, [&] {
    ktorba_lib::withdrawCleanUp(sessionHandle);
    if (getRegistry().removeSession(sessionHandle) == nullptr) {
      raise(nKTAPALS100_tStatus_kInvalidParameter, "ktORBA_CloseOrbaSession", "Invalid orba session handle");
    }
  });
}

int32_t ktORBA_CloseOrbaSession(uint32_t sessionHandle, tStatus* status) {
  return ktorba_lib::closeOrbaSession(sessionHandle, status);
}

int32_t ktORBA_GetWaveformMemorySize(uint32_t sessionHandle, uint64_t* memorySize, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(memorySize, "ktORBA_GetWaveformMemorySize", "memorySizeis NULL!");
    *memorySize = getSessionPtr(sessionHandle)->getHWControl().getWaveformMemorySize();
  });
}

int32_t ktORBA_AllocateWaveform(uint32_t sessionHandle, const char* waveformName, uint32_t numSamples,
                                tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(waveformName, "ktORBA_AllocateWaveform", "waveformNameis NULL!");
    getSessionPtr(sessionHandle)->getHWControl().allocateWaveform(toUtf8(waveformName), numSamples);
  });
}

int32_t ktORBA_WriteWaveformU32(uint32_t sessionHandle, const char* waveformName, const uint32_t* data,
                                uint32_t numSamples, int32_t timeoutMs, tStatus* status) {
  return atBoundary(status,
                    [&] { getSessionPtr(sessionHandle)->writeWaveform(waveformName, data, numSamples, timeoutMs); });
}

int32_t ktORBA_WriteWaveformI16(uint32_t sessionHandle, const char* waveformName, const int16_t* data,
                                uint32_t numSamples, int32_t timeoutMs, tStatus* status) {
  return atBoundary(status,
                    [&] { getSessionPtr(sessionHandle)->writeWaveform(waveformName, data, numSamples, timeoutMs); });
}

int32_t ktORBA_SetWaveformNextWritePosition(uint32_t sessionHandle, const char* waveformName, uint32_t offset,
                                            uint8_t mode, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(waveformName, "ktORBA_SetWaveformNextWritePosition", "waveformNameis NULL!");
    getSessionPtr(sessionHandle)->getHWControl().setWaveformNextWritePosition(toUtf8(waveformName), mode, offset);
  });
}

int32_t ktORBA_ClearWaveform(uint32_t sessionHandle, const char* waveformName, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(waveformName, "ktORBA_ClearWaveform", "waveformNameis NULL!");
    getSessionPtr(sessionHandle)->getHWControl().clearWaveform(toUtf8(waveformName));
    if (getSessionPtr(sessionHandle)->getHWControl().isStreamingWaveform(toUtf8(waveformName))) {
      turnStreamingOff(sessionHandle);
    }
  });
}

int32_t ktORBA_ClearAllWaveforms(uint32_t sessionHandle, tStatus* status) {
  return atBoundary(status, [&] {
    getSessionPtr(sessionHandle)->getHWControl().clearAllWaveforms();
    turnStreamingOff(sessionHandle);
  });
}

int32_t ktORBA_WriteScript(uint32_t sessionHandle, const char* script, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(script, "ktORBA_WriteScript", "scriptis NULL!");
    getSessionPtr(sessionHandle)->getHWControl().writeScript(toUtf8(script));
  });
}

int32_t ktORBA_SelectActiveScript(uint32_t sessionHandle, const char* scriptName, tStatus* status) {
  return atBoundary(status, [&] {
    const SessionPtr session = getSessionPtr(sessionHandle);
    GenerationSettings settings = session->getRequestedSettings();
    session->getHWControl().selectActiveScript(toUtf8(scriptName), settings.activeScriptLength);
    session->applySettings(settings);
  });
}

int32_t ktORBA_DeleteScript(uint32_t sessionHandle, const char* scriptName, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(scriptName, "ktORBA_DeleteScript", "scriptNameis NULL!");
    getSessionPtr(sessionHandle)->getHWControl().deleteScript(toUtf8(scriptName));
  });
}

int32_t ktORBA_StartGeneration(uint32_t sessionHandle, tStatus* status) {
  return atBoundary(status, [&] { getSessionPtr(sessionHandle)->getHWControl().startGeneration(); });
}

int32_t ktORBA_AbortGeneration(uint32_t sessionHandle, tStatus* status) {
  return atBoundary(status, [&] { getSessionPtr(sessionHandle)->getHWControl().abortGeneration(); });
}

int32_t ktORBA_CheckGenerationStatus(uint32_t sessionHandle, uint8_t* isDone, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(isDone, "ktORBA_CheckGenerationStatus", "isDoneis NULL!");
    *isDone = getSessionPtr(sessionHandle)->getHWControl().checkGenerationStatus() ? 1 : 0;
  });
}

int32_t ktORBA_Reset(uint32_t sessionHandle, tStatus* status) {
  return atBoundary(status, [&] {
    getSessionPtr(sessionHandle)->getHWControl().resetGeneration();
    getSessionPtr(sessionHandle)->getHWControl().clearAllWaveforms();
  });
}

int32_t ktORBA_SetDownloadFifoDepth(uint32_t sessionHandle, uint32_t depth, tStatus* status) {
  return atBoundary(status, [&] { getSessionPtr(sessionHandle)->getHWControl().setDownloadFifoDepth(depth); });
}

int32_t ktORBA_SetMemoryReadGrantTime(uint32_t sessionHandle, uint16_t grantTime, tStatus* status) {
  return atBoundary(status, [&] { applySetting(sessionHandle, &GenerationSettings::memoryReadGrantTime, grantTime); });
}

int32_t ktORBA_SetMemoryWriteGrantTime(uint32_t sessionHandle, uint16_t grantTime, tStatus* status) {
  return atBoundary(status, [&] { applySetting(sessionHandle, &GenerationSettings::memoryWriteGrantTime, grantTime); });
}

int32_t ktORBA_SetPrimingDepth(uint32_t sessionHandle, uint32_t primingDepth, tStatus* status) {
  return atBoundary(status, [&] { applySetting(sessionHandle, &GenerationSettings::primingDepth, primingDepth); });
}

int32_t ktORBA_SetWaveformWriteChunkSize(uint32_t sessionHandle, uint32_t chunkSize, tStatus* status) {
  return atBoundary(status, [&] { getSessionPtr(sessionHandle)->getHWControl().setWaveformWriteChunkSize(chunkSize); });
}

int32_t ktORBA_ConfigureStreamingWaveform(uint32_t sessionHandle, const char* streamingWaveformName, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(streamingWaveformName, "ktORBA_ConfigureStreamingWaveform", "streamingWaveformNameis NULL!");
    const std::string name = toUtf8(streamingWaveformName);  // here, and only here, before the look-up
    getSessionPtr(sessionHandle)->configureStreamingWaveform(name);
  });
}

int32_t ktORBA_CheckStreamingWaveformSpace(uint32_t sessionHandle, uint64_t* waveFormSpaceInSamples, tStatus* status) {
  return atBoundary(status, [&] {
    requireArgument(waveFormSpaceInSamples, "ktORBA_CheckStreamingWaveformSpace", "waveFormSpaceInSamplesis NULL!");
    *waveFormSpaceInSamples = getSessionPtr(sessionHandle)->getHWControl().checkStreamingWaveformSpace();
  });
}
