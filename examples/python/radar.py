"""Plays a radar's chirps on the simulated generator until a trigger stops them, and tells what came out.

    python3 examples/python/radar.py
"""

from pathlib import Path

import ktorba
import ktorba.simulator
import numpy as np
import numpy.typing as npt

SAMPLE_RATE_HZ = 20e6
SCRIPT = Path(__file__).parents[1] / "radar.kts"


def make_chirp(length_s: float, first_hz: float, last_hz: float) -> npt.NDArray[np.float64]:
    """Give a sine whose frequency rises, as fractions of full scale."""
    time_s = np.arange(round(length_s * SAMPLE_RATE_HZ)) / SAMPLE_RATE_HZ
    cycles = (first_hz + (last_hz - first_hz) * time_s / (2 * length_s)) * time_s
    fractions: npt.NDArray[np.float64] = np.sin(2 * np.pi * cycles)
    return fractions


def main() -> None:
    """Play, and compare with what was computed without a generator."""
    text = SCRIPT.read_text()
    waveforms = {"chirp": make_chirp(20e-6, 200e3, 4e6), "idle": np.zeros(100)}
    with ktorba.simulator.Generator(sample_rate_hz=SAMPLE_RATE_HZ) as generator, generator.open_session() as session:
        session.waveforms.update(waveforms)
        session.write_script(text)
        session.active_script = "radar"
        generator.record(100_000)
        generator.raise_trigger(1, at=6000)  # the operator, after 300 us
        session.start()
        session.wait(timeout=10)
        played = generator.read()

    print(f"played {played.samples.size} samples, the highest is {played.samples.max()}")
    for sample in np.flatnonzero(played.markers):
        print(f"markers {played.markers[sample]:02x} at sample {sample}")

    timeline = ktorba.compile(text, waveforms).timeline([(6000, 1)])
    print("as computed:", np.array_equal(timeline.samples(), played.samples))


if __name__ == "__main__":
    main()
