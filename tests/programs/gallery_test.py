#!/usr/bin/env python3
"""Runs the example gallery and looks at what it lists, at its contact sheet, and at what it makes of
damaged pictures and of a hostile folder of plugins.

    gallery_test.py GALLERY MAKE_SAMPLES PLUGINS          the programs of this tree
    gallery_test.py --outside EXAMPLES BUILD CC           built on what that build folder installs
"""
import argparse
import os
import random
import re
import shutil
import tempfile
import unittest
import zlib
from pathlib import Path

from programs import as_windows, run, start

LINE = re.compile(r"(\S+) +(?:(\S.*?) +(\d+) x (\d+) +#([0-9a-f]{6})|no plugin|not readable)$")
BOX, GAP, BAR, COLUMNS = 128, 12, 8, 4
INK = (96, 100, 112)


def decode_png(data):
    """(width, height, rows of (r, g, b)) of a true-colour PNG of 8 bits, its checksums looked at."""
    assert data[:8] == b"\x89PNG\r\n\x1a\n"
    at, chunks = 8, {}
    while at < len(data):
        size, kind = int.from_bytes(data[at:at + 4], "big"), data[at + 4:at + 8]
        body = data[at + 8:at + 8 + size]
        assert zlib.crc32(kind + body) == int.from_bytes(data[at + 8 + size:at + 12 + size], "big")
        chunks[kind] = chunks.get(kind, b"") + body
        at += 12 + size
    assert kind == b"IEND" and chunks[b"IHDR"][8:10] == b"\x08\x02"
    width, height = (int.from_bytes(chunks[b"IHDR"][i:i + 4], "big") for i in (0, 4))
    raw, stride = zlib.decompress(chunks[b"IDAT"]), width * 3
    assert len(raw) == height * (stride + 1)
    rows = [raw[y * (stride + 1):(y + 1) * (stride + 1)] for y in range(height)]
    assert all(row[0] == 0 for row in rows)  # no filter: the gallery's own writer uses none
    rows = [triples(row[1:]) for row in rows]
    return width, height, rows


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
        self.start(args.make_samples, "pictures")

    def start(self, program, *words):
        code, output, messages = start(*args.emulator, program, *words, cwd=self.folder,
                                       env=args.env)
        self.assertEqual(code, 0, messages)
        return output, messages

    def show(self, pictures="pictures", plugins=None):
        """The gallery's lines by file name, and its report."""
        output, report = self.start(args.gallery, plugins or args.plugins, pictures, "sheet.png")
        lines = [LINE.match(line) for line in output.splitlines()]
        self.assertNotIn(None, lines, output)
        return {line[1]: line for line in lines}, report

    def sample(self, name):
        return (self.folder / "pictures" / name).read_bytes()

    def test_lists_every_picture(self):
        lines, _ = self.show()
        self.assertEqual(list(lines), sorted(os.listdir(self.folder / "pictures")))
        bmp = triples(self.sample("Tiles.BMP")[54:])
        expected = {
            "Tiles.BMP": ("Windows bitmap", mean(pixel[::-1] for pixel in bmp)),
            "moon.pgm": ("Portable anymap",
                         mean([byte] * 3 for byte in self.sample("moon.pgm")[-240 * 160 * 2::2])),
            "sunrise.ppm": ("Portable anymap", mean(triples(self.sample("sunrise.ppm")[-240 * 160 * 3:]))),
        }
        for name, (kind, colour) in expected.items():
            self.assertEqual(lines[name].groups(), (name, kind, "240", "160", colour))
        self.assertEqual(lines["sky.colour"].groups()[1:], ("Single colour", "96", "64", "87ceeb"))
        self.assertEqual(lines["hills.jpg"].groups()[1:4], ("JPEG image", "240", "160"))
        self.assertEqual(lines["rings.png"].groups()[1:4], ("PNG image", "240", "160"))
        for name, why in (("notes.txt", "no plugin"), ("vase.holo", "no plugin"),
                          ("cut.png", "not readable")):
            self.assertTrue(lines[name][0].endswith(why), lines[name][0])

    def test_contact_sheet(self):
        lines, _ = self.show()
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
        lines, _ = self.show("damaged")
        self.assertEqual(len(lines), len(os.listdir(damaged)))

    def test_text_formats_and_palettes(self):
        pictures = self.folder / "small"
        pictures.mkdir()
        header = lambda bits, colours, compression: (
            b"BM" + bytes(8) + (54 + len(colours)).to_bytes(4, "little")
            + b"".join(n.to_bytes(4, "little") for n in (40, 2)) + (-1 & 0xffffffff).to_bytes(4, "little")
            + (1).to_bytes(2, "little") + bits.to_bytes(2, "little")
            + compression.to_bytes(4, "little") + bytes(12)
            + (2 if bits < 16 else 0).to_bytes(4, "little") + bytes(4) + colours)
        palette = bytes([0, 0, 200, 0, 100, 0, 0, 0])  # red 200, blue 100
        masks = b"".join(n.to_bytes(4, "little") for n in (0xf800, 0x07e0, 0x001f))
        cases = {
            "text.ppm": (b"P3 2 1 # two\n10\n10 0 0  0 0 5", "800040"),
            "text.pgm": (b"P2\n2 1 255 100 50\n", "4b4b4b"),
            "bits1.bmp": (header(1, palette, 0) + b"\x40\0\0\0", "640032"),
            "bits4.bmp": (header(4, palette, 0) + b"\x01\0\0\0", "640032"),
            "bits8.bmp": (header(8, palette, 0) + b"\x00\x01\0\0", "640032"),
            "bits16.bmp": (header(16, b"", 0) + b"\xff\x7f\x00\x00", "808080"),
            "masks16.bmp": (header(16, masks, 3) + b"\x00\xf8\x1f\x00", "800080"),
            "bits32.bmp": (header(32, b"", 0) + b"\x10\x20\x30\0\x30\x40\x50\0", "403020"),
            "colour9.bmp": (header(8, palette, 0) + b"\x00\x02\0\0", None),
            "over.ppm": (b"P3 2 1 10 11 0 0 0 0 5", None),
            "huge.pgm": (b"P5 16384 16384 255\n", None),
            "none.pgm": (b"P5 0 1 255\n", None),
            "huge.bmp": (header(24, b"", 0)[:18] + b"\xff\x7f\0\0\xff\x7f\0\0" + header(24, b"", 0)[26:], None),
        }
        for name, (data, _) in cases.items():
            (pictures / name).write_bytes(data)
        lines, _ = self.show("small")
        self.assertEqual({name: line[5] for name, line in lines.items()},
                         {name: colour for name, (_, colour) in cases.items()})

    def test_hostile_plugins_do_no_harm(self):
        plugins = self.folder / "plugins"
        shutil.copytree(args.plugins, plugins)
        (plugins / "img_text.dll").write_text("no library")
        (plugins / "img_empty.dll").write_bytes(b"")
        bmp = next(plugins.glob("img_bmp*.dll"))
        whole = bmp.read_bytes()
        for size in (64, 500, 4096, len(whole) // 2):
            (plugins / f"img_cut{size}.dll").write_bytes(whole[:size])
        bmp.unlink()
        lines, report = self.show(plugins="plugins")
        self.assertTrue(lines["Tiles.BMP"][0].endswith("no plugin"))
        self.assertEqual(lines["sky.colour"][5], "87ceeb")
        self.assertEqual(report.count("\trejected: library could not be loaded\n"), 6)


def build_outside(found):
    """Installs the library, builds the examples on it and nothing else, and names their programs."""
    examples, build, compiler = found.words
    root = Path(build) / "examples_outside"
    shutil.rmtree(root, ignore_errors=True)
    prefix = root / "prefix"
    choice = ["--toolchain", found.toolchain, f"-DCMAKE_FIND_ROOT_PATH={prefix}"] \
        if found.toolchain else [f"-DCMAKE_C_COMPILER={compiler}"]
    for command in (["cmake", "--install", build, "--prefix", prefix],
                    ["cmake", "-S", examples, "-B", root / "build", "-G", "Ninja",
                     f"-DCMAKE_PREFIX_PATH={prefix}", *choice],
                    ["cmake", "--build", root / "build"]):
        run(*command)
    suffix = ".exe" if found.toolchain else ""
    found.env = {"WINEPATH": as_windows(prefix / "bin")}
    found.words = [root / "build/bin" / ("gallery" + suffix),
                   root / "build/bin" / ("make_samples" + suffix), root / "build/gallery_plugins"]


def arguments():
    parser = argparse.ArgumentParser()
    parser.add_argument("words", nargs=3)
    parser.add_argument("--outside", action="store_true")
    parser.add_argument("--toolchain")
    parser.add_argument("--emulator")
    found = parser.parse_args()
    found.env = None
    if found.outside:
        build_outside(found)
    found.gallery, found.make_samples, found.plugins = map(str, found.words)
    found.emulator = [found.emulator] if found.emulator else []
    return found


if __name__ == "__main__":
    args = arguments()
    # Where it was built makes no difference to what it makes of a picture.
    unittest.main(argv=["gallery_test.py", "-v", *["Gallery.test_lists_every_picture"] * args.outside])
