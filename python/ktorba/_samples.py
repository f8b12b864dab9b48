"""The one door by which arrays become samples.

Integers are codes, floats fractions of full scale. What a generator takes as it is passes without a copy; all else is
converted block by block, so that no more than one block of memory is added. Everything is looked at before the first
block goes out: what is refused has sent nothing.
"""

from __future__ import annotations

import warnings
from typing import TYPE_CHECKING, Any, Iterator, NamedTuple, Tuple

if TYPE_CHECKING:
    import numpy as np
    import numpy.typing as npt

    Array = npt.NDArray[Any]

BLOCK_SAMPLES = 1 << 20
_PIECE_SAMPLES = 1 << 14


class WriteReport(NamedTuple):
    """What a write did.

    Attributes
    ----------
    samples : int
        How many were written.
    clipped : int
        How many of them were beyond full scale and became the greatest or the least code; 1.0 itself, one code too
        high, does not count.
    copied : bool
        Whether they were converted; False: the library read the caller's memory.
    """

    samples: int
    clipped: int
    copied: bool


def _describe(array: Array) -> str:
    return f"dtype {array.dtype}, shape {array.shape}"


def _refuse_kind(data: object, array: Array) -> None:
    reasons = {
        "b": "truth values are no samples: say which level each stands for",
        "c": "samples are real numbers: write real and imaginary part as two waveforms",
        "O": "it holds Python objects that are no numbers of one kind, or rows of different lengths",
        "S": "bytes are no samples by themselves: numpy.frombuffer says of what type they are",
    }
    if array.dtype.kind not in "iuf":
        reason = reasons.get(array.dtype.kind, "samples are integers or floats")
        raise TypeError(f"{type(data).__name__} of {_describe(array)} cannot be written: {reason}")


def as_array(data: object) -> Array:
    """Give any buffer, list or array as an array of one dimension, without a copy where there is memory behind it.

    Raises
    ------
    TypeError, ValueError
        It is no array of numbers, is empty, or has another number of dimensions.
    """
    import numpy as np

    if isinstance(data, np.ma.MaskedArray):
        raise TypeError("a masked array has samples without a value: fill them, array.filled(0)")
    with warnings.catch_warnings():
        warnings.simplefilter("ignore")  # NumPy's on ragged rows: such an array is refused below
        array: Array = np.asarray(data)
    _refuse_kind(data, array)
    if array.ndim != 1:
        raise ValueError(f"a waveform has one dimension, not {array.ndim} ({_describe(array)})")
    if array.size == 0:
        raise ValueError("a waveform has at least one sample: the array is empty")
    return array


def _blocks_of(array: Array) -> Iterator[Tuple[int, Array]]:
    for first in range(0, array.size, BLOCK_SAMPLES):
        yield first, array[first : first + BLOCK_SAMPLES]


class Samples:
    """Samples for a generator of one width, checked; `blocks` gives them as the library takes them.

    Parameters
    ----------
    data : array_like
        One dimension. Integers: codes, of 32-bit generators also as ``uint32`` in two's complement. Floats: fractions
        of full scale, from -1 to 1; what is beyond is clipped and counted.
    sample_width : int
        16 or 32.

    Raises
    ------
    TypeError, ValueError
        The array cannot be samples; the message says why, with the index of the first number that cannot.
    """

    def __init__(self, data: object, sample_width: int) -> None:
        import numpy as np

        self.array = as_array(data)
        self.width = sample_width
        self.target: np.dtype[Any] = np.dtype("int16" if sample_width == 16 else "int32")
        self.clipped = 0
        kind = self.array.dtype
        self._is_pattern = sample_width == 32 and kind.kind == "u" and kind.itemsize == 4
        is_native = kind.isnative and (kind == self.target or self._is_pattern)
        self.copied = not (is_native and self.array.flags.c_contiguous)
        self._check_floats() if kind.kind == "f" else self._check_integers()

    @property
    def count(self) -> int:
        """The number of samples."""
        return int(self.array.size)

    def _check_floats(self) -> None:
        import numpy as np

        for first, block in _blocks_of(self.array):
            finite = np.isfinite(block)
            if not finite.all():
                index = first + int(np.argmin(finite))
                raise ValueError(f"sample {index} is {self.array[index]}: replace it by a number")

    def _check_integers(self) -> None:
        if self.array.dtype.itemsize > self.target.itemsize or self.array.dtype.kind == "u":
            self._check_range()
        if self._are_within_one():
            warnings.warn(
                "integers are codes, not fractions of full scale, and these are all within ±1: did you mean floats?",
                UserWarning,
                stacklevel=5,
            )

    def _check_range(self) -> None:
        import numpy as np

        limits = np.iinfo(self.target)
        for first, block in () if self._is_pattern else _blocks_of(self.array):
            if int(block.min()) < limits.min or int(block.max()) > limits.max:
                outside = (block < limits.min) | (block > limits.max) if block.dtype.kind == "i" else block > limits.max
                index = first + int(np.argmax(outside))
                raise ValueError(
                    f"sample {index} is {self.array[index]}: codes of {self.width} bits go from {limits.min} to "
                    f"{limits.max} (for fractions of full scale, give floats)"
                )

    def _are_within_one(self) -> bool:
        """Whether they are all -1, 0 or 1 but not all 0. Usually the first block tells that they are not."""
        is_any = False
        for _, block in _blocks_of(self.array):
            signed = block.view(block.dtype.str.replace("u", "i")) if self._is_pattern else block
            least, greatest = int(signed.min()), int(signed.max())
            if least < -1 or greatest > 1:
                return False
            is_any = is_any or (least, greatest) != (0, 0)
        return is_any

    def _scale(self, block: Array) -> Array:
        """Make codes of fractions, in pieces that stay in the processor's cache."""
        import numpy as np

        codes = np.empty(block.size, self.target)
        for first in range(0, block.size, _PIECE_SAMPLES):
            piece = slice(first, first + _PIECE_SAMPLES)
            self._scale_piece(block[piece], codes[piece])
        return codes

    def _scale_piece(self, fractions: Array, codes: Array) -> None:
        """Round to the nearest code, halves away from zero, and clip."""
        import numpy as np

        full_scale = 2.0 ** (self.width - 1)
        # A float32 holds every 16-bit code and its half; scaling by a power of two is exact.
        is_single = self.width == 16 and fractions.dtype.itemsize <= 4
        levels = fractions.astype(np.float32 if is_single else np.float64)
        with np.errstate(over="ignore"):  # what becomes infinite is clipped
            levels *= full_scale
        if levels.min() < -full_scale or levels.max() > full_scale:
            self.clipped += int(np.count_nonzero((levels < -full_scale) | (levels > full_scale)))
        # With the number below a half, truncation rounds halves away from zero and what is just below a half to it.
        levels += np.copysign(np.nextafter(levels.dtype.type(0.5), levels.dtype.type(0)), levels)
        np.clip(levels, -full_scale, full_scale - 1, out=levels)
        codes[:] = levels

    def _convert(self, block: Array) -> Array:
        import numpy as np

        if block.dtype.kind == "f":
            return self._scale(block)
        if self._is_pattern:
            return np.ascontiguousarray(block, dtype="u4")
        return np.ascontiguousarray(block, dtype=self.target)

    def blocks(self) -> Iterator[Array]:
        """Give the samples in order, contiguous and in the machine's byte order; 32-bit ones signed or not."""
        for _, block in _blocks_of(self.array):
            yield self._convert(block) if self.copied else block

    def whole(self) -> Array:
        """Give a read-only copy of all of them, signed."""
        import numpy as np

        copy = np.concatenate(list(self.blocks())).view(self.target)
        copy.flags.writeable = False
        return copy

    def report(self) -> WriteReport:
        """Tell what became of them, once all blocks were taken."""
        return WriteReport(self.count, self.clipped, self.copied)
