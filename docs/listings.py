#!/usr/bin/python3
"""Checks that the programs on the pages are those that the tests run.

usage: listings.py [--write] PAGE...
       listings.py --calls PAGE

A listing follows a line that ends with a link to its file and a colon. The script names the listings that differ from
their files, or with --write updates them. --calls prints a program with every call in the second column of the page's
tables, after the page's first block of code, which has the declarations.
"""

import pathlib
import re
import sys

LISTING = re.compile(r"(?<=\]\()([^()\s]+)(\):\n\n```\w*\n)(.*?)(?=^```$)", re.MULTILINE | re.DOTALL)


def differing(page, write):
    """The files whose listings in the page differ from them."""
    text, names = page.read_text(), []

    def listing(match):
        source = (page.parent / match[1]).read_text()
        if source != match[3]:
            names.append(match[1])
        return match[1] + match[2] + source

    updated = LISTING.sub(listing, text)
    if write and names:
        page.write_text(updated)
        names = []
    if re.search(r"^```\w+\n```$", updated, re.MULTILINE):
        names.append("a file for its empty listing")
    return names


def calls(page):
    text = page.read_text()
    declarations = re.search(r"^```cpp\n(.*?)^```$", text, re.MULTILINE | re.DOTALL)[1]
    includes, rest = re.match(r"((?:#include.*\n|\n)*)(.*)", declarations, re.DOTALL).groups()
    rows = [re.split(r"(?<!\\)\|", line)[2] for line in text.splitlines() if line.startswith("| ")]
    spans = [span.replace("\\|", "|") for row in rows for span in re.findall("`+([^`]+)`+", row)]
    assert spans, f"{page} has no calls"
    return f"{includes}\nvoid Calls() {{\n{rest}" + "".join(f"  {{ {span}; }}\n" for span in spans) + "}\n"


def main():
    arguments = sys.argv[1:]
    if arguments[0] == "--calls":
        print(calls(pathlib.Path(arguments[1])))
        return
    write = arguments[0] == "--write"
    for page in map(pathlib.Path, arguments[write:]):
        if names := differing(page, write):
            sys.exit(f"{page} differs from {', '.join(names)}: run docs/listings.py --write {page}")


if __name__ == "__main__":
    main()
