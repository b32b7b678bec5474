"""Reads the public header as its documents see it: families (Doxygen groups) in their order, each
with its opening text, its examples and its entries, each of those with its comment taken apart."""
import re
from dataclasses import dataclass, field

COMMENT = re.compile(r"^/\*\*\n(.*?)\n? ?\*/\n|^/\*\* (.*?) ?\*/\n", re.S | re.M)


@dataclass
class Entry:
    """A function, constant or type: its declaration and what its comment says."""
    name: str
    declaration: str
    text: list                                    # lines before the first argument
    params: list = field(default_factory=list)    # (name, lines)
    returns: list = field(default_factory=list)
    sections: list = field(default_factory=list)  # (title, lines)

    @property
    def is_function(self):
        return self.declaration.startswith("ZV_API ")


@dataclass
class Family:
    name: str
    title: str
    text: list
    entries: list = field(default_factory=list)

    @property
    def functions(self):
        return [entry for entry in self.entries if entry.is_function]

    @property
    def examples(self):
        return [lines for kind, lines in blocks(self.text) if kind == "code"]


def comment_lines(match):
    inner = match.group(1) if match.group(1) is not None else match.group(2)
    return [re.sub(r"^\s*\* ?", "", line).rstrip() for line in inner.split("\n")]


def dedent(lines):
    """The lines without the indent that all of them share, and without empty ones at the ends."""
    while lines and not lines[0].strip():
        lines = lines[1:]
    while lines and not lines[-1].strip():
        lines = lines[:-1]
    indent = min((len(line) - len(line.lstrip()) for line in lines if line.strip()), default=0)
    return [line[indent:] for line in lines]


def declaration_after(text):
    """The declaration that a comment stands before: a macro to the end of its line, macros under
    conditions to the next empty line, else to the semicolon outside all braces."""
    if text.startswith("#"):
        return text.split("\n" if text.startswith("#define") else "\n\n")[0]
    depth = 0
    for place, ch in enumerate(text):
        depth += {"{": 1, "}": -1}.get(ch, 0)
        if ch == ";" and depth == 0:
            return text[:place + 1]
    raise ValueError("no declaration: " + text[:60])


def name_of(declaration):
    for pattern in (r"(?m)^#\s*define (\w+)", r"^(?:typedef )?(?:struct|enum) (\w+) \{",
                    r"^typedef [^;{]*\(\*(\w+)\)\(", r"^[^({;]*?(\w+)\(", r"(\w+);$"):
        found = re.search(pattern, declaration)
        if found:
            return found[1]
    raise ValueError("no name: " + declaration[:60])


def entry_of(lines, declaration):
    entry = Entry(name_of(declaration), declaration, [])
    into = entry.text
    for line in lines:
        param = re.match(r"@param(?:\[\w+\])? (\w+)\s*(.*)", line)
        result = re.match(r"@return\s+(.*)", line)
        section = re.match(r"@par (.*)", line)
        if param:
            into = [param[2]]
            entry.params.append((param[1], into))
        elif result:
            into = entry.returns
            into.append(result[1])
        elif section:
            into = []
            entry.sections.append((section[1], into))
        else:
            into.append(line.strip() if into is not entry.text else line)
    return entry


def read(path):
    """The main page's lines and the families."""
    text = path.read_text(encoding="utf-8")
    main_page, families = [], []
    inside = False
    for match in COMMENT.finditer(text):
        lines = comment_lines(match)
        opening = next((line for line in lines if line.startswith("@defgroup ")), None)
        if "@mainpage" in lines:
            main_page = lines[lines.index("@mainpage") + 1:]
        elif opening:
            _, name, title = opening.split(" ", 2)
            if any(family.name == name for family in families):
                raise ValueError(f"two families are called {name}")
            families.append(Family(name, title,
                                   [line for line in lines if line not in (opening, "@{")]))
            inside = True
        elif lines == ["@}"]:
            inside = False
        elif inside:
            families[-1].entries.append(entry_of(lines, declaration_after(text[match.end():])))
    return main_page, families


def cells(line):
    """The cells of a table's row; a bar inside `code`, or behind a backslash, is text."""
    pieces = re.findall(r"(?:`[^`]*`|\\\||[^|`])+", line.strip("|"))
    return [piece.strip().replace("\\|", "|") for piece in pieces]


def blocks(lines):
    """The text as (kind, lines): paragraph, item, row of a table, code to show as it stands."""
    found = []
    open_code = False
    for line in lines:
        if line.startswith("@code"):
            open_code = True
            found.append(("code", []))
        elif line.startswith("@endcode"):
            open_code = False
            found.append(("blank", []))
        elif open_code:
            found[-1][1].append(line)
        elif not line.strip():
            found.append(("blank", []))
        elif line.startswith("    "):
            if not found or found[-1][0] != "shown":
                found.append(("shown", []))
            found[-1][1].append(line[4:])
        elif line.startswith("- "):
            found.append(("item", [line[2:]]))
        elif line.startswith("|"):
            found.append(("row", cells(line)))
        elif found and found[-1][0] in ("paragraph", "item"):
            found[-1][1].append(line.strip())
        else:
            found.append(("paragraph", [line.strip()]))
    return [(kind, dedent(lines) if kind == "code" else lines)
            for kind, lines in found if kind != "blank"]


def undocumented(path):
    """The names that the header exports outside every family."""
    declared = re.findall(r"^ZV_API [^;(]*?(\w+)\(", path.read_text(encoding="utf-8"), flags=re.M)
    known = {entry.name for family in read(path)[1] for entry in family.functions}
    return [name for name in declared if name not in known]
