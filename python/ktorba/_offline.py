"""What is known of scripts without a generator: checks, programs, and what plays when."""

from __future__ import annotations

import ctypes
import json
import weakref
from typing import TYPE_CHECKING, Any, Callable, Dict, Iterator, List, Mapping, NamedTuple, Optional, Tuple, Union

from . import _names
from ._declarations import TOOLS, Document, ProgramObject, read_document
from ._diagnostics import Diagnostic, read_diagnostic
from ._errors import ScriptError, ToolsError
from ._samples import Samples
from ._timeline import Timeline, TriggersLike
from ._traits import Traits

if TYPE_CHECKING:
    import numpy.typing as npt

    Array = npt.NDArray[Any]

WaveformsLike = Mapping[str, Any]

_SCRIPT_IS_WRONG = -71004


class Instruction(NamedTuple):
    """One instruction of a script, in words.

    Attributes
    ----------
    address : int
        In sequence memory, from 0.
    meaning : str
    samples, memory_words : int
        What one pass plays, and reads.
    line, column : int
        Of what it was made from, from 1, the column in bytes.
    """

    address: int
    meaning: str
    samples: int
    memory_words: int
    line: int
    column: int


class ScriptDifference(NamedTuple):
    """How the scripts of one name play in two programs.

    Attributes
    ----------
    name : str
    same : bool
    whole : bool
        False: only the first 2**64 samples were compared.
    kind : str or None
        How they differ: ``"level"``, ``"markers"``, ``"triggers"``, ``"end"`` or ``"missing"``.
    sample : int or None
        The first sample at which they do.
    first, second : str or None
        What the one and the other does there.
    """

    name: str
    same: bool
    whole: bool
    kind: Optional[str]
    sample: Optional[int]
    first: Optional[str]
    second: Optional[str]


class Difference(NamedTuple):
    """Whether two programs play the same, script by script."""

    same: bool
    scripts: Tuple[ScriptDifference, ...]


def _diagnostics(document: Mapping[str, Any]) -> Tuple[Diagnostic, ...]:
    return tuple(read_diagnostic(fields) for fields in document["diagnostics"])


def _call(function: Callable[..., Any], *arguments: Any) -> Dict[str, Any]:
    document = Document()
    function(*arguments, document)
    return json.loads(read_document(document))  # type: ignore[no-any-return]


def _raise_script_error(error: ToolsError, text: str, name: str) -> None:
    if error.code == _SCRIPT_IS_WRONG:
        raise ScriptError.of(_diagnostics(error.elaboration), text, name) from None
    raise error


def _encode_text(text: object) -> bytes:
    if not isinstance(text, str):
        raise TypeError(f"a script text is a str, not {type(text).__name__}")
    return text.encode()


def check(text: str, generator: Optional[Traits] = None, *, name: str = "script") -> Tuple[Diagnostic, ...]:
    """Check the scripts of a text by themselves, without their waveforms.

    Parameters
    ----------
    text : str
    generator : Traits, optional
        For whom; the default one where it is left out.
    name : str
        What messages call the text.

    Returns
    -------
    tuple of Diagnostic
        Warnings, in the order of the text.

    Raises
    ------
    ScriptError
        The text has errors; its `diagnostics` are all of them.
    ToolsError
        No generator can be as `generator` says.
    """
    content, traits = _encode_text(text), (generator or Traits()).to_json()
    found = _diagnostics(_call(TOOLS.ktTools_Check, content, len(content), traits, len(traits)))
    if any(diagnostic.severity == "error" for diagnostic in found):
        raise ScriptError.of(found, text, name)
    return found


def _is_length(waveform: object) -> bool:
    return isinstance(waveform, int) and not isinstance(waveform, bool)


def _length_of(waveform: Any) -> int:
    return waveform if _is_length(waveform) else waveform.size  # type: ignore[no-any-return]


def _take_waveforms(waveforms: WaveformsLike, width: int) -> Dict[str, Any]:
    for name in waveforms:
        _names.encode(name, "a waveform's name")
    return {name: data if _is_length(data) else Samples(data, width).whole() for name, data in waveforms.items()}


def _describe_waveforms(waveforms: Mapping[str, Any]) -> bytes:
    return json.dumps([{"name": name, "samples": _length_of(data)} for name, data in waveforms.items()]).encode()


def fit(text: str, waveforms: WaveformsLike, generator: Optional[Traits] = None, *, name: str = "script") -> Dict[str, Any]:
    """Tell whether scripts and waveforms fit a generator, and by how much: the document of ``ktorba fit --format json``.

    Parameters
    ----------
    text : str
    waveforms : mapping of str to int or array_like
        Their lengths in samples, or their samples.
    generator : Traits, optional
    name : str
        What messages call the text.

    Returns
    -------
    dict
        ``fits``, ``waveforms``, ``memoryBytes``, ``largestFreeBytes``, ``scripts``, ``diagnostics``; see
        <ktorba/script_tools.h>.

    Raises
    ------
    ScriptError
        The text has errors.
    """
    generator = generator or Traits()
    content, traits = _encode_text(text), generator.to_json()
    lengths = _describe_waveforms(_take_waveforms(waveforms, generator.sample_width))
    try:
        return _call(TOOLS.ktTools_Fit, content, len(content), traits, len(traits), lengths, len(lengths), None, 0)
    except ToolsError as error:
        _raise_script_error(error, text, name)
        raise


class _ProgramHandle:
    """Owns a program of the library's, and keeps alive the samples that it was lent."""

    def __init__(self, pointer: Any, arrays: Mapping[str, Any]) -> None:
        self.pointer = pointer
        self.arrays = arrays
        weakref.finalize(self, _free_program, pointer, arrays).atexit = False

    def lend(self) -> None:
        for name, array in self.arrays.items():
            content = name.encode()
            TOOLS.ktTools_LendSamples(self.pointer, content, len(content), array.ctypes.data, array.size)


def _free_program(pointer: Any, arrays: Mapping[str, Any]) -> None:
    TOOLS.ktTools_FreeProgram(pointer)


class _Words:
    """Shows a script's words to NumPy where they lie; the array that is made of it keeps it, and it the program."""

    def __init__(self, owner: _ProgramHandle, address: int, count: int) -> None:
        self.owner = owner
        self.__array_interface__ = {
            "version": 3,
            "shape": (count,),
            "typestr": "|V16",
            "descr": [(f"word{index}", "<u4") for index in range(4)],
            "data": (address, True),
        }


class CompiledScript:
    """One script of a program: ``program["name"]``."""

    def __init__(self, program: Program, index: int) -> None:
        self._program = program
        self._index = index

    def __reduce__(self) -> Tuple[Any, ...]:
        return CompiledScript, (self._program, self._index)

    def __repr__(self) -> str:
        return f"<ktorba.CompiledScript {self.name!r}, {len(self.words)} instructions>"

    @property
    def name(self) -> str:
        """Its name, as the text has it."""
        return self._program.scripts[self._index]

    @property
    def words(self) -> Array:
        """The instructions: shape (n,), fields ``word0`` (lowest) to ``word3``, read-only, in the program's memory."""
        import numpy as np

        words, count = ctypes.POINTER(ctypes.c_uint32)(), ctypes.c_uint64()
        handle = self._program._handle
        TOOLS.ktTools_Words(handle.pointer, self._index, ctypes.byref(words), ctypes.byref(count))
        address = ctypes.cast(words, ctypes.c_void_p).value or 0
        return np.asarray(_Words(handle, address, count.value))

    @property
    def listing(self) -> Tuple[Instruction, ...]:
        """The instructions in words, by address."""
        document = _call(TOOLS.ktTools_List, self._program._handle.pointer, self._index)
        return tuple(
            Instruction(address, one["meaning"], one["samples"], one["memoryWords"], one["line"], one["column"])
            for address, one in enumerate(document["instructions"])
        )

    def timeline(self, triggers: TriggersLike = ()) -> Timeline:
        """Compute what plays when.

        Parameters
        ----------
        triggers : iterable of (int, int)
            The sample at which a trigger is raised, and which, 1 to 7; in any order.
        """
        return Timeline(self._program, self._index, triggers)


class Program:
    """Scripts compiled for a generator, their waveforms placed in its memory; made by `compile`.

    `words`, `listing` and `timeline` are those of the only script; of several, ``program["name"]`` chooses. A program
    is a value: it can be pickled, and nothing changes it.
    """

    def __init__(self, text: str, waveforms: WaveformsLike, generator: Optional[Traits] = None, name: str = "script"):
        self.text = text
        self.name = name
        self.generator = generator or Traits()
        self._waveforms = _take_waveforms(waveforms, self.generator.sample_width)
        self._handle, self.warnings = self._compile()
        self.scripts = tuple(self._read_name(index) for index in range(TOOLS.ktTools_ScriptCount(self._handle.pointer)))

    def _compile(self) -> Tuple[_ProgramHandle, Tuple[Diagnostic, ...]]:
        pointer = ctypes.POINTER(ProgramObject)()
        content, traits = _encode_text(self.text), self.generator.to_json()
        lengths = _describe_waveforms(self._waveforms)
        texts = (content, len(content), traits, len(traits), lengths, len(lengths))
        try:
            document = _call(TOOLS.ktTools_Compile, *texts, ctypes.byref(pointer))
        except ToolsError as error:
            _raise_script_error(error, self.text, self.name)
            raise
        arrays = {name: data for name, data in self._waveforms.items() if not _is_length(data)}
        handle = _ProgramHandle(pointer, arrays)
        handle.lend()
        return handle, _diagnostics(document)

    def _read_name(self, index: int) -> str:
        return str(_call(TOOLS.ktTools_List, self._handle.pointer, index)["name"])

    def __reduce__(self) -> Tuple[Any, ...]:
        return Program, (self.text, self._waveforms, self.generator, self.name)

    def __repr__(self) -> str:
        return f"<ktorba.Program of {', '.join(self.scripts)}>"

    def __len__(self) -> int:
        return len(self.scripts)

    def __iter__(self) -> Iterator[CompiledScript]:
        return (CompiledScript(self, index) for index in range(len(self.scripts)))

    def __getitem__(self, script: Union[str, int]) -> CompiledScript:
        if isinstance(script, int):
            return CompiledScript(self, range(len(self.scripts))[script])
        folded = [_names.fold(name) for name in self.scripts]
        if _names.fold(script) not in folded:
            raise KeyError(f"there is no script {script!r}. {_names.suggest(script, self.scripts)}")
        return CompiledScript(self, folded.index(_names.fold(script)))

    def _only(self) -> CompiledScript:
        if len(self.scripts) != 1:
            raise ValueError(f"the program has the scripts {', '.join(self.scripts)}: say which, program[name]")
        return CompiledScript(self, 0)

    @property
    def waveforms(self) -> Dict[str, int]:
        """The lengths of the waveforms that it was compiled with, in samples."""
        return {name: _length_of(data) for name, data in self._waveforms.items()}

    @property
    def words(self) -> Array:
        """Those of the only script; see `CompiledScript.words`."""
        return self._only().words

    @property
    def listing(self) -> Tuple[Instruction, ...]:
        """That of the only script; see `CompiledScript.listing`."""
        return self._only().listing

    @property
    def fit(self) -> Dict[str, Any]:
        """Whether it fits the generator, and by how much; see `fit`."""
        return fit(self.text, self.waveforms, self.generator, name=self.name)

    def timeline(self, triggers: TriggersLike = ()) -> Timeline:
        """Compute what the only script plays; see `CompiledScript.timeline`."""
        return self._only().timeline(triggers)


def compile(
    text: str, waveforms: WaveformsLike, generator: Optional[Traits] = None, *, name: str = "script"
) -> Program:
    """Compile the scripts of a text and place the waveforms that they play.

    Parameters
    ----------
    text : str
    waveforms : mapping of str to int or array_like
        Lengths in samples, or samples: integers are codes, floats fractions of full scale. Samples are copied; without
        them a program has no levels: `Timeline.samples`, `Timeline.envelope` and `diff` want them.
    generator : Traits, optional
        For which; the default one where it is left out.
    name : str
        What messages call the text.

    Returns
    -------
    Program

    Raises
    ------
    ScriptError
        The text has errors, or does not fit the waveforms.
    TypeError, ValueError
        A waveform cannot be samples.
    """
    return Program(text, waveforms, generator, name)


def _message_of(side: Optional[Mapping[str, Any]]) -> Optional[str]:
    return None if side is None else str(side["message"])


def _read_difference(script: Mapping[str, Any]) -> ScriptDifference:
    found = script["difference"] or {"kind": None, "sample": None, "first": None, "second": None}
    sample = None if found["sample"] is None else int(found["sample"])
    sides: List[Optional[str]] = [_message_of(found["first"]), _message_of(found["second"])]
    return ScriptDifference(script["name"], script["same"], script["whole"], found["kind"], sample, sides[0], sides[1])


def diff(first: Program, second: Program, script: str = "") -> Difference:
    """Tell whether two programs for generators of one width play the same, whatever triggers come.

    Parameters
    ----------
    first, second : Program
        Compiled with the samples of the waveforms that play.
    script : str
        Compares only the scripts of this name; all, where it is empty.

    Raises
    ------
    ToolsError
        Samples are missing, or the widths differ.
    """
    content = _names.encode(script)
    pointers = (first._handle.pointer, second._handle.pointer)
    document = _call(TOOLS.ktTools_Compare, *pointers, content, len(content))
    return Difference(document["same"], tuple(_read_difference(one) for one in document["scripts"]))
