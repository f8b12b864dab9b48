"""Waveforms, scripts and generation for arbitrary-waveform generators inside an FPGA.

Offline, `check` and `compile` tell of a script what is wrong, what it becomes and what it plays. `Session` drives a
generator; `ktorba.simulator` has one for machines without. Lengths and positions are in samples, time-outs in seconds.
"""

from ._version import VERSION as __version__

__all__ = ["__version__"]
