"""Finds and loads the shared libraries, each once, at its first use, and holds their version against the package's.

Loading waits for the first use so that `import ktorba` stays light, and so that `ktorba.show_versions` can tell what
is missing where something is.
"""

from __future__ import annotations

import ctypes
import os
import sys
import threading
from pathlib import Path
from typing import Dict, Iterator, List, Optional

from ._version import VERSION

PATH_VARIABLE = "KTORBA_LIBRARY_PATH"

# Where libraries lie below a folder of the path: an install's library folder, or a build tree.
_SUBFOLDERS = ("", "lib", "ktorba/simulator", "source/ktorba_lib", "tools/script_tools", "simulator_libraries")

# The platform's libraries keep the platform's names, which carry no number.
_WITHOUT_NUMBER = ("KtFpga", "ktifwu")

# The other libraries tell no version; the number in their file names is the major one.
_VERSION_FUNCTIONS = {"ktorba_tools": "ktTools_Version"}

_loaded: Dict[str, ctypes.CDLL] = {}
_lock = threading.RLock()


class LibraryNotFound(ImportError):
    """A shared library is missing, or is of a version that this package cannot use. The message says where it looked."""


class _DlInfo(ctypes.Structure):
    _fields_ = [
        ("file_name", ctypes.c_char_p),
        ("base", ctypes.c_void_p),
        ("symbol", ctypes.c_char_p),
        ("address", ctypes.c_void_p),
    ]


def file_name(stem: str) -> str:
    """Give the name that the loader knows a library by, such as ``libktorba_tools.so.0``."""
    if sys.platform == "win32":
        return f"{stem}.dll"
    return f"lib{stem}.so" if stem in _WITHOUT_NUMBER else f"lib{stem}.so.{VERSION.split('.')[0]}"


def _folders(beside: Optional[str]) -> List[Path]:
    named = os.environ.get(PATH_VARIABLE)
    roots = [Path(folder) for folder in named.split(os.pathsep) if folder] if named else []
    if not roots:
        roots = [Path(__file__).parent / "_libraries"]
        if beside is not None:
            roots.append(Path(beside).parent)
    return [root / subfolder for root in roots for subfolder in _SUBFOLDERS]


def _candidates(stem: str, beside: Optional[str]) -> Iterator[str]:
    for folder in _folders(beside):
        path = folder / file_name(stem)
        if path.is_file():
            yield str(path)
    if not os.environ.get(PATH_VARIABLE):
        yield file_name(stem)


def _open(stem: str, beside: Optional[str]) -> ctypes.CDLL:
    failures = []
    for candidate in _candidates(stem, beside):
        try:
            return ctypes.CDLL(candidate)
        except OSError as error:
            failures.append(str(error))
    reasons = "; ".join(failures) or f"no folder of {PATH_VARIABLE}={os.environ.get(PATH_VARIABLE)} has it"
    raise LibraryNotFound(f"{file_name(stem)} cannot be loaded: {reasons}")


def _check_version(library: ctypes.CDLL, name: str) -> None:
    """Refuse a library that a program built against this package's version may not use.

    The major number must be the same. Below 1.0, where declarations may still change, the minor number must be, too.
    """
    function = getattr(library, name)
    function.restype = ctypes.c_char_p
    version = function().decode()
    digits = 2 if VERSION.startswith("0.") else 1
    if version.split(".")[:digits] != VERSION.split(".")[:digits]:
        path = path_of(library, name)
        raise LibraryNotFound(f"{path} has version {version}, the package ktorba {VERSION}: install both of one version")


def load(stem: str, beside: Optional[str] = None) -> ctypes.CDLL:
    """Give a library, loaded at the first call: from ``KTORBA_LIBRARY_PATH`` alone where that is set (folders of an
    install, or build trees), else from the wheel, else as the system's loader finds it.

    Parameters
    ----------
    stem : str
        Its name without ``lib`` and ending.
    beside : str, optional
        The path of a library near which it is installed.

    Raises
    ------
    LibraryNotFound
        No place has it, or what is there cannot be loaded.
    """
    with _lock:
        if stem not in _loaded:
            library = _open(stem, beside)
            if stem in _VERSION_FUNCTIONS:
                _check_version(library, _VERSION_FUNCTIONS[stem])
            _loaded[stem] = library
        return _loaded[stem]


def is_loaded(stem: str) -> bool:
    """Tell whether this process has loaded a library through `load`."""
    return stem in _loaded


def path_of(library: ctypes.CDLL, function: str) -> str:
    """Give the file that a library was loaded from, by one of its functions; its name where the system does not tell."""
    if sys.platform != "win32":
        info = _DlInfo()
        address = ctypes.cast(getattr(library, function), ctypes.c_void_p)
        if ctypes.CDLL(None).dladdr(address, ctypes.byref(info)) != 0 and info.file_name:
            return os.fsdecode(info.file_name)
    return str(library._name)
