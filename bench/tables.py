#!/usr/bin/env python3
"""Puts measurements into a document: tables.py DOCUMENT JSON...
Each item's tables replace what stands between its two marks in the document, <!-- ITEM --> and
<!-- /ITEM -->; an item without marks gets its own section at the end. A ratio is the time of who
is named over ours."""
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


def medians(files):
    """{item: {case: {who: median time}}}, in the order in which they were added: the runs of a file
    come in random order."""
    times = defaultdict(lambda: defaultdict(lambda: defaultdict(list)))
    for file in files:
        runs = json.loads(Path(file).read_text())["benchmarks"]
        for run in sorted(runs, key=lambda run: run.get("family_index", 0)):
            if run.get("run_type") == "aggregate":
                continue
            if run.get("error_occurred"):
                sys.exit(f"{run['run_name']}: {run.get('error_message')}")
            item, case, who, *how = run["run_name"].split("/")
            time = run["real_time" if "real_time" in how or "manual_time" in how else "cpu_time"]
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


def comparison(cases):
    rows = []
    for case, times in cases.items():
        ratios = {who: time / times["zarvo"] for who, time in times.items()}
        limits = [f"{who[6:]} {number(ratio)}" for who, ratio in ratios.items()
                  if who.startswith("limit ")]
        peers = sorted((ratio, who) for who, ratio in ratios.items()
                       if who != "zarvo" and not who.startswith("limit "))
        if not peers and not limits:
            continue
        best = f"{peers[0][1]} | **{number(peers[0][0])}**" if peers else " | "
        others = ", ".join(f"{who} {number(ratio)}" for ratio, who in peers[1:])
        rows.append(f"| {spoken(case)} | {best} | {others} | {', '.join(limits)} |")
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


def main():
    path = Path(sys.argv[1])
    document = put(path.read_text(), "machine", machine())
    for item, cases in medians(sys.argv[2:]).items():
        lines = comparison(cases) + growth(cases)
        document = put(document, item, lines)
        print(f"\n{item}", *lines, sep="\n")
    path.write_text(document)


main()
