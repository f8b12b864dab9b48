"""Errors and warnings about a script, and how they are shown: as the command-line tool shows them."""

from __future__ import annotations

import unicodedata
from typing import Any, Dict, List, NamedTuple, Optional, Tuple

_COLUMNS = 171  # of a terminal; 160 of them for the line itself
_TAB_COLUMNS = 8  # at most
_LEAST_GUTTER = 5
_DELIMITERS = b" \t\r\n(),/"
_ELLIPSIS = "\u2026"
_BYTE_ORDER_MARK = b"\xef\xbb\xbf"


class Place(NamedTuple):
    """A place in a text.

    Attributes
    ----------
    offset : int
        Bytes of UTF-8 from the text's start; a byte order mark is not counted.
    line, column : int
        From 1; the column in bytes.
    utf16 : int
        The column in UTF-16 code units, from 0.
    """

    offset: int
    line: int
    column: int
    utf16: int


class Range(NamedTuple):
    """A part of a text: from `start` to `end`, which is the place behind its last byte."""

    start: Place
    end: Place


class Fix(NamedTuple):
    """A change that mends the text, or, unless it is certain, may: `text` in place of what is in `range`."""

    range: Range
    text: str
    certain: bool


class Related(NamedTuple):
    """Another place that has to do with an error; `range` is None for the text as a whole."""

    range: Optional[Range]
    message: str


class Diagnostic(NamedTuple):
    """An error or a warning about a script.

    Attributes
    ----------
    severity : str
        ``"error"`` or ``"warning"``.
    message : str
        What is wrong: one sentence, without a full stop.
    hint : str
        What to do; may be empty.
    range : Range or None
        Where; None for the text as a whole.
    fixes : tuple of Fix
    related : tuple of Related
    constant : str
        The library's error constant; empty for what only the tools find.
    code : int
        Its code.
    """

    severity: str
    message: str
    hint: str
    range: Optional[Range]
    fixes: Tuple[Fix, ...]
    related: Tuple[Related, ...]
    constant: str
    code: int


def _read_range(fields: Optional[Dict[str, Any]]) -> Optional[Range]:
    return None if fields is None else Range(Place(**fields["start"]), Place(**fields["end"]))


def _read_fix(fields: Dict[str, Any]) -> Fix:
    place = _read_range(fields["range"])
    assert place is not None  # a fix always has one
    return Fix(place, fields["text"], fields["confidence"] == "certain")


def read_diagnostic(fields: Dict[str, Any]) -> Diagnostic:
    """Read an element of a document's ``diagnostics``."""
    return Diagnostic(
        severity=fields["severity"],
        message=fields["message"],
        hint=fields["help"],
        range=_read_range(fields["range"]),
        fixes=tuple(_read_fix(fix) for fix in fields["fixes"]),
        related=tuple(Related(_read_range(other["range"]), other["message"]) for other in fields["related"]),
        constant=fields["constant"],
        code=fields["code"],
    )


# ---- The source line with its caret ----


def _is_control(character: str) -> bool:
    return unicodedata.category(character) == "Cc"


def _printable(text: str) -> str:
    return "".join("\ufffd" if _is_control(c) and c != "\t" else c for c in text)


def _width(character: str) -> int:
    if unicodedata.category(character) in ("Mn", "Me", "Cf"):
        return 0
    return 2 if unicodedata.east_asian_width(character) in "WF" else 1


def _blanks_for(text: str) -> str:
    """Give as many columns of blanks as the text takes; tabs stay, so that they end at the same column."""
    return "".join("\t" if c == "\t" else " " * _width(c) for c in _printable(text))


def _decode(line: bytes) -> str:
    return line.decode("utf-8", "replace")


def _columns_of(line: bytes) -> int:
    """Give the most columns that a line can take: no character has more columns than bytes."""
    return len(line) + (_TAB_COLUMNS - 1) * line.count(b"\t")


def _cut(line: bytes, columns: int) -> bytes:
    """Give the start of a line that surely fits into so many columns, of whole characters."""
    end = min(len(line), columns)
    while _columns_of(line[:end]) > columns or (end < len(line) and line[end] & 0xC0 == 0x80):
        end -= 1
    return line[:end]


class _Excerpt(NamedTuple):
    before: bytes  # shown, in front of the place
    behind: bytes  # shown, from the place on
    is_cut_before: bool
    is_cut_behind: bool


def _start_within(line: bytes, place: int, columns: int) -> int:
    first = max(0, place - columns)
    while first < place and (_columns_of(line[first:place]) > columns or line[first] & 0xC0 == 0x80):
        first += 1
    return first


def _make_excerpt(line: bytes, place: int, room: int) -> _Excerpt:
    first = _start_within(line, place, room * 3 // 8) if _columns_of(line) > room else 0
    shown = _cut(line[first:], room)
    end = first + len(shown)
    return _Excerpt(line[first:place], line[place:end], first > 0, end < len(line))


def _word_at(rest: bytes, length: int) -> bytes:
    if length > 0:
        return rest[:length]
    return rest[: next((i for i, byte in enumerate(rest) if byte in _DELIMITERS), len(rest))]


def _source_lines(line: bytes, place: Place, length: int) -> List[str]:
    number = str(place.line).rjust(_LEAST_GUTTER)
    gutter = " " * len(number)
    excerpt = _make_excerpt(line, min(place.column - 1, len(line)), _COLUMNS - len(gutter) - 6)
    front = _ELLIPSIS if excerpt.is_cut_before else ""
    back = _ELLIPSIS if excerpt.is_cut_behind else ""
    shown = _printable(_decode(excerpt.before + excerpt.behind))
    marks = "^" + "~" * (max(1, len(_blanks_for(_decode(_word_at(excerpt.behind, length))))) - 1)
    blanks = _blanks_for(front) + _blanks_for(_decode(excerpt.before))
    return [f"{number} | {front}{shown}{back}", f"{gutter} | {blanks}{marks}"]


def _line_of(text: str, number: int) -> bytes:
    content = text.encode("utf-8", "surrogatepass")
    if content.startswith(_BYTE_ORDER_MARK):
        content = content[len(_BYTE_ORDER_MARK) :]
    lines = content.replace(b"\r\n", b"\n").replace(b"\r", b"\n").split(b"\n")
    return lines[number - 1] if number <= len(lines) else b""


def _place_lines(text: str, name: str, where: Optional[Range], kind: str, message: str) -> List[str]:
    if where is None:
        return [f"{_printable(name)}: {kind}: {message}"]
    start, end = where
    length = end.offset - start.offset if end.line == start.line else 0
    head = f"{_printable(name)}:{start.line}:{start.column}: {kind}: {message}"
    return [head, *_source_lines(_line_of(text, start.line), start, length)]


def format_diagnostic(diagnostic: Diagnostic, text: str, name: str) -> str:
    """Show a diagnostic of `text` as the tool does: place and message, the line with a caret, hint and constant."""
    line = diagnostic.range.start.line if diagnostic.range else 0
    gutter = " " * max(_LEAST_GUTTER, len(str(line)))
    lines = _place_lines(text, name, diagnostic.range, diagnostic.severity, diagnostic.message)
    if diagnostic.hint:
        lines.append(f"{gutter} = {diagnostic.hint}")
    if diagnostic.constant:
        lines.append(f"{gutter} = {diagnostic.constant} ({diagnostic.code})")
    for related in diagnostic.related:
        lines += _place_lines(text, name, related.range, "note", related.message)
    return "\n".join(lines)
