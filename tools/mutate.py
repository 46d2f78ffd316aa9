#!/usr/bin/env python3
"""Puts small faults into the sources, one after the other, and looks whether the tests notice.

The faults stand in tests/mutations.txt, a block each:

    # a sentence that tells the fault
    file  QVSa/numbering/IdMgrIssue.cpp
    tests numbering_tests process_tests
    - the text that is replaced; it must stand in the file exactly once, and may go over several lines
    + what takes its place

A fault is caught by the first of its test programs that turns red. The work is done on a copy of the tree in
build/mutate, so the sources stay as they are. A name behind the command picks the faults whose sentence or file holds
it: tools/mutate.py RowLocks
"""
import pathlib
import shutil
import subprocess
import sys
import time

ROOT = pathlib.Path(__file__).resolve().parent.parent
COPY = ROOT / "build" / "mutate" / "source"
BUILD = ROOT / "build" / "mutate" / "build"
TIME_LIMIT = 600  # seconds for the tests of one fault; a hanging test has noticed it


class Fault:
    def __init__(self, sentence):
        self.sentence, self.file, self.tests, self.old, self.new = sentence, "", [], [], []

    def texts(self):
        """The file, what it holds, and what it holds with the fault."""
        path = COPY / self.file
        text = path.read_text()
        old, new = "\n".join(self.old), "\n".join(self.new)
        count = text.count(old)
        if count != 1:
            raise SystemExit(f"{self.file}: the text of \"{self.sentence}\" stands there {count} times.")
        return path, text, text.replace(old, new)


def read_faults(path):
    faults = []
    for line in path.read_text().splitlines():
        key, _, rest = line.partition(" ")
        if key == "#":
            faults.append(Fault(rest))
        elif key == "file":
            faults[-1].file = rest.strip()
        elif key == "tests":
            faults[-1].tests = rest.split()
        elif key == "-":
            faults[-1].old.append(rest)
        elif key == "+":
            faults[-1].new.append(rest)
    return faults


def run(command, **options):
    return subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, **options)


def copy_tree():
    listed = run(["git", "ls-files", "--cached", "--others", "--exclude-standard"], cwd=ROOT).stdout.splitlines()
    for name in listed:
        source, target = ROOT / name, COPY / name
        if not source.is_file():
            continue
        target.parent.mkdir(parents=True, exist_ok=True)
        # A file that is the same keeps its time, so that it is not built again.
        if not target.exists() or target.read_bytes() != source.read_bytes():
            shutil.copyfile(source, target)


def build(targets):
    return run(["cmake", "--build", str(BUILD), "--target", *targets])


def notices(program):
    path = next(path for path in BUILD.rglob(program) if path.is_file())
    try:
        return run([str(path), "--gtest_brief=1"], cwd=path.parent, timeout=TIME_LIMIT).returncode != 0
    except subprocess.TimeoutExpired:
        return True


def outcome(fault):
    path, before, after = fault.texts()
    path.write_text(after)
    try:
        built = build(fault.tests)
        if built.returncode != 0:
            return "does not build:\n" + built.stdout[-2000:]
        caught = next((program for program in fault.tests if notices(program)), None)
        return f"caught by {caught}" if caught else "NOT caught"
    finally:
        path.write_text(before)


def main():
    wanted = sys.argv[1] if len(sys.argv) > 1 else ""
    faults = [fault for fault in read_faults(ROOT / "tests" / "mutations.txt")
              if wanted in fault.sentence or wanted in fault.file]
    copy_tree()
    # Without what a debugger needs, which takes more time than the rest, and without warnings: a fault may leave behind
    # what nobody uses.
    configured = run(["cmake", "-S", str(COPY), "-B", str(BUILD), "-G", "Ninja", "-DCMAKE_BUILD_TYPE=Debug",
                      "-DCMAKE_CXX_FLAGS_DEBUG=-O0 -w", "--log-level=NOTICE"])
    if configured.returncode != 0:
        raise SystemExit(configured.stdout)
    for fault in faults:
        fault.texts()
    programs = sorted({program for fault in faults for program in fault.tests})
    print(f"Building {len(programs)} test programs", flush=True)
    built = build(programs)
    if built.returncode != 0:
        raise SystemExit(built.stdout[-4000:])
    red = [program for program in programs if notices(program)]
    if red:
        raise SystemExit("Red without any fault: " + " ".join(red))
    bad = 0
    for number, fault in enumerate(faults, 1):
        begin = time.monotonic()
        result = outcome(fault)
        bad += not result.startswith("caught")
        print(f"{number:3}/{len(faults)} {result}: {fault.sentence} ({fault.file}, {time.monotonic() - begin:.0f} s)",
              flush=True)
    print(f"{len(faults) - bad} of {len(faults)} faults are caught.")
    return 1 if bad else 0


if __name__ == "__main__":
    sys.exit(main())
