#!/usr/bin/env python3
"""Builds and installs the library as a static one only, and applications with it.

    static_only_test.py FOLDER [TOOLCHAIN_FILE CC EMULATOR]
"""
import shutil
import sys
import unittest
from pathlib import Path

from installed import SOURCE, Installed, run


class StaticOnly(unittest.TestCase):
    def test_applications(self):
        prefix = folder / "prefix"
        run("cmake", "-S", SOURCE, "-B", folder / "build", "-G", "Ninja", "-DBUILD_TESTING=OFF",
            "-DCMAKE_BUILD_TYPE=Release", "-DBUILD_SHARED_LIBS=OFF",
            *(["--toolchain", toolchain] if toolchain else []))
        run("cmake", "--build", folder / "build")
        run("cmake", "--install", folder / "build", "--prefix", prefix)
        self.assertEqual([path.name for path in prefix.rglob("*zarvo*")
                          if path.suffix in (".a", ".so", ".dll", ".lib")], ["libzarvo.a"])
        Installed(folder / "applications", prefix, cc, toolchain,
                  emulator).expect_all_consumers(self)


folder = Path(sys.argv[1]).absolute()
toolchain, cc, emulator = sys.argv[2:] or (None, "cc", None)
shutil.rmtree(folder, ignore_errors=True)
unittest.main(argv=["static_only_test.py", "-v"])
