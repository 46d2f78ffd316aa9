#!/usr/bin/env python3
"""Checks from the includes that calls go down only. Prints each include that breaks a rule; exit code 1 if there is one.

  - A room includes rooms of a lower layer. Rooms of one layer may include each other, but not in a circle.
  - What lies in a room's internal folder is included by that room alone.
  - A provider's own headers are included by the provider, and by the one source that picks a provider.
  - No public header of QVSa includes providers/Provider.h.
"""
import collections
import pathlib
import re
import subprocess
import sys

PROVIDERS = ["providers/embedded", "providers/odbc"]
# From the bottom up. A file belongs to the longest name that its path begins with.
LAYERS = [
    ["QVSa/values"],
    ["platform"],
    ["QVSa/resources", "providers", "database"],
    ["providers/tsql"],
    PROVIDERS,
    ["QVSa/frame"],
    ["QVSa/identity", "QVSa/organisation", "QVSa/numbering", "QVSa/syslog", "QVSa/classification", "QVSa/settings",
     "QVSa/maintenance"],
    ["QVSa/hosting"],
    ["QVSa"],
    ["server", "bindings", "console", "web", "examples"],
]
LAYER = {room: height for height, rooms in enumerate(LAYERS) for room in rooms}
PICKS_A_PROVIDER = "QVSa/frame/internal/Providers.cpp"
INCLUDE = re.compile(r'^\s*#\s*include\s+"([^"]+)"', re.MULTILINE)


def room_of(path):
    rooms = [room for room in LAYER if path.startswith(room + "/")]
    return max(rooms, key=len, default=None)


def includes():
    listed = subprocess.run(["git", "ls-files", "--cached", "--others", "--exclude-standard", "*.cpp", "*.h", "*.inc"],
                            capture_output=True, text=True, check=True)
    for path in sorted(set(listed.stdout.split())):
        if room_of(path) is None or not pathlib.Path(path).exists():
            continue
        for included in INCLUDE.findall(pathlib.Path(path).read_text(errors="replace")):
            if room_of(included) is not None:
                yield path, included


def is_public(path):
    return path.startswith("QVSa/") and path.endswith(".h") and "/internal/" not in path


def broken_rule(path, included):
    room, target = room_of(path), room_of(included)
    if "/internal/" in included and room != target:
        return f"{included} is internal to {target}"
    if is_public(path) and included.startswith("providers/"):
        return "a public header knows no provider"
    if target in PROVIDERS and room != target and path != PICKS_A_PROVIDER:
        return f"only {PICKS_A_PROVIDER} picks a provider"
    if LAYER[target] > LAYER[room]:
        return f"{target} lies above {room}"
    return None


def circle(arrows):
    """The rooms of one circle, or nothing."""
    done, trail = set(), []

    def visit(room):
        if room in trail:
            return trail[trail.index(room):] + [room]
        if room in done:
            return None
        trail.append(room)
        for target in sorted(arrows[room]):
            found = visit(target)
            if found:
                return found
        trail.pop()
        done.add(room)
        return None

    for room in sorted(arrows):
        found = visit(room)
        if found:
            return found
    return None


def main():
    faults = []
    arrows = collections.defaultdict(set)
    for path, included in includes():
        rule = broken_rule(path, included)
        if rule:
            faults.append(f"{path}: {included}: {rule}")
        room, target = room_of(path), room_of(included)
        if room != target:
            arrows[room].add(target)
    ring = circle(dict(arrows) | {room: set() for room in LAYER if room not in arrows})
    if ring:
        faults.append("A circle of rooms: " + " -> ".join(ring))
    print("\n".join(faults) if faults else "Every include goes down.")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
