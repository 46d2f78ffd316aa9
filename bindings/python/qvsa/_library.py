"""The C interface, as qvsa.h tells it: what a value looks like, and the calls."""

import ctypes
import os
from pathlib import Path

from ._failure import Failure

EMPTY, NULL, BOOLEAN, INTEGER, LONG, DOUBLE, DATE, TEXT, BYTES, OBJECT, ARRAY = range(11)

_NAME = "libqvsa.so.0"


class _Given(ctypes.Structure):
    """A text or bytes of ours, which stay alive as long as the value does."""

    _fields_ = [("data", ctypes.c_char_p), ("length", ctypes.c_size_t)]


class _Taken(ctypes.Structure):
    """A text, bytes or array of the library's."""

    _fields_ = [("data", ctypes.c_void_p), ("length", ctypes.c_size_t)]


class _Content(ctypes.Union):
    _fields_ = [
        ("boolean", ctypes.c_int32),
        ("integer", ctypes.c_int16),
        ("long", ctypes.c_int32),
        ("double", ctypes.c_double),
        ("given", _Given),
        ("taken", _Taken),
        ("object", ctypes.c_uint64),
    ]


class Value(ctypes.Structure):
    _anonymous_ = ("content",)
    _fields_ = [("kind", ctypes.c_int32), ("owner", ctypes.c_uint64), ("content", _Content)]


def _load():
    """QVSA_LIBRARY where it is set, else the library beside this package, else the system's."""
    beside = Path(__file__).parent / _NAME
    return ctypes.CDLL(os.environ.get("QVSA_LIBRARY") or (str(beside) if beside.exists() else _NAME))


_library = _load()
_value = ctypes.POINTER(Value)


def _function(name, result, *arguments):
    function = getattr(_library, name)
    function.restype = result
    function.argtypes = arguments
    return function


create = _function("qvsa_create", ctypes.c_int, ctypes.c_char_p, _value)
release = _function("qvsa_release", ctypes.c_int, _value)
get_property = _function("qvsa_get", ctypes.c_int, ctypes.c_uint64, ctypes.c_char_p, _value)
set_property = _function("qvsa_set", ctypes.c_int, ctypes.c_uint64, ctypes.c_char_p, _value)
call = _function("qvsa_call", ctypes.c_int, ctypes.c_uint64, ctypes.c_char_p, _value, ctypes.c_size_t, _value)
start_walk = _function("qvsa_enumerate", ctypes.c_int, ctypes.c_uint64, _value)
next_item = _function("qvsa_next", ctypes.c_int, ctypes.c_uint64, _value)
describe = _function("qvsa_describe", ctypes.c_char_p)
version = _function("qvsa_version", ctypes.c_char_p)
_error_text = _function("qvsa_error_text", ctypes.c_char_p)
_error_number = _function("qvsa_error_number", ctypes.c_int32)

_RAISED = -8
_EXCEPTIONS = {-3: AttributeError, -4: TypeError, -5: TypeError, -6: ValueError, -7: RuntimeError}


def refused(code):
    """The exception for a call that could not be made."""
    text = _error_text().decode()
    if code == _RAISED:
        return Failure(_error_number(), text)
    return _EXCEPTIONS.get(code, RuntimeError)(text)
