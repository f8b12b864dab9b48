"""A session to one generator: waveforms, scripts, generation, settings."""

from __future__ import annotations

import ctypes
import logging
import os
import sys
import time
import warnings
import weakref
from ctypes import byref, c_int16, c_uint8, c_uint32, c_uint64
from types import TracebackType
from typing import Any, Callable, Dict, FrozenSet, Generic, Iterator, List, Mapping, MutableMapping, NamedTuple, Optional
from typing import Set, Tuple, Type, TypeVar, Union, overload

from . import _loader, _names
from ._declarations import GENERATION, TOOLS, Status, Token, at_address
from ._errors import Error, ScriptError, SessionClosed, UnknownScript, UnknownWaveform
from ._offline import Program
from ._samples import Samples, WriteReport
from ._traits import Traits

_log = logging.getLogger("ktorba")

# Holds the elaboration of all but the longest texts; what does not fit is left out, never cut.
_ELABORATION_BYTES = 65536
_FROM_START = 0
_BYTE_ORDER_MARK = "\ufeff"
_KEYWORD, _NAME = 1, 2  # KTTOOLS_TOKEN_...
_SHORTEST_PAUSE_S, _LONGEST_PAUSE_S = 0.0002, 0.05
_GREATEST_TIMEOUT_MS = 2**31 - 1
_GREATEST_LENGTH = 2**32 - 1
DEFAULT_TIMEOUT_S = 10.0


class Waveform(NamedTuple):
    """What a session knows of one of its waveforms; the generator gives no samples back.

    Attributes
    ----------
    name : str
        As it was first given.
    length : int
        In samples.
    position : int
        Where the next write begins that says no other place; of the streaming waveform while it plays, counted round.
    """

    name: str
    length: int
    position: int


class _Script(NamedTuple):
    name: str
    text: str
    waveforms: FrozenSet[str]  # folded


class _Link:
    """The handle of an open session, its status record, and the right to use them."""

    def __init__(self) -> None:
        self.buffer = ctypes.create_string_buffer(_ELABORATION_BYTES)
        address = ctypes.cast(self.buffer, ctypes.c_char_p)
        self.status = Status(0, _ELABORATION_BYTES, None, address)
        self.handle: Optional[int] = None
        self.process = os.getpid()

    def call(self, function: Callable[..., Any], *arguments: Any) -> None:
        if self.handle is None:
            raise SessionClosed("the session is closed")
        if os.getpid() != self.process:
            raise SessionClosed("the session belongs to the process that opened it, not to its forked child")
        function(self.handle, *arguments, self.status)

    def close(self) -> None:
        """Close once; a forked child leaves the session to its parent."""
        handle, self.handle = self.handle, None
        if handle is not None and os.getpid() == self.process:
            GENERATION.ktORBA_CloseOrbaSession(handle, self.status)


def _integer(value: object, what: str, least: int, greatest: int) -> int:
    if isinstance(value, bool) or not hasattr(value, "__index__"):
        raise TypeError(f"{what} is a whole number, not {type(value).__name__}")
    number: int = value.__index__()
    if not least <= number <= greatest:
        raise ValueError(f"{what} is {number}, and goes from {least} to {greatest}")
    return number


def _milliseconds(timeout: Optional[float]) -> int:
    if timeout is None:
        return -1
    if not 0 <= timeout * 1000 <= _GREATEST_TIMEOUT_MS:
        raise ValueError(f"a time-out is 0 to {_GREATEST_TIMEOUT_MS // 1000} seconds, or None for none, not {timeout}")
    return int(timeout * 1000)


class Waveforms(MutableMapping[str, Any]):
    """The waveforms of a session, by name; letter case does not count.

    Assigning an array writes it; reading gives a `Waveform`: name, length and write position. The C interface lists
    nothing and reads nothing back, so this is the session's own record of what went through it.
    """

    def __init__(self, session: Session) -> None:
        self._session = weakref.ref(session)
        self._link = session._link
        self._width = session.sample_width
        self._known: Dict[str, Waveform] = {}
        # Names of which a write failed: the library may still have them, with any contents.
        self._doubtful: Set[str] = set()

    def __repr__(self) -> str:
        shown = ", ".join(f"{name} ({waveform.length})" for name, waveform in self.items())
        return f"<ktorba.Waveforms {shown or 'none'}>"

    def __len__(self) -> int:
        return len(self._known)

    def __iter__(self) -> Iterator[str]:
        return iter([waveform.name for waveform in self._known.values()])

    def __contains__(self, name: object) -> bool:
        return isinstance(name, str) and _names.fold(name) in self._known

    def __getitem__(self, name: str) -> Waveform:
        _names.encode(name)
        try:
            return self._known[_names.fold(name)]
        except KeyError:
            raise self._unknown(name) from None

    def __setitem__(self, name: str, data: object) -> None:
        self.assign(name, data)

    def __delitem__(self, name: str) -> None:
        content, known = _names.encode(name), self[name]
        self._forget(known.name)
        self._doubtful.add(_names.fold(name))
        self._link.call(GENERATION.ktORBA_ClearWaveform, content)
        self._doubtful.discard(_names.fold(name))

    def clear(self) -> None:
        """Give up all waveforms and, as the library does with them, all scripts."""
        self._owner()._forget_all()
        self._link.call(GENERATION.ktORBA_ClearAllWaveforms)

    def _unknown(self, name: str) -> UnknownWaveform:
        return UnknownWaveform(f"there is no waveform {name!r}. {_names.suggest(name, self)}")

    def _owner(self) -> Session:
        session = self._session()
        if session is None:
            raise SessionClosed("the session is gone")
        return session

    def _forget(self, name: str) -> None:
        self._known.pop(_names.fold(name), None)
        self._owner()._note_moved(_names.fold(name))

    def _clear_doubtful(self, name: str) -> None:
        if _names.fold(name) not in self._doubtful:
            return
        try:
            self._link.call(GENERATION.ktORBA_ClearWaveform, _names.encode(name))
        except UnknownWaveform:
            _log.debug("the library has no waveform %s any more", name)
        self._doubtful.discard(_names.fold(name))

    def allocate(self, name: str, length: int) -> Waveform:
        """Reserve memory for a waveform; its samples are undefined until written.

        Raises
        ------
        WaveformExists, InvalidName, WaveformError, MemoryFull
        """
        content = _names.encode(name)
        length = _integer(length, "a length", 0, _GREATEST_LENGTH)
        folded = _names.fold(name)
        self._clear_doubtful(name)
        if folded not in self._known:
            self._doubtful.add(folded)  # an interrupt may come between the library's record and this one
        self._link.call(GENERATION.ktORBA_AllocateWaveform, content, length)
        waveform = self._known[folded] = Waveform(name, length, 0)
        self._doubtful.discard(folded)
        self._owner()._note_moved(folded)
        return waveform

    def assign(self, name: str, data: object, timeout: Optional[float] = DEFAULT_TIMEOUT_S) -> WriteReport:
        """Write a whole waveform, as ``waveforms[name] = data`` does, and tell what became of the samples.

        A waveform of the same length is overwritten in its place. One of another length gets memory anew; scripts that
        name it are written again before they play.

        Parameters
        ----------
        name : str
        data : array_like
            Shape (n,). Integers are codes; floats fractions of full scale, clipped beyond ±1. A contiguous int16 array
            for a 16-bit generator, uint32 or int32 for a 32-bit one, is not copied.
        timeout : float or None
            Seconds, for each block of 2**20 samples; None for no limit.

        Raises
        ------
        TypeError, ValueError
            The array cannot be samples; nothing was sent.
        InvalidName, WaveformError, MemoryFull, WriteTimeout, DeviceError
            The record of the waveform is dropped; assign it anew.
        """
        _names.encode(name)
        samples, limit = Samples(data, self._width), _milliseconds(timeout)
        known = self._known.get(_names.fold(name))
        if known is not None and known.length != samples.count:
            del self[name]
            known = None
        if known is None:
            self.allocate(name, samples.count)
        return self._write(name, samples, 0, limit)

    def write(
        self, name: str, data: object, at: Optional[int] = None, timeout: Optional[float] = DEFAULT_TIMEOUT_S
    ) -> WriteReport:
        """Write part of a waveform.

        Parameters
        ----------
        name : str
            Of a waveform that exists.
        data : array_like
            As for `assign`.
        at : int, optional
            The first sample written; where the last write ended, when it is left out.
        timeout : float or None
            Seconds, for each block of 2**20 samples.

        Raises
        ------
        UnknownWaveform
            There is none; nothing was sent.
        TypeError, ValueError, WaveformError, WriteTimeout, DeviceError
            As for `assign`.
        """
        known = self[name]
        samples, limit = Samples(data, self._width), _milliseconds(timeout)
        first = None if at is None else _integer(at, "a position", 0, known.length)
        is_ring = self._owner()._is_streaming(name)
        begin = known.position if first is None else first
        if begin + samples.count > known.length and not is_ring:
            raise ValueError(
                f"{samples.count} samples from {begin} on pass the end of {known.name!r}, which has {known.length}"
            )
        return self._write(name, samples, first, limit)

    def _write(self, name: str, samples: Samples, at: Optional[int], limit_ms: int) -> WriteReport:
        """Write blocks; whatever ends it early, an interrupt too, leaves a session that can write the waveform anew."""
        content, known = _names.encode(name), self[name]
        try:
            if at is not None and at != known.position:
                self._link.call(GENERATION.ktORBA_SetWaveformNextWritePosition, content, at, _FROM_START)
            self._write_blocks(content, samples, limit_ms)
        except BaseException:
            self._forget(name)
            self._doubtful.add(_names.fold(name))
            raise
        end = (known.position if at is None else at) + samples.count
        position = end % known.length if self._owner()._is_streaming(name) else end
        self._known[_names.fold(name)] = known._replace(position=position)
        return samples.report()

    def _write_blocks(self, name: bytes, samples: Samples, limit_ms: int) -> None:
        is_narrow = self._width == 16
        function = GENERATION.ktORBA_WriteWaveformI16 if is_narrow else GENERATION.ktORBA_WriteWaveformU32
        kind = c_int16 if is_narrow else c_uint32
        for block in samples.blocks():
            first = at_address(kind, block.__array_interface__["data"][0])
            self._link.call(function, name, first, block.size, limit_ms)

    def _forget_everything(self) -> None:
        self._known.clear()
        self._doubtful.clear()


class Scripts(Mapping[str, str]):
    """The texts of a session's scripts, by name; letter case does not count. Written by `Session.write_script`."""

    def __init__(self, known: Dict[str, _Script]) -> None:
        self._known = known

    def __len__(self) -> int:
        return len(self._known)

    def __iter__(self) -> Iterator[str]:
        return iter([script.name for script in self._known.values()])

    def __getitem__(self, name: str) -> str:
        return find_script(self._known, name).text

    def __repr__(self) -> str:
        return f"<ktorba.Scripts {', '.join(self) or 'none'}>"


def find_script(known: Dict[str, _Script], name: str) -> _Script:
    """Give the script of a name, or raise `UnknownScript` with near misses."""
    _names.encode(name)
    if _names.fold(name) not in known:
        names = [script.name for script in known.values()]
        raise UnknownScript(f"there is no script {name!r}. {_names.suggest(name, names)}")
    return known[_names.fold(name)]


def _tokens_of(content: bytes) -> List[Tuple[int, int, bytes]]:
    """Give kind, offset and bytes of each token of a text."""
    tokens, count = ctypes.POINTER(Token)(), c_uint64()
    TOOLS.ktTools_Tokenize(content, len(content), byref(tokens), byref(count))
    try:
        found = [(token.kind, token.offset, token.length) for token in tokens[: count.value]]
    finally:
        TOOLS.ktTools_FreeTokens(tokens)
    return [(kind, offset, content[offset : offset + length]) for kind, offset, length in found]


def split_scripts(text: str) -> List[_Script]:
    """Split a text without errors into its scripts, each with the waveforms that it names."""
    content = text.encode()
    tokens = _tokens_of(content)
    is_start = [
        kind == _KEYWORD and word == b"script" and (index == 0 or tokens[index - 1][2] != b"end")
        for index, (kind, _, word) in enumerate(tokens)
    ]
    starts = [index for index, found in enumerate(is_start) if found]
    scripts = []
    for start, after in zip(starts, [*starts[1:], len(tokens)]):
        names = [word.decode() for kind, _, word in tokens[start + 1 : after] if kind == _NAME]
        end = tokens[after][1] if after < len(tokens) else len(content)
        part = content[tokens[start][1] : end].decode()
        scripts.append(_Script(names[0], part, frozenset(map(_names.fold, names[1:]))))
    return scripts


_First = TypeVar("_First", int, None)


class _Setting(Generic[_First]):
    """A setting as a property: what was set last, or what it is at first."""

    def __init__(self, function: str, greatest: int, first: _First, doc: str) -> None:
        self._function, self._greatest, self._first = function, greatest, first
        self.__doc__ = doc

    def __set_name__(self, owner: type, name: str) -> None:
        self._name = name

    @overload
    def __get__(self, session: None, owner: type) -> _Setting[_First]: ...

    @overload
    def __get__(self, session: Session, owner: type) -> Union[int, _First]: ...

    def __get__(self, session: Optional[Session], owner: type) -> Any:
        if session is None:
            return self
        return session._settings[self._name] if self._name in session._settings else self._first

    def __set__(self, session: Session, value: int) -> None:
        number = _integer(value, self._name, 0, self._greatest)
        session._link.call(getattr(GENERATION, self._function), number)
        session._settings[self._name] = number


class Session:
    """A session to one generator; `open` makes it, or `ktorba.simulator.Generator.open_session`.

    A context manager: leaving it closes the session, and so does `close`; closing twice is fine. One thread uses a
    session at a time; different sessions are independent. A session that is forgotten is closed with a
    `ResourceWarning`; at the process's end nothing is done. A forked child may not use its parent's sessions.
    """

    read_grant_time = _Setting("ktORBA_SetMemoryReadGrantTime", 65535, 60, "Reading's turn at memory, generator's unit.")
    write_grant_time = _Setting("ktORBA_SetMemoryWriteGrantTime", 65535, 30, "Writing's turn at memory, same unit.")
    priming_depth = _Setting(
        "ktORBA_SetPrimingDepth", _GREATEST_LENGTH, None, "Samples read ahead; None at first: 200 memory words."
    )
    download_fifo_depth = _Setting("ktORBA_SetDownloadFifoDepth", _GREATEST_LENGTH, 40960, "Bytes, at least.")

    def __init__(self, link: _Link, sample_width: int, traits: Optional[Traits], owner: object) -> None:
        self._link = link
        self.sample_width = sample_width
        self._traits = traits
        self._owner = owner  # a simulated generator lives as long as its sessions
        self._settings: Dict[str, int] = {}
        self._scripts: Dict[str, _Script] = {}
        self._stale: Set[str] = set()  # folded names of scripts whose waveforms have moved
        self._active: Optional[str] = None
        self._needs_selection = False  # the active script was written anew, and the generator has the older one
        self._streaming: Optional[str] = None
        self._waveforms = Waveforms(self)
        self._finalizer = weakref.finalize(self, link.close)
        self._finalizer.atexit = False

    @classmethod
    def open(
        cls, fpga_session: int, target: int, ifw_session: int, parent_context: int = 0, instance: int = 0, *,
        sample_width: int,
    ) -> Session:
        """Open a session to a generator of the hardware.

        Parameters
        ----------
        fpga_session, target, ifw_session : int
            The FPGA's session and the interface framework's target and session, opened by the program, which keeps
            them open as long as this one.
        parent_context : int
            Number of the context that the generator is a child of.
        instance : int
            Number of the generator among the parent's, 0 to 255.
        sample_width : int
            Bits of its samples, 16 or 32, which the library does not tell.

        Raises
        ------
        RuntimeError
            This process uses the simulated generator, which holds for the whole process.
        DeviceError, InternalError
            There is no such generator, or it has a session already.
        """
        if _loader.is_loaded("ktorba_simulator"):
            raise RuntimeError("this process uses the simulated generator: open hardware in a process of its own")
        return cls._open((fpga_session, target, ifw_session, parent_context, instance), sample_width, None, None)

    @classmethod
    def _open(cls, numbers: Tuple[int, ...], width: int, traits: Optional[Traits], owner: object) -> Session:
        if width not in (16, 32):
            raise ValueError(f"sample_width is {width}: samples have 16 or 32 bits")
        fpga, target, framework, parent = (_integer(value, "a number of a session", 0, 2**32 - 1) for value in numbers[:4])
        instance = _integer(numbers[4], "instance", 0, 255)
        link, handle = _Link(), c_uint32()
        GENERATION.ktORBA_OpenOrbaSession(
            fpga, target, framework, c_uint32(parent), instance, byref(handle), link.status
        )
        link.handle = handle.value
        return cls(link, width, traits, owner)

    # ---- Life ----

    def __enter__(self) -> Session:
        self._link.call(lambda *_: None)
        return self

    def __exit__(
        self, kind: Optional[Type[BaseException]], error: Optional[BaseException], trace: Optional[TracebackType]
    ) -> None:
        self.close()

    def close(self) -> None:
        """Close the session; its waveforms and scripts are gone. The generator goes on if it was generating."""
        self._finalizer.detach()
        self._link.close()

    @property
    def closed(self) -> bool:
        """Whether it has been closed."""
        return self._link.handle is None

    def __del__(self) -> None:
        link = getattr(self, "_link", None)
        if link is None or link.handle is None or link.process != os.getpid() or sys.is_finalizing():
            return
        warnings.warn(f"session {link.handle} was not closed", ResourceWarning, source=self)

    def __reduce__(self) -> Tuple[Any, ...]:
        raise TypeError("a session cannot be pickled: it drives a generator from this process. Programs can be")

    def __repr__(self) -> str:
        return "<ktorba.Session, closed>" if self.closed else f"<ktorba.Session {self._link.handle}>"

    # ---- Waveforms and scripts ----

    @property
    def waveforms(self) -> Waveforms:
        """The waveforms, by name: ``session.waveforms["pulse"] = array``."""
        return self._waveforms

    @property
    def memory_size(self) -> int:
        """The size of sample memory as the library tells it: its bytes by one more than those of a memory word."""
        size = c_uint64()
        self._link.call(GENERATION.ktORBA_GetWaveformMemorySize, byref(size))
        return size.value

    @property
    def scripts(self) -> Scripts:
        """The texts of the scripts, by name."""
        return Scripts(self._scripts)

    def write_script(self, text: str) -> Tuple[str, ...]:
        """Compile the scripts of a text and keep each under its name; gives the names.

        Raises
        ------
        ScriptError
            The text has errors, or does not fit the waveforms. Scripts of the text before the one that does not fit
            are kept, as the library keeps them.
        UnknownWaveform
            A script names a waveform that there is not.
        """
        content = _names.encode(text, "a script text")
        if text.startswith(_BYTE_ORDER_MARK):  # editors put it there; the tools pass over it, the library does not
            return self.write_script(text[1:])
        try:
            self._link.call(GENERATION.ktORBA_WriteScript, content)
        except (ScriptError, UnknownWaveform) as error:
            self._keep_those_before(text, error)
            raise self._explain(error, text) from None
        scripts = split_scripts(text)
        for script in scripts:
            self._keep(script)
        return tuple(script.name for script in scripts)

    def _keep(self, script: _Script) -> None:
        self._scripts[_names.fold(script.name)] = script
        self._stale.discard(_names.fold(script.name))
        if self._active is not None and _names.fold(self._active) == _names.fold(script.name):
            self._needs_selection = True

    def _keep_those_before(self, text: str, error: Error) -> None:
        """Find out which scripts the library has kept, by writing them singly up to the one that it refuses."""
        if error.constant.startswith("ktwfmscriptcompiler"):
            return  # none
        for script in split_scripts(text):
            try:
                self._link.call(GENERATION.ktORBA_WriteScript, script.text.encode())
            except Error:
                return
            self._keep(script)

    def _explain(self, error: Error, text: str) -> Error:
        """Give the error in the tools' words, which show the place, where they find the same fault; else as it is."""
        try:
            self._compile(text, self._traits or Traits(sample_width=self.sample_width))
        except ScriptError as found:
            if found.code != error.code:
                return error
            if isinstance(error, ScriptError):
                return ScriptError.of(found.diagnostics, text, "script", error)
            return type(error)(found.message, error.code, error.constant, error.elaboration)
        except Error:
            _log.debug("the tools have no words for %s", error.constant)
        return error

    def _compile(self, text: str, traits: Traits) -> Program:
        lengths = {waveform.name: waveform.length for waveform in self._waveforms.values()}
        return Program(text, lengths, traits)

    def delete_script(self, name: str) -> None:
        """Forget a script; when it was the active one, none is active then.

        Raises
        ------
        UnknownScript
        """
        script = find_script(self._scripts, name)
        self._link.call(GENERATION.ktORBA_DeleteScript, script.name.encode())
        del self._scripts[_names.fold(name)]
        if self._active == script.name:
            self._active = None

    @property
    def active_script(self) -> Optional[str]:
        """The script that generation runs; None for none. Setting it sends the script to the generator."""
        return self._active

    @active_script.setter
    def active_script(self, name: Optional[str]) -> None:
        if name is None:
            self._link.call(GENERATION.ktORBA_SelectActiveScript, None)
            self._active = None
            return
        script = find_script(self._scripts, name)
        self._refresh(script)
        self._link.call(GENERATION.ktORBA_SelectActiveScript, script.name.encode())
        self._active, self._needs_selection = script.name, False

    def _refresh(self, script: _Script) -> None:
        """Write a script again whose waveforms have moved: it would play the memory that they had."""
        if _names.fold(script.name) in self._stale:
            self.write_script(script.text)

    def _note_moved(self, waveform: str) -> None:
        self._stale.update(folded for folded, script in self._scripts.items() if waveform in script.waveforms)

    def _is_streaming(self, name: str) -> bool:
        return self._streaming is not None and _names.fold(self._streaming) == _names.fold(name)

    def _forget_all(self) -> None:
        self._waveforms._forget_everything()
        self._scripts.clear()
        self._stale.clear()
        self._active = self._streaming = None

    def reset(self) -> None:
        """Reset the generator and the download FIFO, and give up all scripts and waveforms; settings stay."""
        streaming = self._streaming
        self._link.call(GENERATION.ktORBA_Reset)
        self._forget_all()
        if streaming is not None:  # the library keeps the name, and would refuse every setting for want of the waveform
            self.streaming_waveform = None

    # ---- Generation ----

    def start(self) -> None:
        """Start the active script and return at once; scripts whose waveforms have moved are written again first.

        Raises
        ------
        StateError
            No script is active.
        ScriptError, UnknownWaveform
            The active script no longer fits its waveforms.
        """
        if self._active is not None:
            is_stale = _names.fold(self._active) in self._stale
            if is_stale or self._needs_selection:
                self.active_script = self._active
        self._link.call(GENERATION.ktORBA_StartGeneration)

    def abort(self) -> None:
        """Stop generation; harmless when none runs."""
        self._link.call(GENERATION.ktORBA_AbortGeneration)

    @property
    def is_done(self) -> bool:
        """Whether generation has come to its end.

        Raises
        ------
        Underflow
            The generator ran out of data.
        """
        done = c_uint8()
        self._link.call(GENERATION.ktORBA_CheckGenerationStatus, byref(done))
        return bool(done.value)

    def _is_endless(self) -> bool:
        if self._active is None:
            return False
        traits = self._traits or Traits(self.sample_width, memory_size_bytes=2**32 - 64, sequence_words=2**20)
        try:
            program = self._compile(self._scripts[_names.fold(self._active)].text, traits)
            return program.timeline().length.kind == "endless"
        except Error:
            return False

    def wait(self, timeout: Optional[float] = None) -> None:
        """Wait until generation is done; an interrupt ends the wait at once.

        Parameters
        ----------
        timeout : float, optional
            Seconds; without it as long as it takes, which a script that never ends refuses.

        Raises
        ------
        TimeoutError
            It was not done in that time; generation goes on.
        ValueError
            The active script never ends, and there is no time-out.
        Underflow, DeviceError
        """
        if timeout is not None and not timeout >= 0:
            raise ValueError(f"a time-out is 0 seconds or more, or None for none, not {timeout}")
        if timeout is None and self._is_endless():
            raise ValueError(f"script {self._active!r} never ends: give a time-out, or abort")
        limit = None if timeout is None else time.monotonic() + timeout
        pause = _SHORTEST_PAUSE_S
        while not self.is_done:
            left = pause if limit is None else limit - time.monotonic()
            if left <= 0:
                raise TimeoutError(f"generation was not done within {timeout} s")
            time.sleep(min(pause, left))
            pause = min(2 * pause, _LONGEST_PAUSE_S)

    # ---- Settings ----

    @property
    def chunk_size(self) -> int:
        """Bytes of the largest piece in which a write hands samples on, 1 to 2**32 - 1; 32768 at first."""
        return self._settings.get("chunk_size", 32768)

    @chunk_size.setter
    def chunk_size(self, value: int) -> None:
        number = _integer(value, "chunk_size", 1, _GREATEST_LENGTH)  # with 0 no write would ever end well
        self._link.call(GENERATION.ktORBA_SetWaveformWriteChunkSize, number)
        self._settings["chunk_size"] = number

    @property
    def streaming_waveform(self) -> Optional[str]:
        """The waveform that is written on, circularly, while it plays; None for none."""
        return self._streaming

    @streaming_waveform.setter
    def streaming_waveform(self, name: Optional[str]) -> None:
        content = b"" if name is None else self._waveforms[name].name.encode()
        self._link.call(GENERATION.ktORBA_ConfigureStreamingWaveform, content)
        self._streaming = name

    @property
    def streaming_space(self) -> int:
        """Samples that can be written to the streaming waveform now without overtaking what plays."""
        space = c_uint64()
        self._link.call(GENERATION.ktORBA_CheckStreamingWaveformSpace, byref(space))
        return space.value
