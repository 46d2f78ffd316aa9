"""Writes the types of the package: ``python3 -m qvsa.stubs > bindings/python/qvsa/__init__.pyi``."""

from ._classes import Parameter, description

_HEAD = '''# Written by `python3 -m qvsa.stubs` from the description that the library gives of itself.
# An operation that gives an object gives None for no object, where that is no failure or was not to be checked.
from collections.abc import Iterator
from datetime import date, datetime, time
from enum import IntEnum
from types import TracebackType
from typing import Never, Self

Value = None | bool | int | float | str | bytes | datetime
Moment = date | time

NO_DATE: datetime
__version__: str

class Failure(Exception):
    number: int
    text: str
    def __init__(self, number: int, text: str) -> None: ...

def number(value: int) -> int: ...

class Object:
    def close(self) -> None: ...
    def __enter__(self) -> Self: ...
    def __exit__(
        self, kind: type[BaseException] | None, failure: BaseException | None, trace: TracebackType | None
    ) -> None: ...

class Collection(Object):
    def __contains__(self, index: int | str) -> bool: ...
'''

_GIVEN = {"Date": "Moment", "Variant": "Value | Moment", "Variants": "list[Value | Moment]"}
_TYPES = {
    "Boolean": "bool",
    "Integer": "int",
    "Long": "int",
    "Date": "datetime",
    "String": "str",
    "Bytes": "bytes",
    "Variant": "Value",
    "Variants": "list[Value]",
    "Strings": "list[str]",
    "Rows": "list[tuple[Value, ...]] | None",
    "Nothing": "None",
}


def _taken(type_name):
    return _TYPES.get(type_name, type_name)


def _given(type_name):
    return _GIVEN.get(type_name, _taken(type_name))


def _property(described):
    name, taken, given = described["name"], _taken(described["type"]), _given(described["type"])
    if described["read"] and described["write"] and taken == given:
        yield f"    {name}: {taken}"
        return
    yield "    @property"
    yield f"    def {name}(self) -> {taken if described['read'] else 'Never'}: ..."
    if described["write"]:
        yield f"    @{name}.setter"
        yield f"    def {name}(self, value: {given}) -> None: ..."


def _operation(described):
    parameters = [Parameter(each) for each in described["arguments"]]
    shown = ["self"]
    for each in parameters:
        shown.append(f"{each.name}: {_given(each.type)}" + ("" if each.required else " = ..."))
    if described["failure"]:
        shown += ["*", "check: bool = True"]
    result = _taken(described["result"])
    if back := [_taken(each.type) for each in parameters if each.by_reference]:
        result = f"tuple[{', '.join([result, *back])}]"
    return f"    def {described['name']}({', '.join(shown)}) -> {result}: ..."


def _class(described):
    items = described["items"]
    yield f"class {described['name']}({'Collection' if items else 'Object'}):"
    place = [each["arguments"] for each in described["operations"] if each["name"] == "connect"]
    shown = "".join(f", {each['name']}: str = ..." for each in sum(place, []))
    yield f"    def __init__(self{shown}) -> None: ..."
    if items:
        yield f"    def __iter__(self) -> Iterator[{items}]: ..."
        yield f"    def __getitem__(self, index: int | str) -> {items}: ..."
    for each in described["properties"]:
        yield from _property(each)
    for each in described["operations"]:
        yield _operation(each)
    yield ""


def _enumeration(described):
    yield f"class {described['name']}(IntEnum):"
    for each in described["values"]:
        yield f"    {each['name']} = {each['value']}"
    yield ""


def lines():
    yield from _HEAD.splitlines()
    yield ""
    for each in description["enumerations"]:
        yield from _enumeration(each)
    for each in description["classes"]:
        yield from _class(each)


if __name__ == "__main__":
    print("\n".join(lines()), end="")
