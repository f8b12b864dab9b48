"""Runs what is shown: the README's lines, the example. The guide is run by pytest itself."""

import re
import runpy
import textwrap

from conftest import ROOT


def test_the_lines_of_the_readme_run(capsys):
    block = re.search(r"(?m)^    import numpy.*ktorba.simulator\n(?:    .*\n)+", (ROOT / "README.md").read_text()).group()
    exec(textwrap.dedent(block), {})
    assert capsys.readouterr().out == "32767\n"


def test_the_example_computes_what_it_plays(capsys):
    runpy.run_path(str(ROOT / "examples" / "python" / "radar.py"), run_name="__main__")
    assert "as computed: True" in capsys.readouterr().out
