#!/usr/bin/env python3
"""Unpacks the Windows zip and uses it as a developer on Windows would: with mingw on either C
runtime, and as MSVC does, which clang stands in for, with the headers and the runtime of Wine.

    windows_zip_test.py ZIP FOLDER TOOLCHAIN_FOLDER EMULATOR
"""
import re
import shutil
import sys
import unittest
import zipfile
from pathlib import Path

from installed import CONSUMER, SOURCE, WARNINGS, Installed, run

WINE_HEADERS = Path("/usr/include/wine/wine")
WINE_RUNTIME = "/usr/lib/x86_64-linux-gnu/wine/x86_64-windows/ucrtbase.dll"


class OldRuntime(unittest.TestCase):
    runtime, needed, toolchain = "msvcrt", "msvcrt.dll", "mingw-w64.cmake"

    @classmethod
    def setUpClass(cls):
        cls.prefix, cls.root = unpacked / cls.runtime, folder / cls.runtime
        cls.installed = Installed(cls.root, cls.prefix, "x86_64-w64-mingw32-gcc-posix",
                                  toolchains / cls.toolchain, emulator)

    def test_programs(self):
        """They and the library are all on the one runtime."""
        for file in (*self.prefix.glob("bin/*"), *self.prefix.glob("plugins/*")):
            names = re.findall(r"DLL Name: (msvcrt\.dll|api-ms-win-crt)",
                               run("x86_64-w64-mingw32-objdump", "-p", file))
            self.assertEqual({*names}, {self.needed}, file)
        self.installed.run_program(self.prefix / "bin/make_samples.exe", "samples")
        self.assertRegex(self.installed.run_program(self.prefix / "bin/gallery.exe", self.prefix / "plugins",
                                                    "samples", "sheet.png"), "rings.png +PNG image +240 x 160")
        if self.runtime == "msvcrt":
            self.assertEqual(self.installed.run_program(self.prefix / "bin/zv.exe", "--version"),
                             "zv 1.0.0b\n")

    def test_applications(self):
        """CMake takes zarvo.lib for compilers that it calls MSVC."""
        for name, definitions in ("lib/libzarvo.dll.a", []), ("lib/zarvo.lib", ["-DMSVC=1"]):
            self.installed.expect_cmake_consumers(self, *definitions)
            self.assertIn(name, (self.root / "consumer/build.ninja").read_text())


class UniversalRuntime(OldRuntime):
    runtime, needed, toolchain = "ucrt", "api-ms-win-crt", "mingw-w64-ucrt.cmake"

    def as_msvc(self, name, *words):
        run("clang", "--target=x86_64-pc-windows-msvc", "-D_UCRT", "-DZARVO_DLL", "-nostdlibinc",
            "-isystem", WINE_HEADERS / "msvcrt", "-isystem", WINE_HEADERS / "windows", *WARNINGS,
            "-I", self.prefix / "include", *words, "-x", "none", self.prefix / "lib/zarvo.lib",
            self.root / "ucrtbase.lib", "-nostdlib", "-fuse-ld=lld", "-Wl,/nodefaultlib",
            "-o", self.root / name)
        return self.root / name

    def test_msvc(self):
        """An application, and a plugin that reads with its own fscanf() from a stream of the library's."""
        names = run("x86_64-w64-mingw32-objdump", "-p", WINE_RUNTIME).split("Name Pointer] Table")[1]
        (self.root / "ucrtbase.def").write_text("\n".join(
            ["LIBRARY ucrtbase.dll", "EXPORTS", *re.findall(r"(?m)^\s*\[ *\d+\] (\w+)", names)]))
        run("llvm-dlltool", "-m", "i386:x86-64", "-d", self.root / "ucrtbase.def",
            "-l", self.root / "ucrtbase.lib")
        for language in ["c", "-std=c99"], ["c++", "-std=c++20"]:
            program = self.as_msvc("msvc.exe", "-x", *language, CONSUMER / "consumer.c",
                                   "-Wl,/subsystem:console,/entry:main")
            self.assertEqual(self.installed.run_program(program), "consumer: ok\n")
        (self.root / "pictures").mkdir()
        (self.root / "pictures/sky.colour").write_text("#336699 64x48")
        self.as_msvc("img_colour.dll", "-I", SOURCE / "examples/gallery", "-std=c99",
                     SOURCE / "examples/plugins/colour.c", "-shared", "-Wl,/noentry")
        self.assertRegex(self.installed.run_program(self.prefix / "bin/gallery.exe", self.root, "pictures",
                                                    "sheet.png"), r"sky\.colour +Single colour +64 x 48")


package, folder, toolchains, emulator = (Path(word).absolute() for word in sys.argv[1:])
shutil.rmtree(folder, ignore_errors=True)
with zipfile.ZipFile(package) as zipped:
    zipped.extractall(folder)
unpacked, = folder.iterdir()
unittest.main(argv=["windows_zip_test.py", "-v"])
