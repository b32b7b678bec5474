#!/usr/bin/env python3
"""Runs each program of the cookbook as its first line says, and against what may go wrong. Mail
goes to the server that with_servers runs.

    cookbook_test.py PROGRAMS WORK_FOLDER PLUGINS [EMULATOR]
"""
import os
import shutil
import struct
import sys
import unittest
from pathlib import Path

from failing_servers import HttpServer
from programs import as_windows, start, write_files


class Cookbook(unittest.TestCase):
    def setUp(self):
        shutil.rmtree(work, ignore_errors=True)
        write_files(work, {"tree/a.txt": "12345", "tree/sub/B.TXT": "123456789", "tree/c.txt": "1",
                           "tree/d.bin": "12345", "file": ""})

    def start(self, program, *words, **environment):
        path = programs / (program + suffix) if isinstance(program, str) else program
        return start(*emulator, path, *words, cwd=work,
                     env={"WINEPATH": as_windows(programs), **environment})

    def check(self, code, output, program, *words, **environment):
        """One that fails says why, and names itself; one that does not says nothing."""
        found = self.start(program, *words, **environment)
        self.assertEqual(found[:2], (code, output), found[2])
        name = Path(program).stem
        self.assertEqual(found[2][:len(name) + 7].find(name), {0: -1, 1: 0, 2: 7}[code], found[2])

    def test_usage(self):
        for name in ("big_endian", "find_plugin", "moved", "recent", "report", "retry", "walk"):
            self.check(2, "", name)

    def test_settings(self):
        program = work / "app" / ("settings" + suffix)
        program.parent.mkdir()
        shutil.copy(programs / program.name, program)
        self.check(1, "", program)
        settings, found = program.with_name("settings.ini"), 'back is "blue sky"\nname is ""\n'
        settings.write_bytes(b"# colours\r\nback = blue sky \r\n\nname=\n")
        self.check(0, found, program)
        self.check(0, found, Path("app", program.name))
        if not emulator:
            path = f"{program.parent}:{os.environ['PATH']}"
            self.assertEqual(start("sh", "-c", "settings", cwd=work, env={"PATH": path})[1], found)
        settings.write_text("back\n")
        self.check(1, "", program)

    def test_walk_and_moved(self):
        self.check(0, "tree/a.txt\ntree/sub/B.TXT\n2 files, 14 bytes\n", "walk", "tree", "*.txt;*.x",
                   "5")
        self.check(1, "", "walk", "no-such", "*", "0")
        place = as_windows(work).replace("\\", "/") if emulator else str(work)
        self.check(0, f"tree\\sub\\B.TXT: {place}/new/sub/B.TXT\nfile: {place}/file\n",
                   "moved", "tree", "new", "tree\\sub\\B.TXT", "file")
        self.check(1, "", "moved", "no-such", "elsewhere")

    @unittest.skipUnless(len(sys.argv) > 3 and sys.argv[3], "the gallery's plugins are not built")
    def test_find_plugin(self):
        found = self.start("find_plugin", plugins, "no-such.BMP")
        self.assertRegex(found[1], r"^img_bmpd?\.dll, version 2: Windows bitmap\n$")
        found = self.start("find_plugin", plugins, "a.txt")
        self.assertEqual(found[:2], (1, ""))
        self.assertIn(f"no plugin in {plugins} reads a.txt\n", found[2])

    def test_retry(self):
        for broken, status, code, connections in (
                (2, b"200 OK", 0, 3), (3, b"200 OK", 1, 3), (0, b"404 Not Found", 1, 1)):
            (work / "got").write_bytes(b"old")
            server = HttpServer(broken, status=status)
            found = self.start("retry", server.url, "got")
            self.assertEqual((found[0], server.connections), (code, connections), found[2])
            self.assertEqual("100 %" in found[2], code == 0, found[2])
            self.assertTrue((work / "got").read_bytes() == (b"old" if code else HttpServer.BODY))

    def test_recent(self):
        for name in "one", "two", "three", "four", "five":
            self.start("recent", "list", name)
        self.check(0, "TWO\nfive\nfour\nthree\none\n", "recent", "list", "TWO")
        self.check(0, "six\nTWO\nfive\nfour\nthree\n", "recent", "list", "six")
        self.check(1, "", "recent", "tree", "a folder is no list")

    def test_big_endian(self):
        header = struct.pack(">6I", 0x2E736E64, 28, 12, 3, 8000, 2)
        samples = struct.pack(">6h", 1, -2, 300, -32768, 5, 6)
        (work / "sound").write_bytes(header + b"note" + samples)
        self.check(0, "8000 Hz, 2 channels, 3 samples in each, loudest 32768\n", "big_endian", "sound")
        (work / "sound").write_bytes(header[:20])
        self.check(1, "", "big_endian", "sound")

    def test_report(self):
        login = "{ZARVO_TEST_USER}:{ZARVO_TEST_PASSWORD}@127.0.0.1:{ZARVO_TEST_SMTP_LOGIN_PORT}"
        temporary = work / "temporary"
        temporary.mkdir()
        for server, code in (login.format(**os.environ), 0), ("127.0.0.1:1", 1):
            self.check(code, "", "report", f"smtp://{server}/cook@example.org", TMP=str(temporary))
            self.assertEqual(list(temporary.iterdir()), [])
        mail = Path(os.environ["ZARVO_TEST_MAIL_DIR"], "cook@example.org")
        self.assertTrue((mail / "attachment").read_text().startswith("All is well on "))


if __name__ == "__main__":
    programs, work = (Path(word).resolve() for word in sys.argv[1:3])
    plugins, emulator = sys.argv[3], sys.argv[4:]
    suffix = ".exe" if emulator else ""
    unittest.main(argv=["cookbook_test.py", "-v"])
