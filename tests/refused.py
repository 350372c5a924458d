#!/usr/bin/python3
"""Compiles each call of refused.txt, and compares the compiler's message with the text above the call.

usage: refused.py SOURCE-DIRECTORY WORK-DIRECTORY C++-COMPILER [OPTION...]
"""

import concurrent.futures
import pathlib
import subprocess
import sys

PRELUDE = """
#include <algorithm>
#include <functional>
#include <iostream>
#include <iterator>
#include <string>
#include <utils/xostream.h>
#include <utils/xstring.h>
using namespace mirel;
enum class E { e };
enum Unscoped {};
struct Wrapped { operator int() const; };
struct Converts : std::string { operator string8() const; };
namespace Program { // with operators of its own: functions, templates, and one that takes a view
string8 operator+(const string8&, const char*);
template <class T> bool operator==(const basic_xstring<T>&, const basic_xstring<T>&);
template <class T> bool operator<(const xvector<T>&, const xvector<T>&);
bool operator==(const string8&, std::string_view);
template <class C, class Traits>
std::basic_ostream<C, Traits>& operator<<(std::basic_ostream<C, Traits>&, const xvector<C>&);
inline bool Use(const string8& s) { return s + "x" == s && s < s && s == "x" && std::cout << s << s + s; }
}
"""
CALL = """void F(string8& s, string8& t, const string8& cs, string16& w, xvector<char8>& v, VectorOfByte& b, xostream& os, int n) {
  [[maybe_unused]] double doubles[9]; Wrapped wrapped[1]; Converts converts; volatile char bit = 1;
  (void)s, (void)t, (void)cs, (void)w, (void)v, (void)b, (void)os, (void)n, (void)wrapped, (void)converts, (void)bit;
  (void)(%s);
}
"""


def main():
    source, work, *compiler = sys.argv[1:]
    work = pathlib.Path(work)
    work.mkdir(exist_ok=True)
    compiler += ["-std=c++17", "-O1", "-I", source, "-x"]
    prelude = work / "prelude.h"
    prelude.write_text(PRELUDE)
    subprocess.run([*compiler, "c++-header", prelude, "-o", work / "prelude.h.gch"], check=True)

    def check(expected, include, call):
        result = subprocess.run([*compiler, "c++", "-include", prelude, "-S", "-o", "/dev/null", "-"],
                                input=include + CALL % call, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True)
        good = result.returncode == 0 if expected == "compiles" else expected in result.stdout
        return "" if good else f"{call}: not '{expected}':\n{result.stdout}\n"

    calls, expected, include = [], None, ""
    for line in (pathlib.Path(source) / "tests" / "refused.txt").read_text().splitlines():
        if line.startswith("["):
            expected = line.strip("[]")
        elif line.startswith("#include"):
            include += line + "\n"
        elif line and not line.startswith("#"):
            calls.append((expected, include, line))
    with concurrent.futures.ThreadPoolExecutor(2) as pool:
        failures = [text for text in pool.map(lambda call: check(*call), calls) if text]
    print(*failures, f"{len(calls) - len(failures)} of {len(calls)} calls as expected")
    return len(failures) > 0 or not calls


if __name__ == "__main__":
    sys.exit(main())
