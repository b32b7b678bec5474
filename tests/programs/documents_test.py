#!/usr/bin/env python3
"""Compiles and runs every example of the documents: README, the public header's families and, made
from those, the manual pages.

A block of C is a whole program when it has a main(), a plugin when it has a ZV_PLUGIN_EXPORT, and
otherwise the body of a main() of C99. It must compile without warnings and end with 0; where it has
comments `// prints TEXT`, its output is what they say, in their order, spaces and lines aside. It
runs in a folder with the files that examples name. Hosts of example.com and example.org stand for
servers on loopback, and the logins in front of them for one that these take; so the test runs
beside tests/servers/with_servers.

    documents_test.py SOURCE WORK_FOLDER LIBRARY CC [EMULATOR]
"""
import os
import re
import shutil
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

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
         "album/a.png": "", "album/b.txt": "", "album/sub/c.jpg": "", "photo.img": "x"}
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
    """What a command that must succeed prints; into a file, as a pipe would stay open as long as
    the emulator's own processes."""
    windows = ("Z:" + str(library.parent.parent / "bin")).replace("/", "\\")
    env = dict(given, TMP=str(work), WINEPATH=windows, LD_LIBRARY_PATH=str(library.parent))
    with tempfile.TemporaryFile("w+") as output, tempfile.TemporaryFile("w+") as messages:
        done = subprocess.run([str(word) for word in command], cwd=work, env=env, stdout=output,
                              stderr=messages, stdin=subprocess.DEVNULL, timeout=60,
                              check=False)
        output.seek(0)
        messages.seek(0)
        text, said = output.read(), messages.read()
    if done.returncode != 0:
        raise AssertionError(f"{' '.join(map(str, command))}: {done.returncode}\n{text}{said}")
    return text


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

    def check(self, block):
        text = program_text(URL.sub(on_loopback, block))
        if "ZV_PLUGIN_EXPORT" in block:
            build(text, work / "plugins/img_sample.dll", "-shared", "-fPIC")
            return
        printed = run(*emulator, build(text, work / "example.exe"))
        expected = re.findall(r"// prints (.*)", block)
        if expected:
            self.assertEqual(printed.split(), " ".join(expected).split(), printed)

    def test_families(self):
        """Plugins first: examples of hosts load them."""
        blocks = [(family.name, "\n".join(lines))
                  for family in self.families for lines in family.examples]
        for name, block in sorted(blocks, key=lambda pair: "ZV_PLUGIN_EXPORT" not in pair[1]):
            with self.subTest(name, block=block):
                self.check(block)

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
        for family in self.families:
            page = pages / f"zarvo_{family.name}.3.gz"
            shown = run("sh", "-c", f"zcat {page} | groff -ww -t -man -Tutf8 -P-cbou -rLL=200n")
            self.assertNotIn("warning", shown.splitlines()[0])
            for lines in family.examples:
                self.assertIn("\n".join(lines), re.sub(r"(?m)^ {7}", "", shown))


source, work, library = (Path(word).absolute() for word in sys.argv[1:4])
cc, emulator = sys.argv[4], sys.argv[5:]
sys.path.insert(0, str(source / "docs"))
import header  # noqa: E402  pylint: disable=wrong-import-position

if __name__ == "__main__":
    unittest.main(argv=["documents_test.py", "-v"])
