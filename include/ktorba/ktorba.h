/* The waveform-generation library: drives an arbitrary-waveform generator inside an FPGA design. The host opens the
 * FPGA with the FPGA's own interface library, opens one session per generator instance here, allocates and writes
 * waveforms, writes scripts that say what is played when, selects one, and starts, polls and aborts generation.
 *
 * Rules that hold for every function:
 *
 * Result. Every ktORBA_ function returns a status code: 0 for success, negative for an error. Constants for all codes
 *   are in <ktorba/error_codes.h>; the comments below name them. The first failing check is the one reported, in the
 *   order in which a function's errors are listed. Unless said otherwise a failed call has changed nothing and has
 *   not written through its out-pointers.
 *
 * Status record. `status`, always last, may be null. When it holds an error (a negative code) on entry, the function
 *   returns that code at once and does nothing else. With libktorba_elaborating a host may so make a row of calls with
 *   one record and look once, at the end. A warning (a positive code) does not stop a call.
 *
 * Two libraries export the functions below, built from one source:
 *   libktorba_elaborating is the one for new programs. At the end of every function it hands the code into the caller's
 *                         record too, and with it a JSON text, the elaboration, that names the constant, the source
 *                         place and the values of the failing request. The rule: an error is never replaced, a warning
 *                         only by an error, success by anything.
 *   libktorba             never writes the caller's record. It is for hosts that were built against just that: that
 *                         pass records which they manage themselves. What failed is told by the result alone: look at
 *                         it after every call, since a row of calls reports nothing at its end.
 *
 * Threads. The library starts no thread. Any thread may call any function. One session is used from one thread at a
 *   time, the host sees to that; calls on different sessions are independent. A session that is closed on one thread
 *   while a call on another still uses it lives until that call returns. Waits are bounded busy polls on the calling
 *   thread.
 *
 * Exceptions. None leaves the library, and one that is on its way in the host is none of its business: a function
 *   called from a destructor, while the host's own exception unwinds the stack, reports its failures as ever. What the
 *   host's callbacks throw (reallocJson, the clean-up registration) counts as their refusal.
 *
 * Re-entry. The platform's libraries and the host's callbacks must not call into the session that calls them: that is
 *   the second call at a time which the rule on threads forbids. Into other sessions they may.
 *
 * Processes. A child made by fork() has the parent's sessions but not the right to them: it and the parent would drive
 *   one generator. The child of a process with one thread may open and close sessions of its own; where another thread
 *   was in a call at that moment, the child must not call at all, since the lock of the table of sessions may be held
 *   for ever.
 *
 * Unloading. The library stays in the process from the first session that is opened on, however often it is unloaded,
 *   since a host runtime may still close sessions through it; sessions that are open stay open. The end of the process
 *   closes no session.
 *
 * Ownership. Texts and samples belong to the caller and are read during the call only.
 *
 * Texts (names, scripts) are NUL-terminated: UTF-8, or on Windows the active code page. Letter case does not count
 *   in names.
 *
 * Units. Lengths, offsets and priming depths are in samples, memory words are those of the generator's sample memory,
 *   time-outs are in milliseconds.
 *
 * Errors that many functions share are listed once, here:
 *   (any)       ktorba_nKTAPALS100_tStatus_kInvalidParameter: a required pointer is null (checked before the handle,
 *               except by the two write functions), or `sessionHandle` is not that of an open session.
 *               ktorba_nKTAPALS100_tStatus_kSoftwareFault: memory ran out, or a platform library is missing: the
 *               elaboration says which one, and where it was looked for.
 *   (text)      ktorba_codes_kTextNotConvertible: a text is not valid in its encoding. Windows only:
 *               ktorba_codes_kNoMemoryForConversion.
 *   (hardware)  Codes of the FPGA interface library and of the interface framework, passed on as they are;
 *               ktorba_codes_kNoMemory: there was no memory for a register transfer. One transfer takes at most
 *               1000 ms.
 *   (settings)  Every function that applies settings applies all of them and can return:
 *               ktorba_errors_kErrorPrimingDepthTooLarge,
 *               ktmxl_kErrorNameTooLong: the streaming waveform's name has more than 511 bytes,
 *               ktorba_errors_kErrorSpecifiedWaveformNotFound: the streaming waveform does not exist,
 *               ktorba_errors_kErrorRequestedWaveformLengthIsTooSmall: the streaming waveform is not longer than
 *               twice the sum of the two grant times,
 *               and (hardware). When it fails the session's settings are as before. Applying settings is allowed
 *               while a script plays and does not stop it, but leaves the session configured rather than started:
 *               until the next ktORBA_StartGeneration, writes to the streaming waveform do not wrap.
 */
#ifndef KTORBA_KTORBA_H
#define KTORBA_KTORBA_H

#include <stdint.h>

#include "ktorba/bool.h"

/* The version of this header, and of the library that it came with. Later versions of one major number run programs
 * that were built against an earlier one. */
#define KTORBA_VERSION_MAJOR 0
#define KTORBA_VERSION_MINOR 1
#define KTORBA_VERSION_PATCH 0

/* What a declaration needs to be exported or imported. Empty serves every user. */
#ifndef KTORBA_API
#define KTORBA_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

typedef struct tStatus tStatus;

/* A status record. Start with a buffer of your own that holds zeros, {0, sizeof buffer, NULL, buffer}, where 4096 bytes
 * hold all but the longest texts; with {0, 0, callback, NULL} for texts of any length; or with all zero when no text is
 * wanted. Pass the same record to as many calls as you like, from one thread at a time. To use it again after an error,
 * set `code` to 0. The buffer is the caller's: what a callback got is freed through it, reallocJson(self, 0). Only
 * libktorba_elaborating writes a record. */
struct tStatus {
  int32_t code;      /* negative: error, positive: warning, 0: success */
  uint32_t capacity; /* bytes that `json` points to; 0 when there is none */

  /* Grows the buffer to at least `newCapacity` bytes, up to 2147483647, and keeps its text; frees it when
   * `newCapacity` is 0. Updates `capacity` and `json`. Returns false, with nothing changed, when it cannot. Must not
   * call back into the library. May be null: then a text that does not fit is left out. */
  ktorba_bool (*reallocJson)(tStatus* self, uint32_t newCapacity);

  /* The elaboration, or null: one NUL-terminated JSON object. Every byte behind the NUL is zero, except the last one
   * of the buffer, which is 'J': so a text of n bytes needs a capacity of n + 2. */
  char* json;
};

/* ---- Sessions ---------------------------------------------------------------------------------------------------- */

/* Opens a session to one generator and gives its handle, never 0. Reads the generator's constants, finds, sizes
 * (40960 bytes) and starts its download FIFO. Sends the generator no settings: those are the defaults below until the
 * first function that applies settings.
 *   fpgaSession         the FPGA, opened by the host, which keeps it open as long as the session and closes it after
 *   ifwTarget           the interface framework's target for register transfers
 *   ifwSession          the interface framework's session
 *   parentContext       number of the framework context that the generator is a child of; null stands for 0
 *   instance            number of the generator among the parent's generators, from 0
 *   orbaSessionHandle   out: the handle. Written also when only the clean-up registration fails
 * There is one session per FPGA session and instance. Where a host runtime is present (see the end of this file) the
 * handle is registered with it, to be closed when the program that opened it ends.
 * Defaults: read grant time 60, write grant time 30, priming depth 200 memory words, no streaming waveform.
 * Errors: (any); ktorba_codes_kFlaggedFpgaSession: bit 13 of `fpgaSession` is set; (hardware): the handles, the
 * context or the FIFO are unknown; ktorba_codes_kNotAGenerator; ktorba_codes_kGeneratorTooOld;
 * ktorba_codes_kGeneratorTooNew; ktorba_codes_kSampleWidthIsZero; ktorba_errors_kErrorInternalSWError: the generator
 * reports constants that the library cannot work with; ktorba_nKTAPALS100_tStatus_kInvalidParameter: the generator has
 * a session already; ktorba_nKTAPALS100_tStatus_kSoftwareFault: the host runtime refused the registration, and the
 * session stays open. */
KTORBA_API int32_t ktORBA_OpenOrbaSession(uint32_t fpgaSession, uint32_t ifwTarget, uint32_t ifwSession,
                                          const uint32_t* parentContext, uint8_t instance, uint32_t* orbaSessionHandle,
                                          tStatus* status);

/* Closes a session: its handle, waveforms and scripts are gone. Nothing is sent to the generator, which goes on
 * generating if it was. A call of another thread that still uses the session completes first.
 * Errors: (any). */
KTORBA_API int32_t ktORBA_CloseOrbaSession(uint32_t sessionHandle, tStatus* status);

/* ---- Waveforms --------------------------------------------------------------------------------------------------- */

/* Gives the size of the generator's sample memory.
 *   memorySize   out: bytes of sample memory divided by one more than the bytes of a memory word, rounded down
 * Errors: (any). */
KTORBA_API int32_t ktORBA_GetWaveformMemorySize(uint32_t sessionHandle, uint64_t* memorySize, tStatus* status);

/* Allocates sample memory for a new waveform. Its samples are undefined until written; its write position is 0.
 *   waveformName   1 to 511 bytes; no control characters, blanks or punctuation other than - and _; not beginning
 *                  with _; not the name of an existing waveform
 *   numSamples     length; at least the generator's minimum, a multiple of its alignment quantum
 * Errors: (any), (text), ktorba_errors_kErrorWaveformNameIsEmpty, ktmxl_kErrorInvalidCharInString,
 * ktmxl_kErrorLeadingUnderscoreInString, ktmxl_kErrorNameTooLong, ktorba_errors_kErrorWaveformNameAlreadyExists,
 * ktorba_errors_kErrorNumSamplesInWaveformMustBeGreaterThanZero,
 * ktorba_errors_kErrorRequestedWaveformLengthIsTooSmall,
 * ktorba_errors_kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum,
 * ktorba_errors_kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA. */
KTORBA_API int32_t ktORBA_AllocateWaveform(uint32_t sessionHandle, const char* waveformName, uint32_t numSamples,
                                           tStatus* status);

/* Writes samples into a waveform from its write position on, which then stands behind them. A waveform that does not
 * exist is allocated first, with exactly `numSamples` samples. While generation runs, a write to the streaming
 * waveform wraps at the waveform's end. U32 is for generators of 32-bit samples, I16 for those of 16-bit samples.
 *   data         numSamples samples, borrowed until return
 *   numSamples   at least 1; up to the waveform's end, or for a streaming write up to its length
 *   timeoutMs    limit for the whole write; negative: none, as long as the hardware reports no error
 * Errors: (any), the unknown handle first; ktorba_errors_kErrorInternalSWError: the generator's samples have the other
 * width; (text), ktorba_errors_kErrorNumSamplesInWaveformMustBeGreaterThanZero, those of ktORBA_AllocateWaveform when
 * the waveform does not exist, ktorba_errors_kErrorCannotWriteDataOutsideWaveformBoundaries,
 * ktorba_errors_kErrorWriteWaveformTimeout, (hardware).
 * A write that fails on its way leaves the write position where it was, samples sent so far in memory, and no
 * waveform that it allocated itself. Where all of its samples were sent, the next write waits for it, on its own time;
 * where they were not, the generator goes on expecting them, and all further downloads time out until ktORBA_Reset. */
KTORBA_API int32_t ktORBA_WriteWaveformU32(uint32_t sessionHandle, const char* waveformName, const uint32_t* data,
                                           uint32_t numSamples, int32_t timeoutMs, tStatus* status);
KTORBA_API int32_t ktORBA_WriteWaveformI16(uint32_t sessionHandle, const char* waveformName, const int16_t* data,
                                           uint32_t numSamples, int32_t timeoutMs, tStatus* status);

/* Where the offset of ktORBA_SetWaveformNextWritePosition counts from. */
enum {
  ktORBA_kFromStart = 0,          /* the waveform's first sample */
  ktORBA_kFromCurrentPosition = 1 /* the present write position */
};

/* Moves a waveform's write position, which may stand from its first sample up to behind its last.
 *   offset   samples, a multiple of the alignment quantum; read as a signed 32-bit number, so that
 *            (uint32_t)-16 with ktORBA_kFromCurrentPosition moves back by 16
 *   mode     ktORBA_kFromStart or ktORBA_kFromCurrentPosition
 * Errors: (any), (text), ktorba_errors_kErrorWritePositionIsNotMultipleOfAlignmentQuantum,
 * ktorba_errors_kErrorSpecifiedWaveformNotFound, ktorba_nKTAPALS100_tStatus_kInvalidParameter: another mode;
 * ktorba_errors_kErrorWritePositionIsOutsideWaveformBoundary. */
KTORBA_API int32_t ktORBA_SetWaveformNextWritePosition(uint32_t sessionHandle, const char* waveformName,
                                                       uint32_t offset, uint8_t mode, tStatus* status);

/* Gives a waveform's name and memory up. Scripts written before still refer to that memory: write them again. When it
 * was the streaming waveform, streaming is turned off and the settings are applied.
 * Errors: (any), (text), ktorba_errors_kErrorSpecifiedWaveformNotFound, (settings): the waveform is gone then. */
KTORBA_API int32_t ktORBA_ClearWaveform(uint32_t sessionHandle, const char* waveformName, tStatus* status);

/* Gives all scripts and all waveforms up, turns streaming off and applies the settings. No script is active then.
 * Errors: (any), (settings): the scripts and waveforms are gone then. */
KTORBA_API int32_t ktORBA_ClearAllWaveforms(uint32_t sessionHandle, tStatus* status);

/* ---- Scripts ----------------------------------------------------------------------------------------------------- */

/* Compiles a text of one or more scripts and keeps each under its name, in place of a script of that name. The
 * waveforms must exist, with their final lengths. Nothing is sent to the generator.
 * Errors: (any), (text). From the compiler, with line and position in the elaboration; no script is kept:
 *   ktwfmscriptcompiler_errors_kErrorKeywordExpectedInScript, _kErrorScriptHasInvalidIdentifier,
 *   _kErrorIntegerExpectedInScript, _kErrorScriptHasInvalidCharacter, _kErrorInvalidSubsetLengthInScript,
 *   _kErrorInvalidLoopIterationsInScript, _kErrorRepeatLoopNestingTooDeepInScript,
 *   _kErrorMarkerPositionOutsideSubsetInScript, _kErrorLoopOrProcedureWithNoSamplesGenerated,
 *   _kErrorClearIsLastInstructionOfLoopInScript, _kErrorMarkerNotSupportedInWait,
 *   _kErrorMarkerPositionNotMultipleOfQuantum, _kErrorSubsetLengthNotMultipleOfQuantum,
 *   _kErrorStartOffsetNotMultipleOfQuantum, _kErrorNumSamplesToWaitNotMultipleOfQuantum,
 *   _kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript; ktmxl_kErrorSoftwareFault.
 * From fitting a script to its waveforms; the scripts before it in the text are kept:
 *   ktorba_errors_kErrorSpecifiedWaveformNotFound, _kErrorStartPositionExceedsWaveformLength,
 *   _kErrorRequestedWaveformLengthIsTooSmall, _kErrorRequestedWaveformLengthExceedsAllocatedLength,
 *   _kErrorInvalidStartPositionAndWaveformLengthCombination, _kErrorInvalidWaveformLengthToIgnore,
 *   _kErrorMarkerPositionExceedsLastElementInWaveform, _kErrorInvalidNumberOfMarkersOnAWaveform,
 *   _kErrorInvalidDistanceBetweenTwoMarkerPositions, _kErrorInternalSWError, _kErrorSequenceSizeTooLarge. */
KTORBA_API int32_t ktORBA_WriteScript(uint32_t sessionHandle, const char* script, tStatus* status);

/* Makes a script the one that generation runs: sends it to sequence memory, unless it is active and there already
 * (within 5000 ms), and applies the settings, since no more is primed than the script holds.
 *   scriptName   null or empty: no script is active
 * Errors: (any) but for the null pointer, (text), ktmxl_kErrorScriptNotInMem,
 * ktorba_errors_kErrorWriteWaveformTimeout, (hardware): the script that was active before is still that, and is sent
 * again when it is selected next, which must come before the next start; (settings): the script is active and sent
 * then. */
KTORBA_API int32_t ktORBA_SelectActiveScript(uint32_t sessionHandle, const char* scriptName, tStatus* status);

/* Forgets a script. When it was the active one, none is active; sequence memory is not touched.
 * Errors: (any), (text), ktmxl_kErrorScriptNotInMem. */
KTORBA_API int32_t ktORBA_DeleteScript(uint32_t sessionHandle, const char* scriptName, tStatus* status);

/* ---- Generation -------------------------------------------------------------------------------------------------- */

/* Starts generation of the active script and returns at once.
 * Errors: (any), ktorba_errors_kErrorActiveSequenceNotSpecified, ktorba_errors_kErrorGenerationUnconfigured: no
 * settings were applied since the session was opened or reset; (hardware). */
KTORBA_API int32_t ktORBA_StartGeneration(uint32_t sessionHandle, tStatus* status);

/* Stops generation; harmless when none runs. The streaming waveform's write position goes back to 0.
 * Errors: (any), (hardware). */
KTORBA_API int32_t ktORBA_AbortGeneration(uint32_t sessionHandle, tStatus* status);

/* Tells whether generation has come to its end.
 *   isDone   out: one byte, 1 when done, else 0
 * Errors: (any), (hardware), ktorba_errors_kErrorDeviceDataUnderflow: the generator ran out of data. */
KTORBA_API int32_t ktORBA_CheckGenerationStatus(uint32_t sessionHandle, uint8_t* isDone, tStatus* status);

/* Resets the generator and the download FIFO and gives all scripts and waveforms up. The session's settings stay, a
 * streaming waveform's name included: turn that off with ktORBA_ConfigureStreamingWaveform before the next function
 * that applies settings.
 * Errors: (any), (hardware): the scripts and waveforms are still there then. */
KTORBA_API int32_t ktORBA_Reset(uint32_t sessionHandle, tStatus* status);

/* ---- Settings ---------------------------------------------------------------------------------------------------- */

/* Sets the depth of the download FIFO on the host's side.
 *   depth   bytes, at least; 40960 at first
 * Errors: (any), (hardware). */
KTORBA_API int32_t ktORBA_SetDownloadFifoDepth(uint32_t sessionHandle, uint32_t depth, tStatus* status);

/* Set how long the generator's memory is granted to reading and to writing in turn, and apply the settings.
 *   grantTime   any value, in the generator's own unit; 60 for reading and 30 for writing at first
 * Errors: (any), (settings). */
KTORBA_API int32_t ktORBA_SetMemoryReadGrantTime(uint32_t sessionHandle, uint16_t grantTime, tStatus* status);
KTORBA_API int32_t ktORBA_SetMemoryWriteGrantTime(uint32_t sessionHandle, uint16_t grantTime, tStatus* status);

/* Sets how much the generator reads ahead before it starts, and applies the settings.
 *   primingDepth   samples, rounded up to whole memory words and capped at the active script's length; at most the
 *                  generator's limit
 * Errors: (any), (settings). */
KTORBA_API int32_t ktORBA_SetPrimingDepth(uint32_t sessionHandle, uint32_t primingDepth, tStatus* status);

/* Sets the largest piece in which a write hands samples to the download FIFO.
 *   chunkSize   bytes, 32768 at first. Not checked: with 0 every write ends in its time-out, an
 *               unlimited one at once
 * Errors: (any). */
KTORBA_API int32_t ktORBA_SetWaveformWriteChunkSize(uint32_t sessionHandle, uint32_t chunkSize, tStatus* status);

/* ---- Streaming --------------------------------------------------------------------------------------------------- */

/* Makes an existing waveform the streaming waveform, which the host goes on writing, circularly, while it plays, and
 * applies the settings.
 *   streamingWaveformName   empty: streaming is turned off
 * Errors: (text), before the handle is looked at; (any), (settings). */
KTORBA_API int32_t ktORBA_ConfigureStreamingWaveform(uint32_t sessionHandle, const char* streamingWaveformName,
                                                     tStatus* status);

/* Tells how many samples can be written to the streaming waveform at once without overtaking what plays.
 *   waveFormSpaceInSamples   out
 * Errors: (any), ktorba_errors_kErrorSpecifiedWaveformNotFound: no streaming waveform is configured; (hardware). */
KTORBA_API int32_t ktORBA_CheckStreamingWaveformSpace(uint32_t sessionHandle, uint64_t* waveFormSpaceInSamples,
                                                      tStatus* status);

/* ---- Host runtime ------------------------------------------------------------------------------------------------ */

/* For a host runtime that loads the library and can end the calling program at any time. The runtime exports
 *   int32_t PDRNRegisterCleanUpProc(int32_t (*procedure)(uint32_t handle), uint32_t handle, int32_t mode)
 * which is called with mode 2 when a session is opened (0 refuses) and with mode 0 when it is closed; `procedure`
 * closes the session of its handle and returns 0. The function is looked for on first use: in the module whose handle
 * the thread-local slot holds, in the module given, in the host process. Where nothing has it, sessions are not
 * registered; on Windows, that ends the process with a message. Any thread may call these. */

/* Tells the module (dlopen handle, HMODULE) that exports the registration function; then calls SetPDRNModuleHook. */
KTORBA_API void SetPDRNModule(void* module);

/* Tells the thread-local slot (pthread_key_t, TLS index) that holds the module's handle, 0xFFFFFFFF for none; then
 * calls SetPDRNModuleHook. */
KTORBA_API void SetPDRNTLSIndex(uint32_t index);

/* Do nothing: a place for the host runtime to step in. */
KTORBA_API void SetPDRNModuleHook(void);
KTORBA_API void SetPDRNTLSIndexHook(void);

#ifdef __cplusplus
}
#endif

#endif
