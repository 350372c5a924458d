#!/usr/bin/python3
"""Checks what the debuggers show of a program, with the library installed as users install it.

usage: debugger_test.py SOURCE-DIRECTORY C++-COMPILER
"""

import itertools
import os
import pathlib
import re
import shutil
import subprocess
import sys
import tempfile

WHOLE = {
    "text": r'"Grüße\t\"😀\u202e" (size 16, capacity 16)',
    "alias": r'"Grüße\t\"😀\u202e" (size 16, capacity 16)',
    "wide": r'u"Grüße\t\"😀\u202e" (size 10, capacity 11)',
    "malformed": r'"a\377\355\240\200z\342\202" (size 8, capacity 8)',
    "lone": r'u"a\udc00b\ud83d" (size 4, capacity 4)',
    "bytes": r'"\0001\033" (size 3, capacity 3)',
    "movable": r'u"Grüße\t\"😀\u202e" (size 10, capacity 10)',
    "empty": '"" (size 0, capacity 0)',
}
BROKEN = {
    "negative": "its size is negative, -1 bytes",
    "above": "its size, 9 bytes, is above its capacity, 8 bytes",
    "odd": "its size, 3 bytes, isn't a whole number of elements",
    "nowhere": "it has no storage, but a capacity of 8 bytes",
    "unreadable": "its storage can't be read at 0x10",
    "wrapping": "its storage can't be read at 0xfffffffffffffffe",
    "huge": "its storage can't be read at 0x",
}
LIMITED = {"text": '"Gr"... (size 16,', "wide": 'u"Grü"... (size 10,', "long_text": 'u"€€€"... (size 1000, capacity 5000)'}
ASCII = {"text": r'"Gr\u00fc\u00dfe\t\"\U0001f600\u202e" (size 16, capacity 16)'}


def run(*command, **variables):
    result = subprocess.run(command, env={**os.environ, "LC_ALL": "C.UTF-8", **variables}, timeout=300,
                            stdout=subprocess.PIPE, stderr=subprocess.STDOUT, encoding="utf-8", errors="replace")
    if result.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}\n{result.stdout}")
    return result.stdout


def expect(output, wanted):
    shown = dict(re.findall(r"^(?:\(.*?\) )?(\w+) = (?:@?0x[0-9a-f]+:? )?(.*)", output, re.MULTILINE))
    for name, summary in wanted.items():
        if not shown.get(name, "").startswith(summary):
            sys.exit(f"{name} is not {summary} but {shown.get(name)} in\n{output}")


def expect_text_alone(output):
    if " = {" in output or re.search("warning: .*script", output):
        sys.exit(f"unwanted elements, or a warning, in\n{output}")
    return output


def expect_all(whole, limited):
    expect(whole, WHOLE)
    expect(whole, {name: f"<corrupt or uninitialised: {fault}" for name, fault in BROKEN.items()})
    expect(limited, LIMITED)


def gdb(program, prefix, **variables):
    """Passes only GDB's data directory, in which GDB must find the script by itself."""
    output = run("gdb", "-nx", "-batch", "-data-directory", f"{prefix}/share/gdb", "-iex", "set debuginfod enabled off",
                 "-ex", "break Stop", "-ex", "run", "-ex", "up", "-ex", "info locals", "-ex", "echo LIMITED\\n",
                 "-ex", "set print elements 3", "-ex", "info locals", "-ex", "echo ELEMENTS\\n",
                 "-ex", "set print elements 200", "-ex", "set print mirel-elements on", "-ex", "info locals", program,
                 **variables)
    whole, limited, elements = re.split("LIMITED|ELEMENTS", output)
    expect(elements, {"bytes": WHOLE["bytes"] + r" = {0 '\000', 49 '1', 27 '\033'}"})
    return expect_text_alone(whole), expect_text_alone(limited)


def run_lldb(*arguments):
    # LLDB doesn't look for its Python modules where Debian's package puts them.
    modules = ":".join(map(str, pathlib.Path("/usr/lib").glob("llvm-*/lib/python3.*/*-packages")))
    return run("lldb", "--no-lldbinit", "-b", *arguments, PYTHONPATH=modules)


def lldb(program, prefix):
    script = f"{prefix}/share/gdb/python/gdb/printer/mirel_printers.py"
    commands = [f"command script import {script}", "break set -n Stop", "run", "up", "frame variable",
                'script print("LIMITED")', "settings set target.max-string-summary-length 3", "frame variable",
                'script print("ELEMENTS")', "type category enable mirel-elements", "frame variable lone"]
    options = itertools.chain.from_iterable(("-o", command) for command in commands)
    whole, limited, elements = re.split("\nLIMITED|\nELEMENTS", run_lldb(*options, program))
    if not re.search(r"\[1\] = 56320\s+\[2\] = 98\s", elements):
        sys.exit(f"no elements in\n{elements}")
    return whole, limited


def main():
    source, compiler = sys.argv[1:]
    if not shutil.which("gdb"):
        print("skipped: gdb is not installed")
        sys.exit(77)
    has_lldb = shutil.which("lldb") and "\n42" in run_lldb("-o", "script print(6 * 7)")
    if not has_lldb:
        print("lldb is not installed, or can't run Python: only gdb is tested")
    compilers = [compiler, "clang++"] if shutil.which("clang++") else [compiler]
    with tempfile.TemporaryDirectory() as directory:
        for kind, shared in (("static", "OFF"), ("shared", "ON")):
            prefix, program = f"{directory}/{kind}", f"{directory}/{kind}_program"
            shutil.copytree("/usr/share/gdb", f"{prefix}/share/gdb")
            run("cmake", "-S", source, "-B", f"{prefix}_build", "-G", "Ninja", f"-DCMAKE_CXX_COMPILER={compiler}",
                f"-DBUILD_SHARED_LIBS={shared}", f"-DCMAKE_INSTALL_PREFIX={prefix}", "-DCMAKE_INSTALL_LIBDIR=lib",
                "-DMIREL_BUILD_TESTS=OFF", "-DMIREL_BUILD_EXAMPLES=OFF")
            run("cmake", "--build", f"{prefix}_build", "--target", "install", "-j2")
            for cxx, dwarf in itertools.product(compilers, ("-gdwarf-4", "-gdwarf-5")):
                run(cxx, "-std=c++17", dwarf, f"-I{prefix}/include/mirel", f"{source}/tests/package/debugger_program.cpp", "-o",
                    program, f"-L{prefix}/lib", "-lmirel_utils", f"-Wl,--gc-sections,-rpath,{prefix}/lib")
                expect_all(*gdb(program, prefix))
            expect(gdb(program, prefix, LC_ALL="C")[0], ASCII)
            if has_lldb:
                expect_all(*lldb(program, prefix))


if __name__ == "__main__":
    main()
