#!/usr/bin/env python3
"""The layers of src/ hold: a folder calls and includes only those before it. Calls are read from the
compiled objects, where one through the public header shows as well as any other.

    layers.py SOURCE OBJECTS [NM]     OBJECTS: the folder of the library's objects

Prints each breach and, without one, who calls whom; fails when there is a breach.
"""
import re
import subprocess
import sys
from collections import defaultdict
from pathlib import Path

ORDER = ["frame", "platform", "strings", "strlist", "path", "host", "file", "plugin", "transfer"]


def layer_of(path):
    return ORDER.index(path.parts[0])


def symbols(path, tool):
    """The names that an object defines for others, and those that it takes from them. An inline
    function stands in every object that calls it, as a weak name."""
    defined, taken = set(), set()
    for line in subprocess.run([tool, "-P", path], stdout=subprocess.PIPE, text=True,
                               check=True).stdout.splitlines():
        name, kind = line.split()[:2]
        if kind == "U":
            taken.add(name.removeprefix("__imp_"))
        elif kind in "TDBRSG":
            defined.add(name)
    return defined, taken


def readable(name):
    return subprocess.run(["c++filt", name], stdout=subprocess.PIPE, text=True,
                          check=True).stdout.strip()


def calls(source, objects, tool):
    """Each use of a name that another file defines: the file, the name, the other file. An object
    without its source is left from an earlier build."""
    files = {path.relative_to(objects): symbols(path, tool)
             for path in sorted(objects.rglob("*.cpp.o*"))
             if (source / path.relative_to(objects).as_posix().rpartition(".o")[0]).exists()}
    home = {name: path for path, (defined, _) in files.items() for name in defined}
    for path, (_, taken) in files.items():
        for name in sorted(taken & home.keys()):
            yield path, name, home[name]


def includes(source):
    for path in sorted(source.rglob("*.*")):
        for name in re.findall(r'^#include "(\w+/[^"]+)"', path.read_text("utf-8"), flags=re.M):
            yield path.relative_to(source), Path(name)


def main():
    source, objects = Path(sys.argv[1]) / "src", Path(sys.argv[2])
    tool = sys.argv[3] if len(sys.argv) > 3 else "nm"
    breaches, drawn = [], defaultdict(lambda: defaultdict(set))
    for path, name, other in calls(source, objects, tool):
        drawn[layer_of(path)][layer_of(other)].add(name)
        if layer_of(other) > layer_of(path):
            breaches.append(f"src/{path.as_posix().partition('.cpp')[0]}.cpp ({path.parts[0]}) "
                            f"calls {readable(name)} ({other.parts[0]})")
    if not drawn:
        sys.exit(f"layers.py: {objects} holds no objects of the library")
    for path, other in includes(source):
        if other.parts[0] in ORDER and layer_of(other) > layer_of(path):
            breaches.append(f"src/{path} ({path.parts[0]}) includes {other} ({other.parts[0]})")
    if breaches:
        sys.exit("\n".join([*breaches, f"{len(breaches)} breaches of the order {' < '.join(ORDER)}"]))
    for caller in sorted(drawn):
        row = ", ".join(f"{ORDER[called]} {len(names)}"
                        for called, names in sorted(drawn[caller].items()) if called != caller)
        print(f"{ORDER[caller]:9} calls {row or 'nothing'}")


if __name__ == "__main__":
    main()
