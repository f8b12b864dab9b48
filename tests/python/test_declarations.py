"""Holds the package's declarations against the C headers, and its table of errors against the library's."""

import ctypes
import re
import subprocess
import sys

import pytest
from conftest import ROOT
from ktorba import _declarations, _errors, _version

HEADERS = ROOT / "include" / "ktorba"
SCALARS = {name: getattr(ctypes, "c_" + name[:-2]) for name in
           ("uint8_t", "int16_t", "uint16_t", "int32_t", "uint32_t", "uint64_t")}
SCALARS.update({"void": None, "double": ctypes.c_double, "ktorba_bool": ctypes.c_bool, "char": ctypes.c_char})
RECORDS = {"tStatus": "Status", "ktSim_Fpga": "Fpga", "ktSim_Traits": "SimulatedTraits",
           "ktSim_TraceEntry": "TraceEntry", "ktSim_State": "SimulatedState", "ktSim_Counters": "SimulatedCounters",
           "ktSim_DeviceFault": "DeviceFault", "ktTools_Document": "Document", "ktTools_Token": "Token",
           "ktTools_Trigger": "Trigger", "ktTools_Length": "Length", "ktTools_Run": "Run",
           "ktTools_Program": "ProgramObject", "ktTools_Timeline": "TimelineObject"}
# ktTools_FreeDocument wants the address that the library gave; a text would be a copy.
ADDRESSES = {("ktTools_Document", "text")}


def read_header(name):
    text = re.sub(r"/\*.*?\*/", " ", (HEADERS / name).read_text(), flags=re.S)
    return re.sub(r"^#(?:.*\\\n)*.*$", "", text, flags=re.M)


def ctype_of(text):
    """The ctypes type of a C type: texts and untyped memory by ctypes' own types, all else by pointers."""
    text = text.replace("const", " ").replace(" ", "")
    base, stars = text.rstrip("*"), len(text) - len(text.rstrip("*"))
    if base == "ktSim_OutputCallback":
        return ctypes.c_void_p
    kind = getattr(_declarations, RECORDS[base]) if base in RECORDS else SCALARS[base]
    if stars and base in ("void", "char"):
        kind, stars = (ctypes.c_void_p if base == "void" else ctypes.c_char_p), stars - 1
    for _ in range(stars):
        kind = ctypes.POINTER(kind)
    return kind


def split_declarator(text):
    """("const char*", "name", "160") of "const char* name[160]"."""
    return re.fullmatch(r"\s*(.*?[\s*])(\w+)(?:\[(\d+)\])?\s*", text, re.S).groups()


def functions_of(header):
    text = re.sub(r"\{[^{}]*\}", "", read_header(header).replace('extern "C" {', ""))
    for result, name, arguments in re.findall(r"([\w ]+?[\s*]+)(\w+)\(((?:[^()])*)\);", text):
        if "typedef" in result:
            continue
        types = [split_declarator(argument)[0] for argument in arguments.split(",")] if arguments != "void" else []
        yield name, ctype_of(re.sub(r"KT\w+_API", "", result.strip())), [ctype_of(kind) for kind in types]


@pytest.mark.parametrize("header", _declarations.INTERFACES)
def test_functions_are_those_of_the_header(header):
    declared = _declarations.INTERFACES[header].functions
    read = {name: (result, arguments) for name, result, arguments in functions_of(header)}
    assert len(read) >= 23
    assert {name: (function.result, function.arguments) for name, function in declared.items()} == read


@pytest.mark.parametrize("header", _declarations.INTERFACES)
def test_every_code_is_checked(header):
    unchecked = {name for name, function in _declarations.INTERFACES[header].functions.items()
                 if function.result is ctypes.c_int32 and function.check is None}
    assert not unchecked


def test_records_are_those_of_the_headers():
    text = "".join(read_header(header) for header in _declarations.INTERFACES)
    bodies = dict(re.findall(r"struct (\w+) \{(.*?)^\}", text, re.S | re.M))
    assert set(bodies) == set(RECORDS) - {"ktTools_Program", "ktTools_Timeline"}
    for name, body in bodies.items():
        body = re.sub(r"ktorba_bool \(\*(\w+)\)\([^)]*\)", r"void* \1", body)
        fields = []
        for declarator in filter(str.strip, body.split(";")):
            kind, field, count = split_declarator(declarator)
            kind = ctypes.c_void_p if (name, field) in ADDRESSES else ctype_of(kind)
            fields.append((field, kind * int(count) if count else kind))
        assert getattr(_declarations, RECORDS[name])._fields_ == fields, name


def test_constants_are_those_of_the_header():
    text = (HEADERS / "ktorba.h").read_text()
    assert ".".join(re.findall(r"#define KTORBA_VERSION_\w+ (\d+)", text)) == _version.VERSION


def test_every_error_has_a_class():
    names = re.findall(r"^  \w+?_(k[A-Z]\w*) = -?\d+,? /\*", (HEADERS / "error_codes.h").read_text(), re.M)
    assert set(names) == set(_errors.CLASS_BY_NAME)


def test_import_is_light():
    check = ("import sys; import ktorba; "
             "sys.exit(sorted({'numpy', 'matplotlib', 'asyncio'} & set(sys.modules)) or None)")
    subprocess.run([sys.executable, "-B", "-c", check], check=True, env={"PYTHONPATH": str(ROOT / "python")})
