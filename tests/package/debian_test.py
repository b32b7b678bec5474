#!/usr/bin/env python3
"""Installs the Debian packages on this machine, uses them as a developer and as a shell user would,
and removes them: nothing of them may stay. `scripts/test_packages` gives it a private view of the
machine's files where it can.

    debian_test.py PACKAGE...
"""
import os
import sys
import tempfile
import unittest
from pathlib import Path

from installed import CONSUMER, SOURCE, Installed, run
from programs import start

sys.path.append(str(SOURCE / "docs"))
import header  # noqa: E402  pylint: disable=wrong-import-position

NAMES = ["libzarvo1", "libzarvo-tls1", "libzarvo-dev", "zv"]


def installed_names():
    found = start("dpkg-query", "-W", "-f", "${db:Status-Status} ${Package}\n", *NAMES)[1]
    return [line.split()[1] for line in found.splitlines() if line.startswith("installed ")]


class Debian(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        if installed_names():
            raise AssertionError(f"remove your own first: {' '.join(installed_names())}")
        cls.addClassCleanup(lambda: installed_names() and run("dpkg", "--purge", *NAMES))
        run("dpkg", "--install", *packages)
        scratch = tempfile.TemporaryDirectory()
        cls.addClassCleanup(scratch.cleanup)
        cls.installed = Installed(Path(scratch.name))

    def test_1_applications(self):
        # The system's own folders need no mention.
        self.assertNotIn("/usr", " ".join(self.installed.pkg_config("--cflags", "--libs")))
        self.installed.expect_consumers(self)
        programs = self.installed.build_with_cmake(Path("/usr/share/doc/libzarvo-dev/examples"))
        self.assertIn("bin/walk\n", run(programs / "walk", programs.parent, "walk", "1"))
        # An application's package finds out by itself what it depends on.
        program = self.installed.compile(CONSUMER / "consumer.c", "-lzarvo")
        (self.installed.root / "debian").mkdir()
        (self.installed.root / "debian/control").write_text("Source: x\n\nPackage: x\nArchitecture: any\n")
        self.assertIn("libzarvo1 (>= 1.0.0~beta)",
                      run("dpkg-shlibdeps", "-O", program, cwd=self.installed.root))

    def test_1_tool(self):
        self.assertEqual(run("zv", "--version"), "zv 1.0.0b\n")
        for name, field, value in (("libzarvo1", "Depends", r"libc6 \(>= [\d.]+\)"),
                                   ("libzarvo-tls1", "Depends", r"libc6 .*, libssl3 .*"),
                                   ("zv", "Recommends", "libzarvo-tls1")):
            self.assertRegex(run("dpkg-query", "-W", "-f", "${%s}" % field, name), f"^{value}$")

    def test_1_documents(self):
        pages = {"zv": ["NAME"], "zv_copy": ["Copying between"]}
        for family in header.read(SOURCE / "include/zarvo.h")[1]:
            pages[f"zarvo_{family.name}"] = sum(family.examples, [])
        for name, texts in pages.items():
            code, page, warnings = start("man", "--warnings", "-P", "cat", name, env={"MANWIDTH": "200"})
            self.assertEqual((code, warnings, [text for text in texts if text not in page]), (0, "", []))

    def test_2_nothing_stays(self):
        listed = {path for path in run("dpkg", "-L", *NAMES).split()
                  if not os.path.isdir(path) or "zarvo" in path or path.endswith("/zv")}
        for name in NAMES:
            self.assertLess({f"/usr/share/doc/{name}/{file}" for file in ("copyright", "changelog.gz")},
                            listed)
        self.assertIn("/usr/share/bash-completion/completions/zv", listed)
        run("dpkg", "--purge", *NAMES)
        self.assertEqual([path for path in listed if os.path.lexists(path)], [])
        self.assertNotIn("libzarvo", run("ldconfig", "-p"))


packages = sys.argv[1:]
unittest.main(argv=["debian_test.py", "-v"])
