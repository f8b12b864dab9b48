"""Tells what is installed, for reports of faults."""

from __future__ import annotations

import sys
from typing import Dict

from . import _loader
from ._declarations import INTERFACES, Interface
from ._version import VERSION


def _path_of(interface: Interface) -> str:
    try:
        return interface.path()
    except _loader.LibraryNotFound as error:
        return f"missing: {error}"


def versions() -> Dict[str, str]:
    """Give versions and the paths of the libraries by name; libraries that are missing say where they were looked for."""
    import platform

    try:
        from numpy import __version__ as numpy_version
    except ImportError:
        numpy_version = "missing"
    found = {"ktorba": VERSION, "python": platform.python_version(), "numpy": numpy_version}
    found["system"] = platform.platform()
    found.update((f"lib{interface.stem}", _path_of(interface)) for interface in INTERFACES.values())
    return found


def show_versions() -> None:
    """Write versions, and the paths of the libraries, to the standard output."""
    found = versions()
    width = max(map(len, found))
    sys.stdout.writelines(f"{name.ljust(width)}  {value}\n" for name, value in found.items())
