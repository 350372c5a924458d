#!/usr/bin/python3
"""Fails if a page of the built reference links to a file that isn't there: doxygen passes on what it can't resolve.

usage: links.py DIRECTORY
"""

import pathlib
import re
import sys

root = pathlib.Path(sys.argv[1])
links = [(page.name, link) for page in sorted(root.glob("*.html"))
         for link in re.findall(r'(?:href|src)="([^"#?]+)', page.read_text()) if not re.match(r"[a-z]+:", link)]
dead = [f"{page}: {link} isn't there" for page, link in links if not (root / link).exists()]
sys.exit("\n".join(dead) or None if links else f"no links in {root}")
