"""Exceptions for the codes of the libraries, and the checks that raise them.

Which class a constant has is said once, in a table; a test finds every constant of the library there.
"""

from __future__ import annotations

import json
import logging
import re
from typing import Any, Dict, NamedTuple, Optional, Tuple, Type

from ._diagnostics import Diagnostic, Fix, Place, format_diagnostic

_log = logging.getLogger("ktorba")

# Members of an elaboration that are no message.
_FIXED_MEMBERS = ("error_constant", "file", "line", "component", "translator", "translator_info")


class Error(Exception):
    """A call of the libraries that failed.

    Attributes
    ----------
    code : int
        The library's code; negative.
    constant : str
        Its name, such as ``ktorba_errors::kErrorActiveSequenceNotSpecified``; empty for codes of the hardware.
    elaboration : dict
        What the library said of this failure, as it came; empty where it said nothing.
    """

    def __init__(
        self, message: str, code: int = 0, constant: str = "", elaboration: Optional[Dict[str, Any]] = None
    ) -> None:
        super().__init__(message, code, constant, elaboration or {})
        self.message = message
        self.code = code
        self.constant = constant
        self.elaboration: Dict[str, Any] = elaboration or {}

    def __str__(self) -> str:
        return self.message

    @property
    def values(self) -> Dict[str, Any]:
        """The values of the failing request, by what they are."""
        info = self.elaboration.get("translator_info", {})
        return {entry["usage"]: entry["value"] for entry in info.get("ordered_data", []) if "value" in entry}


class ScriptError(Error):
    """A script that is wrong, or does not fit its waveforms. `str()` shows it as the command-line tool does.

    Attributes
    ----------
    line, column : int
        Where, from 1, the column in bytes of UTF-8; 0 for a text as a whole.
    end : Place or None
        The place behind the last byte that is wrong.
    hint : str
        What to do; may be empty.
    fixes : tuple of Fix
        Changes that mend the text, or may.
    diagnostics : tuple of Diagnostic
        All errors and warnings of the text, in its order; the first error is this one.
    """

    line: int = 0
    column: int = 0
    end: Optional[Place] = None
    hint: str = ""
    fixes: Tuple[Fix, ...] = ()
    diagnostics: Tuple[Diagnostic, ...] = ()

    @classmethod
    def of(cls, diagnostics: Tuple[Diagnostic, ...], text: str, name: str, cause: Optional[Error] = None) -> ScriptError:
        """Make the error of a text from what was found in it, and from the library's own, if there is one."""
        first = next(found for found in diagnostics if found.severity == "error")
        code, constant = (cause.code, cause.constant) if cause else (first.code, first.constant)
        error = cls(format_diagnostic(first, text, name), code, constant, cause.elaboration if cause else None)
        error.diagnostics = diagnostics
        error.hint, error.fixes = first.hint, first.fixes
        if first.range is not None:
            error.line, error.column, error.end = first.range.start.line, first.range.start.column, first.range.end
        return error


class InvalidName(Error, ValueError):
    """A name that no waveform may have."""


class WaveformError(Error, ValueError):
    """A length or a position that does not suit the waveform or the generator."""


class WaveformExists(WaveformError):
    """There is a waveform of that name; letter case does not count."""


class UnknownWaveform(Error, KeyError):
    """There is no waveform of that name. The message names near misses."""


class UnknownScript(Error, KeyError):
    """There is no script of that name. The message names near misses."""


class MemoryFull(Error):
    """Sample memory has no free block that is large enough."""

    @property
    def free(self) -> Optional[int]:
        """Bytes of the largest free block, None where the library did not say."""
        size = self.values.get("kUsageTypeLargestAvailMemoryBlock")
        return None if size is None else int(size)


class SettingError(Error, ValueError):
    """A setting beyond what the generator takes."""


class StateError(Error):
    """A call that came too early, such as a start without an active script."""


class DeviceError(Error):
    """The hardware, or a platform library, failed."""


class Underflow(DeviceError):
    """The generator ran out of data while it played."""


class WriteTimeout(Error, TimeoutError):
    """A download did not complete within its time-out."""


class InternalError(Error):
    """An internal check of the library failed, or memory ran out."""


class SessionClosed(Error, ValueError):
    """A session or generator was used after it was closed, or by a process that has no right to it."""


class SimulatorError(Error):
    """A call of the simulated generator's controls failed."""


class ToolsError(Error, ValueError):
    """A request that the script tools refuse; `elaboration` is their document."""


# By the constant's name in <ktorba/error_codes.h>, without what is before its k. What the hardware, a platform library
# or the simulator returns has no constant: that is a DeviceError.
_CLASSES: Dict[Type[Error], Tuple[str, ...]] = {
    ScriptError: (
        "kErrorKeywordExpectedInScript",
        "kErrorScriptHasInvalidIdentifier",
        "kErrorIntegerExpectedInScript",
        "kErrorInvalidSubsetLengthInScript",
        "kErrorInvalidLoopIterationsInScript",
        "kErrorScriptHasInvalidCharacter",
        "kErrorRepeatLoopNestingTooDeepInScript",
        "kErrorMarkerPositionOutsideSubsetInScript",
        "kErrorLoopOrProcedureWithNoSamplesGenerated",
        "kErrorClearIsLastInstructionOfLoopInScript",
        "kErrorMarkerNotSupportedInWait",
        "kErrorMarkerPositionNotMultipleOfQuantum",
        "kErrorSubsetLengthNotMultipleOfQuantum",
        "kErrorStartOffsetNotMultipleOfQuantum",
        "kErrorNumSamplesToWaitNotMultipleOfQuantum",
        "kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript",
        "kErrorInvalidWaveformLengthToIgnore",
        "kErrorSequenceSizeTooLarge",
        "kErrorRequestedWaveformLengthExceedsAllocatedLength",
        "kErrorInvalidStartPositionAndWaveformLengthCombination",
        "kErrorStartPositionExceedsWaveformLength",
        "kErrorMarkerPositionExceedsLastElementInWaveform",
        "kErrorInvalidDistanceBetweenTwoMarkerPositions",
        "kErrorInvalidNumberOfMarkersOnAWaveform",
    ),
    WaveformError: (
        "kErrorWritePositionIsNotMultipleOfAlignmentQuantum",
        "kErrorWritePositionIsOutsideWaveformBoundary",
        "kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum",
        "kErrorNumSamplesInWaveformMustBeGreaterThanZero",
        "kErrorCannotWriteDataOutsideWaveformBoundaries",
        "kErrorRequestedWaveformLengthIsTooSmall",
    ),
    InvalidName: (
        "kErrorWaveformNameIsEmpty",
        "kErrorInvalidCharInString",
        "kErrorLeadingUnderscoreInString",
        "kErrorEmptyString",
        "kErrorNULLPtr",
        "kErrorNameTooLong",
        "kTextNotConvertible",
    ),
    WaveformExists: ("kErrorWaveformNameAlreadyExists", "kErrorWaveformPreviouslyAllocated"),
    UnknownWaveform: ("kErrorSpecifiedWaveformNotFound",),
    UnknownScript: ("kErrorScriptNotInMem",),
    MemoryFull: ("kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA",),
    SettingError: ("kErrorPrimingDepthTooLarge",),
    StateError: ("kErrorActiveSequenceNotSpecified", "kErrorGenerationUnconfigured", "kErrorInitiateNotCalled"),
    Underflow: ("kErrorDeviceDataUnderflow",),
    WriteTimeout: ("kErrorWriteWaveformTimeout",),
    InternalError: (
        "kErrorInternalSWError",
        "kErrorSoftwareFault",
        "kInvalidParameter",
        "kSoftwareFault",
        "kNoMemory",
        "kNoMemoryForConversion",
        "kUnsupportedLookup",
    ),
    DeviceError: (
        "kFlaggedFpgaSession",
        "kInvalidLumHandle",
        "kNotAGenerator",
        "kGeneratorTooOld",
        "kGeneratorTooNew",
        "kSampleWidthIsZero",
    ),
}
CLASS_BY_NAME: Dict[str, Type[Error]] = {name: kind for kind, names in _CLASSES.items() for name in names}


class _Row(NamedTuple):
    constant: str
    name: str
    meaning: str
    help: str


_table: Dict[int, _Row] = {}


def error_table() -> Dict[int, _Row]:
    """Give the library's errors by code, read once; of two that share a code the first."""
    from ._declarations import TOOLS, Document, read_document

    if not _table:
        document = Document()
        TOOLS.ktTools_ErrorTable(document)
        for row in json.loads(read_document(document))["errors"]:
            _table.setdefault(row["code"], _Row(row["constant"], row["name"], row["meaning"], row["help"]))
    return _table


def short_name(name: str) -> str:
    """Give ``kErrorX`` of ``ktorba_errors_kErrorX``."""
    return name[name.rindex("_k") + 1 :]


def _parse(text: bytes) -> Dict[str, Any]:
    try:
        parsed = json.loads(text.decode("utf-8", "replace"))
    except ValueError:
        return {}
    return parsed if isinstance(parsed, dict) else {}


def _messages(elaboration: Dict[str, Any]) -> str:
    return "; ".join(
        value if key in ("message", "description") else f"{key}: {value}"
        for key, value in elaboration.items()
        if key not in _FIXED_MEMBERS and isinstance(value, str)
    )


def _words(usage: str) -> str:
    """Give ``waveform name`` of ``kUsageTypeWaveformName``."""
    return re.sub(r"(?<!^)([A-Z])", r" \1", usage.replace("kUsageType", "")).lower()


def make_error(code: int, text: bytes) -> Error:
    """Make the exception of a code and its elaboration, a JSON text or nothing."""
    elaboration = _parse(text)
    row = error_table().get(code, _Row("", "", "The hardware, or a platform library, failed.", ""))
    constant = elaboration.get("error_constant") or row.constant
    kind: Type[Error] = CLASS_BY_NAME[short_name(row.name)] if row.name else DeviceError
    values = ", ".join(f"{_words(usage)} {value}" for usage, value in Error("", 0, "", elaboration).values.items())
    parts = [row.meaning, _messages(elaboration), values and f"({values})", row.help]
    return kind(" ".join(part for part in [*parts, f"[{constant or 'code'} {code}]"] if part), code, constant, elaboration)


# ---- Checks: called by ctypes with what a function gave and was given ----


def raise_status(result: int, function: Any, arguments: Tuple[Any, ...]) -> int:
    """Raise what a function of the session interface reports; its record, the last argument, is ready for the next."""
    if result == 0:
        return 0
    status = arguments[-1]
    text = status.json or b""
    status.code = 0
    if result > 0:
        _log.warning("%s: warning %d: %s", function.__name__, result, text.decode("utf-8", "replace"))
        return result
    raise make_error(result, text)


def raise_simulator_error(result: int, function: Any, arguments: Tuple[Any, ...]) -> int:
    """Raise what a control of the simulated generator reports."""
    from ._declarations import SIMULATOR

    if result == 0:
        return 0
    words = SIMULATOR.ktSim_DescribeCode(result).decode()
    raise SimulatorError(f"{function.__name__}: {words} [{result}]", result)


def raise_tools_error(result: int, function: Any, arguments: Tuple[Any, ...]) -> int:
    """Raise what a function of the script tools reports, with what its document says."""
    from ._declarations import TOOLS, Document, read_document

    if result == 0:
        return 0
    found = {}
    for argument in arguments:
        if isinstance(argument, Document):
            found = _parse(read_document(argument))
    words = TOOLS.ktTools_DescribeCode(result).decode()
    reason = found.get("error", "")
    raise ToolsError(f"{function.__name__}: {words}" + (f": {reason}" if reason else ""), result, "", found)
