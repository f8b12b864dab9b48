/* The codes that the library returns, by name. A code is negative and fits 32 bits; what the exported functions
 * return can be compared with these as it is. The same codes with their constants' texts: docs/errors.md.
 *
 * Written by ktorba_describe_errors from kterr/errors.def.
 */
#ifndef KTORBA_ERROR_CODES_H
#define KTORBA_ERROR_CODES_H

/* clang-format off */
enum ktorba_error_code {
  /* A write position is not a multiple of the generator's alignment quantum.
   * Move the position to a multiple of the quantum given in the elaboration. */
  ktorba_errors_kErrorWritePositionIsNotMultipleOfAlignmentQuantum = -1074101632, /* 0xBFFA8280 */
  /* A write position lies before the start or behind the end of the waveform.
   * Choose a position from 0 up to and including the waveform's length; in mode 1 the offset counts from the present position. */
  ktorba_errors_kErrorWritePositionIsOutsideWaveformBoundary = -1074101631, /* 0xBFFA8281 */
  /* The length of an allocation is not a multiple of the generator's alignment quantum.
   * Round the number of samples up to a multiple of the quantum given in the elaboration. */
  ktorba_errors_kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum = -1074101629, /* 0xBFFA8283 */
  /* A waveform was allocated or written with zero samples.
   * Give at least the generator's minimum number of samples to an allocation, and at least one to a write. */
  ktorba_errors_kErrorNumSamplesInWaveformMustBeGreaterThanZero = -1074101624, /* 0xBFFA8288 */
  /* The length of a wait is above 2147483647 samples.
   * Split the wait into several shorter ones, or repeat a shorter one. */
  ktorba_errors_kErrorInvalidWaveformLengthToIgnore = -1074101619, /* 0xBFFA828D */
  /* A write would run past the end of the waveform.
   * Write fewer samples, move the write position back, or allocate a longer waveform. */
  ktorba_errors_kErrorCannotWriteDataOutsideWaveformBoundaries = -1074101617, /* 0xBFFA828F */
  /* Generation was started with no active script.
   * Select a script with ktORBA_SelectActiveScript before starting. */
  ktorba_errors_kErrorActiveSequenceNotSpecified = -1074101614, /* 0xBFFA8292 */
  /* The generator ran out of data while it was playing.
   * When streaming, write faster or into a longer waveform; else raise the memory read grant time or the priming depth. */
  ktorba_errors_kErrorDeviceDataUnderflow = -1074101613, /* 0xBFFA8293 */
  /* A download did not complete within its time-out.
   * Allow more time; if it happens again, check that the FPGA design is running and drains its download FIFO. */
  ktorba_errors_kErrorWriteWaveformTimeout = -1074101611, /* 0xBFFA8295 */
  /* A compiled script has more instructions than the generator's sequence memory holds.
   * Shorten the script: use loops instead of repeated lines, and fewer markers, since each may split a fetch. */
  ktorba_errors_kErrorSequenceSizeTooLarge = -1074101610, /* 0xBFFA8296 */
  /* A subset in a script is longer than its waveform.
   * Shorten the subset or allocate a longer waveform before writing the script. */
  ktorba_errors_kErrorRequestedWaveformLengthExceedsAllocatedLength = -1074101608, /* 0xBFFA8298 */
  /* A waveform or a subset is shorter than the generator's minimum.
   * Use at least the number of samples given in the elaboration. */
  ktorba_errors_kErrorRequestedWaveformLengthIsTooSmall = -1074101607, /* 0xBFFA8299 */
  /* A subset in a script starts inside its waveform but runs past its end.
   * Make the start offset plus the length no more than the waveform's length. */
  ktorba_errors_kErrorInvalidStartPositionAndWaveformLengthCombination = -1074101606, /* 0xBFFA829A */
  /* A subset in a script starts beyond the end of its waveform.
   * Make the start offset smaller than the waveform's length. */
  ktorba_errors_kErrorStartPositionExceedsWaveformLength = -1074101605, /* 0xBFFA829B */
  /* A marker in a script lies at or beyond the end of the samples that it marks.
   * Place the marker at a position from 0 to the length less one. */
  ktorba_errors_kErrorMarkerPositionExceedsLastElementInWaveform = -1074101604, /* 0xBFFA829C */
  /* A named waveform does not exist, or no streaming waveform is configured.
   * Check the name's spelling, and allocate or write the waveform before it is used. */
  ktorba_errors_kErrorSpecifiedWaveformNotFound = -1074101603, /* 0xBFFA829D */
  /* A waveform was allocated with an empty name.
   * Give the waveform a name. */
  ktorba_errors_kErrorWaveformNameIsEmpty = -1074101598, /* 0xBFFA82A2 */
  /* A waveform of that name exists already; letter case does not count.
   * Choose another name, or clear the existing waveform first. */
  ktorba_errors_kErrorWaveformNameAlreadyExists = -1074101597, /* 0xBFFA82A3 */
  /* The waveform is larger than the largest free block of sample memory.
   * Clear waveforms that are no longer needed, or shorten this one; the elaboration gives the largest free block in bytes. */
  ktorba_errors_kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA = -1074101596, /* 0xBFFA82A4 */
  /* The priming depth is above the generator's limit.
   * Use at most the number of samples given in the elaboration. */
  ktorba_errors_kErrorPrimingDepthTooLarge = -1074101595, /* 0xBFFA82A5 */
  /* The request does not fit the generator: sample type, a trait, or a value that its instruction has no room for.
   * Read the elaboration's message: use the write function of the generator's sample width, or bring the value named there below its limit. */
  ktorba_errors_kErrorInternalSWError = -1074101592, /* 0xBFFA82A8 */
  /* Two markers of one instruction stand closer than the generator allows.
   * Keep the distance given in the elaboration between the positions, or make them equal. */
  ktorba_errors_kErrorInvalidDistanceBetweenTwoMarkerPositions = -1074101589, /* 0xBFFA82AB */
  /* An instruction has more marker positions than its length allows.
   * Use at most the number of positions given in the elaboration. */
  ktorba_errors_kErrorInvalidNumberOfMarkersOnAWaveform = -1074101588, /* 0xBFFA82AC */
  /* The operation needs a configured generator.
   * Select a script or change a setting first: after a reset that configures the generator again. */
  ktorba_errors_kErrorGenerationUnconfigured = -1074101586, /* 0xBFFA82AE */
  /* The operation needs generation to have been prepared or started.
   * Call ktORBA_StartGeneration first. */
  ktorba_errors_kErrorInitiateNotCalled = -1074101585, /* 0xBFFA82AF */
  /* A keyword, a parenthesis, a comma or a trigger name is missing in the script, or the script is empty.
   * Put one of the possible keywords named in the elaboration at that line and position. */
  ktwfmscriptcompiler_errors_kErrorKeywordExpectedInScript = -1074101568, /* 0xBFFA82C0 */
  /* A name in the script is missing or begins with a digit.
   * Begin names with a letter. */
  ktwfmscriptcompiler_errors_kErrorScriptHasInvalidIdentifier = -1074101567, /* 0xBFFA82C1 */
  /* A number in the script is missing or above 2147483647.
   * Write a decimal integer from 0 to 2147483647 there. */
  ktwfmscriptcompiler_errors_kErrorIntegerExpectedInScript = -1074101566, /* 0xBFFA82C2 */
  /* A subset in the script has a length of 0.
   * Give the subset a length of at least the generator's minimum. */
  ktwfmscriptcompiler_errors_kErrorInvalidSubsetLengthInScript = -1074101564, /* 0xBFFA82C4 */
  /* A repeat in the script has a count of 0.
   * Repeat at least once, or remove the loop. */
  ktwfmscriptcompiler_errors_kErrorInvalidLoopIterationsInScript = -1074101563, /* 0xBFFA82C5 */
  /* A word of the script holds a character that scripts do not use.
   * Use letters, digits, parentheses, commas, blanks and // comments only; names take any non-ASCII letter too. */
  ktwfmscriptcompiler_errors_kErrorScriptHasInvalidCharacter = -1074101561, /* 0xBFFA82C7 */
  /* A repeat stands inside a repeat.
   * Nest loops one level deep; only a repeat forever that is a script's whole body may hold further loops. */
  ktwfmscriptcompiler_errors_kErrorRepeatLoopNestingTooDeepInScript = -1074101560, /* 0xBFFA82C8 */
  /* A marker lies at or beyond the end of its subset or wait.
   * Place the marker at a position from 0 to the length less one. */
  ktwfmscriptcompiler_errors_kErrorMarkerPositionOutsideSubsetInScript = -1074101559, /* 0xBFFA82C9 */
  /* A script or a loop body generates no samples.
   * Add a generate or a counted wait to it. */
  ktwfmscriptcompiler_errors_kErrorLoopOrProcedureWithNoSamplesGenerated = -1074101557, /* 0xBFFA82CB */
  /* A loop body ends with a clear, which would act on no instruction.
   * Move the clear to the start of the loop body or in front of another instruction. */
  ktwfmscriptcompiler_errors_kErrorClearIsLastInstructionOfLoopInScript = -1074101555, /* 0xBFFA82CD */
  /* A wait until a trigger carries markers.
   * Put the markers on the instruction before or after the wait. */
  ktwfmscriptcompiler_errors_kErrorMarkerNotSupportedInWait = -1074101554, /* 0xBFFA82CE */
  /* A marker position is not a multiple of the alignment quantum.
   * Move the marker to a multiple of the quantum given in the elaboration. */
  ktwfmscriptcompiler_errors_kErrorMarkerPositionNotMultipleOfQuantum = -1074101553, /* 0xBFFA82CF */
  /* A subset length is not a multiple of the alignment quantum.
   * Change the length to a multiple of the quantum given in the elaboration. */
  ktwfmscriptcompiler_errors_kErrorSubsetLengthNotMultipleOfQuantum = -1074101552, /* 0xBFFA82D0 */
  /* A subset start is not a multiple of the alignment quantum.
   * Change the start to a multiple of the quantum given in the elaboration. */
  ktwfmscriptcompiler_errors_kErrorStartOffsetNotMultipleOfQuantum = -1074101551, /* 0xBFFA82D1 */
  /* A wait length is not a multiple of the alignment quantum.
   * Change the length to a multiple of the quantum given in the elaboration. */
  ktwfmscriptcompiler_errors_kErrorNumSamplesToWaitNotMultipleOfQuantum = -1074101550, /* 0xBFFA82D2 */
  /* A wait is shorter than the generator's minimum.
   * Wait at least the number of samples given in the elaboration. */
  ktwfmscriptcompiler_errors_kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript = -1074101549, /* 0xBFFA82D3 */
  /* A name is a null pointer.
   * Pass a NUL-terminated text. */
  ktmxl_kErrorNULLPtr = -1074098093, /* 0xBFFA9053 */
  /* A name begins with an underscore.
   * Begin the name with a letter, a digit or a minus. */
  ktmxl_kErrorLeadingUnderscoreInString = -1074098082, /* 0xBFFA905E */
  /* A name holds a blank, a control character or punctuation other than - and _.
   * Remove the character at the position given in the elaboration. */
  ktmxl_kErrorInvalidCharInString = -1074098079, /* 0xBFFA9061 */
  /* A name is empty.
   * Pass a name of 1 to 511 bytes. */
  ktmxl_kErrorEmptyString = -1074098043, /* 0xBFFA9085 */
  /* A named script has not been written to this session.
   * Check the name's spelling, and write the script before it is selected or deleted. */
  ktmxl_kErrorScriptNotInMem = -1074097987, /* 0xBFFA90BD */
  /* A waveform was added under a name that the waveform table holds already.
   * Choose another name, or clear the existing waveform first. */
  ktmxl_kErrorWaveformPreviouslyAllocated = -1074097977, /* 0xBFFA90C7 */
  /* A name is longer than 511 bytes.
   * Shorten the name; characters outside ASCII take two to four bytes each. */
  ktmxl_kErrorNameTooLong = -1074097806, /* 0xBFFA9172 */
  /* The compiler met an instruction or a loop of unknown kind.
   * Please report this together with the script: no script text should lead here. */
  ktmxl_kErrorSoftwareFault = -1074097800, /* 0xBFFA9178 */
  /* An argument is invalid: a null pointer, an unknown session handle, a second session on one generator, or a bad mode.
   * Read the message in the elaboration: it names the function and the argument. */
  ktorba_nKTAPALS100_tStatus_kInvalidParameter = -52005, /* 0xFFFF34DB */
  /* An internal check failed, memory ran out, a platform library is missing, or clean-up could not be registered.
   * Read the message in the elaboration; check that both platform libraries are installed and that memory is left. */
  ktorba_nKTAPALS100_tStatus_kSoftwareFault = -52003, /* 0xFFFF34DD */
  /* The FPGA session handle given to a session open carries flag bit 0x2000.
   * Open the session with a plain FPGA session handle. */
  ktorba_codes_kFlaggedFpgaSession = -1, /* 0xFFFFFFFF */
  /* The FPGA session handle is invalid.
   * Open the session with a plain FPGA session handle. */
  ktorba_codes_kInvalidLumHandle = -52, /* 0xFFFFFFCC */
  /* A name or a script text is not valid in the text encoding that the library expects.
   * Pass valid UTF-8 (on Windows: text in the active code page). */
  ktorba_codes_kTextNotConvertible = -52027, /* 0xFFFF34C5 */
  /* There was no memory to convert a name or a script text.
   * Free memory and try again. */
  ktorba_codes_kNoMemoryForConversion = -52000, /* 0xFFFF34E0 */
  /* There was no memory for a register transfer or a result array.
   * Free memory and try again. */
  ktorba_codes_kNoMemory = -52000, /* 0xFFFF34E0 */
  /* A form of context lookup was asked for that this library does not support.
   * Please report this: no call of the public interface should lead here. */
  ktorba_codes_kUnsupportedLookup = -52002, /* 0xFFFF34DE */
  /* The register block found is not that of a waveform generator.
   * Check the parent context and the instance number against the FPGA design. */
  ktorba_codes_kNotAGenerator = -1074101587, /* 0xBFFA82AD */
  /* The generator's version is refused by the first result of the version check.
   * Use an FPGA design whose generator is compatible with version 4.2. */
  ktorba_codes_kGeneratorTooOld = -1074101621, /* 0xBFFA828B */
  /* The generator's version is refused by the second result of the version check.
   * Use an FPGA design whose generator is compatible with version 4.2. */
  ktorba_codes_kGeneratorTooNew = -1074101622, /* 0xBFFA828A */
  /* The generator reports a sample width of 0 bits.
   * Check that the FPGA design is loaded and running. */
  ktorba_codes_kSampleWidthIsZero = -1074097783 /* 0xBFFA9189 */
};

/* The same codes as a list, X(name, code, meaning, help), for programs that print them: the two texts are string
 * literals, those of the comments above. Two names share a code, so a switch cannot have all of them.
 */
#define KTORBA_ERROR_CODES(X) \
  X(ktorba_errors_kErrorWritePositionIsNotMultipleOfAlignmentQuantum, -1074101632, \
    "A write position is not a multiple of the generator's alignment quantum.", \
    "Move the position to a multiple of the quantum given in the elaboration.") \
  X(ktorba_errors_kErrorWritePositionIsOutsideWaveformBoundary, -1074101631, \
    "A write position lies before the start or behind the end of the waveform.", \
    "Choose a position from 0 up to and including the waveform's length; in mode 1 the offset counts from the present position.") \
  X(ktorba_errors_kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum, -1074101629, \
    "The length of an allocation is not a multiple of the generator's alignment quantum.", \
    "Round the number of samples up to a multiple of the quantum given in the elaboration.") \
  X(ktorba_errors_kErrorNumSamplesInWaveformMustBeGreaterThanZero, -1074101624, \
    "A waveform was allocated or written with zero samples.", \
    "Give at least the generator's minimum number of samples to an allocation, and at least one to a write.") \
  X(ktorba_errors_kErrorInvalidWaveformLengthToIgnore, -1074101619, \
    "The length of a wait is above 2147483647 samples.", \
    "Split the wait into several shorter ones, or repeat a shorter one.") \
  X(ktorba_errors_kErrorCannotWriteDataOutsideWaveformBoundaries, -1074101617, \
    "A write would run past the end of the waveform.", \
    "Write fewer samples, move the write position back, or allocate a longer waveform.") \
  X(ktorba_errors_kErrorActiveSequenceNotSpecified, -1074101614, \
    "Generation was started with no active script.", \
    "Select a script with ktORBA_SelectActiveScript before starting.") \
  X(ktorba_errors_kErrorDeviceDataUnderflow, -1074101613, \
    "The generator ran out of data while it was playing.", \
    "When streaming, write faster or into a longer waveform; else raise the memory read grant time or the priming depth.") \
  X(ktorba_errors_kErrorWriteWaveformTimeout, -1074101611, \
    "A download did not complete within its time-out.", \
    "Allow more time; if it happens again, check that the FPGA design is running and drains its download FIFO.") \
  X(ktorba_errors_kErrorSequenceSizeTooLarge, -1074101610, \
    "A compiled script has more instructions than the generator's sequence memory holds.", \
    "Shorten the script: use loops instead of repeated lines, and fewer markers, since each may split a fetch.") \
  X(ktorba_errors_kErrorRequestedWaveformLengthExceedsAllocatedLength, -1074101608, \
    "A subset in a script is longer than its waveform.", \
    "Shorten the subset or allocate a longer waveform before writing the script.") \
  X(ktorba_errors_kErrorRequestedWaveformLengthIsTooSmall, -1074101607, \
    "A waveform or a subset is shorter than the generator's minimum.", \
    "Use at least the number of samples given in the elaboration.") \
  X(ktorba_errors_kErrorInvalidStartPositionAndWaveformLengthCombination, -1074101606, \
    "A subset in a script starts inside its waveform but runs past its end.", \
    "Make the start offset plus the length no more than the waveform's length.") \
  X(ktorba_errors_kErrorStartPositionExceedsWaveformLength, -1074101605, \
    "A subset in a script starts beyond the end of its waveform.", \
    "Make the start offset smaller than the waveform's length.") \
  X(ktorba_errors_kErrorMarkerPositionExceedsLastElementInWaveform, -1074101604, \
    "A marker in a script lies at or beyond the end of the samples that it marks.", \
    "Place the marker at a position from 0 to the length less one.") \
  X(ktorba_errors_kErrorSpecifiedWaveformNotFound, -1074101603, \
    "A named waveform does not exist, or no streaming waveform is configured.", \
    "Check the name's spelling, and allocate or write the waveform before it is used.") \
  X(ktorba_errors_kErrorWaveformNameIsEmpty, -1074101598, \
    "A waveform was allocated with an empty name.", \
    "Give the waveform a name.") \
  X(ktorba_errors_kErrorWaveformNameAlreadyExists, -1074101597, \
    "A waveform of that name exists already; letter case does not count.", \
    "Choose another name, or clear the existing waveform first.") \
  X(ktorba_errors_kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA, -1074101596, \
    "The waveform is larger than the largest free block of sample memory.", \
    "Clear waveforms that are no longer needed, or shorten this one; the elaboration gives the largest free block in bytes.") \
  X(ktorba_errors_kErrorPrimingDepthTooLarge, -1074101595, \
    "The priming depth is above the generator's limit.", \
    "Use at most the number of samples given in the elaboration.") \
  X(ktorba_errors_kErrorInternalSWError, -1074101592, \
    "The request does not fit the generator: sample type, a trait, or a value that its instruction has no room for.", \
    "Read the elaboration's message: use the write function of the generator's sample width, or bring the value named there below its limit.") \
  X(ktorba_errors_kErrorInvalidDistanceBetweenTwoMarkerPositions, -1074101589, \
    "Two markers of one instruction stand closer than the generator allows.", \
    "Keep the distance given in the elaboration between the positions, or make them equal.") \
  X(ktorba_errors_kErrorInvalidNumberOfMarkersOnAWaveform, -1074101588, \
    "An instruction has more marker positions than its length allows.", \
    "Use at most the number of positions given in the elaboration.") \
  X(ktorba_errors_kErrorGenerationUnconfigured, -1074101586, \
    "The operation needs a configured generator.", \
    "Select a script or change a setting first: after a reset that configures the generator again.") \
  X(ktorba_errors_kErrorInitiateNotCalled, -1074101585, \
    "The operation needs generation to have been prepared or started.", \
    "Call ktORBA_StartGeneration first.") \
  X(ktwfmscriptcompiler_errors_kErrorKeywordExpectedInScript, -1074101568, \
    "A keyword, a parenthesis, a comma or a trigger name is missing in the script, or the script is empty.", \
    "Put one of the possible keywords named in the elaboration at that line and position.") \
  X(ktwfmscriptcompiler_errors_kErrorScriptHasInvalidIdentifier, -1074101567, \
    "A name in the script is missing or begins with a digit.", \
    "Begin names with a letter.") \
  X(ktwfmscriptcompiler_errors_kErrorIntegerExpectedInScript, -1074101566, \
    "A number in the script is missing or above 2147483647.", \
    "Write a decimal integer from 0 to 2147483647 there.") \
  X(ktwfmscriptcompiler_errors_kErrorInvalidSubsetLengthInScript, -1074101564, \
    "A subset in the script has a length of 0.", \
    "Give the subset a length of at least the generator's minimum.") \
  X(ktwfmscriptcompiler_errors_kErrorInvalidLoopIterationsInScript, -1074101563, \
    "A repeat in the script has a count of 0.", \
    "Repeat at least once, or remove the loop.") \
  X(ktwfmscriptcompiler_errors_kErrorScriptHasInvalidCharacter, -1074101561, \
    "A word of the script holds a character that scripts do not use.", \
    "Use letters, digits, parentheses, commas, blanks and // comments only; names take any non-ASCII letter too.") \
  X(ktwfmscriptcompiler_errors_kErrorRepeatLoopNestingTooDeepInScript, -1074101560, \
    "A repeat stands inside a repeat.", \
    "Nest loops one level deep; only a repeat forever that is a script's whole body may hold further loops.") \
  X(ktwfmscriptcompiler_errors_kErrorMarkerPositionOutsideSubsetInScript, -1074101559, \
    "A marker lies at or beyond the end of its subset or wait.", \
    "Place the marker at a position from 0 to the length less one.") \
  X(ktwfmscriptcompiler_errors_kErrorLoopOrProcedureWithNoSamplesGenerated, -1074101557, \
    "A script or a loop body generates no samples.", \
    "Add a generate or a counted wait to it.") \
  X(ktwfmscriptcompiler_errors_kErrorClearIsLastInstructionOfLoopInScript, -1074101555, \
    "A loop body ends with a clear, which would act on no instruction.", \
    "Move the clear to the start of the loop body or in front of another instruction.") \
  X(ktwfmscriptcompiler_errors_kErrorMarkerNotSupportedInWait, -1074101554, \
    "A wait until a trigger carries markers.", \
    "Put the markers on the instruction before or after the wait.") \
  X(ktwfmscriptcompiler_errors_kErrorMarkerPositionNotMultipleOfQuantum, -1074101553, \
    "A marker position is not a multiple of the alignment quantum.", \
    "Move the marker to a multiple of the quantum given in the elaboration.") \
  X(ktwfmscriptcompiler_errors_kErrorSubsetLengthNotMultipleOfQuantum, -1074101552, \
    "A subset length is not a multiple of the alignment quantum.", \
    "Change the length to a multiple of the quantum given in the elaboration.") \
  X(ktwfmscriptcompiler_errors_kErrorStartOffsetNotMultipleOfQuantum, -1074101551, \
    "A subset start is not a multiple of the alignment quantum.", \
    "Change the start to a multiple of the quantum given in the elaboration.") \
  X(ktwfmscriptcompiler_errors_kErrorNumSamplesToWaitNotMultipleOfQuantum, -1074101550, \
    "A wait length is not a multiple of the alignment quantum.", \
    "Change the length to a multiple of the quantum given in the elaboration.") \
  X(ktwfmscriptcompiler_errors_kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript, -1074101549, \
    "A wait is shorter than the generator's minimum.", \
    "Wait at least the number of samples given in the elaboration.") \
  X(ktmxl_kErrorNULLPtr, -1074098093, \
    "A name is a null pointer.", \
    "Pass a NUL-terminated text.") \
  X(ktmxl_kErrorLeadingUnderscoreInString, -1074098082, \
    "A name begins with an underscore.", \
    "Begin the name with a letter, a digit or a minus.") \
  X(ktmxl_kErrorInvalidCharInString, -1074098079, \
    "A name holds a blank, a control character or punctuation other than - and _.", \
    "Remove the character at the position given in the elaboration.") \
  X(ktmxl_kErrorEmptyString, -1074098043, \
    "A name is empty.", \
    "Pass a name of 1 to 511 bytes.") \
  X(ktmxl_kErrorScriptNotInMem, -1074097987, \
    "A named script has not been written to this session.", \
    "Check the name's spelling, and write the script before it is selected or deleted.") \
  X(ktmxl_kErrorWaveformPreviouslyAllocated, -1074097977, \
    "A waveform was added under a name that the waveform table holds already.", \
    "Choose another name, or clear the existing waveform first.") \
  X(ktmxl_kErrorNameTooLong, -1074097806, \
    "A name is longer than 511 bytes.", \
    "Shorten the name; characters outside ASCII take two to four bytes each.") \
  X(ktmxl_kErrorSoftwareFault, -1074097800, \
    "The compiler met an instruction or a loop of unknown kind.", \
    "Please report this together with the script: no script text should lead here.") \
  X(ktorba_nKTAPALS100_tStatus_kInvalidParameter, -52005, \
    "An argument is invalid: a null pointer, an unknown session handle, a second session on one generator, or a bad mode.", \
    "Read the message in the elaboration: it names the function and the argument.") \
  X(ktorba_nKTAPALS100_tStatus_kSoftwareFault, -52003, \
    "An internal check failed, memory ran out, a platform library is missing, or clean-up could not be registered.", \
    "Read the message in the elaboration; check that both platform libraries are installed and that memory is left.") \
  X(ktorba_codes_kFlaggedFpgaSession, -1, \
    "The FPGA session handle given to a session open carries flag bit 0x2000.", \
    "Open the session with a plain FPGA session handle.") \
  X(ktorba_codes_kInvalidLumHandle, -52, \
    "The FPGA session handle is invalid.", \
    "Open the session with a plain FPGA session handle.") \
  X(ktorba_codes_kTextNotConvertible, -52027, \
    "A name or a script text is not valid in the text encoding that the library expects.", \
    "Pass valid UTF-8 (on Windows: text in the active code page).") \
  X(ktorba_codes_kNoMemoryForConversion, -52000, \
    "There was no memory to convert a name or a script text.", \
    "Free memory and try again.") \
  X(ktorba_codes_kNoMemory, -52000, \
    "There was no memory for a register transfer or a result array.", \
    "Free memory and try again.") \
  X(ktorba_codes_kUnsupportedLookup, -52002, \
    "A form of context lookup was asked for that this library does not support.", \
    "Please report this: no call of the public interface should lead here.") \
  X(ktorba_codes_kNotAGenerator, -1074101587, \
    "The register block found is not that of a waveform generator.", \
    "Check the parent context and the instance number against the FPGA design.") \
  X(ktorba_codes_kGeneratorTooOld, -1074101621, \
    "The generator's version is refused by the first result of the version check.", \
    "Use an FPGA design whose generator is compatible with version 4.2.") \
  X(ktorba_codes_kGeneratorTooNew, -1074101622, \
    "The generator's version is refused by the second result of the version check.", \
    "Use an FPGA design whose generator is compatible with version 4.2.") \
  X(ktorba_codes_kSampleWidthIsZero, -1074097783, \
    "The generator reports a sample width of 0 bits.", \
    "Check that the FPGA design is loaded and running.")
/* clang-format on */

#endif
