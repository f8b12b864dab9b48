// The engine facade: every exported function that touches waveforms, scripts, generation or settings ends in one of
// these operations. Names are UTF-8; two that differ in letter case alone are one. One thread at a time per object.
//
// Failures are kterr::Exception. What the FPGA, its register bus and its framework report is raised as it is: "the
// hardware's errors" below. A failed operation leaves waveforms, scripts and settings as they were, except where its
// comment says otherwise.
#pragma once

#include <cstdint>
#include <string>

#include "ktorba/download/DataWrapperInterface.h"
#include "ktorba/hwRecords/HWSettings.h"
#include "ktorba/hwRecords/HWTraits.h"

namespace ktorba {

class ScriptTableInterface;

class HWControlInterface {
 public:
  virtual ~HWControlInterface() = default;

  // Gives the generator's constants; with `refresh` reads them anew. Raises then the hardware's errors, and
  // ktorba_errors::kErrorInternalSWError for constants that the engine cannot work with: those known before stay.
  virtual void getHWTraits(HWTraits& out, bool refresh) = 0;

  // Returns HWTraits::waveformMemorySize, in its unit.
  virtual std::uint32_t getWaveformMemorySize() = 0;

  // Returns the length of the longest waveform that can be allocated now, samples.
  virtual std::uint32_t getLargestAllocatableLength() = 0;

  // Keeps `settings` for the next configureGeneration(); sends nothing.
  virtual void receiveSettings(const HWSettingsRecord& settings) = 0;

  // Gives the settings kept last; the defaults at first.
  virtual void provideSettings(HWSettingsRecord& out) = 0;

  // Hands settings and traits to the parts and writes the settings to the generator, unless they are what was written
  // last and `force` is not set. Generation counts as configured then, one that runs as well. Raises the hardware's
  // errors: the state of generation is as before, and the next call writes again.
  virtual void configureGeneration(bool force) = 0;

  // Sets HWTraits::auxiliarySize and hands the traits, which it reads anew with `refresh`, to the parts. Raises what
  // getHWTraits() does.
  virtual void setAuxiliarySize(std::uint32_t value, bool refresh) = 0;

  // Starts generating the active script and returns at once. Raises ktorba_errors::kErrorActiveSequenceNotSpecified: no
  // script is active; kErrorGenerationUnconfigured: nothing was configured since the beginning or the last reset; the
  // hardware's errors.
  virtual void startGeneration() = 0;

  // Resets the generator and restarts the download FIFO. Generation is unconfigured then; waveforms, scripts and
  // settings stay. Raises the hardware's errors: the state of generation is as before.
  virtual void resetGeneration() = 0;

  // Stops generation; harmless when none runs. Where it ran with a streaming waveform, that one's write position goes
  // back to its start, here and in the generator. Raises the hardware's errors, and
  // ktorba_errors::kErrorSpecifiedWaveformNotFound when the streaming waveform is gone: generation has stopped then.
  virtual void abortGeneration() = 0;

  // Read whether the script has come to its end, and whether the generator has run out of data. Raise the hardware's
  // errors.
  virtual void readGenerationDone(bool& out) = 0;
  virtual void readDataUnderflow(bool& out) = 0;

  // Returns whether the script has come to its end. Raises the hardware's errors, and
  // ktorba_errors::kErrorDeviceDataUnderflow when the generator has run out of data, also where it has ended since.
  virtual bool checkGenerationStatus() = 0;

  // Gives the download FIFO a depth of at least that many bytes on the host's side. Raises the hardware's errors.
  virtual void setDownloadFifoDepth(std::uint32_t depth) = 0;

  // Allocates a waveform of `numSamples` samples, undefined until they are written, at write position 0. Raises, in
  // this order, ktorba_errors::kErrorWaveformNameIsEmpty; the errors of ktcheckname::checkName() for a name that no
  // waveform may have; kErrorWaveformNameAlreadyExists; kErrorNumSamplesInWaveformMustBeGreaterThanZero,
  // kErrorRequestedWaveformLengthIsTooSmall and kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum for a length
  // that the generator cannot play; kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA: no free block is that large.
  virtual void allocateWaveform(const std::string& name, std::uint32_t numSamples) = 0;

  // Moves a waveform's write position by `offset` samples, a multiple of the alignment quantum: from the waveform's
  // start with `mode` 0, from where it is with 1. Read as a signed number, so that it can go back. It may stand from
  // the first sample up to behind the last. Raises, in this order,
  // ktorba_errors::kErrorWritePositionIsNotMultipleOfAlignmentQuantum, kErrorSpecifiedWaveformNotFound,
  // nKTAPALS100_tStatus_kInvalidParameter: another mode; kErrorWritePositionIsOutsideWaveformBoundary.
  virtual void setWaveformNextWritePosition(const std::string& name, std::uint32_t mode, std::uint32_t offset) = 0;

  virtual bool waveformExists(const std::string& name) = 0;

  // Writes the samples of `data`, which have the generator's width, from the write position on, which then stands
  // behind them; returns when the generator has them. A waveform that does not exist is allocated first, as long as the
  // data, if `allocateIfMissing`. While generation runs, a write to the streaming waveform goes on at its start where
  // it meets its end. `timeoutMs` limits the whole write; above INT32_MAX (a negative one, to the caller) is no limit.
  // Raises ktorba_errors::kErrorNumSamplesInWaveformMustBeGreaterThanZero, what allocateWaveform() does,
  // kErrorSpecifiedWaveformNotFound, kErrorCannotWriteDataOutsideWaveformBoundaries, kErrorWriteWaveformTimeout and the
  // hardware's errors. After a failure the write position is what it was, samples already sent stay in the generator's
  // memory, and a waveform allocated by this call is gone again.
  virtual void writeWaveform(const std::string& name, const DataWrapperInterface& data, std::uint32_t timeoutMs,
                             bool allocateIfMissing) = 0;

  // Sets the most bytes that a write hands to the download FIFO in one call. Not checked: with 0 every write ends in
  // its time-out, one without limit at once.
  virtual void setWaveformWriteChunkSize(std::uint32_t chunkBytes) = 0;

  // Gives a waveform's name and memory up, to which scripts written before still refer. Raises
  // ktorba_errors::kErrorSpecifiedWaveformNotFound.
  virtual void clearWaveform(const std::string& name) = 0;

  // Gives all waveforms up, and all scripts with them.
  virtual void clearAllWaveforms() = 0;

  // Forgets all scripts; none is active then.
  virtual void clearAllScripts() = 0;

  // Compiles the scripts of `text`, finds their waveforms, and keeps each as not loaded, in place of one of its name.
  // Sends nothing. Raises the compiler's errors, and keeps no script then; the errors of
  // ScriptProcessor::buildInstructionWords(), and ktorba_errors::kErrorSequenceSizeTooLarge for more instructions than
  // the generator's sequence memory holds: the scripts in front of the one at fault are kept then.
  virtual void writeScript(const std::string& text) = 0;

  // Forgets a script; when it was the active one, none is active then. Raises ktmxl::kErrorScriptNotInMem.
  virtual void deleteScript(const std::string& name) = 0;

  // Makes a script the active one, and sends it to sequence memory first unless it is active and loaded, within five
  // seconds. `activeScriptLength` becomes its length in memory words, 0xFFFFFFFF when it has no end. An empty name
  // stands for no script, of length 0. Raises ktmxl::kErrorScriptNotInMem, ktorba_errors::kErrorWriteWaveformTimeout
  // and the hardware's errors: the active script and `activeScriptLength` are what they were. After a download that
  // failed behind its announcement no script counts as loaded: the next selection of any sends it.
  virtual void selectActiveScript(const std::string& name, std::uint32_t& activeScriptLength) = 0;

  // Returns the table of scripts, which the session owns.
  virtual ScriptTableInterface* getScriptTable() = 0;

  // Whether the settings kept last name this waveform as the streaming waveform.
  virtual bool isStreamingWaveform(const std::string& name) = 0;

  // Returns how many samples can be written to the streaming waveform at once without overtaking what plays. Raises the
  // hardware's errors, and ktorba_errors::kErrorSpecifiedWaveformNotFound when the settings name no streaming waveform
  // or one that is gone.
  virtual std::uint64_t checkStreamingWaveformSpace() = 0;
};

}  // namespace ktorba
