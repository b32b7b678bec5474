#!/usr/bin/env python3
"""Compiles and runs every example of the documents: README, the public header's families and, made
from those, the manual pages of section 3; and the command lines that zv's help and page show.

A block of C is a whole program when it has a main(), a plugin when it has a ZV_PLUGIN_EXPORT, and
otherwise the body of a main() of C99. It must compile without warnings and end with 0; where it has
comments `// prints TEXT`, its output is what they say, in their order, spaces and lines aside. It
runs in a folder with the files that examples name. Hosts of example.com and example.org stand for
servers on loopback, and the logins in front of them for one that these take; so the test runs
beside tests/servers/with_servers.

    documents_test.py SOURCE WORK_FOLDER LIBRARY ZV CC [EMULATOR]
"""
import os
import re
import shlex
import shutil
import sys
import unittest
from pathlib import Path

import programs

WARNINGS = ["-std=c99", "-Wall", "-Wextra", "-Wpedantic", "-Wconversion", "-Wshadow", "-Werror"]
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
         "old/album/d.png": "", "cmake": ""}
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


def program_text(block):
    if re.search(r"\bint main\(", block):
        return block
    return FRAME % block if "ZV_PLUGIN_EXPORT" not in block else FRAME.split("int main")[0] + block


def run(*command):
    """What a command prints, which finds the library and, in the search path, the files above."""
    windows = f"{programs.as_windows(library.parent.parent / 'bin')};{programs.as_windows(work)}"
    return programs.run(*command, cwd=work, env=dict(
        TMP=str(work), WINEPATH=windows, LD_LIBRARY_PATH=str(library.parent),
        PATH=f"{work}:{given['PATH']}"))


def build(text, program, *words):
    file = work / "example.c"
    file.write_text(text + "\n")
    run(cc, *WARNINGS, "-I", source / "include", file, "-o", program, *words, library)
    return program


class Documents(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        shutil.rmtree(work, ignore_errors=True)
        for name, text in FILES.items():
            (work / name).parent.mkdir(parents=True, exist_ok=True)
            (work / name).write_text(text)
        (work / "plugins").mkdir()
        (work / "codecs").mkdir()
        build(CODEC, work / "codecs/fast.dll", "-shared", "-fPIC")
        Path(given["ZARVO_TEST_HTTP_ROOT"], "data.bin").write_text("data")
        cls.families = header.read(source / "include/zarvo.h")[1]
        cls.blocks = [(family.name, "\n".join(lines))
                      for family in cls.families for lines in family.examples]
        plugin, = (block for _, block in cls.blocks if "ZV_PLUGIN_EXPORT" in block)
        build(program_text(plugin), work / "plugins/img_sample.dll", "-shared", "-fPIC")
        cls.help = {command: run(*emulator, zv, *command.split(), "--help") for command in COMMANDS}
        cls.page = re.sub(r"\\\(aq", "'", (source / "tools/zv/zv.1").read_text().replace("\\-", "-"))

    def check(self, block):
        text = program_text(URL.sub(on_loopback, block))
        printed = run(*emulator, build(text, work / "example.exe"))
        expected = re.findall(r"// prints (.*)", block)
        if expected:
            self.assertEqual(printed.split(), " ".join(expected).split(), printed)

    def test_families(self):
        for name, block in self.blocks:
            if "ZV_PLUGIN_EXPORT" not in block:
                with self.subTest(name, block=block):
                    self.check(block)

    def check_command_lines(self, text):
        """Each as a shell runs it."""
        lines = re.findall(r"(?m)^ *(zv .*)$", text)
        self.assertTrue(lines)
        for line in lines:
            with self.subTest(line):
                run("sh", "-ec", f"zv() {{ {shlex.join([*emulator, str(zv)])} \"$@\"; }}\n"
                    + URL.sub(on_loopback, line))

    def test_help(self):
        for command in COMMANDS[1:]:
            with self.subTest(command):
                self.check_command_lines(re.split(r"Examples?:\n", self.help[command])[1])

    def test_page_of_the_tool(self):
        self.check_command_lines(re.search(r"(?s)\.SH EXAMPLES\n\.EX\n(.*)\.EE", self.page)[1])
        option = r"--[a-z-]+"
        self.assertEqual(set(re.findall(option, re.sub(r"\\f.", "", self.page))),
                         set(re.findall(option, "".join(self.help.values()))))
        for command in COMMANDS:
            self.assertIn(command.split(" ")[-1], self.page)

    def test_each_family_has_an_example(self):
        self.assertEqual([family.name for family in self.families if not family.examples], [])

    def test_readme(self):
        blocks = re.findall(r"```c\n(.*?)```", (source / "README.md").read_text(), flags=re.S)
        self.assertTrue(blocks)
        for block in blocks:
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
cc, emulator = sys.argv[5], sys.argv[6:]
sys.path.insert(0, str(source / "docs"))
import header  # noqa: E402  pylint: disable=wrong-import-position

if __name__ == "__main__":
    unittest.main(argv=["documents_test.py", "-v"])
