"""Between the values of Python and those of the C interface."""

import ctypes
from datetime import date, datetime, time, timedelta

from . import _library as library
from ._library import Value

_DAY_ZERO = datetime(1899, 12, 30)
_DAY_MILLISECONDS = 86_400_000


def days_of(moment):
    """The days since 1899-12-30. Before that day the fraction still counts forward."""
    if isinstance(moment, time):
        moment = datetime.combine(_DAY_ZERO, moment)
    elif not isinstance(moment, datetime):
        moment = datetime.combine(moment, time())
    if moment.tzinfo is not None:
        raise TypeError("a date of the library has no time zone")
    since = moment - _DAY_ZERO
    fraction = (since.seconds + since.microseconds / 1e6) / 86_400
    return since.days + fraction if since.days >= 0 else since.days - fraction


def moment_of(days):
    """To the millisecond."""
    whole = int(days)
    return _DAY_ZERO + timedelta(days=whole, milliseconds=round(abs(days - whole) * _DAY_MILLISECONDS))


def _put_boolean(value, content):
    value.kind = library.BOOLEAN
    value.boolean = content


def _put_long(value, content):
    if not -(1 << 31) <= content < 1 << 31:
        raise OverflowError(f"{content} does not fit a Long")
    value.kind = library.LONG
    value.long = content


def _put_double(value, content):
    value.kind = library.DOUBLE
    value.double = content


def _put_date(value, content):
    value.kind = library.DATE
    value.double = days_of(content)


def _put_bytes(value, content):
    value.kind = library.BYTES
    value.given.data = bytes(content)
    value.given.length = len(content)


def _put_text(value, content):
    _put_bytes(value, content.encode())
    value.kind = library.TEXT


def _put_array(value, content):
    items = (Value * len(content))()
    for item, its_content in zip(items, content):
        put(item, its_content)
    value.kind = library.ARRAY
    value.given.data = ctypes.cast(items, ctypes.c_char_p)
    value.given.length = len(content)


# A bool is an int, and a datetime a date.
_PUT = {
    bool: _put_boolean,
    int: _put_long,
    float: _put_double,
    str: _put_text,
    datetime: _put_date,
    date: _put_date,
    time: _put_date,
    bytes: _put_bytes,
    bytearray: _put_bytes,
    list: _put_array,
    tuple: _put_array,
}


def put(value, content, none=library.NULL):
    """Puts ``content`` into ``value``; None as a value of kind ``none`` without content."""
    if content is None:
        value.kind = none
        return
    write = _PUT.get(type(content))
    if write is None:
        write = _writer_of(content)
    write(value, content)


def _put_object(value, content):
    value.kind = library.OBJECT
    value.object = content._handle


def _writer_of(content):
    """For an object of the library, and for the classes that are derived from those of the table."""
    if hasattr(content, "_handle"):
        return _put_object
    for known, write in _PUT.items():
        if isinstance(content, known):
            return write
    raise TypeError(f"the library has no value like {content!r}")


def _bytes_of(value):
    taken = value.taken
    return ctypes.string_at(taken.data, taken.length) if taken.length else b""


def _items_of(value):
    items = ctypes.cast(value.taken.data, ctypes.POINTER(Value))
    return [_READ[item.kind](item) for item in items[: value.taken.length]]


# By kind.
_READ = {
    library.EMPTY: lambda value: None,
    library.NULL: lambda value: None,
    library.BOOLEAN: lambda value: value.boolean != 0,
    library.INTEGER: lambda value: value.integer,
    library.LONG: lambda value: value.long,
    library.DOUBLE: lambda value: value.double,
    library.DATE: lambda value: moment_of(value.double),
    library.TEXT: lambda value: _bytes_of(value).decode(errors="replace"),
    library.BYTES: _bytes_of,
    library.ARRAY: _items_of,
}


def take(value):
    """What the library has put into ``value``, which is released."""
    content = _READ[value.kind](value)
    if value.owner:
        library.release(value)
    return content
