#!/usr/bin/env python3
"""Compiles and runs every example of the documents: README, the public headers' families and, made
from those of C, the manual pages of section 3; and the command lines that zv's help and page show.

A block of C that has neither a main() nor a ZV_PLUGIN_EXPORT is the body of a main(). It must end
with 0 and print what its comments `// prints TEXT` say, spaces and lines aside. Hosts of example.com
and example.org stand for the servers of tests/servers/with_servers, which the test runs beside.

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
FRAME = """#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <zarvo.h>

int main(void) {
  {
%s
  }
  return 0;
}
"""
CODEC = "int codec_v2(void); int codec_v2(void) { return 2; }\n"
FILES = {"notes.txt": "first\nsecond\n", "report.pdf": "%PDF", "data/input.txt": "12345",
         "album/a.png": "", "album/b.txt": "", "album/sub/c.jpg": "", "photo.img": "x",
         "old/album/d.png": "", "cmake": "", "plugins/readme": "", "codecs/readme": ""}
COMMANDS = ["", "copy", "scan", "match", "path", "path normalize", "path absolute", "path relative",
            "path split", "path locate", "rm", "plugins", "info"]
URL = re.compile(r'(ftp|http|smtp)://([^/"]*@)?[a-z.]*example\.(?:com|org)/')
given = os.environ


def on_loopback(match):
    """A location on the test's own servers; who logs in does so as their user."""
    scheme, login = match[1], match[2]
    port = given.get({"ftp": "ZARVO_TEST_FTP_PORT", "http": "ZARVO_TEST_HTTP_PORT",
                      "smtp": "ZARVO_TEST_SMTP_LOGIN_PORT" if login else "ZARVO_TEST_SMTP_PORT"}[scheme])
    if port is None:
        raise unittest.SkipTest(f"without root there is no {scheme} server")
    login = login and f"{given['ZARVO_TEST_USER']}:{given['ZARVO_TEST_PASSWORD']}@"
    return f"{scheme}://{login or ''}127.0.0.1:{port}/"


def run(*command):
    """What a command prints, which finds the library and, in the search path, the files above."""
    windows = f"{programs.as_windows(library.parent.parent / 'bin')};{programs.as_windows(work)}"
    return programs.run(*command, cwd=work, env=dict(
        TMP=str(work), WINEPATH=windows, LD_LIBRARY_PATH=str(library.parent),
        PATH=f"{work}:{given['PATH']}"))


def build(text, program, *words):
    """In C99, or in C++17 where the text includes that header."""
    layer = "zarvo.hpp" in text
    file = work / ("example.cpp" if layer else "example.c")
    file.write_text(text + "\n")
    run(*([cxx, "-std=c++17", *(["-static"] if emulator else [])] if layer else [cc, "-std=c99"]),
        *WARNINGS, "-I", source / "include", file, "-o", program, *words, library)
    return program


class Documents(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        shutil.rmtree(work, ignore_errors=True)
        programs.write_files(work, FILES)
        build(CODEC, work / "codecs/fast.dll", "-shared", "-fPIC")
        Path(given["ZARVO_TEST_HTTP_ROOT"], "data.bin").write_text("data")
        cls.families = header.read(source / "include/zarvo.h")[1]
        cls.blocks = ["\n".join(lines) for family in cls.families for lines in family.examples]
        layer = re.search(r"(?s)@code\{.cpp\}\n(.*) \* @endcode", (source / "include/zarvo.hpp").read_text())
        cls.blocks.append(FRAME.replace(".h>\n\n", ".hpp>\n\n") % re.sub(r"(?m)^ \* ", "", layer[1]))
        plugin, = (block for block in cls.blocks if "ZV_PLUGIN_EXPORT" in block)
        cls.blocks.remove(plugin)
        build(FRAME.split("int main")[0] + plugin, work / "plugins/img_sample.dll", "-shared", "-fPIC")
        cls.help = {command: run(*emulator, zv, *command.split(), "--help") for command in COMMANDS}
        cls.page = re.sub(r"\\\(aq", "'", (source / "tools/zv/zv.1").read_text().replace("\\-", "-"))

    def check(self, block):
        text = URL.sub(on_loopback, block)
        whole = re.search(r"\bint main\(", text)
        printed = run(*emulator, build(text if whole else FRAME % text, work / "example.exe"))
        expected = re.findall(r"// prints (.*)", block)
        if expected:
            self.assertEqual(printed.split(), " ".join(expected).split(), printed)

    def check_command_lines(self, text):
        """Each as a shell runs it."""
        lines = re.findall(r"(?m)^ *(zv .*)$", text)
        self.assertTrue(lines)
        for line in lines:
            with self.subTest(line):
                run("sh", "-ec", f"zv() {{ {shlex.join([*emulator, str(zv)])} \"$@\"; }}\n"
                    + URL.sub(on_loopback, line))

    def test_help_and_page_of_the_tool(self):
        for command in COMMANDS[1:]:
            with self.subTest(command):
                self.check_command_lines(re.split(r"Examples?:\n", self.help[command])[1])
        self.check_command_lines(re.search(r"(?s)\.SH EXAMPLES\n\.EX\n(.*)\.EE", self.page)[1])
        option = r"--[a-z-]+"
        self.assertEqual(set(re.findall(option, re.sub(r"\\f.", "", self.page))),
                         set(re.findall(option, "".join(self.help.values()))))
        for command in COMMANDS:
            self.assertIn(command.split(" ")[-1], self.page)

    def test_readme_and_families(self):
        blocks = re.findall(r"```c(?:pp)?\n(.*?)```", (source / "README.md").read_text(), flags=re.S)
        self.assertTrue(blocks)
        self.assertEqual([family.name for family in self.families if not family.examples], [])
        for block in blocks + self.blocks:
            with self.subTest(block=block):
                self.check(block)

    @unittest.skipUnless(shutil.which("groff"), "no groff here")
    def test_manual_pages_show_them_unchanged(self):
        pages = work / "man3"
        run(sys.executable, source / "docs/man_pages.py", source / "include/zarvo.h", "1.0.0", pages)
        shown_by = "groff -ww -t -man -Tutf8 -P-cbou -rLL=200n 2>&1"
        self.assertNotIn("warning", run("sh", "-c", f"cat {source / 'tools/zv/zv.1'} | {shown_by}"))
        for family in self.families:
            page = pages / f"zarvo_{family.name}.3.gz"
            shown = run("sh", "-c", f"zcat {page} | {shown_by}")
            self.assertNotIn("warning", shown)
            for lines in family.examples:
                self.assertIn("\n".join(lines), re.sub(r"(?m)^ {7}", "", shown))


source, work, library, zv = (Path(word).absolute() for word in sys.argv[1:5])
cc, cxx, *emulator = sys.argv[5:]
sys.path.insert(0, str(source / "docs"))
import header  # noqa: E402  pylint: disable=wrong-import-position

if __name__ == "__main__":
    unittest.main(argv=["documents_test.py", "-v"])
