"""What a script plays, computed: of any length, without a generator and without visiting passes that repeat."""

from __future__ import annotations

import ctypes
import weakref
from ctypes import POINTER, byref, c_uint64
from typing import TYPE_CHECKING, Any, Iterable, Iterator, List, NamedTuple, Optional, Tuple

from . import _declarations
from ._declarations import TOOLS, Run, TimelineObject, Trigger, at_address

if TYPE_CHECKING:
    import numpy as np
    import numpy.typing as npt

    from ._offline import Program

    Array = npt.NDArray[Any]

TriggersLike = Iterable[Tuple[int, int]]

NO_SAMPLE = 2**64 - 1
_RUNS_AT_ONCE = 4096
_MARKERS = 8
_LENGTH_KINDS = {1: "exact", 2: "too long", 3: "endless", 4: "waiting"}

# The fields of `Timeline.runs`, in the order of ktTools_Run.
_RUN_FIELDS = (
    "first_sample",
    "sample_count",
    "first_in_waveform",
    "loop_pass",
    "round",
    "kind",
    "trigger",
    "waveform",
    "address",
    "line",
    "column",
    "markers",
    "marker_offset",
)


class Length(NamedTuple):
    """How long a script plays.

    Attributes
    ----------
    kind : str
        ``"exact"``; ``"too long"``: beyond 2**64 - 2 samples; ``"endless"``; ``"waiting"``: for a trigger that is never
        raised.
    samples : int or None
        How many, where that is exact.
    trigger : int or None
        That it waits for.
    waiting_since : int or None
        The sample from which on only this wait, or this loop, plays.
    line, column : int
        Of it in the text, from 1; 0 where it does not wait.
    """

    kind: str
    samples: Optional[int]
    trigger: Optional[int]
    waiting_since: Optional[int]
    line: int
    column: int


class Envelope(NamedTuple):
    """The least and the greatest level of each column, as arrays of int32."""

    lows: Array
    highs: Array


def _index(value: object, what: str) -> int:
    if isinstance(value, bool) or not hasattr(value, "__index__"):
        raise TypeError(f"{what} is a whole number, not {type(value).__name__}")
    number: int = value.__index__()
    if not 0 <= number < NO_SAMPLE:
        raise ValueError(f"{what} is {number}, and goes from 0 to 2**64 - 2")
    return number


def _take_triggers(triggers: TriggersLike) -> Tuple[Tuple[int, int], ...]:
    taken = tuple((_index(sample, "a trigger's sample"), _index(trigger, "a trigger")) for sample, trigger in triggers)
    for _, trigger in taken:
        if not 1 <= trigger <= 7:
            raise ValueError(f"there is no trigger {trigger}: they are trigger 1 to 7")
    return taken


def _address_of(array: Array) -> int:
    return int(array.ctypes.data)


class Timeline:
    """What a script plays with the triggers that are raised; made by `Program.timeline`.

    Samples are counted from 0, the first one that plays; a script begins with a wait of the generator's shortest fetch.
    One thread uses a timeline at a time. It is a value, and can be pickled.
    """

    def __init__(self, program: Program, script: int, triggers: TriggersLike = ()) -> None:
        self._arguments = (program, script, _take_triggers(triggers))
        raised = [Trigger(sample, trigger) for sample, trigger in self._arguments[2]]
        array = (Trigger * max(1, len(raised)))(*raised)
        self._pointer = POINTER(TimelineObject)()
        TOOLS.ktTools_MakeTimeline(program._handle.pointer, script, array, len(raised), byref(self._pointer))
        # The samples that the program was lent must stay as long as the timeline, which may outlive it.
        weakref.finalize(self, _free, self._pointer, program._handle.arrays).atexit = False

    def __reduce__(self) -> Tuple[Any, ...]:
        return Timeline, self._arguments

    def __repr__(self) -> str:
        length = self.length
        shown = f"{length.samples} samples" if length.samples is not None else length.kind
        return f"<ktorba.Timeline of {self.script}, {shown}>"

    @property
    def script(self) -> str:
        """The name of the script that plays."""
        program, index, _ = self._arguments
        return program.scripts[index]

    @property
    def triggers(self) -> Tuple[Tuple[int, int], ...]:
        """Pairs of sample and trigger, as given."""
        return self._arguments[2]

    @property
    def length(self) -> Length:
        """How long it plays."""
        found = _declarations.Length()
        TOOLS.ktTools_PlayLength(self._pointer, found)
        is_exact, is_waiting = found.kind == 1, found.trigger != 0
        return Length(
            _LENGTH_KINDS[found.kind],
            found.samples if is_exact else None,
            found.trigger if is_waiting else None,
            found.waitingSince if is_waiting else None,
            found.line,
            found.column,
        )

    @property
    def waveforms(self) -> Tuple[str, ...]:
        """The names of the waveforms that play; `runs` counts them from 0."""
        return tuple(self._name(index) for index in range(TOOLS.ktTools_WaveformCount(self._pointer)))

    def _name(self, index: int) -> str:
        name, length = ctypes.c_char_p(), c_uint64()
        TOOLS.ktTools_WaveformName(self._pointer, index, byref(name), byref(length))
        return ctypes.string_at(name, length.value).decode("utf-8", "replace")

    def _window(self, start: int, stop: Optional[int]) -> Tuple[int, int]:
        first, exact = _index(start, "start"), self.length.samples
        if stop is None and exact is None:
            raise ValueError(f"the script plays without a known end ({self.length.kind}): say where to stop")
        last = NO_SAMPLE if stop is None else _index(stop, "stop")
        return first, max(first, min(last, NO_SAMPLE if exact is None else exact))

    def _runs_from(self, begin: int, end: int) -> Iterator[Array]:
        import numpy as np

        kind = np.dtype(Run)
        kind.names = _RUN_FIELDS
        while begin < end:
            block: Any = np.empty(_RUNS_AT_ONCE, kind)
            count = c_uint64()
            TOOLS.ktTools_Runs(self._pointer, begin, block.size, at_address(Run, _address_of(block)), byref(count))
            firsts: Any = block["first_sample"][: count.value]
            yield block[: int(np.count_nonzero(firsts < end))]
            if count.value < _RUNS_AT_ONCE:
                return
            begin = int(firsts[-1]) + int(block["sample_count"][-1])

    def runs(self, start: int = 0, stop: Optional[int] = None) -> np.recarray[Any, Any]:
        """Give what plays, instruction by instruction and pass by pass.

        Parameters
        ----------
        start, stop : int
            Samples; the first run is the one that holds `start`, the last begins before `stop`. Without `stop`: to
            the end.

        Returns
        -------
        numpy.recarray
            Shape (n,), a field for each of ktTools_Run in <ktorba/script_tools.h>: ``first_sample``,
            ``sample_count`` (2**64 - 1: without end), ``first_in_waveform``, ``loop_pass``, ``round``, ``kind``
            (1 waveform, 2 wait, 3 wait for a trigger), ``trigger``, ``waveform`` (an index of `waveforms`; 2**32 - 1
            for waits), ``address``, ``line``, ``column``, ``markers`` (bit n: marker n) and ``marker_offset``.

        Raises
        ------
        ValueError
            It plays without a known end, and no `stop` was given.
        """
        import numpy as np

        first, last = self._window(start, stop)
        blocks: List[Array] = list(self._runs_from(first, last)) or [np.empty(0, np.dtype(Run))]
        joined = blocks[0] if len(blocks) == 1 else np.concatenate(blocks)
        if joined.dtype.names != _RUN_FIELDS:
            joined.dtype.names = _RUN_FIELDS
        return joined.view(np.recarray)

    def _read(self, start: int, stop: Optional[int], is_mask: bool) -> Array:
        import numpy as np

        first, last = self._window(start, stop)
        width = self._arguments[0].generator.sample_width
        array = np.empty(last - first, "u1" if is_mask else f"i{width // 8}")
        count = c_uint64()
        samples = None if is_mask else _address_of(array)
        markers = at_address(ctypes.c_uint8, _address_of(array)) if is_mask and array.size else None
        TOOLS.ktTools_Samples(self._pointer, first, array.size, samples, markers, byref(count))
        return array[: count.value]

    def samples(self, start: int = 0, stop: Optional[int] = None) -> Array:
        """Compute the samples of a window.

        Parameters
        ----------
        start, stop : int
            The first sample, and the one behind the last. Without `stop`: to the end.

        Returns
        -------
        numpy.ndarray
            Shape (n,), int16 or int32 as the generator's width is; shorter than the window where the script ends.

        Raises
        ------
        ToolsError
            The program was compiled without the samples of a waveform that plays.
        ValueError
            It plays without a known end, and no `stop` was given.
        """
        return self._read(start, stop, False)

    def marker_mask(self, start: int = 0, stop: Optional[int] = None) -> Array:
        """Compute a byte of markers for each sample of a window; bit n is marker n. Errors as for `samples`."""
        return self._read(start, stop, True)

    def marker_count(self, marker: int, start: int = 0, stop: Optional[int] = None) -> int:
        """Count how often marker 0 to 7 fires in a window; without `stop` to the end."""
        number = _index(marker, "a marker")
        if number >= _MARKERS:
            raise ValueError(f"there is no marker {number}: they are marker 0 to 7")
        first, last = self._window(start, stop)
        count = c_uint64()
        TOOLS.ktTools_MarkerCount(self._pointer, number, first, last, byref(count))
        return count.value

    def markers(self, marker: int, start: int = 0, stop: Optional[int] = None) -> Array:
        """Give the samples of a window at which marker 0 to 7 fires: shape (n,), uint64, ascending.

        Raises
        ------
        ValueError
            There is no such marker, or it plays without a known end and no `stop` was given.
        """
        import numpy as np

        first, last = self._window(start, stop)
        before, count = self.marker_count(marker, 0, first), self.marker_count(marker, first, last)
        pulses, sample = np.empty(count, np.uint64), c_uint64()
        for index in range(count):
            TOOLS.ktTools_MarkerPulse(self._pointer, marker, before + index, byref(sample))
            pulses[index] = sample.value
        return pulses

    def envelope(self, start: int, stop: int, width: int) -> Envelope:
        """Compute the least and the greatest level of each `width` samples: exact, and as quick at any width.

        Parameters
        ----------
        start, stop : int
            The window; the last column is narrower where `width` does not divide it.
        width : int
            Samples of a column, at least 1.

        Returns
        -------
        Envelope
            Two int32 arrays of one length; columns behind the script's end are missing.

        Raises
        ------
        ToolsError
            The program was compiled without the samples of a waveform that plays.
        """
        import numpy as np

        if _index(width, "width") == 0:
            raise ValueError("width is 0: a column has at least one sample")
        first, last = self._window(start, stop)
        whole, rest = divmod(last - first, width)
        parts = [self._columns(first, width, whole)]
        if rest:
            parts.append(self._columns(first + whole * width, rest, 1))
        return Envelope(*(np.concatenate(side) for side in zip(*parts)))

    def _columns(self, begin: int, width: int, columns: int) -> Tuple[Array, Array]:
        import numpy as np

        lows, highs, count = np.empty(columns, np.int32), np.empty(columns, np.int32), c_uint64()
        if columns:
            sides = (at_address(ctypes.c_int32, _address_of(side)) for side in (lows, highs))
            TOOLS.ktTools_Envelope(self._pointer, begin, width, columns, *sides, byref(count))
        return lows[: count.value], highs[: count.value]


def _free(pointer: Any, arrays: object) -> None:
    TOOLS.ktTools_FreeTimeline(pointer)
