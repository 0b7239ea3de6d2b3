#!/usr/bin/env python3
"""Breaks the library's sources one place at a time and lists what no test notices.

Works on a copy of the sources in build/mutation and leaves the tree alone. A mutant is one changed
shift, comparison, limit, constant, operator or operand. Its part's tests run first, then those of
the parts that are built on it, until one fails. A mutant whose library comes out the same, byte for
byte, is not one; the compiler's refusal, for a warning too, counts as a test. The same seed picks the same mutants.
"""

import argparse
import hashlib
import os
import pathlib
import random
import re
import shutil
import subprocess
import sys
import time

ROOT = pathlib.Path(__file__).resolve().parent.parent
WORK = ROOT / "build" / "mutation"
TREE = WORK / "source"
BUILD = TREE / "build" / "dev"
LIBRARY = BUILD / "libvidshowhw2-19.so"

# Whose tests see a part's mutants, in this order.
TESTS_OF = {
    "kernels": ["kernels", "imageproc"],
    "imageproc": ["imageproc", "presenter"],
    "presenter": ["presenter"],
    "platform": ["platform", "presenter"],
}
# Back ends that this processor may not run, and what only the linker reads.
LEFT_OUT = re.compile(r"/neon/|avx512|/android/device/")

# The formatter puts blanks around binary operators, and none around template brackets.
REPLACEMENTS = [
    ("shift", r" >> ", [" << "]),
    ("shift", r" << (?=\d)", [" >> "]),
    ("comparison", r" < ", [" <= ", " > "]),
    ("comparison", r" <= ", [" < "]),
    ("comparison", r" > ", [" >= ", " < "]),
    ("comparison", r" >= ", [" > "]),
    ("comparison", r" == ", [" != "]),
    ("comparison", r" != ", [" == "]),
    ("limit", r"std::min\b", ["std::max"]),
    ("limit", r"std::max\b", ["std::min"]),
    ("limit", r"\bAddSat\(", ["Add("]),
    ("limit", r"\bSubSat\(", ["Sub("]),
    ("operator", r" \+ ", [" - "]),
    ("operator", r" - ", [" + "]),
    ("operator", r" \* (?=\w)", [" + "]),
    ("operator", r" / ", [" * "]),
    ("operator", r" & (?=\w)", [" | "]),
    ("operator", r" \| ", [" & "]),
    ("operator", r" && ", [" || "]),
    ("operator", r" \|\| ", [" && "]),
    ("constant", r"\btrue\b", ["false"]),
    ("constant", r"\bfalse\b", ["true"]),
]
NUMBER = re.compile(r"(?<![\w.\"'])(0x[0-9A-Fa-f]+|0|[1-9]\d*)(?![\w.\"'])")
OPERANDS = re.compile(r"(?<![\w.)\]>-] )\b(\w+(?:\.\w+)?) (-|/|<<|>>) (\w+(?:\.\w+)?)\b(?![(\[.<])")
NO_CODE = re.compile(r"^\s*(//|#|static_assert|using |template|namespace|extern )")


class Mutant:
    def __init__(self, path, line, kind, before, after):
        self.path, self.line, self.kind = path, line, kind
        self.before, self.after = before, after

    @property
    def part(self):
        return self.path.split("/")[0]

    def __str__(self):
        return (f"{self.path}:{self.line + 1}: {self.kind}\n"
                f"    - {self.before.strip()}\n    + {self.after.strip()}")


def code_of(line):
    """The line without its comment; texts keep their length."""
    line = re.sub(r'"(?:[^"\\]|\\.)*"', lambda text: '"' + "_" * (len(text[0]) - 2) + '"', line)
    return line.split("//")[0]


def changes(line):
    code = code_of(line)
    for kind, pattern, others in REPLACEMENTS:
        for found in re.finditer(pattern, code):
            for other in others:
                yield kind, line[:found.start()] + other + line[found.end():]
    for found in NUMBER.finditer(code):
        number = int(found[1], 0)
        other = hex(number + 1) if found[1].startswith("0x") else str(number + 1)
        yield "constant", line[:found.start()] + other + line[found.end():]
    for found in OPERANDS.finditer(code):
        swapped = f"{found[3]} {found[2]} {found[1]}"
        yield "operands", line[:found.start()] + swapped + line[found.end():]


def mutants_of(parts):
    for part in parts:
        for path in sorted((ROOT / part).rglob("*")):
            name = path.relative_to(ROOT).as_posix()
            if path.suffix not in (".cpp", ".h") or LEFT_OUT.search(name):
                continue
            for number, line in enumerate(path.read_text().splitlines(keepends=True)):
                if NO_CODE.match(line):
                    continue
                for kind, after in changes(line):
                    yield Mutant(name, number, kind, line, after)


def run(command, timeout=None, **options):
    """@return whether it succeeded in time; what it started is ended with it"""
    with subprocess.Popen(command, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                          stdin=subprocess.DEVNULL, start_new_session=True, **options) as process:
        try:
            return process.wait(timeout) == 0
        except subprocess.TimeoutExpired:
            os.killpg(process.pid, 9)
            process.wait()
            return False


def prepare(parts):
    listed = subprocess.run(["git", "ls-files", "-z"], cwd=ROOT, check=True, capture_output=True)
    names = [name for name in listed.stdout.decode().split("\0") if (ROOT / name).is_file()]
    for stale in sorted(path for path in TREE.rglob("*") if path.is_file()):
        name = stale.relative_to(TREE).as_posix()
        if not name.startswith("build/") and name not in names:
            stale.unlink()  # the build would find it
    for name in names:
        copy = TREE / name
        if not copy.exists() or copy.read_bytes() != (ROOT / name).read_bytes():
            copy.parent.mkdir(parents=True, exist_ok=True)
            shutil.copy(ROOT / name, copy)
    configure = ["cmake", "--preset", "dev", "-DVIDSHOW_BUILD_TOOLS=OFF", "-DVIDSHOW_BUILD_BENCH=OFF"]
    subprocess.run(configure, cwd=TREE, check=True, stdout=subprocess.DEVNULL)
    if not build(parts):
        sys.exit("mutate.py: the tests do not build")


def programs_of(part):
    names = subprocess.run(["ninja", "-C", BUILD, "-t", "targets", "all"], check=True,
                           capture_output=True, text=True).stdout
    found = re.findall(rf"^(tests/{part}/\w+_test): CXX_EXECUTABLE_LINKER", names, re.M)
    return [name for name in found if "soak" not in name and "load" not in name]


def build(parts):
    targets = [program for part in parts for program in programs_of(part)]
    return run(["ninja", "-C", str(BUILD), "libvidshowhw2-19.so", *targets])


class Tests:
    """The programs of a part, quickest first, with how long each may take."""

    def __init__(self):
        self.programs = {}

    def of(self, part):
        if part not in self.programs:
            timed = []
            for program in programs_of(part):
                start = time.monotonic()
                if not self.passes(program, 600):
                    sys.exit(f"mutate.py: {program} fails without a mutant")
                timed.append((time.monotonic() - start, program))
            self.programs[part] = [(name, 10 + 10 * taken) for taken, name in sorted(timed)]
        return self.programs[part]

    @staticmethod
    def passes(program, seconds):
        name = BUILD / program
        return run([str(name), "--gtest_brief=1", "--gtest_fail_fast"], seconds, cwd=name.parent)

    def killer(self, parts):
        """@return the program that fails; None: none does"""
        for part in parts:
            for program, seconds in self.of(part):
                if not self.passes(program, seconds):
                    return program
        return None


def digest():
    """Of the library without its notes on where in the sources its code comes from."""
    stripped = WORK / "stripped.so"
    subprocess.run(["strip", "-R", ".note.gnu.build-id", "-o", stripped, LIBRARY], check=True)
    return hashlib.sha256(stripped.read_bytes()).digest()


def outcome(mutant, tests, unchanged):
    path = TREE / mutant.path
    original = path.read_text()
    lines = original.splitlines(keepends=True)
    lines[mutant.line] = mutant.after
    path.write_text("".join(lines))
    try:
        if not build(TESTS_OF[mutant.part][:1]):
            return "killed by the compiler"
        if digest() == unchanged:
            return "is the same"
        killer = tests.killer(TESTS_OF[mutant.part])
        return f"killed by {killer}" if killer else "SURVIVED"
    finally:
        path.write_text(original)


def main():
    parser = argparse.ArgumentParser(description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--count", type=int, default=100, help="most mutants (%(default)s)")
    parser.add_argument("--seconds", type=float, default=1800, help="begin none after (%(default)s)")
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--list", action="store_true", help="list the mutants, run nothing")
    parser.add_argument("parts", nargs="*", default=list(TESTS_OF), metavar="PART",
                        help="kernels, imageproc, presenter, platform (all of them)")
    arguments = parser.parse_args()
    unknown = set(arguments.parts) - set(TESTS_OF)
    if unknown:
        parser.error(f"no such part: {', '.join(sorted(unknown))}")

    mutants = list(mutants_of(arguments.parts))
    print(f"{len(mutants)} places", flush=True)
    random.Random(arguments.seed).shuffle(mutants)
    if arguments.list:
        print(*mutants[:arguments.count], sep="\n")
        return 0

    wanted = sorted({tested for part in arguments.parts for tested in TESTS_OF[part]})
    prepare(wanted)
    tests = Tests()
    for part in wanted:
        tests.of(part)
    unchanged = digest()
    tally = {}
    start = time.monotonic()
    for mutant in mutants[:arguments.count]:
        if time.monotonic() - start > arguments.seconds:
            break
        result = outcome(mutant, tests, unchanged)
        print(f"{mutant}\n    {result}", flush=True)
        kind = result.split(" by ")[0]
        tally[kind] = tally.get(kind, 0) + 1
    print(", ".join(f"{count} {kind}" for kind, count in sorted(tally.items())))
    return 1 if "SURVIVED" in tally else 0


if __name__ == "__main__":
    sys.exit(main())
