"""The classes, made from the description that the library gives of itself."""

import enum
import inspect
import json
import keyword

from . import _library as library
from ._failure import Failure
from ._library import Value
from ._values import put, take

description = json.loads(library.describe())
classes = {}

_NO_KEY = 5
_NO_POSITION = 9


class Object:
    """An object of the library. ``with`` closes it, as its end does."""

    __slots__ = ("_handle", "__weakref__")

    def __init__(self, *place):
        self._handle = 0
        value = Value()
        if code := library.create(self._class, value):
            raise library.refused(code)
        self._handle = value.object
        if place:
            self.connect(*place)

    def close(self):
        """Lets the object go. Any later use of it is a ValueError."""
        handle, self._handle = self._handle, 0
        library.release(Value(kind=library.OBJECT, object=handle))

    # Bound here, since the names of a module are gone when the interpreter ends.
    def __del__(self, _value=Value, _kind=library.OBJECT, _release=library.release):
        _release(_value(kind=_kind, object=self._handle))

    def __enter__(self):
        return self

    def __exit__(self, *failure):
        self.close()

    def __reduce__(self):
        raise TypeError("an object of the library can be neither copied nor pickled")

    def __repr__(self):
        name = f"qvsa.{type(self).__name__}"
        if not self._handle:
            return f"<{name}, closed>"
        shown = (f"{each}={getattr(self, each)!r}" for each in ("Id", "Name") if hasattr(type(self), each))
        return f"<{' '.join((name, *shown))}>"


class Collection(Object):
    """A collection: iterated over, and asked for its items by position, from 1, or by key."""

    __slots__ = ()

    def __iter__(self):
        walk, value = Value(), Value()
        if code := library.start_walk(self._handle, walk):
            raise library.refused(code)
        try:
            while True:
                if code := library.next_item(walk.object, value):
                    raise library.refused(code)
                if value.kind == library.EMPTY:
                    return
                yield _object(value, self._items)
        finally:
            library.release(walk)

    def __getitem__(self, index):
        try:
            item = self.Item(index)
        except Failure as failure:
            if failure.number not in (_NO_KEY, _NO_POSITION):
                raise
            item = None
        if item is None:
            raise (KeyError if isinstance(index, str) else IndexError)(index)
        return item

    def __contains__(self, index):
        try:
            self[index]
        except LookupError:
            return False
        return True


def _object(value, class_name):
    """The object in ``value``, or None."""
    if not value.object:
        return None
    cls = classes[class_name]
    taken = cls.__new__(cls)
    taken._handle = value.object
    return taken


def _rows(value):
    """The rows of a record set, the names of its columns first; None for a closed one."""
    rows = take(value)
    return rows if rows is None else [tuple(row) for row in rows]


def _is_class(type_name):
    return any(each["name"] == type_name for each in description["classes"])


def _taker(type_name):
    """What reads a value of a type, and releases it."""
    if _is_class(type_name):
        return lambda value: _object(value, type_name)
    return _rows if type_name == "Rows" else take


def _property(described):
    name = described["name"].encode()
    take_it = _taker(described["type"])
    none = library.OBJECT if _is_class(described["type"]) else library.NULL

    def read(self):
        value = Value()
        if code := library.get_property(self._handle, name, value):
            raise library.refused(code)
        return take_it(value)

    def write(self, content):
        value = Value()
        put(value, content, none)
        if code := library.set_property(self._handle, name, value):
            raise library.refused(code)

    return property(read if described["read"] else None, write if described["write"] else None)


class Parameter:
    """One argument of an operation."""

    def __init__(self, described):
        self.name = described["name"] + ("_" if keyword.iskeyword(described["name"]) else "")
        self.type = described["type"]
        self.by_reference = described["byReference"]
        self.default = described["default"]
        # What comes back need not be given.
        self.required = not described["optional"] and not self.by_reference


def _signature(parameters, can_fail):
    shown = [inspect.Parameter("self", inspect.Parameter.POSITIONAL_ONLY)]
    for each in parameters:
        default = inspect.Parameter.empty if each.required else each.default
        shown.append(inspect.Parameter(each.name, inspect.Parameter.POSITIONAL_OR_KEYWORD, default=default))
    if can_fail:
        shown.append(inspect.Parameter("check", inspect.Parameter.KEYWORD_ONLY, default=True))
    return inspect.Signature(shown)


def _operation(described, error_text):
    """``error_text`` is the property that holds the text of the last failure."""
    name, encoded = described["name"], described["name"].encode()
    parameters = [Parameter(each) for each in described["arguments"]]
    failures = described["failure"]
    places = {each.name: i for i, each in enumerate(parameters)}
    required = [each.name for each in parameters if each.required]
    nones = [library.NULL if each.required else library.EMPTY for each in parameters]
    come_back = [(i, _taker(each.type)) for i, each in enumerate(parameters) if each.by_reference]
    take_result = _taker(described["result"])
    count = len(parameters)
    Values = Value * count

    def operation(self, /, *given, check=True, **named):
        if len(given) > count:
            raise TypeError(f"{name}() takes {count} arguments, not {len(given)}")
        values = Values()
        for i, content in enumerate(given):
            put(values[i], content, nones[i])
        for key, content in named.items():
            i = places.get(key, -1)
            if i < len(given):
                raise TypeError(f"{name}() got {'an unknown argument' if i < 0 else 'two values for'} {key!r}")
            put(values[i], content, nones[i])
        if len(given) < len(required):
            for key in required[len(given) :]:
                if key not in named:
                    raise TypeError(f"{name}() misses the argument {key!r}")

        value = Value()
        if code := library.call(self._handle, encoded, values, count, value):
            raise library.refused(code)
        result = take_result(value)
        back = [take_it(values[i]) for i, take_it in come_back]
        if check and result in failures:
            raise Failure(self.errNumber, getattr(self, error_text))
        return (result, *back) if back else result

    operation.__name__ = name
    operation.__signature__ = _signature(parameters, bool(failures))
    return operation


def _class(described):
    properties = {each["name"]: _property(each) for each in described["properties"]}
    error_text = "errDesc" if "errDesc" in properties else "errDescription"
    operations = {each["name"]: _operation(each, error_text) for each in described["operations"]}
    own = {"__slots__": (), "__module__": "qvsa", "_class": described["name"].encode(), "_items": described["items"]}
    return type(described["name"], (Collection if described["items"] else Object,), own | properties | operations)


for _each in description["classes"]:
    classes[_each["name"]] = _class(_each)

enumerations = {
    each["name"]: enum.IntEnum(each["name"], {value["name"]: value["value"] for value in each["values"]}, module="qvsa")
    for each in description["enumerations"]
}
