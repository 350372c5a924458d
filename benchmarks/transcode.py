#!/usr/bin/python3
"""Compares the example program with the C library's iconv command, and prints a table of ratios.

usage: transcode.py TRANSCODE [MEGABYTES [REPETITIONS]]

A ratio is iconv's time divided by ours, so that above 1 we are ahead. The two run in turn on the same file, from start
to exit, and print to /dev/null; the ratio is taken of the medians, and the spread is that of single repetitions. Before
that their outputs are compared.
"""

import ast
import filecmp
import pathlib
import random
import re
import statistics
import subprocess
import sys
import tempfile
import time

TEXTS = pathlib.Path(__file__).with_name("Texts.h")
STRING = r'"(?:[^"\\]|\\.)*"'
WORK = [("utf-8", "utf-16le"), ("utf-16le", "utf-8"), ("utf-8", "utf-8")]


def read_sentences():
    """{language: [sentence]}"""
    entries = re.findall(r'\{"(\w+)",\s*\{((?:%s|[,\s])*)\}\}' % STRING, TEXTS.read_text())
    return {name: [ast.literal_eval(s) for s in re.findall(STRING, sentences)] for name, sentences in entries}


def make_text(sentences, size):
    sizes = [len(s.encode()) for s in sentences]
    rng = random.Random(11)
    chosen, total = [], 0
    while total < size:
        i = rng.randrange(len(sentences))
        chosen.append(sentences[i])
        total += sizes[i]
    return "".join(chosen)


def run(command, output):
    with open(output, "wb") as file:
        start = time.perf_counter()
        subprocess.run(command, stdout=file, check=True)
        return time.perf_counter() - start


def measure(transcode, source, target, path, directory, repetitions):
    ours = [transcode, "-f", source, "-t", target, path]
    theirs = ["iconv", "-f", source, "-t", target, path]
    run(ours, directory / "ours")
    run(theirs, directory / "theirs")
    if not filecmp.cmp(directory / "ours", directory / "theirs", shallow=False):
        sys.exit(f"{path.name}, {source} to {target}: the outputs differ")
    times = [(run(ours, "/dev/null"), run(theirs, "/dev/null")) for _ in range(repetitions)]
    single = [t / o for o, t in times]
    medians = [statistics.median(column) for column in zip(*times)]
    return f"{medians[1] / medians[0]:.2f} ({min(single):.2f} to {max(single):.2f})"


def main():
    transcode = str(pathlib.Path(sys.argv[1]).resolve())
    size = int(sys.argv[2] if len(sys.argv) > 2 else 40) * 1000 * 1000
    repetitions = int(sys.argv[3] if len(sys.argv) > 3 else 9)
    print("# transcode beside iconv\n")
    print(f"The time of the C library's `iconv` command divided by ours, on {size // 10**6} MB of each text; {repetitions} "
          "repetitions of\neach, in turn. The spread is in brackets. `./dev bench` repeats it.\n")
    print("| text | " + " | ".join(f"{source} to {target}" for source, target in WORK) + " |")
    print("|---|" + "--:|" * len(WORK))
    for language, sentences in read_sentences().items():
        with tempfile.TemporaryDirectory() as name:
            directory = pathlib.Path(name)
            text = make_text(sentences, size)
            for encoding in ("utf-8", "utf-16le"):
                (directory / encoding).write_bytes(text.encode(encoding))
            cells = [measure(transcode, source, target, directory / source, directory, repetitions)
                     for source, target in WORK]
            print(f"| {language} | " + " | ".join(cells) + " |", flush=True)


if __name__ == "__main__":
    main()
