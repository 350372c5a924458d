#!/usr/bin/python3
"""Makes docs/benchmarks.md and docs/benchmarks.png from the results of the benchmark programs.

usage: report.py OUTPUT-DIRECTORY NAME=RESULTS.json...

A ratio is the peer's time divided by ours, so that above 1 we are ahead. Parties run in turn, again and again; the
ratio is taken of the medians, and the spread is the middle half of the ratios of single repetitions.
"""

import csv
import json
import pathlib
import statistics
import sys

import matplotlib

matplotlib.use("Agg")
import matplotlib.pyplot as plt

GOALS = pathlib.Path(__file__).with_name("goals.csv")
NOTES = pathlib.Path(__file__).with_name("notes.md")
LISTED_SIZES = {"12", "65536", "1000", "200000"}


def read_times(path):
    """{case: {party: [time of each repetition]}}, a case being (work, data, size, width)."""
    results = json.loads(pathlib.Path(path).read_text())
    times = {}
    for run in results["benchmarks"]:
        if run["run_type"] != "iteration":
            continue
        *case, party = run["run_name"].split(";")
        times.setdefault(tuple(case), {}).setdefault(party, []).append(run["real_time"])
    return times, results["context"]


def ratio(ours, theirs):
    low, _, high = statistics.quantiles((t / o for o, t in zip(ours, theirs)), n=4)
    return statistics.median(theirs) / statistics.median(ours), low, high


def read_goals():
    """The rows of the goals, of which the first that fits holds; a field is part of a name, an empty one of any."""
    with GOALS.open(newline="") as file:
        return list(csv.DictReader(file))


def goal_of(goals, case, peer):
    work, data, size, width = case
    for row in goals:
        wanted = {"work": work, "data": data, "size": size, "width": width, "peer": peer}
        if all(not row[key] or row[key] in wanted[key] for key in wanted):
            return float(row["goal"]), row["reason"]
    return None, ""


def table(runs, goals, keep):
    names = list(runs)
    lines = ["| work | data | size | width | peer | " + " | ".join(names) + " | goal | |",
             "|---|---|--:|---|---|" + "--:|" * len(names) + "--:|---|"]
    below = total = 0
    first = runs[names[0]]
    for case in sorted(first, key=lambda c: (c[0], c[1], c[3], int(c[2]))):
        for peer in sorted(first[case]):
            if peer == "ours" or not keep(case):
                continue
            ratios = [ratio(runs[n][case]["ours"], runs[n][case][peer]) for n in names]
            goal, reason = goal_of(goals, case, peer)
            cells = [f"{r:.2f} ({low:.2f} to {high:.2f})" for r, low, high in ratios]
            missing = [high for r, _, high in ratios if goal is not None and round(r, 2) < goal]
            total += goal is not None
            below += bool(missing)
            note = ""
            if missing:
                note = "within the spread" if all(high >= goal for high in missing) else reason or "below"
            lines.append(f"| {case[0]} | {case[1]} | {case[2]} | {case[3]} | {peer} | " + " | ".join(cells) +
                         f" | {goal if goal is not None else ''} | {note} |")
    return lines, total, below


def plot(runs, path):
    """One bar for each case of 64 Ki units and for each peer, in the first of the runs."""
    name, times = next(iter(runs.items()))
    bars = []
    for case in sorted(times, key=lambda c: (c[0], c[1], c[3])):
        if case[2] in ("65536", "200000"):
            for peer in sorted(times[case]):
                if peer != "ours":
                    value, _, _ = ratio(times[case]["ours"], times[case][peer])
                    bars.append((f"{case[0]}, {case[1]}, {case[3]}: {peer}", value))
    figure, axes = plt.subplots(figsize=(11, 0.17 * len(bars) + 1))
    axes.barh([label for label, _ in bars], [value for _, value in bars],
              color=["#2a78b5" if value >= 1 else "#c25b4e" for _, value in bars])
    axes.set_xscale("log")
    axes.set_xlim(min(0.25, min(v for _, v in bars)), max(v for _, v in bars) * 1.2)
    axes.axvline(1, color="black", linewidth=1)
    axes.set_ylim(len(bars) - 0.5, -0.5)
    axes.tick_params(axis="y", labelsize=6)
    axes.set_xlabel(f"peer's time / our time, 64 Ki units or 200,000 edits ({name}); right of the line we are ahead")
    figure.tight_layout()
    figure.savefig(path, dpi=110)


def main():
    output = pathlib.Path(sys.argv[1])
    runs, contexts = {}, {}
    for argument in sys.argv[2:]:
        name, path = argument.split("=", 1)
        runs[name], contexts[name] = read_times(path)
    goals = read_goals()
    listed, total, below = table(runs, goals, lambda case: case[2] in LISTED_SIZES)
    others, _, _ = table(runs, goals, lambda case: case[2] not in LISTED_SIZES)
    context = next(iter(contexts.values()))
    cpu = next((line.split(":")[1].strip() for line in open("/proc/cpuinfo") if line.startswith("model name")), "?")
    repetitions = max(len(t) for case in next(iter(runs.values())).values() for t in case.values())
    lines = ["# Benchmarks", "",
             "Each number is a peer's time divided by ours on the same data in the same run: above 1 we are ahead.",
             "In brackets is the middle half of the ratios of single repetitions. Absolute times on a shared machine mean",
             "little, so the tables have none. A row that is below its goal in any column says why.", "",
             f"- machine: {cpu}, {context['num_cpus']} cores at about {context['mhz_per_cpu']} MHz",
             "- columns: the compiler and optimisation of the program; the library is a release build (-O3) by the "
             "same compiler",
             f"- command: `./dev bench`, {repetitions} repetitions of each party, interleaved at random",
             f"- rows with a goal: {total}, of which below it in at least one column: {below}", "",
             "![ratios](benchmarks.png)", "", "## Work that has goals, and its kin", "", *listed, "",
             NOTES.read_text(), "## Other sizes", "", *others, ""]
    (output / "benchmarks.md").write_text("\n".join(lines))
    plot(runs, output / "benchmarks.png")
    print(f"{total} rows with a goal, {below} below it; see {output}/benchmarks.md")


if __name__ == "__main__":
    main()
