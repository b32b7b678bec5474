#!/usr/bin/env python3
"""Puts measurements into a document: tables.py [--windows] DOCUMENT JSON...
Each item's tables replace what stands between its two marks in the document, <!-- ITEM --> and
<!-- /ITEM -->; an item without marks gets its own section at the end. A ratio is the time of who
is named over ours. With --windows all go into one table, between the marks of "windows"; its last
column is our time over that of the same case in build/bench/results, measured on Linux."""
import json
import math
import platform
import re
import statistics
import sys
from collections import defaultdict
from pathlib import Path

SECONDS = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}
SIZE = re.compile(r"(.*) @(\d+)$")


def medians(files, by_clock=False):
    """{item: {case: {who: median time}}}, in the order in which they were added: the runs of a file
    come in random order. Windows tells the processor's time too coarsely."""
    times = defaultdict(lambda: defaultdict(lambda: defaultdict(list)))
    for file in files:
        runs = json.loads(Path(file).read_text())["benchmarks"]
        for run in sorted(runs, key=lambda run: run.get("family_index", 0)):
            if run.get("run_type") == "aggregate":
                continue
            if run.get("error_occurred"):
                sys.exit(f"{run['run_name']}: {run.get('error_message')}")
            item, case, who, *how = run["run_name"].split("/")
            real = by_clock or "real_time" in how or "manual_time" in how
            time = run["real_time" if real else "cpu_time"]
            times[item][case][who].append(time * SECONDS[run["time_unit"]])
    return {item: {case: {who: statistics.median(values) for who, values in runs.items()}
                   for case, runs in cases.items()}
            for item, cases in times.items()}


def number(value):
    if value >= 9.95:
        return f"{value:,.0f}"
    return f"{value:.1f}" if value >= 0.995 else f"{value:.2f}"


def spoken(case):
    return SIZE.sub(lambda match: f"{match[1]}, {int(match[2]):,}", case)


def compared(times):
    """The cells of a case: the best peer, its ratio, all others, the limits. Another way of our own is
    the last of the others, and stands for us where there is no first way."""
    ours = [who for who in times if who.startswith("zarvo")]
    ratios = {who: time / times[ours[0]] for who, time in times.items() if who != ours[0]}
    limits = ", ".join(f"{who[6:]} {number(ratio)}" for who, ratio in ratios.items()
                       if who.startswith("limit "))
    peers = sorted((who in ours, ratio, who) for who, ratio in ratios.items()
                   if not who.startswith("limit "))
    best = peers.pop(0) if peers and not peers[0][0] else None
    cells = [best[2], f"**{number(best[1])}**"] if best else ["", ""]
    return cells + [", ".join(f"{who} {number(ratio)}" for _, ratio, who in peers), limits]


def comparison(cases):
    rows = [f"| {spoken(case)} | {' | '.join(cells)} |" for case, cells in
            ((case, compared(times)) for case, times in cases.items()) if any(cells)]
    if not rows:
        return []
    return ["| case | best peer | ratio | other peers | limit |", "|---|---|---|---|---|", *rows]


def exponent(series):
    """The slope of the line through the logarithms."""
    points = [(math.log(size), math.log(time)) for size, time in series]
    x_mean, y_mean = (statistics.mean(column) for column in zip(*points))
    return (sum((x - x_mean) * (y - y_mean) for x, y in points)
            / sum((x - x_mean) ** 2 for x, _ in points))


def growth(cases):
    series = defaultdict(list)
    for case, times in cases.items():
        if match := SIZE.match(case):
            series[match[1]].append((int(match[2]), times["zarvo"]))
    rows = []
    for case, points in series.items():
        if len(points) < 3:
            continue
        points.sort()
        costs = ", ".join(f"{size:,}: {number(time / points[0][1])}" for size, time in points)
        rows.append(f"| {case} | {costs} | {exponent(points):.2f} |")
    return ["", "| growth of | cost at each size | exponent |", "|---|---|---|", *rows] if rows else []


def machine():
    cpu = re.search(r"^model name\s*: (.*)$", Path("/proc/cpuinfo").read_text(), re.M)
    system = platform.freedesktop_os_release()["PRETTY_NAME"]
    return [f"{cpu[1] if cpu else platform.machine()}, Linux {platform.release()}, {system}."]


def put(document, mark, lines):
    block = "\n".join([f"<!-- {mark} -->", *lines, f"<!-- /{mark} -->"])
    found = re.compile(rf"<!-- {mark} -->.*?<!-- /{mark} -->", re.S)
    if found.search(document):
        return found.sub(lambda _: block, document)
    return document.rstrip("\n") + f"\n\n## {mark}\n\n{block}\n"


def on_windows(files):
    """{"windows": every case beside the best and the other peers there, and beside Linux}"""
    linux = medians(filter(Path.exists, (Path("build/bench/results", Path(file).name)
                                         for file in files)))
    lines = ["| item | case | best peer | ratio | other peers | over Linux |",
             "|---|---|---|---|---|---|"]
    for item, cases in medians(files, by_clock=True).items():
        for case, times in cases.items():
            there = linux.get(item, {}).get(case, {}).get("zarvo")
            over = number(times["zarvo"] / there) if there else ""
            lines.append(f"| {item} | {spoken(case)} | {' | '.join(compared(times)[:3])} | {over} |")
    return {"windows": lines}


def on_linux(files):
    """{item: its tables}"""
    return {item: comparison(cases) + growth(cases) for item, cases in medians(files).items()}


def main():
    windows = sys.argv[1] == "--windows"
    path, *files = sys.argv[1 + windows:]
    path = Path(path)
    document = put(path.read_text(), "machine", machine())
    for item, lines in (on_windows if windows else on_linux)(files).items():
        document = put(document, item, lines)
        print(f"\n{item}", *lines, sep="\n")
    path.write_text(document)


main()
