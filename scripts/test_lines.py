#!/usr/bin/env python3
"""How many lines the tests have, blank ones aside, and their share of all other code of the tree:
documents, data, seeds and pictures are no code. Fails where they have grown beyond their limits."""
import re
import subprocess
import sys
from pathlib import Path

MOST_LINES, MOST_PERCENT = 6920, 33  # the wish is 5,600: lower it with what is cut
CODE = re.compile(r"\.(c|h|cpp|hpp|py|sh|bash|cmake|in|rc)$|(^|/)CMakeLists\.txt$")
NO_CODE = ("abi/", "fuzz/corpus/")


def is_code(name, text):
    return not name.startswith(NO_CODE) and (CODE.search(name) or text.startswith("#!"))


def lines(text):
    return sum(bool(line.strip()) for line in text.split("\n"))


top = Path(__file__).resolve().parent.parent
names = subprocess.run(["git", "ls-files", "-z"], cwd=top, stdout=subprocess.PIPE, check=True,
                       text=True).stdout.split("\0")[:-1]
texts = {name: (top / name).read_text("utf-8", "replace") for name in names if (top / name).is_file()}
tests = sum(lines(text) for name, text in texts.items() if name.startswith("tests/"))
others = sum(lines(text) for name, text in texts.items()
             if not name.startswith("tests/") and is_code(name, text))
share = 100 * tests / others
print(f"tests: {tests:,} lines (at most {MOST_LINES:,}), {share:.1f} % of the other lines "
      f"(at most {MOST_PERCENT})")
sys.exit(tests > MOST_LINES or share > MOST_PERCENT)
