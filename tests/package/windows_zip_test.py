#!/usr/bin/env python3
"""Unpacks the Windows zip and uses it as a developer on Windows would, with either import library.

    windows_zip_test.py ZIP FOLDER TOOLCHAIN_FILE EMULATOR
"""
import shutil
import sys
import unittest
import zipfile
from pathlib import Path

from installed import CONSUMER, SOURCE, Installed, run

CC = "x86_64-w64-mingw32-gcc-posix"


class WindowsZip(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        shutil.rmtree(folder, ignore_errors=True)
        with zipfile.ZipFile(package) as file:
            file.extractall(folder)
        cls.prefix, = folder.iterdir()
        cls.installed = Installed(folder / "applications", cls.prefix, CC, toolchain, emulator)

    def test_each_import_library(self):
        for library in ("libzarvo.dll.a", "zarvo.lib"):
            program = self.installed.compile(CONSUMER / "consumer.c", "-I", self.prefix / "include",
                                             self.prefix / "lib" / library)
            self.assertIn(b"zarvo.dll", program.read_bytes())
            self.assertEqual(self.installed.run_program(program), "consumer: ok\n")

    def test_applications(self):
        """CMake takes zarvo.lib for compilers that it calls MSVC."""
        self.installed.expect_all_consumers(self)
        commands = folder / "applications/consumer/build.ninja"
        self.assertNotIn("lib/zarvo.lib", commands.read_text())
        self.installed.expect_cmake_consumers(self, "-DMSVC=1")
        self.assertIn("lib/zarvo.lib", commands.read_text())

    def test_tool(self):
        self.assertEqual(self.installed.run_program(self.prefix / "bin/zv.exe", "--version"),
                         "zv 1.0.0b\n")

    def test_sample_host(self):
        run(sys.executable, SOURCE / "tests/programs/gallery_test.py",
            self.prefix / "bin/gallery.exe", self.prefix / "bin/make_samples.exe",
            self.prefix / "plugins", emulator)


package, folder, toolchain, emulator = (Path(word).absolute() for word in sys.argv[1:])
unittest.main(argv=["windows_zip_test.py", "-v"])
