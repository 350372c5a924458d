#!/usr/bin/python3
"""Builds and tests the library in every way that is promised to work, and prints a table of the results.

usage: check.py [--long] [--list] [WORD...]

With words, only the rows whose names have one of them are run. --long adds the rows that take many minutes or most of
the machine's memory. The output of each row is kept in build/check.
"""

import argparse
import concurrent.futures
import os
import pathlib
import re
import shlex
import subprocess
import sys
import time

ROOT = pathlib.Path(__file__).resolve().parent.parent
OUT = ROOT / "build" / "check"
WARNINGS = "-Wall -Wextra -Wpedantic -Wconversion -Wsign-conversion -Wshadow -Werror"
GTEST_SOURCE = "/usr/src/googletest"
FUZZERS = ("edits", "conversions")
FUZZ_SECONDS = 20


class Failed(Exception):
    """A row's command failed."""


class Row:
    """A row of the table: its name, what it does, and its log."""

    def __init__(self, name, work):
        self.name, self.work = name, work
        self.slug = re.sub(r"[^A-Za-z0-9+]+", "-", name).strip("-")
        self.dir = OUT / self.slug
        self.log = OUT / f"{self.slug}.log"

    def run(self, *command, errors=subprocess.STDOUT, **env):
        """Runs a command; its output goes to the log, and its standard error too unless errors says otherwise."""
        with self.log.open("a") as log:
            log.write(f"$ {shlex.join(map(str, command))}\n")
            log.flush()
            code = subprocess.run(list(map(str, command)), cwd=ROOT, stdin=subprocess.DEVNULL, stdout=log,
                                  stderr=errors, env={**os.environ, **env}).returncode
        if code != 0:
            raise Failed(f"exit code {code}: {shlex.join(map(str, command))[:200]}")

    def build(self, *targets, cxx="g++", std=17, flags="", program="", options=()):
        """Configures and builds a tree of its own, with warnings as errors; program has flags for the tests alone."""
        self.run("cmake", "-S", ROOT, "-B", self.dir, "-G", "Ninja", "-DCMAKE_BUILD_TYPE=None",
                 f"-DCMAKE_CXX_COMPILER={cxx}", f"-DCMAKE_CXX_STANDARD={std}", "-DCMAKE_CXX_EXTENSIONS=OFF",
                 f"-DCMAKE_CXX_FLAGS={flags}", f"-DMIREL_TEST_FLAGS={program}", "-DMIREL_BUILD_TESTS=ON",
                 "-DCMAKE_COMPILE_WARNING_AS_ERROR=ON", *options)
        self.run("cmake", "--build", self.dir, "-j", "1", *(("--target", *targets) if targets else ()))

    def attempt(self):
        start = time.monotonic()
        self.log.write_text("")
        try:
            note = self.work(self) or ""
            ok = True
        except Failed as failure:
            ok, note = False, str(failure)
        return self, ok, note, time.monotonic() - start


def suite(flags, exhaustive=True, **how):
    """A row that builds everything in one way and runs all tests of code. Unless it is exhaustive, it leaves out those
    of every short sequence and every place in a block: without optimisation or under emulation they take minutes, mostly
    in the oracle."""
    def work(row):
        row.build(flags=flags, **how)
        left_out = () if exhaustive else ("-E", "Utf.EverySequence|SequencesAtEveryPlaceInABlock")
        row.run("ctest", "--test-dir", row.dir, "--output-on-failure", "--no-tests=error", "-LE", "package", *left_out,
                ASAN_OPTIONS="allocator_may_return_null=1", UBSAN_OPTIONS="print_stacktrace=1")
    return work


def headers(row):
    """Compiles every public header alone, and all of them without exceptions and RTTI."""
    for cxx in ("g++", "clang++", "clang++ -stdlib=libc++"):
        for std in ("17", "20", "2b"):
            for header in sorted((ROOT / "utils").glob("*.h")):
                row.run(*cxx.split(), f"-std=c++{std}", *WARNINGS.split(), "-x", "c++", "-include", header,
                        "-fsyntax-only", "/dev/null")
    everything = [flag for header in (ROOT / "utils").glob("*.h") for flag in ("-include", header)]
    for cxx in ("g++", "clang++"):
        for level in range(4):
            row.run(cxx, "-std=c++17", *WARNINGS.split(), f"-O{level}", "-fno-exceptions", "-fno-rtti", "-x", "c++",
                    *everything, "-S", "/dev/null", "-o", "/dev/null")


def unity(row):
    """Builds the library as one source, as a project with unity builds does."""
    for cxx in ("g++", "clang++"):
        tree = row.dir / cxx
        row.run("cmake", "-S", ROOT, "-B", tree, "-G", "Ninja", f"-DCMAKE_CXX_COMPILER={cxx}", "-DCMAKE_UNITY_BUILD=ON",
                "-DCMAKE_COMPILE_WARNING_AS_ERROR=ON", "-DMIREL_BUILD_TESTS=OFF")
        row.run("cmake", "--build", tree, "-j", "1", "--target", "mirel_utils")


def layout(row):
    """Checks the layout of the sources, runs clang-tidy, and checks that the mutants still fit the sources."""
    row.run("tools/mutants.py", "--check")
    sources = [path for folder in ("utils", "examples", "tests", "benchmarks")
               for path in sorted((ROOT / folder).rglob("*")) if path.suffix in (".h", ".cpp")]
    row.run("clang-format", "--dry-run", "-Werror", *sources)
    row.run("cmake", "-S", ROOT, "-B", row.dir, "-G", "Ninja", "-DMIREL_BUILD_TESTS=OFF")  # makes utils/Version.h
    for source in sorted((ROOT / "utils" / "src").glob("*.cpp")) + sorted((ROOT / "examples" / "transcode").glob("*.cpp")):
        row.run("clang-tidy", "--quiet", source, "--", "-std=c++17", "-I.", f"-I{row.dir}/include")


def emulated(processor, triplet="", emulator="", link="", exhaustive=True):
    """The suite for another processor, under emulation. If the tools or QEMU have another name for the processor, it is
    the triplet or the emulator."""
    triplet = triplet or f"{processor}-linux-gnu"
    return suite(cxx=f"{triplet}-g++", flags="-O2", exhaustive=exhaustive, options=(
        "-DCMAKE_SYSTEM_NAME=Linux", f"-DCMAKE_SYSTEM_PROCESSOR={processor}",
        f"-DCMAKE_CROSSCOMPILING_EMULATOR=qemu-{emulator or processor};-L;/usr/{triplet}",
        f"-DCMAKE_EXE_LINKER_FLAGS={link}", f"-DMIREL_GTEST_SOURCE={GTEST_SOURCE}", NO_FMT))


def everyday(row):
    """Tests what most users build; then the same program on older processors, from one with every instruction set of
    the kernels to one without any, and under valgrind. These runs leave out slow tests that would find nothing new:
    millions of texts and, under valgrind, tests whose child processes do the work, on which it doesn't report."""
    suite(flags="-O2 -g")(row)
    tests = row.dir / "tests" / "mirel_tests"
    for processor, kernels in ("Haswell", "AVX2"), ("Nehalem", "SSE4"), ("core2duo", "none"):
        row.run("qemu-x86_64", "-cpu", processor, tests, "--gtest_brief=1", "--gtest_filter=-Utf.Every*:*AMillion*",
                MIREL_EXPECTED_KERNELS=kernels)
    row.run("valgrind", "-q", "--error-exitcode=9", "--leak-check=full", "--child-silent-after-fork=yes", tests,
            "--gtest_filter=-Utf.Every*:*AMillion*:Precondition*", "--gtest_brief=1")


def coverage(row):
    """Checks that the tests run every code region of utils/ and take every branch both ways."""
    row.build("mirel_tests", cxx="clang++", flags="-O1 -g -fprofile-instr-generate -fcoverage-mapping "
              "-mllvm -runtime-counter-relocation")
    row.run("tools/coverage.py", row.dir)


def threads(row):
    """Runs the tests of threads many times: a race doesn't show in every run."""
    row.build("mirel_tests", cxx="clang++", flags="-O1 -g -fsanitize=thread")
    row.run(row.dir / "tests" / "mirel_tests", "--gtest_filter=Thread*", "--gtest_repeat=20")


def fuzz(row):
    """Runs each fuzzer for a short time, from the seeds."""
    row.run("tools/fuzz.sh", FUZZ_SECONDS)


def long_tests(row):
    """Runs the exhaustive tests, and those of more than 4 GiB; last, because they take all the memory."""
    row.build("mirel_long_tests", flags="-O2")
    row.run(row.dir / "tests" / "mirel_long_tests", "--gtest_brief=1", errors=None)  # it shows its progress there


def mutants(row):
    row.run("tools/mutants.py")
    return row.log.read_text().splitlines()[-1]


HARDENING = ("-O2 -D_FORTIFY_SOURCE=2 -D_GLIBCXX_ASSERTIONS -fstack-protector-strong -fstack-clash-protection "
             "-fcf-protection -Wformat -Werror=format-security -fPIE")
SHARED = "-DBUILD_SHARED_LIBS=ON"
# Debian's fmt is built for libstdc++ and the native processor, and its headers have implicit conversions, which clang's
# sanitizer reports.
NO_FMT = "-DCMAKE_DISABLE_FIND_PACKAGE_fmt=ON"


def libcxx(std, flags, *options, exhaustive=True):
    return suite(cxx="clang++", std=std, flags=f"-stdlib=libc++ {flags}", exhaustive=exhaustive,
                 options=(f"-DMIREL_GTEST_SOURCE={GTEST_SOURCE}", NO_FMT, *options))


ROWS = [
    Row("AArch64 under emulation", suite(cxx="aarch64-linux-gnu-g++", flags="-O2", options=("--preset", "aarch64"))),
    # The exhaustive tests are written for the kernels. Of the emulated processors AArch64 has NEON; i686 has SSE4,
    # which the rows for x86-64 test; the others have none.
    Row("s390x under emulation, big-endian", emulated("s390x", exhaustive=False)),
    Row("i686 under emulation, 32 bits", emulated("i686", emulator="i386", exhaustive=False,
        link="-static")),  # QEMU 7.2 hangs when a dynamic program of i686 forks
    Row("armhf under emulation, 32 bits", emulated("arm", "arm-linux-gnueabihf", exhaustive=False)),
    Row("g++ C++17 -O2, older x86-64 processors, valgrind", everyday),
    Row("headers alone", headers),
    Row("unity builds", unity),
    Row("clang-format, clang-tidy", layout),
    Row("g++ C++20 -O3 NDEBUG unsigned char", suite(std=20, flags="-O3 -DNDEBUG -funsigned-char")),
    Row("g++ C++23 -O0 signed char", suite(std=23, flags="-O0 -fsigned-char", exhaustive=False)),
    Row("g++ C++17 -O2 without kernels and assertion facility", suite(
        flags="-O2 -DMIREL_NO_ASSERT_FACILITY", options=("-DMIREL_KERNELS=OFF",))),
    Row("g++ C++20 shared hardened, NDEBUG in the program only", suite(
        std=20, flags=HARDENING, program="-DNDEBUG", options=(SHARED, "-DCMAKE_SHARED_LINKER_FLAGS=-Wl,-z,relro,-z,now",
                                                              "-DCMAKE_EXE_LINKER_FLAGS=-Wl,-z,relro,-z,now -pie"))),
    Row("clang++ C++20 -O3 shared, NDEBUG in the library only", suite(
        cxx="clang++", std=20, flags="-O3 -DNDEBUG", program="-UNDEBUG", options=(SHARED,))),
    Row("clang++ C++23 -O0 unsigned char", suite(cxx="clang++", std=23, flags="-O0 -funsigned-char", exhaustive=False)),
    Row("clang++ libc++ C++17 -O3 shared", libcxx(17, "-O3", SHARED)),
    Row("clang++ libc++ C++20 -O2 unsigned char", libcxx(20, "-O2 -funsigned-char")),
    Row("clang++ libc++ C++23 -O0 NDEBUG", libcxx(23, "-O0 -DNDEBUG", exhaustive=False)),
    # The sanitizers of g++ are in the preset "sanitize", which ./dev test runs.
    Row("clang++ address, leak, undefined, conversions", suite(
        cxx="clang++", flags="-O2 -g -fsanitize=address,undefined,implicit-conversion,nullability,local-bounds,"
        "float-divide-by-zero -fno-sanitize-recover=all -fno-omit-frame-pointer", options=(NO_FMT,))),
    Row("clang++ thread", threads),
    Row("coverage", coverage),
    Row("fuzzers", fuzz),
]
LONG_ROWS = [
    Row("riscv64 under emulation", emulated("riscv64")),
    Row("ppc64el under emulation", emulated("ppc64le", "powerpc64le-linux-gnu")),
    Row("mutants", mutants),
    Row("exhaustive and large", long_tests),
]


def print_row(name, result, seconds, note=""):
    print(f"{name:<54} {result:<7} {seconds:>6} {note}", flush=True)


def run_rows(rows, workers):
    """Runs the rows, prints each as it ends, and returns the results in the order of the rows."""
    with concurrent.futures.ThreadPoolExecutor(workers) as pool:
        pending = [pool.submit(row.attempt) for row in rows]
        for done in concurrent.futures.as_completed(pending):
            row, ok, note, seconds = done.result()
            print_row(row.name, "ok" if ok else "FAILED", f"{seconds:.0f} s", note)
            if not ok:
                print("".join(row.log.read_text(errors="replace").splitlines(True)[-40:]), flush=True)
        return [future.result() for future in pending]


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--long", action="store_true")
    parser.add_argument("--list", action="store_true")
    parser.add_argument("words", nargs="*")
    arguments = parser.parse_args()

    def wanted(row):
        return not arguments.words or any(word in row.name for word in arguments.words)

    rows = [row for row in ROWS if wanted(row)]
    long_rows = [row for row in LONG_ROWS if arguments.long and wanted(row)]
    if arguments.list or not rows + long_rows:
        print("\n".join(row.name for row in rows + long_rows) or "no row's name has one of the words")
        return 0 if arguments.list else 2
    OUT.mkdir(parents=True, exist_ok=True)
    start = time.monotonic()
    results = run_rows(rows, os.cpu_count() or 1)
    results += run_rows(long_rows, 1)
    failed = sum(not ok for _, ok, _, _ in results)
    print()
    print_row("row", "result", "time")
    for row, ok, note, seconds in results:
        print_row(row.name, "ok" if ok else "FAILED", f"{seconds:.0f} s", note)
    print(f"{len(results) - failed} passed, {failed} failed in {time.monotonic() - start:.0f} s; logs in build/check")
    return failed > 0


if __name__ == "__main__":
    sys.exit(main())
