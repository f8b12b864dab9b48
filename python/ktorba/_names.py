"""Names as the library compares them, and names that are nearly the one asked for."""

from __future__ import annotations

from typing import Iterable

# The letters whose case names disregard, as ktcheckname has them: Latin, its ligatures, and Latin in other guises.
_FOLDED = ((0x41, 0x232), (0x1E00, 0x1E9B), (0x2160, 0x216F), (0x24B6, 0x24CF), (0xFB00, 0xFB06), (0xFF21, 0xFF3A))


def _fold_letter(letter: str) -> str:
    return letter.casefold() if any(first <= ord(letter) <= last for first, last in _FOLDED) else letter


def fold(name: str) -> str:
    """Give what is the same of two names that the library takes for one."""
    return name.lower() if name.isascii() else "".join(map(_fold_letter, name))


def encode(name: object, what: str = "a name") -> bytes:
    """Give a name or text as the library takes it.

    Raises
    ------
    TypeError
        It is no `str`.
    ValueError
        It holds a NUL, which would end it, or half of a surrogate pair.
    """
    if not isinstance(name, str):
        raise TypeError(f"{what} is a str, not {type(name).__name__}")
    if "\0" in name:
        raise ValueError(f"{what} holds a NUL character, at position {name.index(chr(0))}")
    return name.encode()


def suggest(name: str, known: Iterable[str]) -> str:
    """Give a sentence that names near misses, or all that there are when they are few."""
    import difflib

    names = {fold(one): one for one in known}
    near = difflib.get_close_matches(fold(name), names, 3, 0.6)
    if near:
        return f"Similar: {', '.join(names[one] for one in near)}."
    return f"There are: {', '.join(names.values())}." if 0 < len(names) <= 8 else f"There are {len(names)}."
