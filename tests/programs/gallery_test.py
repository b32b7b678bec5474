#!/usr/bin/env python3
"""Runs the example gallery and looks at what it lists, at its contact sheet, and at what it makes of
damaged pictures and of a hostile folder of plugins.

    gallery_test.py GALLERY MAKE_SAMPLES PLUGINS [EMULATOR]
"""
import os
import random
import re
import shutil
import struct
import sys
import tempfile
import unittest
import zlib
from pathlib import Path

from programs import run

LINE = re.compile(r"(\S+) +(?:(\S.*?) +(\d+) x (\d+) +#([0-9a-f]{6})|no plugin|not readable)$")
BOX, GAP, BAR, COLUMNS = 128, 12, 8, 4
INK = (96, 100, 112)


def decode_png(data):
    """(width, height, rows of (r, g, b)) of a true-colour PNG of 8 bits, its checksums looked at."""
    assert data[:8] == b"\x89PNG\r\n\x1a\n"
    at, chunks = 8, {}
    while at < len(data):
        size, kind = struct.unpack_from(">I4s", data, at)
        body, check = struct.unpack_from(f">{size}sI", data, at + 8)
        assert zlib.crc32(kind + body) == check
        chunks[kind] = chunks.get(kind, b"") + body
        at += 12 + size
    width, height, *form = struct.unpack(">II5B", chunks[b"IHDR"])
    assert kind == b"IEND" and form == [8, 2, 0, 0, 0]
    # Each row begins with its filter, and the gallery's own writer uses none.
    rows = list(struct.iter_unpack(f"B{width * 3}s", zlib.decompress(chunks[b"IDAT"])))
    assert len(rows) == height and not any(used for used, _ in rows)
    return width, height, [triples(row) for _, row in rows]


def mean(pixels):
    """The average colour as the gallery prints it."""
    pixels = list(pixels)
    sums = [sum(pixel[i] for pixel in pixels) for i in range(3)]
    return "".join(f"{(total + len(pixels) // 2) // len(pixels):02x}" for total in sums)


def triples(data):
    return [tuple(data[i:i + 3]) for i in range(0, len(data), 3)]


class Gallery(unittest.TestCase):
    def setUp(self):
        self.folder = Path(tempfile.mkdtemp(prefix="zarvo-gallery-"))
        self.addCleanup(shutil.rmtree, self.folder)
        run(*emulator, make_samples, "pictures", cwd=self.folder)

    def show(self, pictures="pictures", folder=None):
        """The gallery's lines by file name."""
        output = run(*emulator, gallery, folder or plugins, pictures, "sheet.png", cwd=self.folder)
        lines = [LINE.match(line) for line in output.splitlines()]
        self.assertNotIn(None, lines, output)
        return {line[1]: line for line in lines}

    def sample(self, name):
        return (self.folder / "pictures" / name).read_bytes()

    def test_lists_every_picture(self):
        lines = self.show()
        self.assertEqual(list(lines), sorted(os.listdir(self.folder / "pictures")))
        bmp = mean(pixel[::-1] for pixel in triples(self.sample("Tiles.BMP")[54:]))
        pgm = mean([byte] * 3 for byte in self.sample("moon.pgm")[-240 * 160 * 2::2])
        ppm = mean(triples(self.sample("sunrise.ppm")[-240 * 160 * 3:]))
        large = ("240", "160")
        for name, expected in (("Tiles.BMP", ("Windows bitmap", *large, bmp)),
                               ("moon.pgm", ("Portable anymap", *large, pgm)),
                               ("sunrise.ppm", ("Portable anymap", *large, ppm)),
                               ("sky.colour", ("Single colour", "96", "64", "87ceeb")),
                               ("hills.jpg", ("JPEG image", *large)),
                               ("rings.png", ("PNG image", *large))):
            self.assertEqual(lines[name].groups()[1:len(expected) + 1], expected)
        for name, why in (("notes.txt", "no plugin"), ("vase.holo", "no plugin"),
                          ("cut.png", "not readable")):
            self.assertTrue(lines[name][0].endswith(why), lines[name][0])

    def test_contact_sheet(self):
        pictures = "\u00fc \u0436 \u65e5"
        (self.folder / "pictures").rename(self.folder / pictures)
        lines = self.show(pictures)
        width, height, rows = decode_png((self.folder / "sheet.png").read_bytes())
        self.assertEqual((width, height), (GAP + COLUMNS * (BOX + GAP),
                                           GAP + (len(lines) + 3) // 4 * (BOX + BAR + 2 * GAP)))
        for cell, (name, line) in enumerate(lines.items()):
            left = GAP + cell % COLUMNS * (BOX + GAP)
            top = GAP + cell // COLUMNS * (BOX + BAR + 2 * GAP)
            if line[5] is None:
                self.assertEqual(rows[top + 5][left + 5], INK, name)
                continue
            self.assertEqual("%02x%02x%02x" % rows[top + BOX + GAP // 2][left], line[5], name)
            # A picture of 240 x 160 fills 128 x 85; scaled down, it keeps its average nearly.
            high = int(line[4]) * BOX // int(line[3]) if int(line[3]) > BOX else int(line[4])
            wide = min(int(line[3]), BOX)
            shown = mean(rows[top + (BOX - high) // 2 + y][left + (BOX - wide) // 2 + x]
                         for y in range(high) for x in range(wide))
            for i in (0, 2, 4):
                self.assertAlmostEqual(int(shown[i:i + 2], 16), int(line[5][i:i + 2], 16), delta=2)

    def test_damaged_pictures_are_refused_or_read(self):
        source = random.Random(5)
        damaged = self.folder / "damaged"
        damaged.mkdir()
        for name in sorted(os.listdir(self.folder / "pictures")):
            whole = self.sample(name)
            for i in range(20):
                (damaged / f"cut{i}_{name}").write_bytes(whole[:source.randrange(len(whole))])
                changed = bytearray(whole)
                for _ in range(source.randrange(1, 8)):
                    changed[source.randrange(min(len(whole), 90))] = source.randrange(256)
                (damaged / f"changed{i}_{name}").write_bytes(changed)
        lines = self.show("damaged")
        self.assertEqual(len(lines), len(os.listdir(damaged)))

    def test_text_formats_and_palettes(self):
        pictures = self.folder / "small"
        pictures.mkdir()

        def bitmap(bits, pixels, colours=b"", compression=0, size=(2, -1)):
            return struct.pack("<2s8xIIiiHHI12xI4x", b"BM", 54 + len(colours), 40, *size, 1, bits,
                               compression, 2 if bits < 16 else 0) + colours + pixels

        palette = bytes([0, 0, 200, 0, 100, 0, 0, 0])  # red 200, blue 100
        masks = struct.pack("<3I", 0xf800, 0x07e0, 0x001f)
        cases = {
            "text.ppm": (b"P3 2 1 # two\n10\n10 0 0  0 0 5", "800040"),
            "text.pgm": (b"P2\n2 1 255 100 50\n", "4b4b4b"),
            "bits1.bmp": (bitmap(1, b"\x40\0\0\0", palette), "640032"),
            "bits4.bmp": (bitmap(4, b"\x01\0\0\0", palette), "640032"),
            "bits8.bmp": (bitmap(8, b"\x00\x01\0\0", palette), "640032"),
            "bits16.bmp": (bitmap(16, b"\xff\x7f\x00\x00"), "808080"),
            "masks16.bmp": (bitmap(16, b"\x00\xf8\x1f\x00", masks, 3), "800080"),
            "bits32.bmp": (bitmap(32, b"\x10\x20\x30\0\x30\x40\x50\0"), "403020"),
            "colour9.bmp": (bitmap(8, b"\x00\x02\0\0", palette), None),
            "over.ppm": (b"P3 2 1 10 11 0 0 0 0 5", None),
            "huge.pgm": (b"P5 16384 16384 255\n", None),
            "none.pgm": (b"P5 0 1 255\n", None),
            "huge.bmp": (bitmap(24, b"", size=(32767, 32767)), None),
        }
        for name, (data, _) in cases.items():
            (pictures / name).write_bytes(data)
        lines = self.show("small")
        self.assertEqual({name: line[5] for name, line in lines.items()},
                         {name: colour for name, (_, colour) in cases.items()})

    def test_hostile_plugins_do_no_harm(self):
        folder = self.folder / "plugins"
        shutil.copytree(plugins, folder)
        bmp, = folder.glob("img_bmp*.dll")
        whole = bmp.read_bytes()
        for size in (0, 64, 500, 4096, len(whole) // 2):
            (folder / f"img_cut{size}.dll").write_bytes(whole[:size])
        bmp.unlink()
        lines = self.show(folder="plugins")
        self.assertTrue(lines["Tiles.BMP"][0].endswith("no plugin"))
        self.assertEqual(lines["sky.colour"][5], "87ceeb")


if __name__ == "__main__":
    gallery, make_samples, plugins, *emulator = sys.argv[1:]
    unittest.main(argv=["gallery_test.py", "-v"])
