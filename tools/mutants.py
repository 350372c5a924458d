#!/usr/bin/python3
"""Breaks the library in small ways, one at a time, and checks whether the tests notice.

usage: mutants.py [--jobs N] [NUMBER...]
       mutants.py --check    builds nothing; exits with 1 if a mutant no longer fits the source

tools/mutants.txt lists the mutants: a file's name, and below it pairs of lines, a text that occurs once in the source
and its replacement, with \\n for the end of a line. Each mutant is built in a copy of the tree, one copy for each
processor, with the address sanitizer, which notices errors that happen to do no harm on this machine. A file marked
"Release" gets an ordinary build, whose tests alone must notice. A mutant with an endless loop is killed when its time is
up. Exits with 1 if a mutant survives, doesn't compile or no longer fits the source.
"""

import argparse
import os
import pathlib
import queue
import shutil
import subprocess
import sys
import threading
import time

ROOT = pathlib.Path(__file__).resolve().parent.parent
OUT = ROOT / "build" / "mutants"


def read_mutants():
    """(kind of build, file, original text, replacement) of each."""
    mutants, kind, file, original = [], None, None, None
    for line in (ROOT / "tools" / "mutants.txt").read_text().splitlines():
        line = line.replace("\\n", "\n")
        if line.startswith("- "):
            original = line[2:]
        elif line.startswith("+"):  # the replacement may be empty
            mutants.append((kind, file, original, line[2:]))
        elif line and not line.startswith("#"):
            file, _, kind = line.partition(", ")
    return mutants


def is_stale(number, _kind, file, original, _replacement):
    """Whether the source has changed so that a mutant no longer fits; prints that."""
    path = ROOT / file
    found = path.read_text().count(original) if path.exists() else 0
    if found != 1:
        print(f"mutant {number}: must occur once in {file}, occurs {found} times: {original}")
    return found != 1


BUILDS = {"": ("-DCMAKE_BUILD_TYPE=None", "-DCMAKE_CXX_FLAGS=-O1 -fsanitize=address"),
          "Release": ("-DCMAKE_BUILD_TYPE=Release",)}


class Build:
    """A build of the suite from a copy of the tree."""

    def __init__(self, tree, build, kind):
        self.build, self.test_seconds = build, None
        shutil.rmtree(build, ignore_errors=True)  # an interrupted run may have left a broken one
        self.run("cmake", "-S", tree, "-B", build, "-G", "Ninja", *BUILDS[kind], "-DMIREL_BUILD_EXAMPLES=OFF",
                 "-DMIREL_BUILD_TESTS=ON").check_returncode()
        start = time.monotonic()
        if self.verdict() != "survived":
            raise RuntimeError(f"the suite fails as it is, in {build}")
        self.test_seconds = time.monotonic() - start  # including the build, so much longer than the tests alone

    def run(self, *command, timeout=None, **env):
        return subprocess.run(command, stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                              text=True, errors="replace", timeout=timeout, env={**os.environ, **env})

    def verdict(self):
        built = self.run("cmake", "--build", self.build, "-j", "1", "--target", "mirel_tests")
        if built.returncode != 0:
            return "doesn't compile"
        try:
            ran = self.run(self.build / "tests" / "mirel_tests", "--gtest_brief=1", "--gtest_fail_fast",
                           timeout=self.test_seconds, ASAN_OPTIONS="allocator_may_return_null=1")
        except subprocess.TimeoutExpired:
            return "killed by its time"
        if ran.returncode == 0:
            return "survived"
        failed = [line.split()[3].rstrip(",") for line in ran.stdout.splitlines() if line.startswith("[  FAILED  ]")]
        return f"killed by {failed[0]}" if failed else f"killed, exit code {ran.returncode}"


class Copy:
    """A copy of the tree, and the builds made of it so far."""

    def __init__(self, number):
        self.number, self.tree, self.builds = number, OUT / f"tree{number}", {}
        shutil.rmtree(self.tree, ignore_errors=True)
        shutil.copytree(ROOT, self.tree, ignore=shutil.ignore_patterns("build", ".git"))

    def judge(self, kind, file, original, replacement):
        if kind not in self.builds:
            self.builds[kind] = Build(self.tree, OUT / f"build{self.number}{kind}", kind)
        path = self.tree / file
        source = path.read_text()
        path.write_text(source.replace(original, replacement))
        try:
            return self.builds[kind].verdict()
        finally:
            path.write_text(source)


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--check", action="store_true")
    parser.add_argument("--jobs", type=int, default=os.cpu_count() or 1)
    parser.add_argument("numbers", type=int, nargs="*")
    arguments = parser.parse_args()
    mutants = list(enumerate(read_mutants(), 1))
    if any([is_stale(number, *mutant) for number, mutant in mutants]):
        return 1
    if arguments.check:
        return 0
    if arguments.numbers:
        mutants = [mutant for mutant in mutants if mutant[0] in arguments.numbers]
    waiting = queue.Queue()
    for mutant in mutants:
        waiting.put(mutant)
    verdicts = {}

    def work(copy):
        while True:
            try:
                number, mutant = waiting.get_nowait()
            except queue.Empty:
                return
            verdicts[number] = copy.judge(*mutant)
            print(f"{number}: {mutant[1]}: {mutant[3].strip()}: {verdicts[number]}", flush=True)

    threads = [threading.Thread(target=work, args=[Copy(i)]) for i in range(arguments.jobs)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    killed = sum(verdict.startswith("killed") for verdict in verdicts.values())
    print(f"{killed} of {len(mutants)} mutants killed")
    return killed < len(mutants)


if __name__ == "__main__":
    sys.exit(main())
