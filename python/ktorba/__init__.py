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

__all__ = [name for name in dir() if not name.startswith("_")] + ["__version__"]
