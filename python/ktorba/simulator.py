"""A simulated generator: sessions without hardware.

Using it holds for the whole process: the library then finds the simulator in place of the hardware's libraries, and
`ktorba.Session.open` refuses. Its time stands still but for what each look at it lets pass, so that the same calls give
the same samples.
"""

from __future__ import annotations

import dataclasses
import os
import weakref
from ctypes import byref, c_bool, c_uint8, c_uint32, c_uint64
from types import TracebackType
from typing import TYPE_CHECKING, Any, NamedTuple, Optional, Type

from . import _loader, _names
from ._declarations import SIMULATOR, Fpga, SimulatedState, SimulatedTraits, at_address
from ._errors import SessionClosed
from ._session import Session, _integer
from ._traits import Traits

if TYPE_CHECKING:
    import numpy.typing as npt

    Array = npt.NDArray[Any]

_PLATFORM = ("KtFpga", "ktifwu")
_SIMULATED_FIELDS = {
    "sample_width": "sampleWidthBits",
    "memory_size_bytes": "memorySizeBytes",
    "memory_word_bytes": "memoryWordBytes",
    "min_fetch_samples": "minFetchSamples",
    "sequence_words": "sequenceWords",
    "max_priming_words": "maxPrimingWords",
}


class Output(NamedTuple):
    """What was played.

    Attributes
    ----------
    samples : numpy.ndarray
        Shape (n,), int16 or int32 as the generator's width is.
    markers : numpy.ndarray
        Shape (n,), uint8; bit n is marker n.
    """

    samples: Array
    markers: Array


def _load() -> None:
    """Load the simulator in front of the library's first look for the hardware's libraries: that takes what is there."""
    SIMULATOR.ktSim_DescribeCode(0)
    for stem in _PLATFORM:
        _loader.load(stem, beside=SIMULATOR.path())


def _destroy(fpga_session: int, process: int) -> None:
    if os.getpid() == process:
        SIMULATOR.ktSim_DestroyFpga(fpga_session)


class Generator:
    """A simulated FPGA with one generator; a context manager.

    Parameters
    ----------
    sample_width : int
        Bits of a sample, 16 or 32.
    auto_advance : int
        Samples that pass with every look of the library at the generator, so that waiting ends; 0: none, and only
        `advance` plays.
    **traits
        Other fields of `ktorba.Traits`.

    Raises
    ------
    SimulatorError
        No simulated generator can be so.
    LibraryNotFound
        The simulator's libraries are missing.
    """

    def __init__(self, sample_width: int = 16, *, auto_advance: int = 65536, **traits: Any) -> None:
        self.traits = Traits(sample_width=sample_width, **traits)
        _load()
        fpga, number = Fpga(), c_uint32()
        SIMULATOR.ktSim_CreateFpga(fpga)
        self._fpga = fpga
        self._finalizer = weakref.finalize(self, _destroy, fpga.fpgaSession, os.getpid())
        self._finalizer.atexit = False
        SIMULATOR.ktSim_AddGenerator(fpga.fpgaSession, self._simulated_traits(), byref(number))
        self._number = number.value
        SIMULATOR.ktSim_SetAutoAdvance(self._number, _integer(auto_advance, "auto_advance", 0, 2**64 - 1))

    def _simulated_traits(self) -> SimulatedTraits:
        simulated = SimulatedTraits()
        SIMULATOR.ktSim_DefaultTraits(simulated)
        for name, value in dataclasses.asdict(self.traits).items():
            if name in _SIMULATED_FIELDS:
                setattr(simulated, _SIMULATED_FIELDS[name], _integer(value, name, 0, 2**32 - 1))
        return simulated

    def __enter__(self) -> Generator:
        return self

    def __exit__(
        self, kind: Optional[Type[BaseException]], error: Optional[BaseException], trace: Optional[TracebackType]
    ) -> None:
        self.close()

    def close(self) -> None:
        """Forget the generator with its memories; closing twice is fine. Close its session first."""
        self._finalizer()

    def __reduce__(self) -> Any:
        raise TypeError("a simulated generator cannot be pickled: it lives in this process")

    def _id(self) -> int:
        if not self._finalizer.alive:
            raise SessionClosed("the simulated generator is closed")
        return self._number

    def open_session(self) -> Session:
        """Open the session that drives it; there is one at a time."""
        self._id()
        fpga = self._fpga
        numbers = (fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, fpga.parentContext, 0)
        return Session._open(numbers, self.traits.sample_width, self.traits, self)

    # ---- Time and triggers ----

    def advance(self, samples: int) -> int:
        """Play up to so many samples and tell how many it were: fewer when generation ends, or does not run."""
        played = c_uint64()
        SIMULATOR.ktSim_Advance(self._id(), _integer(samples, "samples", 0, 2**64 - 1), byref(played))
        return played.value

    def raise_trigger(self, trigger: int, at: Optional[int] = None) -> None:
        """Raise trigger 1 to 7 of the scripts: now, or once `at` samples have been played since the start."""
        hardware = _integer(trigger, "a trigger", 1, 7) + 1  # hardware trigger 1 is the start
        if at is None:
            SIMULATOR.ktSim_RaiseTrigger(self._id(), hardware)
        else:
            SIMULATOR.ktSim_RaiseTriggerAt(self._id(), hardware, _integer(at, "at", 0, 2**64 - 1))

    # ---- What was played ----

    def record(self, capacity: int) -> None:
        """Keep what is played from now on, up to so many samples that were not read; 0 ends it."""
        SIMULATOR.ktSim_RecordOutput(self._id(), _integer(capacity, "capacity", 0, 2**64 - 1))

    def read(self) -> Output:
        """Take what was recorded."""
        import numpy as np

        count = c_uint64()
        SIMULATOR.ktSim_ReadOutput(self._id(), 0, None, None, byref(count))
        samples = np.empty(count.value, f"i{self.traits.sample_width // 8}")
        markers = np.empty(count.value, np.uint8)
        if count.value:
            mask = at_address(c_uint8, markers.ctypes.data)
            SIMULATOR.ktSim_ReadOutput(self._id(), count.value, samples.ctypes.data, mask, byref(count))
        return Output(samples, markers)

    @property
    def samples_played(self) -> int:
        """How many samples were played since the latest start."""
        state = SimulatedState()
        SIMULATOR.ktSim_GetState(self._id(), state)
        return int(state.samplesPlayed)

    # ---- Faults on demand ----

    def fail_call(self, nth: int = 1, code: int = 0, function: Optional[str] = None) -> None:
        """Let the `nth` call from now of a platform function, or of any, fail once with `code`; 0: with the usual."""
        name = None if function is None else _names.encode(function)
        numbers = (_integer(nth, "nth", 1, 2**64 - 1), _integer(code, "code", -(2**31), 2**31 - 1))
        self._id()
        SIMULATOR.ktSim_FailCall(self._fpga.fpgaSession, name, *numbers, None)

    def hold_memory_writes(self, hold: bool) -> None:
        """Let memory writes never report that they are complete, while held."""
        SIMULATOR.ktSim_HoldMemoryWrites(self._id(), c_bool(hold))
