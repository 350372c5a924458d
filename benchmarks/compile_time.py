#!/usr/bin/python3
"""Compares the compile time of our headers with that of <string>, and prints a section of docs/benchmarks.md.

usage: compile_time.py INCLUDE-DIRECTORY [REPETITIONS]

A ratio is the time of a translation unit that includes only the header, divided by that of one that includes only
<string>: above 1 ours costs more. The headers are compiled in turn. The ratio is that of the medians of user time, and
in brackets that of the minima.
"""

import os
import pathlib
import statistics
import subprocess
import sys
import tempfile

COMPILERS = ("g++", "clang++")
HEADERS = ("string", "utils/xstring.h", "utils/Std.h", "utils/Utf.h")


def user_time(command):
    before = os.times().children_user
    subprocess.run(command, check=True)
    return os.times().children_user - before


def measure(compiler, include, repetitions, directory):
    """{header: [seconds]}"""
    times = {header: [] for header in HEADERS}
    for repetition in range(repetitions + 1):
        for i, header in enumerate(HEADERS):
            source = directory / f"{i}.cpp"
            source.write_text(f"#include <{header}>\n")
            seconds = user_time([compiler, "-std=c++17", "-O2", f"-I{include}", "-c", source, "-o", directory / "o"])
            if repetition > 0:  # the first one only fills the file cache
                times[header].append(seconds)
    return times


def main():
    include = pathlib.Path(sys.argv[1]).resolve()
    repetitions = int(sys.argv[2] if len(sys.argv) > 2 else 15)
    with tempfile.TemporaryDirectory() as name:
        columns = [measure(compiler, include, repetitions, pathlib.Path(name)) for compiler in COMPILERS]
    print("\n## Compile time\n")
    print("The compile time of a translation unit that includes the header, divided by that of one that includes\n"
          f"`<string>`: above 1 ours costs more. It is user time with -std=c++17 -O2, the medians of {repetitions} "
          "compilations in\nturn; in brackets the minima.\n")
    print("| header | " + " | ".join(COMPILERS) + " |")
    print("|---|" + "--:|" * len(COMPILERS))
    for header in HEADERS[1:]:
        cells = ["{} ({})".format(*("{:.2f}".format(f(times[header]) / f(times["string"]))
                                    for f in (statistics.median, min))) for times in columns]
        print(f"| `{header}` | " + " | ".join(cells) + " |")


if __name__ == "__main__":
    main()
