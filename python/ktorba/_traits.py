"""What a generator is like, as far as scripts and waveforms have to fit it."""

from __future__ import annotations

import dataclasses
import json
from dataclasses import dataclass

_UNITS = {"sample_width": "sampleWidthBits"}


def _camel(name: str) -> str:
    first, *others = name.split("_")
    return _UNITS.get(name, first + "".join(other.capitalize() for other in others))


@dataclass(frozen=True)
class Traits:
    """A generator for which scripts are compiled, or that is simulated.

    Parameters
    ----------
    sample_width : int
        Bits of a sample, 16 or 32.
    sample_rate_hz : float
        Samples per second; it changes words alone, such as "plays 5 ms".
    memory_size_bytes, memory_word_bytes : int
        Sample memory, and its word.
    min_fetch_samples : int
        The shortest piece of a waveform that can be played.
    sequence_words : int
        Instructions that sequence memory holds.
    max_priming_words : int
        Memory words that can be read ahead at most.
    priming_depth_samples : int
        Samples that are read ahead; 0 for the default.
    """

    sample_width: int = 16
    sample_rate_hz: float = 1e6
    memory_size_bytes: int = 67108864
    memory_word_bytes: int = 16
    min_fetch_samples: int = 64
    sequence_words: int = 4096
    max_priming_words: int = 512
    priming_depth_samples: int = 0

    def to_json(self) -> bytes:
        """Give the description as the C interfaces take it."""
        return json.dumps({_camel(name): value for name, value in dataclasses.asdict(self).items()}).encode()
