#!/usr/bin/env python3
"""Counts what ctest ran in the build folders given: each case of a GoogleTest program by itself,
each other test as one. A program that died before it wrote its results counts as one failure."""
import sys
import xml.etree.ElementTree as ElementTree
from pathlib import Path


def counts(build):
    """(passed, failed, skipped) of one build folder."""
    total = [0, 0, 0]
    for test in ElementTree.parse(build / "junit.xml").getroot().iter("testcase"):
        results = build / "tests" / "results" / (test.get("name") + ".xml")
        if results.exists():
            cases = list(ElementTree.parse(results).getroot().iter("testcase"))
            failed = sum(case.find("failure") is not None for case in cases)
            skipped = sum(case.get("status") == "notrun" or case.find("skipped") is not None
                          for case in cases)
            if test.get("status") == "fail":
                failed = max(failed, 1)
            total[0] += len(cases) - failed - skipped
            total[1] += failed
            total[2] += skipped
        else:
            total[{"run": 0, "fail": 1}.get(test.get("status"), 2)] += 1
    return total


passed, failed, skipped = (sum(column) for column in zip(*map(counts, map(Path, sys.argv[1:]))))
print(f"{passed} passed, {failed} failed" + (f", {skipped} skipped" if skipped else ""))
