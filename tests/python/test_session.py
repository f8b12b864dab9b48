"""Sessions on the simulated generator: what plays is compared with what was written."""

import gc
import os
import pickle
import threading
import warnings

import ktorba
import ktorba._session
import ktorba.simulator
import numpy as np
import pytest
from ktorba import _samples

LOOP = "script a repeat 3 generate w marker0(5) end repeat end script"


@pytest.fixture(name="generator")
def make_generator():
    with ktorba.simulator.Generator() as generator:
        generator.record(1 << 22)
        yield generator


@pytest.fixture(name="session")
def open_session(generator):
    with generator.open_session() as session:
        yield session


def play(session, generator):
    session.start()
    session.wait(5)
    return generator.read().samples


def expected(samples, passes=3):
    return np.concatenate([np.zeros(64), np.tile(samples, passes), np.full(64, samples[-1])])


@pytest.mark.parametrize("width, kind", [(16, np.int16), (32, np.int32)])
def test_what_is_written_plays(width, kind):
    with ktorba.simulator.Generator(width) as generator, generator.open_session() as session:
        generator.record(10_000)
        samples = np.arange(-300, 300, dtype=kind)
        session.waveforms["w"] = samples if width == 16 else samples.view(np.uint32)
        assert session.write_script(LOOP) == ("a",)
        session.active_script = "A"
        session.start()
        session.wait()
        played = generator.read()
        assert (played.samples == expected(samples)).all() and session.is_done
        assert np.flatnonzero(played.markers).tolist() == [69, 669, 1269]
        program = ktorba.compile(LOOP, {"w": samples}, generator.traits)
        assert (program.timeline().samples() == played.samples).all()


def test_waveforms_are_a_mapping(session):
    waveforms = session.waveforms
    waveforms.update({"one": np.arange(64), "Two": np.arange(128), "groß": np.arange(64)})
    assert list(waveforms) == ["one", "Two", "groß"] and len(waveforms) == 3
    assert "TWO" in waveforms and "GROSS" in waveforms and "three" not in waveforms and 3 not in waveforms
    assert waveforms["two"] == ("Two", 128, 128) and waveforms.get("three") is None
    assert waveforms.pop("one").length == 64 and "one" not in waveforms
    with pytest.raises(KeyError, match="Similar: Two"):
        del waveforms["twoo"]
    assert waveforms.write("two", [7] * 64, at=32) == (64, 0, True)
    assert waveforms["two"].position == 96
    waveforms.write("two", [8] * 32)
    with pytest.raises(ValueError, match="pass the end"):
        waveforms.write("two", [9])
    session.write_script("script s generate two end script")
    waveforms.clear()
    assert not waveforms and not session.scripts and session.active_script is None
    waveforms.allocate("two", 64)
    with pytest.raises(ktorba.WaveformExists):
        waveforms.allocate("TWO", 64)
    assert waveforms["two"].length == 64


def test_scripts_follow_a_waveform_that_moves(session, generator):
    session.waveforms["w"] = np.arange(640)
    session.waveforms["other"] = np.arange(64)
    session.write_script("script b generate other end script " + LOOP + " script c generate W end script")
    session.active_script = "a"
    assert (play(session, generator) == expected(np.arange(640))).all()
    for samples in (np.arange(2000, 1000, -1), np.arange(100), np.arange(100) + 5):
        session.waveforms["w"] = samples
        session.waveforms["filler%d" % samples[0]] = np.full(640, 99)
        assert (play(session, generator) == expected(samples)).all()
    session.active_script = "c"
    assert (play(session, generator) == expected(np.arange(100) + 5, 1)).all()
    session.write_script("script c generate other end script")
    assert (play(session, generator) == expected(np.arange(64), 1)).all()
    session.active_script = "a"
    del session.waveforms["w"]
    with pytest.raises(ktorba.UnknownWaveform):
        session.start()


def test_scripts_are_kept_as_the_library_keeps_them(session):
    session.waveforms["w"] = np.arange(64)
    with pytest.raises(ktorba.ScriptError, match="a subset of 99 samples"):
        session.write_script("\ufeffscript a // one\n generate w end script\nscript b generate w subset(0, 99) end script")
    assert list(session.scripts) == ["a"]
    with pytest.raises(ktorba.ScriptError, match="genrate"):
        session.write_script("script c generate w end script script d genrate end script")
    with pytest.raises(ktorba.UnknownWaveform, match="(?s)`v`.*\\^"):
        session.write_script("script c generate v end script")
    session.active_script = "a"
    with pytest.raises(ktorba.UnknownScript, match="There are: a"):
        session.active_script = "c"
    session.delete_script("A")
    assert session.active_script is None and not session.scripts
    with pytest.raises(ktorba.StateError):
        session.start()


def test_arrays_reach_the_library_in_place(session, monkeypatch):
    addresses = []
    passed = ktorba._session.at_address
    monkeypatch.setattr(ktorba._session, "at_address", lambda kind, at: addresses.append(at) or passed(kind, at))
    data = np.arange(_samples.BLOCK_SAMPLES + 64, dtype=np.int32).astype(np.int16)
    assert session.waveforms.assign("w", data) == (data.size, 0, False)
    assert addresses == [data.ctypes.data, data.ctypes.data + 2 * _samples.BLOCK_SAMPLES]


@pytest.mark.parametrize("nth", range(1, 12))
def test_a_failed_write_can_be_done_again(session, generator, nth):
    session.waveforms["w"] = np.arange(640)
    session.write_script(LOOP)
    session.active_script = "a"
    generator.fail_call(nth)
    samples = np.arange(1280) if nth % 2 else np.arange(640) + 7
    try:
        session.waveforms["w"] = samples
    except ktorba.DeviceError as error:
        assert error.code == -70014 and "w" not in session.waveforms
        session.reset()
        session.waveforms["w"] = samples
        session.write_script(LOOP)
    try:
        session.active_script = "a"
        samples_played = play(session, generator)
    except ktorba.DeviceError:
        session.active_script = "a"
        samples_played = play(session, generator)
    assert (samples_played == expected(samples)).all()


def test_an_interrupt_leaves_a_usable_session(session, generator, monkeypatch):
    passed, calls = ktorba._session.at_address, []

    def interrupt(kind, address):
        calls.append(address)
        if len(calls) == 2:
            raise KeyboardInterrupt
        return passed(kind, address)

    monkeypatch.setattr(_samples, "BLOCK_SAMPLES", 256)
    monkeypatch.setattr(ktorba._session, "at_address", interrupt)
    with pytest.raises(KeyboardInterrupt):
        session.waveforms["w"] = np.arange(640)
    assert "w" not in session.waveforms
    session.waveforms["w"] = np.arange(640)
    session.write_script(LOOP)
    session.active_script = "a"
    assert (play(session, generator) == expected(np.arange(640))).all()


def test_waiting_ends_in_an_answer(session, generator):
    session.waveforms["w"] = np.arange(64)
    session.write_script("script e repeat forever generate w end repeat end script script t wait until trigger3 wait 64 end script")
    session.active_script = "e"
    session.start()
    with pytest.raises(ValueError, match="never ends"):
        session.wait()
    with pytest.raises(TimeoutError, match="0.01 s"):
        session.wait(0.01)
    session.abort()
    session.active_script = "t"
    session.start()
    generator.raise_trigger(3, at=1000)
    session.wait()
    assert generator.samples_played == 64 + 960 + 64 + 64


def test_settings_tell_what_was_set(session):
    assert (session.read_grant_time, session.write_grant_time, session.priming_depth) == (60, 30, None)
    assert (session.download_fifo_depth, session.chunk_size, session.streaming_waveform) == (40960, 32768, None)
    session.read_grant_time, session.priming_depth, session.chunk_size = 61, 128, 4096
    with pytest.raises(ktorba.SettingError):
        session.priming_depth = 10**9
    assert (session.read_grant_time, session.priming_depth, session.chunk_size) == (61, 128, 4096)
    for name, value in (("read_grant_time", 65536), ("chunk_size", 0), ("write_grant_time", "fast"), ("priming_depth", 1.5)):
        with pytest.raises((TypeError, ValueError), match=name):
            setattr(session, name, value)
    session.waveforms["ring"] = np.arange(1280)
    session.streaming_waveform = "ring"
    assert session.streaming_space >= 0
    session.reset()
    assert session.streaming_waveform is None and not session.waveforms
    session.read_grant_time = 60


def test_memory_full_tells_what_is_free(session):
    with pytest.raises(ktorba.MemoryFull, match="largest") as caught:
        session.waveforms.allocate("w", 10**9)
    error = pickle.loads(pickle.dumps(caught.value))
    assert 0 < error.free <= 64 << 20 and error.elaboration["error_constant"] == error.constant
    with pytest.raises(ktorba.InvalidName):
        session.waveforms["a b"] = np.arange(64)
    with pytest.raises(ktorba.WaveformError):
        session.waveforms["short"] = [5]
    for bad in ("a\0b", 5, None, "\ud800"):
        with pytest.raises((TypeError, ValueError)):
            session.waveforms[bad] = np.arange(64)
    session.waveforms["w"] = np.arange(64)


def test_use_after_close_is_an_exception(generator):
    session = generator.open_session()
    session.close()
    session.close()
    for use in (session.start, lambda: session.waveforms.allocate("w", 64), session.__enter__, lambda: session.is_done):
        with pytest.raises(ktorba.SessionClosed):
            use()
    with pytest.raises(TypeError, match="cannot be pickled"):
        pickle.dumps(session)
    generator.open_session().close()


def test_a_forgotten_session_warns_and_is_closed(generator):
    with pytest.warns(ResourceWarning, match="not closed"):
        generator.open_session()
        gc.collect()
    generator.open_session().close()
    with pytest.raises(RuntimeError, match="process of its own"):
        ktorba.Session.open(1, 1, 1, sample_width=16)


def test_a_forked_child_is_refused(session):
    child = os.fork()
    if child == 0:
        with warnings.catch_warnings():
            warnings.simplefilter("error")
            try:
                session.start()
            except ktorba.SessionClosed:
                session.close()
                os._exit(7)
        os._exit(1)
    assert os.waitstatus_to_exitcode(os.waitpid(child, 0)[1]) == 7
    session.waveforms["w"] = np.arange(64)


def test_two_sessions_play_on_two_threads():
    played = {}

    def run(number):
        with ktorba.simulator.Generator() as generator, generator.open_session() as session:
            generator.record(10_000)
            session.waveforms["w"] = np.arange(640) + number
            session.write_script(LOOP)
            session.active_script = "a"
            played[number] = [play(session, generator) for _ in range(20)]

    threads = [threading.Thread(target=run, args=(number,)) for number in (0, 1000)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    assert all((one == expected(np.arange(640) + number)).all() for number in (0, 1000) for one in played[number])
