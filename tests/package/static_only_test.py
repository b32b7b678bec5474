#!/usr/bin/env python3
"""Builds and installs the library as a static one only, and applications with it.

    static_only_test.py FOLDER
"""
import shutil
import sys
import unittest
from pathlib import Path

from installed import CONSUMER, SOURCE, Installed, run


class StaticOnly(unittest.TestCase):
    def test_applications(self):
        prefix = folder / "prefix"
        run("cmake", "-S", SOURCE, "-B", folder / "build", "-G", "Ninja", "-DBUILD_TESTING=OFF",
            "-DCMAKE_BUILD_TYPE=Release", "-DBUILD_SHARED_LIBS=OFF")
        run("cmake", "--build", folder / "build")
        run("cmake", "--install", folder / "build", "--prefix", prefix)
        self.assertEqual([path.name for path in (prefix / "lib").glob("libzarvo*")], ["libzarvo.a"])
        installed = Installed(folder / "applications", prefix)
        self.assertEqual(installed.with_pkg_config(CONSUMER / "consumer.c").strip(), "consumer: ok")
        self.assertEqual(installed.static_with_pkg_config().strip(), "consumer: ok")
        self.assertEqual(installed.with_cmake(), ["consumer: ok"] * 2)


folder = Path(sys.argv[1]).absolute()
shutil.rmtree(folder, ignore_errors=True)
unittest.main(argv=["static_only_test.py", "-v"])
