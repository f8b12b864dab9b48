"""The one door for arrays: what becomes of every kind of them, and what is refused."""

import array
import decimal
import math
import warnings

import numpy as np
import pytest
from ktorba import _samples
from ktorba._samples import Samples


def codes(data, width=16):
    samples = Samples(data, width)
    return np.concatenate(list(samples.blocks())), samples.report()


RAMP = np.arange(-3000, 3000, dtype=np.int16)


@pytest.mark.parametrize("data", [
    RAMP[::3], RAMP[::-1], RAMP.astype(">i2"), RAMP.astype(np.int64), RAMP.tolist(), array.array("h", RAMP.tolist()),
    memoryview(RAMP), np.arange(0, 250, dtype=np.uint8), RAMP.astype(np.uint32)[3000:]], ids=repr)
def test_integers_are_codes(data):
    assert codes(data)[0].tolist() == codes(data, 32)[0].view(np.int32).tolist() == list(data)


def test_native_arrays_pass_without_a_copy():
    patterns = RAMP.astype(np.int32).view(np.uint32)
    read_only = RAMP.copy()
    read_only.flags.writeable = False
    for data, width in ((RAMP, 16), (read_only, 16), (patterns, 32), (RAMP.astype(np.int32), 32)):
        block, = Samples(data, width).blocks()
        assert np.shares_memory(block, data) and not Samples(data, width).copied
    assert codes(patterns.astype(">u4"), 32)[0].view(np.int32).tolist() == RAMP.tolist()


@pytest.mark.parametrize("kind", ["f2", "f4", ">f4", "f8", "g"])
def test_floats_are_fractions_of_full_scale(kind):
    just_below = [np.nextafter(0.5, 0), np.nextafter(np.float32(-0.5), np.float32(0))]
    steps = [0, 0.5, -0.5, 1.5, -1.5, 2.5, 1000.25, -32768, 32768, 40000, -40000, -65536.5, *just_below]
    data = np.array(steps, np.float64) / 32768
    taken, report = codes(data.astype(kind))
    levels = (np.float64(data.astype(kind)) * 32768).tolist()
    rounded = [int(decimal.Decimal(level).quantize(decimal.Decimal(1), decimal.ROUND_HALF_UP)) for level in levels]
    assert taken.tolist() == np.clip(rounded, -32768, 32767).tolist()
    assert report == (len(steps), 3, True)


def test_blocks_join_without_a_seam(monkeypatch):
    data = np.sin(np.arange(1000.0))
    whole = codes(data)[0]
    monkeypatch.setattr(_samples, "BLOCK_SAMPLES", 7)
    assert (codes(data)[0] == whole).all() and codes(data[::2])[1].samples == 500
    with pytest.raises(ValueError, match="sample 40 is nan"):
        codes(np.where(np.arange(50) == 40, np.nan, 0.5))
    with pytest.raises(ValueError, match="sample 40 is 99999"):
        codes(np.where(np.arange(50) == 40, 99999, 5))


@pytest.mark.parametrize("data, words", [
    ([[1, 2], [3, 4]], "one dimension, not 2"), ([[1, 2], [3]], "rows of different lengths|inhomogeneous"), ([], "empty"),
    (3.5, "one dimension, not 0"), ([True, False], "truth values"), ([1j], "real numbers"), ([None, 1.0], "objects"),
    ("noise", "samples are"), (b"noise", "frombuffer"), ([math.inf], "sample 0 is inf"), ([5, -32769], "sample 1 is -32769"),
    (np.array([5, 2**63], np.uint64), "sample 1 is 9223"), (np.array([5, 40000], np.uint16), "sample 1 is 40000"),
    (np.ma.masked_array([1, 2], [0, 1]), "masked"), ({"a": 1}, "objects"), (np.array(["2020-01-01"], "M8[D]"), "samples are")])
def test_what_cannot_be_samples_is_refused_with_the_reason(data, words):
    with pytest.raises((TypeError, ValueError), match=words):
        codes(data)


def test_integers_that_look_like_fractions_warn():
    for data, width in (([0, 1, -1], 16), (np.array([0, 1], np.int16), 16), (np.array([1, 2**32 - 1], np.uint32), 32)):
        with pytest.warns(UserWarning, match="did you mean floats"):
            codes(data, width)
    with warnings.catch_warnings():
        warnings.simplefilter("error")
        assert codes([1e308, -1e308])[0].tolist() == [32767, -32768]
        codes(np.zeros(10, np.int16)), codes([0, 1, 2]), codes([0.0, 1.0])
