#!/usr/bin/env python3
"""Holds the description of the C interface beside the public headers of the library.

    check_headers.py SOURCES LIBRARY

Fails for a public member, argument, default or enumeration of a header that the description lacks or tells otherwise.
SOURCES is the folder of the sources, LIBRARY the shared library of the C interface.
"""

import ctypes
import json
import re
import sys
from pathlib import Path


def without_bodies(text):
    """The text with each balanced pair of braces, and what stands in it, made a semicolon."""
    result, depth = [], 0
    for character in text:
        if character == "{":
            depth += 1
        elif character == "}":
            depth -= 1
            if depth == 0:
                result.append(";")
        elif depth == 0:
            result.append(character)
    return "".join(result)


def body_of(text, opening):
    """What stands between the brace at the end of `opening` and its partner."""
    depth = 1
    for end in range(opening.end(), len(text)):
        depth += {"{": 1, "}": -1}.get(text[end], 0)
        if depth == 0:
            return text[opening.end() : end]
    raise SystemExit(f"no end of {opening.group(0)}")


def split_arguments(text):
    parts, depth, part = [], 0, ""
    for character in text:
        depth += {"<": 1, "(": 1, ">": -1, ")": -1}.get(character, 0)
        if character == "," and depth == 0:
            parts.append(part)
            part = ""
        else:
            part += character
    return [p for p in (*parts, part) if p.strip()]


def plain(name):
    """A name that C++ reserves has an underscore behind it in the headers."""
    return name.removesuffix("_")


DEFAULTS = {"nullptr": None, "true": True, "false": False, "Date::empty()": 2.0}


def argument(text):
    declaration, _, default = (part.strip() for part in text.partition("="))
    name = re.search(r"(\w+)$", declaration).group(1)
    entry = {"name": plain(name), "optional": bool(default), "default": None}
    if default:
        entry["default"] = DEFAULTS[default] if default in DEFAULTS else json.loads(default)
    return entry


class Headers:
    def __init__(self, sources):
        self.sources = Path(sources)

    def read(self, path):
        return re.sub(r"//[^\n]*|^\s*#.*$", "", (self.sources / path).read_text(), flags=re.M)

    def public_headers(self):
        text = (self.sources / "QVSa/QVSa.h").read_text()
        # What lies in hosting is for hosts in C++, and the version has a call of its own.
        return [path for path in re.findall(r'#include "([^"]+)"', text) if not re.search("/(hosting|frame)/", path)]

    def functions(self, path, name, sections):
        """The functions of class `name`: by name the list of (result, arguments) of the overloads."""
        text = self.read(path)
        opening = re.search(rf"\bclass (?:QVSA_EXPORT )?{name}\b([^;{{]*)\{{", text)
        section, functions = "private", {}
        for part in re.split(r"\b(public|protected|private):", body_of(text, opening)):
            if part in ("public", "protected", "private"):
                section = part
            elif section in sections:
                self.collect(name, without_bodies(part), functions)
        if base := re.search(r"public Collection<(\w+)>", opening.group(1)):
            for inherited, overloads in self.functions("QVSa/frame/Collection.h", "Collection", {"public"}).items():
                functions.setdefault(inherited, overloads)
        return functions

    def collect(self, class_name, text, functions):
        for declaration in (" ".join(part.split()) for part in text.split(";")):
            if using := re.fullmatch(r"using (\w+)::(\w+)", declaration):
                base, name = using.groups()
                inherited = self.functions(f"QVSa/frame/{base}.h", base, {"public", "protected"})
                functions.setdefault(name, []).extend(inherited[name])
            elif function := re.fullmatch(r"(?:template <.*?> )?(.*?)\b(\w+) ?\((.*)\)(?: const)?", declaration):
                result, name, arguments = function.groups()
                if name not in (class_name, "begin", "end", "operator") and "~" not in result:
                    functions.setdefault(plain(name), []).append((result.strip(), split_arguments(arguments)))

    def enumerations(self):
        found = {}
        for header in self.public_headers():
            room = Path(header).parent
            includes = re.findall(r'#include "([^"]+)"', (self.sources / header).read_text())
            for path in [header, *(include for include in includes if Path(include).parent == room)]:
                for indent, name, body in re.findall(r"^( *)enum (\w+)[^{;]*\{([^}]*)\}", self.read(path), flags=re.M):
                    entries = (entry.split("=") for entry in body.split(","))
                    # Those inside a class have its name in front.
                    found[Path(path).stem + name if indent else name] = {key.strip(): int(value) for key, value in entries}
        return found


def property_differences(overloads, described):
    readable = any(not arguments for _, arguments in overloads)
    writable = any(result == "void" and len(arguments) == 1 for result, arguments in overloads)
    if (described["read"], described["write"]) != (readable, writable):
        yield "can be read or set otherwise"


def operation_differences(overloads, described):
    if len(overloads) != 1:
        yield "is a property in C++"
    expected = [argument(text) for text in overloads[0][1]]
    given = [{key: each[key] for key in ("name", "optional", "default")} for each in described["arguments"]]
    if given != expected:
        yield f"has the arguments {expected}, described as {given}"


def differences(headers, description):
    classes = {each["name"]: each for each in description["classes"]}
    for path in headers.public_headers():
        name = Path(path).stem
        described = classes.get(name, {"properties": [], "operations": []})
        properties = {each["name"]: each for each in described["properties"]}
        operations = {each["name"]: each for each in described["operations"]}
        for member, overloads in headers.functions(path, name, {"public"}).items():
            if member in properties:
                found = property_differences(overloads, properties[member])
            elif member in operations:
                found = operation_differences(overloads, operations[member])
            else:
                found = ["is not described"]
            yield from (f"{name}.{member} {difference}" for difference in found)
    described = {
        each["name"]: {value["name"]: value["value"] for value in each["values"]} for each in description["enumerations"]
    }
    for name, values in headers.enumerations().items():
        if described.get(name) != values:
            yield f"{name} is {values}, described as {described.get(name)}"


def main(sources, library):
    describe = ctypes.CDLL(library).qvsa_describe
    describe.restype = ctypes.c_char_p
    found = list(differences(Headers(sources), json.loads(describe())))
    print("\n".join(found) if found else "The description tells all that the public headers do.")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]) if len(sys.argv) == 3 else __doc__)
