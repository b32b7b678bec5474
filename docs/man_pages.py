#!/usr/bin/env python3
"""man_pages.py HEADER VERSION FOLDER: makes the manual pages of section 3 from the header's comments.

zarvo(3) says what holds for every function; each family has a page, zarvo_FAMILY(3), and each of
its functions a link to that, so that `man zv_copy` finds it. All are compressed.
"""
import gzip
import re
import shutil
import sys
from pathlib import Path

import header

def plain(text):
    """Text that roff shows as it stands."""
    return text.replace("\\", "\\e").replace("-", "\\-").replace("'", "\\(aq").replace("`", "\\(ga")


def inline(text):
    """The markup inside a line: `code`, names of functions and #NAMES become bold."""
    pieces = re.split(r"(`[^`]+`|\bz(?:v|arvo)_\w+\(\)|(?<!\w)#[A-Za-z]\w*)", text)
    for place in range(1, len(pieces), 2):
        code = pieces[place]
        code = code[1:-1] if code.startswith("`") else code.lstrip("#")
        pieces[place] = f"\\%\\fB{plain(code)}\\fR"
    pieces[::2] = (text.replace("\\", "\\e").replace("@ref ", "") for text in pieces[::2])
    return "".join(pieces)


def line(text):
    return "\\&" + text if text.startswith((".", "'")) else text


def flowing(lines):
    return line(inline(" ".join(part.strip() for part in lines if part.strip()).strip()))


def shown(lines):
    return [".PP", ".EX", *(line(plain(text)) for text in lines), ".EE"]


def table(rows):
    rows = [row for row in rows if not all(re.fullmatch(r":?-+:?", cell) for cell in row)]
    yield from (".PP", ".TS", "tab(\t);", "lb " * (len(rows[0]) - 1) + "lbx",
                "l " * (len(rows[0]) - 1) + "lx.")
    for row in rows:
        yield "\t".join(map(inline, row[:-1])) + "\tT{\n" + line(inline(row[-1])) + "\nT}"
    yield ".TE"


def body(lines):
    """Paragraphs, lists, tables and shown code; the examples have a place of their own."""
    rows = []
    for kind, content in [*header.blocks(lines), ("end", [])]:
        if kind == "row":
            rows.append(content)
            continue
        if rows:
            yield from table(rows)
            rows = []
        if kind == "paragraph":
            yield from (".PP", flowing(content))
        elif kind == "item":
            yield from (".IP \\(bu 2", flowing(content))
        elif kind == "shown":
            yield from shown(content)


def declaration(entry):
    """As a C programmer writes it: without the mark of an export and of a comment's purpose."""
    text = re.sub(r"/\*\*<?", "/*", entry.declaration.removeprefix("ZV_API "))
    return text.split("\n")


def entry_part(entry):
    yield f".SS {entry.name}"
    if not entry.is_function:
        yield from shown(declaration(entry))
    yield from body(entry.text)
    for name, lines in entry.params:
        yield from (".TP", f".I {plain(name)}", flowing(lines))
    if entry.returns:
        yield from (".PP", "Returns " + flowing(entry.returns))
    for title, lines in entry.sections:
        yield from (".PP", f".I {title}:", flowing(lines))


def title(page):
    return [f'.TH {page.upper()} 3 "" "zarvo {version}" "zarvo"', ".ad l"]


def other_pages(families, but=None):
    names = ["zarvo"] if but else []
    names += [f"zarvo_{family.name}" for family in families if family is not but]
    yield ".SH SEE ALSO"
    for name in names:
        yield f".BR {name} (3)" + ("," if name is not names[-1] else "")


def synopsis(entries):
    yield from (".SH SYNOPSIS", ".nf", ".B #include <zarvo.h>")
    for entry in entries:
        yield ".sp"
        yield from (f"\\fB{plain(text)}\\fR" for text in declaration(entry))
    yield ".fi"


def family_page(family, families):
    names = [f"zarvo_{family.name}", *(entry.name for entry in family.functions)]
    yield from title(names[0])
    yield from (".SH NAME", ", ".join(names) + " \\- " + inline(family.title))
    yield from synopsis(family.functions)
    yield ".SH DESCRIPTION"
    yield from body(family.text)
    for entry in family.entries:
        yield from entry_part(entry)
    yield ".SH EXAMPLES"
    for example in family.examples:
        yield from shown(example)
    yield from other_pages(families, family)


def main_page(lines, families):
    yield from title("zarvo")
    yield from (".SH NAME", "zarvo \\- the same application code on Windows and on Linux")
    yield from synopsis([])
    yield from (".PP", ".nf", "\\fBcc\\fR \\fIfile\\fR \\fB$(pkg\\-config \\-\\-cflags "
                "\\-\\-libs zarvo)\\fR", ".fi")
    yield ".SH DESCRIPTION"
    yield from body(lines)
    yield ".SS Families"
    for family in families:
        yield from (".TP", f".BR zarvo_{family.name} (3)", line(inline(family.title)) + ": "
                    + ", ".join("\\%" + entry.name for entry in family.functions) + ".")
    yield from (".SH SEE ALSO", ".BR zv (1)")


def write(folder, page, lines):
    """One page; tbl(1) is called for by a comment at its start."""
    lines = list(lines)
    text = ("'\\\" t\n" if ".TS" in lines else "") + "\n".join(lines) + "\n"
    # No blank line may stand in a page, and no paragraph right behind a heading.
    text = re.sub(r"\n\n+", "\n.sp\n", text)
    text = re.sub(r"(\n\.S[HS] [^\n]*)\n\.PP(?=\n)", r"\1", text)
    with open(folder / f"{page}.3.gz", "wb") as raw, \
            gzip.GzipFile(filename="", mode="wb", fileobj=raw, mtime=0) as file:
        file.write(text.encode())


def main(source, folder):
    left_out = header.undocumented(source)
    if left_out:
        sys.exit(f"{source}: in no family: {', '.join(left_out)}")
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    lines, families = header.read(source)
    write(folder, "zarvo", main_page(lines, families))
    for family in families:
        page = f"zarvo_{family.name}"
        write(folder, page, family_page(family, families))
        for entry in family.functions:
            (folder / f"{entry.name}.3.gz").symlink_to(f"{page}.3.gz")


if __name__ == "__main__":
    version = sys.argv[2]
    main(Path(sys.argv[1]), Path(sys.argv[3]))
