"""Waveforms, scripts and generation for arbitrary-waveform generators inside an FPGA.

Offline, `check` and `compile` tell of a script what is wrong, what it becomes and what it plays. `Session` drives a
generator; `ktorba.simulator` has one for machines without. Lengths and positions are in samples, time-outs in seconds.
"""

from ._diagnostics import Diagnostic, Fix, Place, Range, Related
from ._errors import (
    DeviceError,
    Error,
    InternalError,
    InvalidName,
    MemoryFull,
    ScriptError,
    SessionClosed,
    SettingError,
    SimulatorError,
    StateError,
    ToolsError,
    Underflow,
    UnknownScript,
    UnknownWaveform,
    WaveformError,
    WaveformExists,
    WriteTimeout,
)
from ._loader import LibraryNotFound
from ._offline import CompiledScript, Difference, Instruction, Program, ScriptDifference, check, compile, diff, fit
from ._samples import WriteReport
from ._session import Scripts, Session, Waveform, Waveforms
from ._timeline import Envelope, Length, Timeline
from ._traits import Traits
from ._version import VERSION as __version__
from ._versions import show_versions, versions

__all__ = [
    "CompiledScript",
    "DeviceError",
    "Diagnostic",
    "Difference",
    "Envelope",
    "Error",
    "Fix",
    "Instruction",
    "InternalError",
    "InvalidName",
    "Length",
    "LibraryNotFound",
    "MemoryFull",
    "Place",
    "Program",
    "Range",
    "Related",
    "ScriptDifference",
    "ScriptError",
    "Scripts",
    "Session",
    "SessionClosed",
    "SettingError",
    "SimulatorError",
    "StateError",
    "Timeline",
    "ToolsError",
    "Traits",
    "Underflow",
    "UnknownScript",
    "UnknownWaveform",
    "Waveform",
    "WaveformError",
    "WaveformExists",
    "Waveforms",
    "WriteReport",
    "WriteTimeout",
    "__version__",
    "check",
    "compile",
    "diff",
    "fit",
    "show_versions",
    "versions",
]
