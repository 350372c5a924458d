#!/usr/bin/python3
"""Makes docs/benchmarks.md and docs/benchmarks.png from the results of the benchmark programs.

usage: report.py OUTPUT-DIRECTORY NAME=RESULTS.json...

A ratio is the peer's time divided by ours: above 1 we are ahead. The contenders run many times, interleaved at random;
the ratio is that of the medians. A ratio for several texts is their geometric mean.
"""

import collections
import csv
import fnmatch
import functools
import json
import pathlib
import re
import statistics
import sys

import matplotlib

matplotlib.use("Agg")
import matplotlib.pyplot as plt

GOALS = pathlib.Path(__file__).with_name("goals.csv")
NOTES = pathlib.Path(__file__).with_name("notes.md")
# The columns of sizes, the smallest size in each, and its colour. Size 200 is in none.
SIZES = {"12–16": (1, "#c6a300"), "64": (64, "#6fa93d"), "1,000": (1000, "#1f9e89"), "64 Ki": (65536, "#31688e"),
         "4 Mi": (1 << 19, "#440154")}
EARLIER = "earlier version"
WORST_OF_GOAL = 0.7  # no text may be below this fraction of a goal
CONVERSIONS = ("UTF-8 to UTF-16", "UTF-16 to UTF-8")
# The first table: a label, benchmarks, their data, unit and column of sizes. Ten rows, with those where others are ahead.
GLANCE = [
    ("converting UTF-8 to UTF-16", "UTF-8 to UTF-16", "*", "*", "64 Ki"),
    ("converting UTF-16 to UTF-8", "UTF-16 to UTF-8", "*", "*", "64 Ki"),
    ("converting malformed UTF-8 with U+FFFD", "lossy, malformed, UTF-8*", "*", "*", "64 Ki"),
    ("checking UTF-8", "FindMalformed", "*", "bytes", "64 Ki"),
    ("finding a byte", "find(c)", "*", "bytes", "64 Ki"),
    ("finding a needle in UTF-8", "find(needle)", "*, absent", "bytes", "64 Ki"),
    ("finding a needle in UTF-16", "find(needle)", "*, absent", "16-bit units", "64 Ki"),
    ("splitting UTF-8 into words", "splitting", "*", "bytes", "64 Ki"),
    ("building a string by appends", "append*", "*", "edits, bytes", "64 Ki"),
    ("sorting and storing short strings", "push_back of strings|copy and sort|insertion of keys", "*", "* bytes", "1,000"),
]

Case = collections.namedtuple("Case", "area operation data size unit")


class Run:
    """The results of one program: times[case][contender] lists the time of each repetition."""

    def __init__(self, path):
        results = json.loads(pathlib.Path(path).read_text())
        self.context = results["context"]
        self.times = {}
        for run in results["benchmarks"]:
            if run["run_type"] == "iteration":
                area, operation, data, size, unit, contender = re.sub("/repeats:.*", "", run["run_name"]).split(";")
                case = self.times.setdefault(Case(area, operation, data, int(size), unit), {})
                case.setdefault(contender, []).append(run["real_time"])
        self.times = {case: contenders for case, contenders in self.times.items() if "ours" in contenders}

    @functools.lru_cache(maxsize=None)
    def ratio(self, case, peer):
        return statistics.median(self.times[case][peer]) / statistics.median(self.times[case]["ours"])

    def has(self, case, peer):
        return peer in self.times.get(case, {})

    def single_ratios(self, case, peer):
        return [theirs / ours for ours, theirs in zip(self.times[case]["ours"], self.times[case][peer])]

    def mean(self, cases, peer):
        return statistics.geometric_mean(self.ratio(case, peer) for case in cases)

    def upper_quartile(self, cases, peer):
        """The upper quartile of the means of single repetitions."""
        means = [statistics.geometric_mean(r) for r in zip(*(self.single_ratios(case, peer) for case in cases))]
        return statistics.quantiles(means, n=4)[2] if len(means) > 1 else means[0]

    def peers(self, cases):
        """The contenders of all the cases, except the library itself in another way or another version."""
        common = set.intersection(*(set(self.times[case]) for case in cases)) if cases else set()
        return sorted(p for p in common if p not in ("ours", EARLIER) and not p.startswith("our "))

    def closest_peer(self, cases):
        return min(self.peers(cases), key=lambda peer: self.mean(cases, peer), default=None)

    def select(self, operations, data="", unit="", column=None):
        """The cases that match the patterns, of which an empty one matches all, and the column of sizes."""
        return [c for c in self.times if any(fnmatch.fnmatchcase(c.operation, w.replace("[]", "[[]]"))
                                             for w in operations.split("|"))
                and fnmatch.fnmatchcase(c.data, data or "*") and fnmatch.fnmatchcase(c.unit, unit or "*")
                and (column is None or column_of(c.size) == column)]


def column_of(size):
    if size == 200:
        return None
    return [name for name, (smallest, _) in SIZES.items() if size >= smallest][-1]


def number(size):
    for power, name in ((20, "Mi"), (10, "Ki")):
        if size % (1 << power) == 0:
            return f"{size >> power} {name}"
    return f"{size:,}"


def table(header, alignment, rows):
    return ["| " + " | ".join(header) + " |", "|" + "|".join(alignment) + "|",
            *("| " + " | ".join(row) + " |" for row in rows), ""]


def glance(run):
    rows = []
    for label, operations, data, unit, column in GLANCE:
        cases = run.select(operations, data, unit, column)
        peer = run.closest_peer(cases)
        amounts = sorted({f"{number(case.size)} {case.unit}" for case in cases})
        ratio = f"{run.mean(cases, peer):.2f}" if peer else ""
        rows.append([label, ", ".join(amounts), peer or "not measured", ratio])
    return rows


def measure_goal(run, cases, peers, goal):
    """(the cell of the table, whether the goal is reached, whether it is within the spread), or None."""
    groups = {}
    for case in cases:
        for peer in peers:
            if run.has(case, peer):
                groups.setdefault((case.operation, case.unit, peer), []).append(case)
    if not groups:
        return None
    means = {group: run.mean(members, group[2]) for group, members in groups.items()}
    lowest = min(means, key=means.get)
    worst, worst_case, worst_group = min((run.ratio(case, group[2]), case, group)
                                         for group, members in groups.items() for case in members)

    def name(group):  # its fields that differ from other groups'
        fields = (0, 2) if len({(g[0], g[2]) for g in groups}) == len(groups) else (0, 1, 2)
        return ", ".join(group[i] for i in fields if len({g[i] for g in groups}) > 1)

    text = f"{means[lowest]:.2f}" + (f" {name(lowest)}" if len(groups) > 1 else "")
    if max(map(len, groups.values())) > 1:
        beside = f", {name(worst_group)}" if worst_group != lowest else ""
        text += f" ({worst:.2f} {worst_case.data}{beside})"
    reached = round(means[lowest], 2) >= goal and round(worst, 2) >= round(WORST_OF_GOAL * goal, 2)
    close = worst >= WORST_OF_GOAL * goal and all(
        means[group] >= goal or run.upper_quartile(members, group[2]) >= goal for group, members in groups.items())
    return text, reached, close


def goals_table(runs):
    """A row for each goal and size; the rows of goals.csv name the cases and peers of each."""
    rows, reached = [], 0
    with GOALS.open(newline="") as file:
        goals = [(row, column) for row in csv.DictReader(file) for column in SIZES if row[column]]
    for row, column in goals:
        beside_earlier = row[column] == EARLIER  # the goal is to be as fast as that
        goal = 1.0 if beside_earlier else float(row[column])
        peers = [EARLIER] if beside_earlier else row["peer"].split("|")
        found = [run.select(row["operation"], row["data"], row["unit"], column) for run in runs.values()]
        results = [measure_goal(run, cases, peers, goal) for run, cases in zip(runs.values(), found)]
        missed = [r for r in results if r and not r[1]]
        sizes = sorted({case.size for case in sum(found, [])})
        units = sorted({case.unit for case in sum(found, [])})
        reason = "" if all(results) else "not measured"
        if missed:
            reason = "within the spread" if all(r[2] for r in missed) else row["reason"] or "**below**"
        reached += not missed and all(results)
        operation = row["operation"].replace("|", ", ") + (f": {row['data']}" if row["data"] else "")
        rows.append([operation.replace("*", "…"), " or ".join(peers), ", ".join(map(number, sizes)) or column,
                     " or ".join(units) or row["unit"] or "units", f"{goal:g}",
                     *(r[0] if r else "–" for r in results), reason])
    return rows, reached


def long_table(runs, area):
    """A row for each benchmark, text and peer; a cell has the ratios of all runs."""
    cases = {case: None for run in runs.values() for case in run.times if case.area == area}
    sizes = sorted({case.size for case in cases})
    rows = {}
    for case in cases:
        for peer in {p: None for run in runs.values() for p in run.times.get(case, {}) if p != "ours"}:
            rows.setdefault((case.operation, case.data, case.unit, peer), {})[case.size] = case
    lines = []
    for (operation, data, unit, peer), by_size in sorted(rows.items()):
        cells, spreads = [], []
        for size in sizes:
            case = by_size.get(size)
            here = [run if case and run.has(case, peer) else None for run in runs.values()]
            cells.append(" / ".join(f"{run.ratio(case, peer):.2f}" if run else "–" for run in here)
                         if any(here) else "–")
            for run in filter(None, here):
                singles = run.single_ratios(case, peer)
                if len(singles) > 1:
                    low, middle, high = statistics.quantiles(singles, n=4)
                    spreads.append((high - low) / 2 / middle)
        spread = f"±{statistics.median(spreads):.0%}" if spreads else ""
        lines.append([operation, data, unit, peer, *cells, spread])
    header = ["benchmark", "data", "unit", "peer", *map(number, sizes), "spread"]
    return table(header, ["---"] * 4 + ["--:"] * (len(sizes) + 1), lines)


def plot(name, run, path):
    """A panel for each area, with a row for each benchmark and a dot for each column of sizes."""
    def row(label, cases, peer):
        columns = {column: [c for c in cases if column_of(c.size) == column] for column in SIZES}
        return label, {column: run.mean(group, peer) for column, group in columns.items() if group}

    def by_peer(operation):
        cases = run.select(operation)
        rows = [row(peer, cases, peer) for peer in run.peers(cases)]
        return sorted(rows, key=lambda r: statistics.geometric_mean(r[1].values()))

    def by_operation(*areas):
        groups = {}
        for case in run.times:
            if case.area in areas and case.size != 200 and case.operation not in CONVERSIONS:
                groups.setdefault(case.operation, []).append(case)
        for operation, cases in sorted(groups.items()):
            kinds = {case.unit: [c for c in cases if c.unit == case.unit] for case in cases}
            for unit, members in kinds.items():
                peer = run.closest_peer(members)
                width = "" if len(kinds) == 1 else ", bytes" if unit.endswith("bytes") else ", 16-bit"
                if peer:
                    yield row(f"{operation}{width}: {peer}", members, peer)

    panels = [("UTF-8 to UTF-16, mean over all texts", by_peer(CONVERSIONS[0])),
              ("UTF-16 to UTF-8, mean over all texts", by_peer(CONVERSIONS[1])),
              ("Searches in bytes", list(by_operation("Searches in bytes"))),
              ("Searches in 16-bit units", list(by_operation("Searches in 16-bit units"))),
              ("Building and editing", list(by_operation("Building", "Editing"))),
              ("Fresh, malformed, worst cases, short strings",
               list(by_operation("Conversions into a fresh string", "Malformed text", "Worst cases", "Short strings"))),
              ("Text: checking, counting, walking", list(by_operation("Text"))),
              ("Lossy conversions", list(by_operation("Lossy conversions")))]
    heights = [max(len(panels[i][1]), len(panels[i + 1][1]), 1) + 3 for i in range(0, len(panels), 2)]
    figure, grid = plt.subplots(len(heights), 2, figsize=(13, 10), height_ratios=heights)
    for axes, (title, rows) in zip(grid.flat, panels):
        for column, (_, colour) in SIZES.items():
            places = [(values[column], y) for y, (_, values) in enumerate(rows) if column in values]
            axes.scatter(*zip(*places) if places else ((), ()), s=22, color=colour, label=column, zorder=3)
        axes.axvline(1, color="black", linewidth=1)
        axes.set_xscale("log", base=2)
        axes.xaxis.set_major_formatter(matplotlib.ticker.FuncFormatter(lambda x, _: f"{x:g}"))
        axes.set_yticks(range(len(rows)), [label for label, _ in rows], fontsize=7.5)
        axes.set_ylim(len(rows) - 0.4, -0.6)
        axes.tick_params(axis="x", labelsize=7.5)
        axes.grid(axis="both", color="#dddddd", linewidth=0.6)
        axes.set_title(title, fontsize=9.5, loc="left")
    handles, labels = grid.flat[0].get_legend_handles_labels()
    figure.legend(handles, labels, loc="lower center", ncol=5, fontsize=8.5, frameon=False,
                  title=f"peer's time / ours ({name}), by units; right of the line we are ahead", title_fontsize=8.5)
    figure.tight_layout(rect=(0, 0.055, 1, 1))
    figure.savefig(path, dpi=100)


def read_notes():
    """{heading: text}; a text whose heading is an area stands above that area's table."""
    parts = re.split("^## (.*)\n", NOTES.read_text(), flags=re.MULTILINE)
    return dict(zip(parts[1::2], (text.strip() for text in parts[2::2])))


def main():
    output = pathlib.Path(sys.argv[1])
    runs = {name: Run(path) for name, path in (argument.split("=", 1) for argument in sys.argv[2:])}
    names = list(runs)
    first = runs[names[0]]
    notes = read_notes()
    goals, reached = goals_table(runs)
    cpu = next((line.split(":")[1].strip() for line in open("/proc/cpuinfo") if line.startswith("model name")), "?")
    repetitions = max(len(times) for case in first.times.values() for times in case.values())
    context = first.context

    def peer_line(peer):
        return f"- {peer}: {context.get(peer, 'not measured')}"

    lines = ["# Benchmarks", "",
             "Each number is a peer's time divided by ours on the same data in the same run: above 1 we are ahead.",
             f"First the main results, with {names[0]}: the best peer is the one with the lowest ratio.", "",
             *table(["what we do", "of what", "best peer", "its time / ours"], ["---", "---", "---", "--:"],
                    glance(first)),
             "A ratio for several texts is their geometric mean. Units are code units: bytes of UTF-8, or 16-bit units",
             "of UTF-16.", "", "![ratios](benchmarks.png)", "", "## How it was measured", "",
             f"- machine: {cpu}, {context['num_cpus']} cores at about {context['mhz_per_cpu']} MHz",
             f"- our kernels: {context.get('kernels', '?')}", peer_line("simdutf, same level"),
             peer_line("simdutf, best"), f"- earlier version: {context.get(EARLIER, 'not measured')}",
             "- columns: the compiler and optimisation of the program; the library and simdutf are release builds (-O3)",
             "  by the same compiler",
             f"- command: `./dev bench`, with `--simdutf` and `--before` for those peers; {repetitions} repetitions of "
             "each contender, 9 for the", "  longest, interleaved at random",
             "- conversions of up to 64 units go through eight texts in turn; texts of 12 to 16 units end between code points",
             "- absolute times on a shared machine mean little, so the tables have none", "",
             "## Goals", "",
             "A goal applies to the geometric mean over the texts, against the peer with the lowest ratio. In brackets is the",
             f"worst text, which may not be below {WORST_OF_GOAL} of the goal. A row that is below its goal in any column",
             f"gives the reason. Of {len(goals)} goals {reached} are reached in all columns. The goals beside the earlier",
             "version keep short inputs from getting slower.", "",
             *table(["benchmark", "peer", "size", "unit", "goal", *names, "reason"],
                    ["---", "---", "--:", "---", "--:", *["--:"] * len(names), "---"], goals)]
    areas = {case.area: None for case in first.times}
    for heading, text in notes.items():
        if heading not in areas:
            lines += [f"## {heading}", "", text, ""]
    lines += ["## All benchmarks", "",
              f"A cell has the ratios of {' / '.join(names)}; – stands for not measured. The spread is half the",
              "interquartile range of the ratios of single repetitions, relative to their median; the column has the median of",
              "a row's spreads.", ""]
    for area in sorted(areas):
        lines += [f"### {area}", "", *([notes[area], ""] if area in notes else []), *long_table(runs, area)]
    (output / "benchmarks.md").write_text("\n".join(lines).rstrip() + "\n")
    plot(names[0], first, output / "benchmarks.png")
    print(f"{len(goals)} goals, {reached} reached; see {output}/benchmarks.md")


if __name__ == "__main__":
    main()
