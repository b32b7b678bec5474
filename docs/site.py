#!/usr/bin/env python3
"""Pages of the site that the headers do not hold.

    site.py SOURCE PAGES    makes them from README and its neighbours, for Doxygen
    site.py --header FILE   prints the C header as Doxygen is to read it: the first page is README's
    site.py --finish HTML   makes its search find functions without their prefix, and looks at the
                            site: every link leads somewhere, every page has a title
"""
import re
import sys
from html.parser import HTMLParser
from pathlib import Path
from urllib.parse import unquote

# Documents of the tree and the pages that they become.
PAGES = {"README.md": "index", "examples/README.md": "examples", "docs/performance.md": "performance",
         "CHANGELOG.md": "changelog", "CONTRIBUTING.md": "contributing", "SECURITY.md": "security"}
REFERENCE = {"include/zarvo.h": "modules.html", "include/zarvo.hpp": "group__cpp.html"}
LANGUAGES = {".c": "c", ".h": "c", ".cpp": "cpp", ".manifest": "xml"}


def programs(source):
    """The files that README of the examples and README itself name, as (path, page)."""
    named = [file for folder in ("cookbook", "plugins", "windows")
             for file in sorted((source / "examples" / folder).iterdir())]
    named.append(source / "examples/gallery/img.h")
    return {str(file.relative_to(source)): re.sub(r"\W", "_", file.name)
            for file in named if file.suffix in LANGUAGES}


def with_links(text, folder, places):
    """The text with its links to files of the tree turned into links to their pages."""
    def link(match):
        target = match[2]
        if target.startswith(("http:", "https:", "#", "mailto:")) or match[1].startswith("!"):
            return match[0]
        path = str((Path("/") / folder / target).resolve())[1:]
        if path not in places:
            return match[1][1:-1]  # its words alone: the site has no such page
        return f"{match[1]}({places[path]})"
    return re.sub(r"(!?\[[^\]]*\])\(([^)\s]+)\)", link, without_addresses(text))


def without_addresses(text):
    """Keeps Doxygen from making a link of `ftp://`, by a character without width."""
    return re.sub(r"`(\w+)://", "`\\1\u2060://", text)


def make(source, pages):
    pages.mkdir(parents=True, exist_ok=True)
    files = programs(source)
    places = dict(REFERENCE)
    places.update({name: "index.html" if page == "index" else f"{page}.html"
                   for name, page in PAGES.items()})
    places.update({name: f"{page}.html" for name, page in files.items()})
    places["examples"] = places["examples/README.md"]
    for name, page in PAGES.items():
        text = with_links((source / name).read_text(), Path(name).parent, places)
        if page != "index":
            text = re.sub(r"\A# (.*)", rf"# \1 {{#{page}}}", text)
        (pages / f"{page}.md").write_text(text)
    for name, page in files.items():
        language = LANGUAGES[Path(name).suffix]
        text = (source / name).read_text()
        (pages / f"{page}.md").write_text(
            f"# {name.removeprefix('examples/')} {{#{page}}}\n\n```{{.{language}}}\n{text}```\n")


def finish_search(folder):
    """The search goes by the beginning of a name: "strlist" is to find zv_strlist() too. Its results
    are pages of their own, which get the site's colours."""
    letters = re.search(r'0: "(\w+)"', (folder / "searchdata.js").read_text())[1]
    short = {}
    for file in folder.glob("all_*.js"):
        for name, rest in re.findall(r"(?m)^  \['zv_5f(\w+)'(.*\]),?$", file.read_text()):
            short.setdefault(name[0], []).append(f"  ['{name}'{rest}")
    for letter, entries in short.items():
        file = folder / f"all_{letters.find(letter):x}.js"
        if letter in letters:
            file.write_text(file.read_text().replace("\n];", ",\n" + ",\n".join(entries) + "\n];"))
    style = folder / "search.css"
    style.write_text('@import "../site.css";\n' + style.read_text())


class Page(HTMLParser):
    """The title, the anchors and the links of one page."""

    def __init__(self, file):
        super().__init__()
        self.title, self.anchors, self.links, self.in_title = "", set(), [], False
        self.feed(file.read_text(encoding="utf-8"))

    def handle_starttag(self, tag, attrs):
        self.in_title = tag == "title"
        for name, value in attrs:
            if name in ("id", "name"):
                self.anchors.add(value)
            elif name in ("href", "src", "data") and value:
                self.links.append(value)

    def handle_data(self, data):
        if self.in_title:
            self.title += data
            self.in_title = False


def faults(folder):
    pages = {file.name: Page(file) for file in folder.glob("*.html")}
    for name, page in sorted(pages.items()):
        if not page.title.removeprefix("zarvo:").strip():
            yield f"{name}: no title"
        for link in page.links:
            if re.match(r"[a-z]+:", link):
                continue
            target, _, anchor = unquote(link).partition("#")
            target = target or name
            if not (folder / target).exists():
                yield f"{name}: {link} leads nowhere"
            elif anchor and target in pages and anchor not in pages[target].anchors:
                yield f"{name}: {link} leads to no place of that page"


if __name__ == "__main__":
    if sys.argv[1] == "--header":
        print(without_addresses(Path(sys.argv[2]).read_text()).replace(
            "@mainpage", "@page contract What holds for every function"))
        sys.exit()
    if sys.argv[1] == "--finish":
        finish_search(Path(sys.argv[2]) / "search")
        found = list(faults(Path(sys.argv[2])))
        print("\n".join(found), end="\n" if found else "")
        sys.exit(bool(found))
    make(Path(sys.argv[1]), Path(sys.argv[2]))
