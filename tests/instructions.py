#!/usr/bin/python3
"""Looks for instructions that a processor may not have.

usage: instructions.py OBJDUMP ARCHIVE [INSTRUCTION-SET...]

Disassembles the static library for x86-64. Only the kernels of an instruction set, recognised by their names, may have
instructions that are newer than the first 64-bit processors; the named instruction sets must be used.
"""

import re
import subprocess
import sys

SSE4 = re.compile(r"p(shufb|alignr|hadd|hsub|maddubsw|mulhrsw|sign[bwd]|abs[bwd])|pblend|blendv|pmov[sz]x|ptest|popcnt|crc32"
                  r"|pcmp(eqq|gtq|[ei]str)|p(min|max)(sb|uw|sd|ud)|p(insr|extr)[bdq]|packusdw|pmulld|round[ps]|mpsadbw")
AVX2 = re.compile(r"v[a-z]|(andn|bextr|blsi|blsr|blsmsk|bzhi|mulx|pdep|pext|rorx|sarx|shlx|shrx|lzcnt)[lq]?$")


def main():
    listing = subprocess.run([sys.argv[1], "-d", "-C", "--no-show-raw-insn", sys.argv[2]], check=True, text=True,
                             stdout=subprocess.PIPE).stdout
    function, counts, faults = "", {"AVX2": 0, "SSE4": 0, "": 0}, []
    for line in listing.splitlines():
        if line.endswith(">:"):
            function = line
        fields = line.split("\t")
        if len(fields) < 2:
            continue
        level = next((name for name in ("AVX2", "SSE4") if "N_" + name in function), "")
        mnemonic = fields[1].split()[0] if fields[1].split() else ""
        if AVX2.match(mnemonic):
            needed = "AVX2"
        else:
            needed = "SSE4" if SSE4.match(mnemonic) else ""
        counts[needed] += 1
        if needed not in (level, "") and (level, needed) != ("AVX2", "SSE4"):
            faults.append(f"{needed}: {mnemonic} in {function}")
    print("\n".join(sorted(set(faults))))
    print("instructions:", ", ".join(f"{count} {name or 'of any processor'}" for name, count in counts.items()))
    return bool(faults) or not all(counts[name] for name in ["", *sys.argv[3:]])


if __name__ == "__main__":
    sys.exit(main())
