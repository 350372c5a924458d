#!/usr/bin/python3
"""Lists the code of utils/ that the tests don't run, and the branches that they take one way only.

usage: coverage.py BUILD-DIRECTORY

The tests are built there with clang's -fprofile-instr-generate -fcoverage-mapping and -mllvm
-runtime-counter-relocation. The last option keeps the counters in a file that child processes write too, so a violated
precondition, which ends its process, is counted. The tests of threads are left out: a branch not taken is a difference of
counters, and concurrent threads lose some counts. The instances of a template count together. A violated precondition
also counts for those after it in the function, since their counts are differences; the tables of
tests/PreconditionTest.cpp check that each is reported. Exits with 1 if anything is missed.
"""

import collections
import json
import os
import pathlib
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent
# This processor, and emulated ones with other kernels and without any.
PROCESSORS = {"this": [], "sse4": ["qemu-x86_64", "-cpu", "Nehalem"], "none": ["qemu-x86_64", "-cpu", "core2duo"]}
COMPILE_TIME = {"ConversionTables.cpp"}  # code that only the compiler runs
BY_THE_COMPILER = "// decided at compile time"  # ends a line that generates no code


def run_suite(build):
    profile, raws = build / "suite.profdata", []
    for name, emulator in PROCESSORS.items():
        raws.append(build / f"{name}.profraw")
        raws[-1].unlink(missing_ok=True)
        subprocess.run([*emulator, build / "tests" / "mirel_tests", "--gtest_brief=1",
                        "--gtest_filter=-Thread*" + (":Utf.Every*" if emulator else "")],
                       check=True, env={**os.environ, "LLVM_PROFILE_FILE": f"{raws[-1]}%c"})
    subprocess.run(["llvm-profdata-14", "merge", "-o", profile, *raws], check=True)
    exported = subprocess.run(["llvm-cov-14", "export", build / "tests" / "mirel_tests", f"-instr-profile={profile}",
                               ROOT / "utils"], check=True, stdout=subprocess.PIPE).stdout
    return json.loads(exported)["data"][0]


def region_counts(functions):
    """{file: {(line, column) where a code region begins: how often it was run}}"""
    counts = collections.defaultdict(lambda: collections.defaultdict(int))
    for function in functions:
        for line, column, _, _, count, file, _, kind in function["regions"]:
            if kind == 0:  # code, not a gap or the place of a macro
                counts[function["filenames"][file]][line, column] += count
    return counts


def branch_counts(file):
    """{(place, number at that place): [times true, times false]}; the parts of an assertion's condition share the
    assertion's place."""
    counts = collections.defaultdict(lambda: [0, 0])

    def add(place, branches):
        for number, (line, column, _, _, true, false, *_) in enumerate(branches):
            total = counts[(place, number) if place else ((line, column), 0)]
            total[0] += true
            total[1] += false

    add(None, file["branches"])
    for expansion in file.get("expansions", []):
        add(tuple(expansion["source_region"][:2]), expansion["branches"])
    return counts


def main():
    build = pathlib.Path(sys.argv[1]).resolve()
    missed = 0
    data = run_suite(build)
    regions = region_counts(data["functions"])
    for file in data["files"]:
        path = pathlib.Path(file["filename"])
        if path.name in COMPILE_TIME:
            continue
        source = path.read_text().splitlines()
        # If neither way was taken, the condition is constant in all instances, or its code is in the other list.
        branches = {at: count for at, count in branch_counts(file).items() if any(count)}
        for (line, _), count in sorted(regions[file["filename"]].items()):
            if count == 0 and not source[line - 1].endswith(BY_THE_COMPILER):
                missed += 1
                print(f"{path.name}:{line}: never run: {source[line - 1].strip()}")
        for (at, *_), (true, false) in sorted(branches.items()):
            if (not true or not false) and not source[at[0] - 1].endswith(BY_THE_COMPILER):
                missed += 1
                print(f"{path.name}:{at[0]}: never {'true' if not true else 'false'}: {source[at[0] - 1].strip()}")
        print(f"{path.name}: {len(regions[file['filename']])} code regions, {len(branches)} branches")
    print(f"{missed} missed")
    return missed > 0


if __name__ == "__main__":
    sys.exit(main())
