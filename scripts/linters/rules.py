#!/usr/bin/env python3
"""The rules of this tree that no other linter knows: where a platform may be named, which functions
are not called, how long a function and a file may be. Prints each breach in the files given; fails
when there is one."""
import re
import sys
from pathlib import Path

# The few files outside src/platform/ that may name a platform or include its headers.
PLATFORM = re.compile(r"src/platform/(posix|windows|openssl|schannel)/|include/zarvo\.h$|_(posix|windows)\.(cpp|c|h)$")
FREE_OF_PLATFORMS = re.compile(r"(src|include|tools|examples)/")

PLATFORM_CONDITION = re.compile(
    r"#\s*(if|ifdef|ifndef|elif)\b.*\b(_WIN32|_WIN64|WIN32|__MINGW\w+|__linux__|__unix__|_MSC_VER"
    r"|__APPLE__|__CYGWIN__)")
INCLUDE = re.compile(r"#\s*include\s*<([^>]+)>")
STANDARD_C = re.compile(
    r"(assert|ctype|errno|float|inttypes|limits|locale|math|pthread|setjmp|stdarg|stdbool|stddef"
    r"|stdint|stdio|stdlib|string|time)\.h$")
OTHERS = re.compile(r"CLI/|stb/|gtest/|zarvo\.h")

BANNED = {
    "sprintf": "snprintf", "vsprintf": "vsnprintf", "strcpy": "zv_strncpy or TextBuffer",
    "strcat": "TextBuffer", "strncat": "TextBuffer", "strncpy": "zv_strncpy or TextBuffer",
    "gets": "zv_fgets", "strtok": "strtok_r or string_view", "alloca": "a bounded buffer",
    "system": "nothing", "popen": "nothing", "tmpnam": "a private folder",
}
CALL = re.compile(r"(?<![\w.>])(?:std::|::)?(" + "|".join(BANNED) + r")\s*\(")

# What a view has only as functions that may throw: a build without optimisation would call them,
# and so need the C++ runtime.
THROWING = re.compile(r"\.(substr|at|compare|copy)\s*\(")

LONGEST_FILE = 420
LONGEST_FUNCTION = 60


def without_comments(text):
    """The text with comments and string contents blanked, line ends kept."""
    def blank(match):
        found = match.group(0)
        if found[0] in "\"'":
            return found[0] + re.sub(r"[^\n]", " ", found[1:-1]) + found[0]
        return re.sub(r"[^\n]", " ", found)
    return re.sub(r"//[^\n]*|/\*.*?\*/|\"(?:\\.|[^\"\\\n])*\"|'(?:\\.|[^'\\\n])*'", blank, text,
                  flags=re.S)


def platform_breaches(name, lines):
    if not FREE_OF_PLATFORMS.match(name) or PLATFORM.search(name):
        return
    for number, line in enumerate(lines, 1):
        if PLATFORM_CONDITION.search(line):
            yield number, "a platform is named outside src/platform/"
        header = INCLUDE.search(line)
        if header and ("/" in header[1] or header[1].endswith(".h")) \
                and not STANDARD_C.match(header[1]) and not OTHERS.match(header[1]):
            yield number, f"<{header[1]}> is a system header outside src/platform/"


def banned_calls(name, lines):
    if name.startswith("tests/"):
        return
    for number, line in enumerate(lines, 1):
        for call in CALL.finditer(line):
            yield number, f"{call[1]}() is not called here; use {BANNED[call[1]]}"


def throwing_members(name, lines):
    if not name.startswith("src/"):
        return
    for number, line in enumerate(lines, 1):
        for call in THROWING.finditer(line):
            yield number, f"{call[1]}() may throw; make the view of its pointer and size"


def long_functions(lines):
    """A block whose head has an argument list, outside any other such block, is a function's."""
    blocks = []
    head = ""
    for number, line in enumerate(lines, 1):
        if line.lstrip().startswith("#"):
            continue
        for ch in line + " ":
            if ch == "{":
                blocks.append((number, is_function(head) and not any(f for _, f in blocks)))
            elif ch == "}" and blocks:
                start, function = blocks.pop()
                if function and number - start + 1 > LONGEST_FUNCTION:
                    yield start, f"a function of {number - start + 1} lines"
            head = "" if ch in "{};" else head + ch


def is_function(head):
    return "(" in head and not re.match(r"\s*(struct|class|enum|union|namespace|extern)\b", head)


def breaches(name):
    text = Path(name).read_text(encoding="utf-8", errors="replace")
    lines = without_comments(text).split("\n")
    raw = text.split("\n")
    yield from platform_breaches(name, lines)
    yield from banned_calls(name, lines)
    yield from throwing_members(name, lines)
    if not name.startswith("tests/"):
        yield from long_functions(lines)
    if len(raw) > LONGEST_FILE and not name.startswith(("tests/", "include/")):
        yield 1, f"a file of {len(raw)} lines"
    for number, line in enumerate(raw, 1):
        if re.search(r"\b(TODO|FIXME|XXX)\b", line):
            yield number, "an open point; it belongs in an issue"


def main():
    found = 0
    for name in sys.argv[1:]:
        for number, what in breaches(name):
            print(f"{name}:{number}: {what}")
            found += 1
    return 1 if found else 0


sys.exit(main())
