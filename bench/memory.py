#!/usr/bin/env python3
"""Puts what the library needs of memory into a document: memory.py DOCUMENT BUILD

Stack: the compiler's own record of every frame and call, along the deepest way from each public
function. What the system's functions need comes on top, and so does what a caller's filter or a
plugin needs. Heap: what the program that counts it printed."""
import json
import re
import shlex
import subprocess
import sys
import tempfile
from collections import defaultdict
from pathlib import Path

ROWS = 12  # of the table; the other functions are one row
NODE = re.compile(r'^node: \{ title: "([^"]+)" label: "[^"]*?(\d+) bytes')
EDGE = re.compile(r'^edge: \{ sourcename: "([^"]+)" targetname: "([^"]+)"')


def frames(build):
    """{function: bytes} and {function: the functions it calls} of the library's objects."""
    sizes, called = {}, defaultdict(set)
    with tempfile.TemporaryDirectory() as folder:
        for entry in json.loads((build / "compile_commands.json").read_text()):
            words = shlex.split(entry["command"])
            if not any("zarvo_objects.dir" in word for word in words):
                continue
            words = words[words.index("ccache") + 1:] if "ccache" in words else words
            words[words.index("-o") + 1] = f"{folder}/made.o"
            subprocess.run([*words, "-fcallgraph-info=su"], cwd=entry["directory"], check=True)
            for line in Path(folder, "made.ci").read_text().splitlines():
                if node := NODE.match(line):
                    sizes[node[1]] = int(node[2])
                elif edge := EDGE.match(line):
                    called[edge[1]].add(edge[2])
    return sizes, called


def depth(function, sizes, called, known, above=()):
    """The deepest way down; a function that calls itself counts once."""
    if function in above:
        return 0
    if function not in known:
        below = [depth(other, sizes, called, known, (*above, function)) for other in called[function]]
        known[function] = sizes.get(function, 0) + max(below, default=0)
    return known[function]


def stack_table(build, header):
    sizes, called = frames(build)
    names = re.findall(r"^ZV_API [^;(]*?(\w+)\(", header.read_text(), flags=re.M)
    known = {}
    ranked = sorted(((depth(name, sizes, called, known), name) for name in names), reverse=True)
    rows = [f"| `{name}` | {size:,} |" for size, name in ranked[:ROWS]]
    return ["| function | bytes of stack |", "|---|---|", *rows,
            f"| the other {len(names) - ROWS} | at most {ranked[ROWS][0]:,} |"]


def heap_table(build):
    lines = subprocess.run([build / "bench/bin/peak_heap"], stdout=subprocess.PIPE,
                           stderr=subprocess.DEVNULL, text=True, check=True).stdout.splitlines()
    rows = [line.split("\t") for line in lines]
    return ["| call | largest heap, bytes |", "|---|---|",
            *(f"| {what} | {int(size):,} |" for what, size in rows)]


def main():
    document, build = Path(sys.argv[1]), Path(sys.argv[2])
    header = document.parents[1] / "include/zarvo.h"
    block = "\n".join(["<!-- memory -->", *stack_table(build, header), "", *heap_table(build),
                       "<!-- /memory -->"])
    document.write_text(re.sub(r"<!-- memory -->.*<!-- /memory -->", lambda _: block,
                               document.read_text(), flags=re.S))
    print(block)


main()
