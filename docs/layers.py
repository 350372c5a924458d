#!/usr/bin/python3
"""Draws the layers of the library, in the language of dot, from the #include lines of its sources.

usage: layers.py DIRECTORY > layers.dot

A box is a header with the source of the same name. A line is an include of the header, left out where other lines lead
there too; a dashed line is an include of the source alone.
"""

import pathlib
import re
import sys
import textwrap


def includes(path):
    """The names of a file's includes, of this project and of libraries; standard headers have no directory."""
    text = path.read_text()
    found = re.findall(r"^#include <(\w+)/([\w/]+)\.\w+>", text, re.MULTILINE)
    own = set(re.findall(r'^#include "([\w-]+)\.h"', text, re.MULTILINE))
    return own | {name if library == "utils" else library for library, name in found}


def summary(path):
    """The first sentence of a file's first comment, which describes the file."""
    comment = re.search(r"^//[^\n]*(\n//[^\n]*)*", path.read_text(), re.MULTILINE)
    text = " ".join(re.sub(r"^//+( @file)?", "", line).strip() for line in comment[0].splitlines()).strip()
    return re.match(r".*?[.](?= |$)", text)[0]


def below(edges, start):
    """The nodes that are reached from a node, in one step or more."""
    reached, steps = set(), list(edges.get(start, ()))
    while steps:
        step = steps.pop()
        if step not in reached:
            reached.add(step)
            steps += edges.get(step, ())
    return reached


def main():
    directory = pathlib.Path(sys.argv[1])
    headers = {path.stem: path for path in sorted([*directory.glob("*.h"), *directory.glob("src/*.h")])}
    sources = {path.stem: path for path in sorted(directory.glob("src/*.cpp"))}
    above = {name: includes(path) for name, path in headers.items()}
    loops = [name for name in above if name in below(above, name)]
    if loops:
        sys.exit(f"headers include each other: {', '.join(loops)}")

    print('digraph layers {')
    print('node [shape=box, margin="0.2,0.1", fontname="sans-serif", fontsize=10]')
    print('edge [arrowsize=0.6]')
    for name, path in {**sources, **headers}.items():
        lines = textwrap.wrap(summary(path), 44)
        title = path.relative_to(directory.parent)
        print(f'"{name}" [label=<<b>{title}</b><br/>{"<br/>".join(map(escape, lines))}>]')
    for name, targets in above.items():
        for target in sorted(targets):
            if not any(target in below(above, other) for other in targets):
                print(f'"{name}" -> "{target}"')
    for name, path in sources.items():
        for target in sorted(includes(path) - {name}):
            if target not in below(above, name):
                print(f'"{name}" -> "{target}" [style=dashed{", constraint=false" if name in headers else ""}]')
    print("}")


def escape(text):
    return text.replace("&", "&amp;").replace("<", "&lt;").replace(">", "&gt;")


if __name__ == "__main__":
    main()
