"""Scripts without a generator: messages, programs, timelines, differences; all of them as values."""

import os
import pickle
import re
import subprocess

import ktorba
import numpy as np
import pytest
from conftest import ROOT

PAIR = re.compile(r"\n```\n(.*?)```\n```\n(.*?)```", re.S)
TEXT = """script first
  repeat 3
    generate w subset(0, 128) marker0(5)
    wait 64
  end repeat
end script
script second
  wait until trigger2
  generate w marker1(0)
end script
"""
SAMPLES = np.arange(-100, 156, dtype=np.int16) * 100


def described_messages():
    """The scripts of the page of messages that are wrong by themselves, with what the tool says."""
    sections = (ROOT / "docs" / "messages.md").read_text().split("\n### ")[1:]
    for script, answer in (PAIR.search(section).groups() for section in sections if PAIR.search(section)):
        if "\ufffd" in script:  # stands for bytes that the page cannot show
            continue
        try:
            ktorba.check(script)
        except ktorba.ScriptError:
            yield script, answer


def test_errors_read_as_the_tool_prints_them():
    cases = list(described_messages())
    assert len(cases) > 20
    for script, answer in cases:
        with pytest.raises(ktorba.ScriptError) as caught:
            ktorba.check(script, name="s.kts")
        assert answer.startswith(str(caught.value) + "\n")


def test_carets_stand_where_the_tool_puts_them(tmp_path):
    tool = os.environ.get("KTORBA_TOOL")
    if not tool:
        pytest.skip("KTORBA_TOOL does not name the tool")
    path = tmp_path / "s.kts"
    for line in ("\tgenrate\tw", "generate \u00e4\u0301\u4e16 / 3", "\u4e16\u200b\x01 / w", "genr\u00e4te\x7f",
                 "wait 1 " + "generate w " * 40 + "/ " + "\u4e16" * 90, "wait 1 // " + "\t\u00e4" * 60,
                 "\u00e4" * 150 + "\t" * 30 + "/", "/" + "\t" * 50 + "\u4e16" * 50):
        script = f"\ufeffscript s\n  {line}\r\n wait 64 /\nend script\n"
        path.write_bytes(script.encode())
        printed = subprocess.run([tool, "check", path], capture_output=True, encoding="utf-8").stderr
        with pytest.raises(ktorba.ScriptError) as caught:
            ktorba.check(script, name=str(path))
        assert printed.startswith(str(caught.value) + "\n")


def test_script_errors_carry_fixes_and_pickle():
    with pytest.raises(ktorba.ScriptError) as caught:
        ktorba.compile("script s\n genrate w\nend script", {"w": 64})
    error = pickle.loads(pickle.dumps(caught.value))
    assert (error.line, error.column, error.end.column) == (2, 2, 9)
    assert error.constant == "ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript"
    assert [(fix.text, fix.certain) for fix in error.fixes] == [("generate", True)]
    with pytest.raises(ktorba.ScriptError, match="a subset of 999 samples"):
        ktorba.compile("script s generate w subset(0, 999) end script", {"w": 64})


def test_program_shows_words_in_place_and_outlives_its_name():
    program = ktorba.compile(TEXT, {"w": SAMPLES})
    words = program["FIRST"].words
    assert words.dtype.names == ("word0", "word1", "word2", "word3") and not words.flags.writeable
    assert np.shares_memory(words, program["first"].words)
    listing = program["first"].listing
    assert [one.samples for one in listing] == [64, 0, 128, 64, 0, 64] and len(words) == 6
    copy = words.copy()
    del program
    assert (words == copy).all()


def expected_first():
    """What the first script plays by the language's rules."""
    once = np.concatenate([SAMPLES[:128], np.full(64, SAMPLES[127])])
    return np.concatenate([np.zeros(64, np.int16), once, once, once, np.full(64, SAMPLES[127])])


def test_timeline_is_what_plays():
    timeline = pickle.loads(pickle.dumps(ktorba.compile(TEXT, {"w": SAMPLES})["first"].timeline()))
    expected = expected_first()
    assert timeline.length.samples == len(expected)
    assert (timeline.samples() == expected).all()
    assert (timeline.samples(100, 333) == expected[100:333]).all() and timeline.samples(10**6, 10**7).size == 0
    assert timeline.markers(0).tolist() == np.flatnonzero(timeline.marker_mask()).tolist() == [69, 261, 453]
    assert timeline.markers(0, 70, 453).tolist() == [261]
    runs = timeline.runs()
    assert runs.first_sample.tolist() == np.concatenate([[0], np.cumsum(runs.sample_count)[:-1]]).tolist()
    assert timeline.runs(70, 257).kind.tolist() == [1, 2, 1]
    lows, highs = timeline.envelope(10, 600, 100)
    windows = [expected[first:min(first + 100, 600)] for first in range(10, 600, 100)]
    assert lows.tolist() == [window.min() for window in windows]
    assert highs.tolist() == [window.max() for window in windows]


def test_timelines_of_any_length():
    text = "script s repeat 2000000000 generate w end repeat end script"
    timeline = ktorba.compile(text, {"w": SAMPLES}).timeline()
    assert timeline.length.samples == 2_000_000_000 * 256 + 128
    assert len(timeline.runs(10**9, 10**9 + 256 * 10_000)) in (10_000, 10_001)
    endless = ktorba.compile("script s repeat forever generate w end repeat end script", {"w": 256}).timeline()
    assert endless.length.kind == "endless"
    for without_end in (endless.runs, endless.samples, lambda: endless.markers(0)):
        with pytest.raises(ValueError, match="say where to stop"):
            without_end()
    with pytest.raises(ktorba.ToolsError, match="not been lent"):
        endless.samples(0, 1000)


def test_triggers_end_waits():
    second = ktorba.compile(TEXT, {"w": SAMPLES})["second"]
    waiting = second.timeline().length
    assert (waiting.kind, waiting.trigger, waiting.line) == ("waiting", 2, 8)
    assert second.timeline([(1000, 2)]).markers(1).tolist() == [1024]
    for bad in ([(0, 8)], [(-1, 1)], [(0.5, 1)]):
        with pytest.raises((TypeError, ValueError)):
            second.timeline(bad)


def test_diff_names_the_first_sample():
    other = SAMPLES.copy()
    other[100] += 1
    first, second = (ktorba.compile(TEXT, {"w": samples}) for samples in (SAMPLES, other))
    found = pickle.loads(pickle.dumps(ktorba.diff(first, second, "first")))
    assert not found.same and (found.scripts[0].kind, found.scripts[0].sample) == ("level", 164)
    assert ktorba.diff(first, pickle.loads(pickle.dumps(first))).same


def test_bad_requests_are_refused_in_words():
    for text, waveforms, generator, words in (
            (3, {}, None, "a script text is a str"), ("script s wait 64 end script", {"w": [[1, 2]]}, None, "one dimension"),
            ("script s wait 64 end script", {}, ktorba.Traits(sample_width=17), "the generator"),
            (TEXT, {"w": 256}, None, "say which")):
        with pytest.raises((TypeError, ValueError), match=words):
            ktorba.compile(text, waveforms, generator).words
    with pytest.raises(KeyError, match="Similar: first"):
        ktorba.compile(TEXT, {"w": 256})["firts"]
