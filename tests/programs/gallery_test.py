#!/usr/bin/env python3
"""Runs the example gallery: what it lists, and what it makes of damaged pictures and plugins.

    gallery_test.py GALLERY MAKE_SAMPLES PLUGINS [EMULATOR]
"""
import random
import shutil
import struct
import sys
import tempfile
import unittest
from pathlib import Path

from programs import run

SAMPLES = """Tiles.BMP Windows bitmap 240 x 160 #87b191
cut.png not readable
hills.jpg JPEG image 240 x 160 #7fa1a6
moon.pgm Portable anymap 240 x 160 #353535
notes.txt no plugin
rings.png PNG image 240 x 160 #635d69
sky.colour Single colour 96 x 64 #87ceeb
sunrise.ppm Portable anymap 240 x 160 #88586d
vase.holo no plugin"""


class Gallery(unittest.TestCase):
    def setUp(self):
        self.folder = Path(tempfile.mkdtemp(prefix="zarvo-gallery-"))
        self.addCleanup(shutil.rmtree, self.folder)
        run(*emulator, make_samples, "pictures", cwd=self.folder)

    def show(self, pictures):
        folder = self.folder / "plugins"
        shutil.copytree(plugins, folder)
        whole = next(folder.iterdir()).read_bytes()
        for size in (0, 64, 500, 4096):
            (folder / f"img_cut{size}.dll").write_bytes(whole[:size])
        shown = run(*emulator, gallery, "plugins", pictures, "sheet.png", cwd=self.folder)
        return "\n".join(" ".join(line.split()) for line in shown.splitlines())

    def test_every_picture(self):
        pictures = "\u00fc \u0436 \u65e5"
        (self.folder / "pictures").rename(self.folder / pictures)
        self.assertEqual(self.show(pictures), SAMPLES)
        self.assertEqual(struct.unpack(">8s8x2I", (self.folder / "sheet.png").read_bytes()[:24]),
                         (b"\x89PNG\r\n\x1a\n", 572, 492))  # of four columns

    def test_damaged_pictures_are_refused_or_read(self):
        source = random.Random(5)
        for path in sorted((self.folder / "pictures").iterdir()):
            for i in range(40):
                changed = bytearray(path.read_bytes()[:source.randrange(1, 999) if i % 2 else None])
                for _ in range(source.randrange(1, 8)):
                    changed[source.randrange(min(len(changed), 90))] = source.randrange(256)
                path.with_name(f"{i}_{path.name}").write_bytes(changed)
        self.assertEqual(len(self.show("pictures").splitlines()), 41 * 9)


if __name__ == "__main__":
    gallery, make_samples, plugins, *emulator = sys.argv[1:]
    unittest.main(argv=["gallery_test.py", "-v"])
