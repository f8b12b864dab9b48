"""The functions of the C libraries: result, arguments and error check of each stand beside its name, once.

`GENERATION` is <ktorba/ktorba.h>, `SIMULATOR` <ktorba/simulator.h>, `TOOLS` <ktorba/script_tools.h>. A test reads the
headers and fails where a declaration differs. An interface binds a function when it is first asked for, so importing
this module loads nothing.
"""

from __future__ import annotations

import ctypes
from ctypes import POINTER, Structure, c_bool, c_char, c_char_p, c_double, c_int16, c_int32, c_uint8
from ctypes import c_uint16, c_uint32, c_uint64, c_void_p
from typing import Any, Callable, Dict, List, Optional, Tuple

from . import _loader
from ._errors import raise_simulator_error, raise_status, raise_tools_error

Check = Callable[[Any, Any, Tuple[Any, ...]], Any]

# ---- Records ----


class Status(Structure):
    """tStatus. The function pointer stays null: C never calls back into Python."""

    _fields_ = [("code", c_int32), ("capacity", c_uint32), ("reallocJson", c_void_p), ("json", c_char_p)]


class Fpga(Structure):
    """ktSim_Fpga."""

    _fields_ = [
        ("fpgaSession", c_uint32),
        ("ifwSession", c_uint32),
        ("ifwTarget", c_uint32),
        ("parentContext", c_uint32),
    ]


class SimulatedTraits(Structure):
    """ktSim_Traits."""

    _fields_ = [
        ("sampleWidthBits", c_uint32),
        ("memoryWordBytes", c_uint32),
        ("memorySizeBytes", c_uint32),
        ("minFetchSamples", c_uint32),
        ("sequenceWords", c_uint32),
        ("maxPrimingWords", c_uint32),
        ("downloadElementBits", c_uint32),
        ("hasStreamingRegisters", c_bool),
        ("versionMajor", c_uint16),
        ("versionMinor", c_uint16),
        ("contextType", c_uint16),
        ("reportedType", c_uint16),
        ("instance", c_int32),
        ("downloadFifoNumber", c_int32),
    ]


class TraceEntry(Structure):
    """ktSim_TraceEntry."""

    _fields_ = [("firstSample", c_uint64), ("address", c_uint32), ("words", c_uint32 * 4), ("loopPass", c_uint32)]


class SimulatedState(Structure):
    """ktSim_State."""

    _fields_ = [
        ("running", c_bool),
        ("done", c_bool),
        ("underflow", c_bool),
        ("writeReady", c_bool),
        ("streaming", c_bool),
        ("triggerLatches", c_uint8),
        ("waitingForTrigger", c_uint8),
        ("address", c_uint32),
        ("loopDepth", c_uint32),
        ("lastSample", c_uint32),
        ("samplesPlayed", c_uint64),
        ("writeBytesMissing", c_uint64),
        ("fifoDepth", c_uint64),
        ("fifoLevel", c_uint64),
        ("streamingFreeWords", c_uint64),
    ]


class SimulatedCounters(Structure):
    """ktSim_Counters."""

    _fields_ = [
        ("samplesPlayed", c_uint64),
        ("instructionsExecuted", c_uint64),
        ("markersFired", c_uint64),
        ("initiates", c_uint64),
        ("memoryWrites", c_uint64),
        ("bytesReceived", c_uint64),
        ("registerReads", c_uint64),
        ("registerWrites", c_uint64),
        ("samplesLost", c_uint64),
        ("traceEntriesLost", c_uint64),
        ("deviceFaults", c_uint64),
    ]


class DeviceFault(Structure):
    """ktSim_DeviceFault."""

    _fields_ = [("code", c_int32), ("address", c_uint32), ("sample", c_uint64), ("text", c_char * 160)]


class Document(Structure):
    """ktTools_Document. `text` is an address, so that the library gets back what it gave."""

    _fields_ = [("text", c_void_p), ("length", c_uint64)]


class Token(Structure):
    """ktTools_Token."""

    _fields_ = [("offset", c_uint64), ("length", c_uint64), ("kind", c_int32)]


class Trigger(Structure):
    """ktTools_Trigger."""

    _fields_ = [("sample", c_uint64), ("trigger", c_int32)]


class Length(Structure):
    """ktTools_Length."""

    _fields_ = [
        ("kind", c_int32),
        ("trigger", c_int32),
        ("samples", c_uint64),
        ("waitingSince", c_uint64),
        ("address", c_uint32),
        ("line", c_uint32),
        ("column", c_uint32),
    ]


class Run(Structure):
    """ktTools_Run."""

    _fields_ = [
        ("firstSample", c_uint64),
        ("sampleCount", c_uint64),
        ("firstInWaveform", c_uint64),
        ("pass", c_uint64),
        ("round", c_uint64),
        ("kind", c_int32),
        ("trigger", c_int32),
        ("waveform", c_uint32),
        ("address", c_uint32),
        ("line", c_uint32),
        ("column", c_uint32),
        ("markers", c_uint32),
        ("markerOffset", c_uint32),
    ]


class ProgramObject(Structure):
    """ktTools_Program, of which only pointers are seen."""


class TimelineObject(Structure):
    """ktTools_Timeline, of which only pointers are seen."""


# ---- Functions ----


class Function:
    """What one C function gives, takes, and is checked by."""

    __slots__ = ("result", "arguments", "check")

    def __init__(self, result: Any, arguments: List[Any], check: Optional[Check] = None) -> None:
        self.result = result
        self.arguments = arguments
        self.check = check


class Interface:
    """The functions of one library as attributes, loaded and bound at their first use."""

    def __init__(self, stem: str, functions: Dict[str, Function]) -> None:
        self.stem = stem
        self.functions = functions

    def __getattr__(self, name: str) -> Callable[..., Any]:
        if name not in self.functions:
            raise AttributeError(name)
        declared = self.functions[name]
        function: Any = getattr(_loader.load(self.stem), name)
        function.restype = declared.result
        function.argtypes = declared.arguments
        if declared.check is not None:
            function.errcheck = declared.check
        setattr(self, name, function)
        return function  # type: ignore[no-any-return]

    def path(self) -> str:
        """Give the file that the library was loaded from."""
        return _loader.path_of(_loader.load(self.stem), next(iter(self.functions)))


_STATUS = POINTER(Status)
_DOCUMENT = POINTER(Document)
_PROGRAM = POINTER(ProgramObject)
_TIMELINE = POINTER(TimelineObject)
_U8, _U16, _U32, _U64, _I32 = c_uint8, c_uint16, c_uint32, c_uint64, c_int32
_TEXT = [c_char_p, c_uint64]  # a text, and its length in bytes

GENERATION = Interface(
    "ktorba_elaborating",
    {
        "ktORBA_OpenOrbaSession": Function(
            _I32, [_U32, _U32, _U32, POINTER(_U32), _U8, POINTER(_U32), _STATUS], raise_status
        ),
        "ktORBA_CloseOrbaSession": Function(_I32, [_U32, _STATUS], raise_status),
        "ktORBA_GetWaveformMemorySize": Function(_I32, [_U32, POINTER(_U64), _STATUS], raise_status),
        "ktORBA_AllocateWaveform": Function(_I32, [_U32, c_char_p, _U32, _STATUS], raise_status),
        "ktORBA_WriteWaveformU32": Function(
            _I32, [_U32, c_char_p, POINTER(_U32), _U32, _I32, _STATUS], raise_status
        ),
        "ktORBA_WriteWaveformI16": Function(
            _I32, [_U32, c_char_p, POINTER(c_int16), _U32, _I32, _STATUS], raise_status
        ),
        "ktORBA_SetWaveformNextWritePosition": Function(_I32, [_U32, c_char_p, _U32, _U8, _STATUS], raise_status),
        "ktORBA_ClearWaveform": Function(_I32, [_U32, c_char_p, _STATUS], raise_status),
        "ktORBA_ClearAllWaveforms": Function(_I32, [_U32, _STATUS], raise_status),
        "ktORBA_WriteScript": Function(_I32, [_U32, c_char_p, _STATUS], raise_status),
        "ktORBA_SelectActiveScript": Function(_I32, [_U32, c_char_p, _STATUS], raise_status),
        "ktORBA_DeleteScript": Function(_I32, [_U32, c_char_p, _STATUS], raise_status),
        "ktORBA_StartGeneration": Function(_I32, [_U32, _STATUS], raise_status),
        "ktORBA_AbortGeneration": Function(_I32, [_U32, _STATUS], raise_status),
        "ktORBA_CheckGenerationStatus": Function(_I32, [_U32, POINTER(_U8), _STATUS], raise_status),
        "ktORBA_Reset": Function(_I32, [_U32, _STATUS], raise_status),
        "ktORBA_SetDownloadFifoDepth": Function(_I32, [_U32, _U32, _STATUS], raise_status),
        "ktORBA_SetMemoryReadGrantTime": Function(_I32, [_U32, _U16, _STATUS], raise_status),
        "ktORBA_SetMemoryWriteGrantTime": Function(_I32, [_U32, _U16, _STATUS], raise_status),
        "ktORBA_SetPrimingDepth": Function(_I32, [_U32, _U32, _STATUS], raise_status),
        "ktORBA_SetWaveformWriteChunkSize": Function(_I32, [_U32, _U32, _STATUS], raise_status),
        "ktORBA_ConfigureStreamingWaveform": Function(_I32, [_U32, c_char_p, _STATUS], raise_status),
        "ktORBA_CheckStreamingWaveformSpace": Function(_I32, [_U32, POINTER(_U64), _STATUS], raise_status),
        "SetPDRNModule": Function(None, [c_void_p]),
        "SetPDRNTLSIndex": Function(None, [_U32]),
        "SetPDRNModuleHook": Function(None, []),
        "SetPDRNTLSIndexHook": Function(None, []),
    },
)

_simulated = raise_simulator_error

SIMULATOR = Interface(
    "ktorba_simulator",
    {
        "ktSim_DescribeCode": Function(c_char_p, [_I32]),
        "ktSim_CreateFpga": Function(_I32, [POINTER(Fpga)], _simulated),
        "ktSim_DestroyFpga": Function(_I32, [_U32], _simulated),
        "ktSim_DefaultTraits": Function(None, [POINTER(SimulatedTraits)]),
        "ktSim_TraitLimits": Function(None, [POINTER(SimulatedTraits), POINTER(SimulatedTraits)]),
        "ktSim_AddGenerator": Function(_I32, [_U32, POINTER(SimulatedTraits), POINTER(_U32)], _simulated),
        "ktSim_AddContext": Function(_I32, [_U32, _U32, _U16, POINTER(_U32)], _simulated),
        "ktSim_ListContext": Function(_I32, [_U32, _U32, _U32], _simulated),
        "ktSim_ChangeChildrenAfterCount": Function(_I32, [_U32, _U32, _I32], _simulated),
        "ktSim_AddLoopbackFifo": Function(_I32, [_U32, c_char_p, POINTER(_U32)], _simulated),
        "ktSim_AddRegisterName": Function(_I32, [_U32, c_char_p, _U32], _simulated),
        "ktSim_Advance": Function(_I32, [_U32, _U64, POINTER(_U64)], _simulated),
        "ktSim_AdvanceInto": Function(_I32, [_U32, _U64, c_void_p, POINTER(_U8), POINTER(_U64)], _simulated),
        "ktSim_SetAutoAdvance": Function(_I32, [_U32, _U64], _simulated),
        "ktSim_SetWallClock": Function(_I32, [_U32, c_double], _simulated),
        "ktSim_RaiseTrigger": Function(_I32, [_U32, _U32], _simulated),
        "ktSim_RaiseTriggerAt": Function(_I32, [_U32, _U32, _U64], _simulated),
        "ktSim_RecordOutput": Function(_I32, [_U32, _U64], _simulated),
        "ktSim_ReadOutput": Function(_I32, [_U32, _U64, c_void_p, POINTER(_U8), POINTER(_U64)], _simulated),
        "ktSim_SetOutputCallback": Function(_I32, [_U32, c_void_p, c_void_p], _simulated),
        "ktSim_RecordTrace": Function(_I32, [_U32, _U64], _simulated),
        "ktSim_ReadTrace": Function(_I32, [_U32, _U64, POINTER(TraceEntry), POINTER(_U64)], _simulated),
        "ktSim_GetState": Function(_I32, [_U32, POINTER(SimulatedState)], _simulated),
        "ktSim_GetCounters": Function(_I32, [_U32, POINTER(SimulatedCounters)], _simulated),
        "ktSim_GetDeviceFault": Function(_I32, [_U32, _U64, POINTER(DeviceFault)], _simulated),
        "ktSim_ClearDeviceFaults": Function(_I32, [_U32], _simulated),
        "ktSim_ReadSampleMemory": Function(_I32, [_U32, _U64, c_void_p, _U64], _simulated),
        "ktSim_WriteSampleMemory": Function(_I32, [_U32, _U64, c_void_p, _U64], _simulated),
        "ktSim_ReadSequenceMemory": Function(_I32, [_U32, _U64, POINTER(_U32), _U64], _simulated),
        "ktSim_WriteSequenceMemory": Function(_I32, [_U32, _U64, POINTER(_U32), _U64], _simulated),
        "ktSim_PeekRegister": Function(_I32, [_U32, _U32, POINTER(_U64)], _simulated),
        "ktSim_FailCall": Function(_I32, [_U32, c_char_p, _U64, _I32, c_char_p], _simulated),
        "ktSim_ClearFailures": Function(_I32, [_U32], _simulated),
        "ktSim_OverrideRegister": Function(_I32, [_U32, _U32, _U64], _simulated),
        "ktSim_RestoreRegister": Function(_I32, [_U32, _U32], _simulated),
        "ktSim_HoldMemoryWrites": Function(_I32, [_U32, c_bool], _simulated),
        "ktSim_SetDrainRate": Function(_I32, [_U32, _U64], _simulated),
        "ktSim_RecordCalls": Function(_I32, [_U32, _U64], _simulated),
        "ktSim_ReadCalls": Function(_I32, [_U32, c_char_p, _U64, POINTER(_U64)], _simulated),
        "ktSim_GetCallCount": Function(_I32, [_U32, POINTER(_U64)], _simulated),
    },
)

_tools = raise_tools_error

TOOLS = Interface(
    "ktorba_tools",
    {
        "ktTools_Version": Function(c_char_p, []),
        "ktTools_DescribeCode": Function(c_char_p, [_I32]),
        "ktTools_FreeDocument": Function(None, [_DOCUMENT]),
        "ktTools_FreeTokens": Function(None, [POINTER(Token)]),
        "ktTools_FreeProgram": Function(None, [_PROGRAM]),
        "ktTools_Check": Function(_I32, [*_TEXT, *_TEXT, _DOCUMENT], _tools),
        "ktTools_Tokenize": Function(_I32, [*_TEXT, POINTER(POINTER(Token)), POINTER(_U64)], _tools),
        "ktTools_Compile": Function(_I32, [*_TEXT, *_TEXT, *_TEXT, POINTER(_PROGRAM), _DOCUMENT], _tools),
        "ktTools_ScriptCount": Function(_U64, [_PROGRAM]),
        "ktTools_Words": Function(_I32, [_PROGRAM, _U64, POINTER(POINTER(_U32)), POINTER(_U64)], _tools),
        "ktTools_List": Function(_I32, [_PROGRAM, _U64, _DOCUMENT], _tools),
        "ktTools_Fit": Function(_I32, [*_TEXT, *_TEXT, *_TEXT, *_TEXT, _DOCUMENT], _tools),
        "ktTools_FreeTimeline": Function(None, [_TIMELINE]),
        "ktTools_LendSamples": Function(_I32, [_PROGRAM, *_TEXT, c_void_p, _U64], _tools),
        "ktTools_MakeTimeline": Function(_I32, [_PROGRAM, _U64, POINTER(Trigger), _U64, POINTER(_TIMELINE)], _tools),
        "ktTools_PlayLength": Function(_I32, [_TIMELINE, POINTER(Length)], _tools),
        "ktTools_WaveformCount": Function(_U64, [_TIMELINE]),
        "ktTools_WaveformName": Function(_I32, [_TIMELINE, _U64, POINTER(c_char_p), POINTER(_U64)], _tools),
        "ktTools_Runs": Function(_I32, [_TIMELINE, _U64, _U64, POINTER(Run), POINTER(_U64)], _tools),
        "ktTools_MarkerCount": Function(_I32, [_TIMELINE, _U32, _U64, _U64, POINTER(_U64)], _tools),
        "ktTools_MarkerPulse": Function(_I32, [_TIMELINE, _U32, _U64, POINTER(_U64)], _tools),
        "ktTools_Samples": Function(_I32, [_TIMELINE, _U64, _U64, c_void_p, POINTER(_U8), POINTER(_U64)], _tools),
        "ktTools_Envelope": Function(
            _I32, [_TIMELINE, _U64, _U64, _U64, POINTER(_I32), POINTER(_I32), POINTER(_U64)], _tools
        ),
        "ktTools_Compare": Function(_I32, [_PROGRAM, _PROGRAM, *_TEXT, _DOCUMENT], _tools),
        "ktTools_ErrorTable": Function(_I32, [_DOCUMENT], _tools),
    },
)

INTERFACES: Dict[str, Interface] = {
    "ktorba.h": GENERATION,
    "simulator.h": SIMULATOR,
    "script_tools.h": TOOLS,
}


def at_address(kind: Any, address: int) -> Any:
    """Make an object of a ctypes type of what lies there, which ctypes passes for a pointer to it."""
    return kind.from_address(address)


def read_document(document: Document) -> bytes:
    """Take a document over: its text, and the library has its memory back. Empty where there is none."""
    try:
        return ctypes.string_at(document.text, document.length) if document.text else b""
    finally:
        TOOLS.ktTools_FreeDocument(document)
