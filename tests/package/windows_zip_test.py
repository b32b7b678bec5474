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


def records_program(header):
    """A program that prints the size of every record of the header and where its fields lie."""
    text = re.sub(r"(?s)/\*.*?\*/", "", header.read_text())
    records = {name: re.findall(r"(\w+)\)?(?:\([^)]*\))?;", fields)
               for name, fields in re.findall(r"(?s)struct (\w+) \{(.*?)\n\}", text)}
    records["_stat64"] = ["st_" + field for field in "dev ino mode nlink uid gid rdev size atime mtime "
                          "ctime".split()]
    shown = "".join(f' typedef struct {name} r_{name}; printf("{name} %d\\n", (int)sizeof(r_{name}));'
                    + "".join(f' printf("{field} %d\\n", (int)offsetof(r_{name}, {field}));'
                              for field in fields) for name, fields in records.items())
    return f"#include <stdio.h>\n#include <zarvo.h>\nint main(void) {{{shown} return 0; }}\n"


class OldRuntime(unittest.TestCase):
    runtime, specs, toolchain = "msvcrt", [], "mingw-w64.cmake"

    @classmethod
    def setUpClass(cls):
        cls.prefix = unpacked / cls.runtime
        cls.installed = Installed(folder / cls.runtime, cls.prefix, "x86_64-w64-mingw32-gcc-posix",
                                  toolchains / cls.toolchain, emulator)

    def compile(self, source, library):
        return self.installed.compile(source, *self.specs, "-I", self.prefix / "include",
                                      self.prefix / "lib" / library)

    def test_runtime(self):
        """The library and its programs are all on the one runtime."""
        for file in (*self.prefix.glob("bin/*"), *self.prefix.glob("plugins/*")):
            needed = run("x86_64-w64-mingw32-objdump", "-p", file)
            self.assertEqual("DLL Name: msvcrt.dll" in needed, self.runtime == "msvcrt", file)
            self.assertEqual("DLL Name: api-ms-win-crt" in needed, self.runtime == "ucrt", file)

    def test_each_import_library(self):
        for library in ("libzarvo.dll.a", "zarvo.lib"):
            program = self.compile(CONSUMER / "consumer.c", library)
            self.assertIn(b"zarvo.dll", program.read_bytes())
            self.assertEqual(self.installed.run_program(program), "consumer: ok\n")

    def test_applications(self):
        """CMake takes zarvo.lib for compilers that it calls MSVC."""
        self.installed.expect_cmake_consumers(self)
        commands = self.installed.root / "consumer/build.ninja"
        self.assertNotIn("lib/zarvo.lib", commands.read_text())
        self.installed.expect_cmake_consumers(self, "-DMSVC=1")
        self.assertIn("lib/zarvo.lib", commands.read_text())

    def test_programs(self):
        if self.runtime == "msvcrt":
            self.assertEqual(self.installed.run_program(self.prefix / "bin/zv.exe", "--version"),
                             "zv 1.0.0b\n")
        run(sys.executable, SOURCE / "tests/programs/gallery_test.py",
            self.prefix / "bin/gallery.exe", self.prefix / "bin/make_samples.exe",
            self.prefix / "plugins", emulator)


class UniversalRuntime(OldRuntime):
    runtime, toolchain = "ucrt", "mingw-w64-ucrt.cmake"
    specs = [f"-specs={SOURCE / 'cmake/ucrt.specs'}"]

    @classmethod
    def setUpClass(cls):
        super().setUpClass()
        cls.root = cls.installed.root
        names = run("x86_64-w64-mingw32-objdump", "-p", WINE_RUNTIME).split("Name Pointer] Table")[1]
        (cls.root / "ucrtbase.def").write_text("\n".join(
            ["LIBRARY ucrtbase.dll", "EXPORTS", *re.findall(r"(?m)^\s*\[ *\d+\] (\w+)", names)]))
        run("llvm-dlltool", "-m", "i386:x86-64", "-d", cls.root / "ucrtbase.def",
            "-l", cls.root / "ucrtbase.lib")

    def as_msvc(self, file, *words):
        run("clang", "--target=x86_64-pc-windows-msvc", "-D_UCRT", "-DZARVO_DLL", "-nostdlibinc",
            "-isystem", WINE_HEADERS / "msvcrt", "-isystem", WINE_HEADERS / "windows", *WARNINGS,
            "-I", self.prefix / "include", *words, self.prefix / "lib/zarvo.lib",
            self.root / "ucrtbase.lib", "-nostdlib", "-fuse-ld=lld", "-Wl,/nodefaultlib", "-o", file)
        return file

    def test_msvc_applications(self):
        records = self.root / "records.c"
        records.write_text(records_program(self.prefix / "include/zarvo.h"))
        own = self.installed.run_program(self.compile(records, "zarvo.lib"))
        for text in "_stat64 56\n", "show_hidden 24\n", "api_entry 16\n", "module 40\n":
            self.assertIn(text, own)
        for source, expected in ((CONSUMER / "consumer.c", "consumer: ok\n"), (records, own)):
            for language in (["c", "-std=c99"], ["c++", "-std=c++20"]):
                program = self.as_msvc(self.root / "msvc.exe", "-x", *language, source, "-x", "none",
                                       "-Wl,/subsystem:console,/entry:main")
                self.assertEqual(self.installed.run_program(program), expected)

    def test_msvc_plugin(self):
        """It reads with its own fscanf() from a stream of the library's."""
        pictures = self.root / "pictures"
        pictures.mkdir()
        (pictures / "sky.colour").write_text("#336699 64x48")
        self.as_msvc(self.root / "img_colour.dll", "-I", SOURCE / "examples/gallery", "-std=c99",
                     SOURCE / "examples/plugins/colour.c", "-shared", "-Wl,/noentry")
        self.assertRegex(self.installed.run_program(self.prefix / "bin/gallery.exe", self.root, pictures,
                                                    "sheet.png"), r"sky\.colour +Single colour +64 x 48")


package, folder, toolchains, emulator = (Path(word).absolute() for word in sys.argv[1:])
shutil.rmtree(folder, ignore_errors=True)
with zipfile.ZipFile(package) as zipped:
    zipped.extractall(folder)
unpacked, = folder.iterdir()
unittest.main(argv=["windows_zip_test.py", "-v"])
