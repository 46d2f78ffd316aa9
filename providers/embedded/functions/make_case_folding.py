#!/usr/bin/env python3
"""Prints CaseFolding.inc: the case mappings that a database's order of texts rests on.

The output is part of the files' layout. Another version of Unicode gives other tables; then the layout version has to
rise and every index over texts has to be built anew.

    python3 make_case_folding.py > CaseFolding.inc
"""

import sys
import unicodedata


def single(mapped, otherwise):
    return mapped if len(mapped) == 1 else otherwise


def folded(char):
    return single(char.casefold(), single(char.lower(), char))


def ranges(mapping):
    """Runs of code points with one distance to their image, each 1 or 2 apart from the next: first, last, step, delta."""
    runs = []
    for code in range(sys.maxunicode + 1):
        if 0xD800 <= code <= 0xDFFF:
            continue
        delta = ord(mapping(chr(code))) - code
        if delta == 0:
            continue
        if runs and runs[-1][3] == delta and extends(runs[-1], code):
            runs[-1][2] = code - runs[-1][1]
            runs[-1][1] = code
        else:
            runs.append([code, code, 1, delta])
    return runs


def extends(run, code):
    gap = code - run[1]
    return gap in (1, 2) if run[0] == run[1] else gap == run[2]


def print_table(name, mapping):
    print(f"constexpr CaseRange {name}[] = {{")
    for first, last, step, delta in ranges(mapping):
        print(f"    {{0x{first:04X}, 0x{last:04X}, {step}, {delta}}},")
    print("};")


print(f"// Made by make_case_folding.py from Unicode {unicodedata.unidata_version}. Frozen with the layout of the files.")
print_table("foldRanges", folded)
print_table("upperRanges", lambda char: single(char.upper(), char))
print_table("lowerRanges", lambda char: single(char.lower(), char))
