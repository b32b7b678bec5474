#!/usr/bin/env python3
"""Runs each example as its first lines say, and against what may go wrong: the cookbook, whose mail
goes to the server that with_servers runs, and the gallery.

    examples_test.py PROGRAMS WORK_FOLDER PLUGINS [EMULATOR]
"""
import os
import random
import shutil
import struct
import sys
import unittest
from pathlib import Path

from failing_servers import HttpServer
from programs import as_windows, start, write_files

LOGIN = "{ZARVO_TEST_USER}:{ZARVO_TEST_PASSWORD}@127.0.0.1:{ZARVO_TEST_SMTP_LOGIN_PORT}"
SOUND = struct.pack(">7I6h", 0x2E736E64, 28, 12, 3, 8000, 2, 0, 1, -2, 300, -32768, 5, 6)
# A command line, its exit code and its output.
ROWS = [
    *((name, 2, "") for name in ("big_endian", "find_plugin", "moved", "recent", "report", "retry", "walk")),
    ("walk tree *.txt;*.x 5", 0, "tree/a.txt\ntree/sub/B.TXT\n2 files, 14 bytes\n"),
    ("walk no-such * 0", 1, ""),
    ("recent list one", 0, "one\n"),
    ("recent list two", 0, "two\none\n"),
    ("recent list ONE", 0, "ONE\ntwo\n"),
    *((f"recent list {n}", 0, "\n".join([*map(str, range(n, 0, -1)), "ONE", "two"][:5]) + "\n")
      for n in range(1, 6)),
    ("recent tree document", 1, ""),
    ("big_endian sound", 0, "8000 Hz, 2 channels, 3 samples in each, loudest 32768\n"),
    ("big_endian cut", 1, ""),
    (f"report smtp://{LOGIN}/cook@example.org", 0, ""),
    ("report smtp://127.0.0.1:1/cook@example.org", 1, ""),
    ("moved tree new tree\\sub\\B.TXT cut", 0, "tree\\sub\\B.TXT: {PLACE}/new/sub/B.TXT\ncut: {PLACE}/cut\n"),
    ("moved no-such elsewhere", 1, ""),
    ("retry http://127.0.0.1:1/x got", 1, ""),
]
# These need the gallery's plugins.
GALLERY = [
    ("find_plugin {PLUGINS} a.BMP", 0, "{BMP}, version 2: Windows bitmap\n"),
    ("find_plugin {PLUGINS} a.txt", 1, ""),
    ("make_samples pictures", 0, ""),
    ("gallery {PLUGINS} \u00fc\u0436\u65e5 sheet.png", 0, """\
Tiles.BMP            Windows bitmap     240 x 160   #87b191
cut.png              not readable
hills.jpg            JPEG image         240 x 160   #7fa1a6
moon.pgm             Portable anymap    240 x 160   #353535
notes.txt            no plugin
rings.png            PNG image          240 x 160   #635d69
sky.colour           Single colour       96 x 64    #87ceeb
sunrise.ppm          Portable anymap    240 x 160   #88586d
vase.holo            no plugin
"""),
]


class Examples(unittest.TestCase):
    def setUp(self):
        shutil.rmtree(work, ignore_errors=True)
        write_files(work, {"tree/a.txt": "12345", "tree/sub/B.TXT": "123456789", "tree/c.txt": "1",
                           "tree/d.bin": "12345", "temporary/x": ""})
        (work / "sound").write_bytes(SOUND)
        (work / "cut").write_bytes(SOUND[:20])

    def start(self, program, *words):
        path = programs / (program + suffix) if isinstance(program, str) else program
        return start(*emulator, path, *words, cwd=work,
                     env={"WINEPATH": as_windows(programs), "TMP": str(work / "temporary")})

    def test_rows(self):
        """One that fails says why, and names itself; one that does not says nothing."""
        known = {**os.environ, "PLACE": as_windows(work).replace("\\", "/") if emulator else work,
                 "PLUGINS": plugins, "BMP": "".join(path.name for path in Path(plugins).glob("img_bmp*"))}
        for line, code, output in ROWS + GALLERY * bool(plugins):
            with self.subTest(line):
                words = [word.format(**known) for word in line.split(" ")]
                if words[0] == "gallery":
                    (work / "pictures").rename(work / words[2])
                found = self.start(*words)
                self.assertEqual(found[:2], (code, output.format(**known)), found[2])
                if words[1:2] != [plugins]:  # of which the library itself tells
                    self.assertRegex(found[2], ["^$", f"^{words[0]}: ", f"^usage: {words[0]} "][code])
        mail = Path(os.environ["ZARVO_TEST_MAIL_DIR"], "cook@example.org/attachment").read_text()
        self.assertTrue(mail.startswith("All is well on "))
        self.assertEqual(os.listdir(work / "temporary"), ["x"])
        if plugins:  # the sheet is a PNG of four columns
            self.assertEqual((work / "sheet.png").read_bytes()[:24], b"\x89PNG\r\n\x1a\n\0\0\0\rIHDR"
                             + struct.pack(">2I", 572, 492))

    def test_settings(self):
        program = work / "app" / ("settings" + suffix)
        program.parent.mkdir()
        shutil.copy(programs / program.name, program)
        settings, found = program.with_name("settings.ini"), (0, 'back is "blue sky"\nname is ""\n', "")
        self.assertEqual(self.start(program)[:2], (1, ""))
        settings.write_bytes(b"# colours\r\nback = blue sky \r\n\nname=\n")
        self.assertEqual([self.start(program), self.start(Path("app", program.name))], [found] * 2)
        settings.write_text("back\n")
        self.assertEqual(self.start(program)[:2], (1, ""))

    def test_retry(self):
        server = HttpServer(broken=2)
        found = self.start("retry", server.url, "got")
        self.assertIn("100 %", found[2])
        self.assertEqual((found[0], server.connections, (work / "got").read_bytes() == HttpServer.BODY),
                         (0, 3, True))

    @unittest.skipUnless(len(sys.argv) > 3 and sys.argv[3], "the gallery's plugins are not built")
    def test_damaged(self):
        """Pictures are refused or read, plugins do no harm."""
        self.start("make_samples", "pictures")
        shutil.copytree(plugins, work / "plugins")
        whole, source = next((work / "plugins").iterdir()).read_bytes(), random.Random(5)
        for size in (0, 64, 500, 4096):
            (work / f"plugins/img_cut{size}.dll").write_bytes(whole[:size])
        for path in sorted((work / "pictures").iterdir()):
            for i in range(40):
                changed = bytearray(path.read_bytes()[:source.randrange(1, 999) if i % 2 else None])
                for _ in range(source.randrange(1, 8)):
                    changed[source.randrange(min(len(changed), 90))] = source.randrange(256)
                path.with_name(f"{i}_{path.name}").write_bytes(changed)
        code, shown, _ = self.start("gallery", "plugins", "pictures", "sheet.png")
        self.assertEqual((code, len(shown.splitlines())), (0, 41 * 9))


if __name__ == "__main__":
    programs, work = (Path(word).resolve() for word in sys.argv[1:3])
    plugins, emulator = sys.argv[3], sys.argv[4:]
    suffix = ".exe" if emulator else ""
    unittest.main(argv=["examples_test.py", "-v"])
