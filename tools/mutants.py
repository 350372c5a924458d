#!/usr/bin/python3
"""Breaks the library in small ways, one at a time, and sees whether the suite notices.

usage: mutants.py [NUMBER...]
       mutants.py --check    builds nothing; ends with 1 if some mutant no longer fits the source

The mutants stand in tools/mutants.txt, a file's name and below it pairs of lines: what stands in the source, once,
and what is put in its place, with \\n for the end of a line. Each is built in a copy of the tree, one copy for each
processor, with the address sanitizer, which notices what happens to go well on this machine. Ends with 1 if one
survives. A mutant that makes a loop endless is noticed too, by the time that it takes.
"""

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
    """(file, what stands there, what is put there) of each."""
    mutants, file, original = [], None, None
    for line in (ROOT / "tools" / "mutants.txt").read_text().splitlines():
        line = line.replace("\\n", "\n")
        if line.startswith("- "):
            original = line[2:]
        elif line.startswith("+"):  # nothing may stand behind it
            mutants.append((file, original, line[2:]))
        elif line and not line.startswith("#"):
            file = line
    return mutants


def is_stale(number, file, original, _):
    """Whether a mutant can't be made, because the source was changed under it; says so."""
    path = ROOT / file
    found = path.read_text().count(original) if path.exists() else 0
    if found != 1:
        print(f"mutant {number}: {file} has {found} in place of one: {original}")
    return found != 1


class Copy:
    """A copy of the tree with a build of its own."""

    def __init__(self, number):
        self.tree, self.build = OUT / f"tree{number}", OUT / f"build{number}"
        shutil.rmtree(self.tree, ignore_errors=True)
        shutil.rmtree(self.build, ignore_errors=True)  # what an interrupted run has left may be broken
        shutil.copytree(ROOT, self.tree, ignore=shutil.ignore_patterns("build", ".git"))
        self.run("cmake", "-S", self.tree, "-B", self.build, "-G", "Ninja", "-DCMAKE_BUILD_TYPE=None",
                 "-DCMAKE_CXX_FLAGS=-O1 -fsanitize=address", "-DMIREL_BUILD_EXAMPLES=OFF", "-DMIREL_BUILD_TESTS=ON").check_returncode()
        self.test_seconds = None
        start = time.monotonic()
        if self.verdict() != "survived":
            sys.exit("the suite fails as it is")
        self.test_seconds = time.monotonic() - start  # with the build, and so much more than the tests alone take

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

    def judge(self, file, original, replacement):
        path = self.tree / file
        source = path.read_text()
        path.write_text(source.replace(original, replacement))
        try:
            return self.verdict()
        finally:
            path.write_text(source)


def main():
    mutants = list(enumerate(read_mutants(), 1))
    if any([is_stale(number, *mutant) for number, mutant in mutants]):
        return 1
    if sys.argv[1:] == ["--check"]:
        return 0
    if len(sys.argv) > 1:
        mutants = [mutant for mutant in mutants if str(mutant[0]) in sys.argv[1:]]
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
            print(f"{number}: {mutant[0]}: {mutant[2].strip()}: {verdicts[number]}", flush=True)

    threads = [threading.Thread(target=work, args=[Copy(i)]) for i in range(os.cpu_count() or 1)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    killed = sum(verdict.startswith("killed") for verdict in verdicts.values())
    print(f"{killed} of {len(mutants)} mutants killed")
    return killed < len(mutants)


if __name__ == "__main__":
    sys.exit(main())
