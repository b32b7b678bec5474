#!/usr/bin/env python3
"""Compiles and runs every example of README and the public headers, and runs the command lines that
zv's help and manual page show.

A block of C that has neither a main() nor a ZV_PLUGIN_EXPORT is the body of a main(). It must end
with 0 and print what its comments `// prints TEXT` say, spaces and lines aside. Hosts of example.com
and example.org stand for the servers of with_servers, which the test runs beside.

    documents_test.py SOURCE WORK_FOLDER LIBRARY ZV CC CXX [EMULATOR]
"""
import os
import re
import shlex
import shutil
import sys
import unittest
from pathlib import Path

import programs

WARNINGS = ["-Wall", "-Wextra", "-Wpedantic", "-Wconversion", "-Wshadow", "-Werror"]
INCLUDES = "#include <stdio.h>\n#include <stdlib.h>\n#include <string.h>\n#include <zarvo.h>\n"
FILES = {"notes.txt": "first\nsecond\n", "report.pdf": "%PDF", "data/input.txt": "12345",
         "album/a.png": "", "album/b.txt": "", "album/sub/c.jpg": "", "photo.img": "x",
         "old/album/d.png": "", "cmake": "", "plugins/readme": "", "codecs/readme": ""}
COMMANDS = ["copy", "scan", "match", "path", "path normalize", "path absolute", "path relative",
            "path split", "path locate", "rm", "plugins", "info"]
URL = re.compile(r'(ftp|http|smtp)://([^/"]*@)?[a-z.]*example\.(?:com|org)/')


def on_loopback(match):
    """A location on the test's own servers; who logs in does so as their user."""
    scheme, login = match[1], match[2] and "{USER}:{PASSWORD}@"
    kind = "SMTP_LOGIN" if login and scheme == "smtp" else scheme.upper()
    if kind + "_PORT" not in given:
        raise unittest.SkipTest(f"without root there is no {scheme} server")
    return f"{scheme}://{login or ''}127.0.0.1:{{{kind}_PORT}}/".format(**given)


def run(*command):
    """What a command prints, which finds the library and, in the search path, the files above."""
    windows = f"{programs.as_windows(library.parent.parent / 'bin')};{programs.as_windows(work)}"
    return programs.run(*command, cwd=work, env=dict(
        TMP=str(work), WINEPATH=windows, LD_LIBRARY_PATH=str(library.parent),
        PATH=f"{work}:{os.environ['PATH']}"))


def build(text, program, *words):
    """In C99, or in C++17 where the text includes that header."""
    layer = "zarvo.hpp" in text
    file = work / ("example.cpp" if layer else "example.c")
    file.write_text(text + "\n")
    compiler = [cxx, "-std=c++17", *["-static"] * bool(emulator)] if layer else [cc, "-std=c99"]
    run(*compiler, *WARNINGS, "-I", source / "include", file, "-o", program, *words, library)
    return program


class Documents(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        shutil.rmtree(work, ignore_errors=True)
        programs.write_files(work, FILES)
        build("int codec_v2(void); int codec_v2(void) { return 2; }", work / "codecs/fast.dll",
              "-shared", "-fPIC")
        cls.families = header.read(source / "include/zarvo.h")[1]
        cls.blocks = ["\n".join(lines) for family in cls.families for lines in family.examples]
        plugin, = (block for block in cls.blocks if "ZV_PLUGIN_EXPORT" in block)
        cls.blocks.remove(plugin)
        build(INCLUDES + plugin, work / "plugins/img_sample.dll", "-shared", "-fPIC")
        Path(given["HTTP_ROOT"], "data.bin").write_text("data")

    def test_examples(self):
        self.assertEqual([family.name for family in self.families if not family.examples], [])
        layer = re.search(r"(?s)@code\{.cpp\}\n(.*) \* @endcode", (source / "include/zarvo.hpp").read_text())
        blocks = ["// zarvo.hpp\n" + re.sub(r"(?m)^ \* ", "", layer[1]), *self.blocks, *re.findall(
            r"```c(?:pp)?\n(.*?)```", (source / "README.md").read_text(), flags=re.S)]
        for block in blocks:
            with self.subTest(block=block):
                text = URL.sub(on_loopback, block)
                if "int main(" not in text:
                    includes = INCLUDES + "#include <zarvo.hpp>\n" * ("zarvo.hpp" in text)
                    text = f"{includes}int main(void) {{\n{{\n{text}\n}}\nreturn 0;\n}}"
                printed = run(*emulator, build(text, work / "example.exe"))
                expected = re.findall(r"// prints (.*)", block)
                self.assertEqual(printed.split() if expected else [], " ".join(expected).split())

    def test_command_lines(self):
        """Each as a shell runs it."""
        page = re.sub(r"\\\(aq", "'", (source / "tools/zv/zv.1").read_text().replace("\\-", "-"))
        shown = {command: re.split("Examples?:\n", run(*emulator, zv, *command.split(), "--help"))[1]
                 for command in COMMANDS}
        for text in *shown.values(), re.search(r"(?s)\.SH EXAMPLES\n\.EX\n(.*)\.EE", page)[1]:
            for line in re.findall(r"(?m)^ *(zv .*)$", text) or self.fail(text):
                with self.subTest(line):
                    run("sh", "-ec", f"zv() {{ {shlex.join([*emulator, str(zv)])} \"$@\"; }}\n"
                        + URL.sub(on_loopback, line))


source, work, library, zv = (Path(word).absolute() for word in sys.argv[1:5])
cc, cxx, *emulator = sys.argv[5:]
given = {name.removeprefix("ZARVO_TEST_"): value for name, value in os.environ.items()}
sys.path.insert(0, str(source / "docs"))
import header  # noqa: E402  pylint: disable=wrong-import-position

if __name__ == "__main__":
    unittest.main(argv=["documents_test.py", "-v"])
