#!/usr/bin/env python3
"""Installs the library from a build folder and looks at it as a stranger would: does an application
build against it and run, does it need what it may need, does it export what its header declares.

    package_test.py SOURCE BUILD CC CXX OBJDUMP [--toolchain FILE --emulator WINE] [TEST...]
"""
import argparse
import re
import shutil
import tempfile
import unittest
from pathlib import Path

from installed import CONSUMER, WARNINGS, Installed, run

WINDOWS_OWN = {f"{name}.dll" for name in "kernel32 msvcrt advapi32 ws2_32 crypt32 secur32".split()}


class Package(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        # CMake itself finds no package below brackets.
        cls.root = Path(tempfile.mkdtemp(dir="/tmp" if "[" in tempfile.gettempdir() else None)).resolve()
        cls.addClassCleanup(shutil.rmtree, cls.root)
        cls.prefix = cls.root / "pr\u00e4 fix"
        run("cmake", "--install", args.build, "--prefix", cls.prefix)
        cls.installed = Installed(cls.root, cls.prefix, args.cc, args.toolchain, args.emulator)
        cls.library = cls.prefix / ("bin/zarvo.dll" if args.windows else "lib/libzarvo.so")
        cls.encryption = cls.prefix / "lib/libzarvo_tls.so.1"  # where OpenSSL is
        cls.declared = re.findall(r"^ZV_API [^;(]*?(\w+)\(", (args.source / "include/zarvo.h")
                                  .read_text(), flags=re.M)

    def test_applications(self):
        self.assertEqual(self.installed.pkg_config("--modversion"), ["1.0.0"])
        if not self.library.exists():
            self.assertEqual([path.name for path in self.prefix.rglob("*zarvo*")
                              if path.suffix in (".a", ".so", ".dll", ".lib")], ["libzarvo.a"])
        self.installed.expect_consumers(self)
        run(args.cxx, "-std=c++11", "-xc++", "-fsyntax-only", *WARNINGS, "-I", self.prefix / "include",
            CONSUMER / "consumer.c")

    def test_examples(self):
        """They are a project of its own, whose host finds its plugins."""
        programs = self.installed.build_with_cmake(args.source / "examples")
        host, samples = (programs / (name + ".exe" * args.windows) for name in ("gallery", "make_samples"))
        if not samples.exists():
            self.skipTest("there is no stb here")
        self.installed.run_program(samples, "pictures")
        words = [programs.parent / "gallery_plugins", "pictures", "sheet.png"]
        self.assertRegex(self.installed.run_program(host, *words), r"Tiles\.BMP +Windows bitmap +240 x 160")

    def test_inside_another_tree(self):
        """The library's own tests and programs are none of an including program's targets."""
        run("cmake", "-S", CONSUMER, "-B", self.root / "inside", "-G", "Ninja",
            f"-DZARVO_TREE={args.source}", *self.installed.compiler)
        targets = run("ninja", "-C", self.root / "inside", "-t", "targets")
        self.assertEqual({*re.findall(r"(?m)^((?:zarvo|zv|gtest|test)\w*): phony$", targets)} - {"zarvo_tls"},
                         {"zarvo", "zarvo_objects", "zarvo_static"})

    def test_exports_and_needs(self):
        """It exports what its header declares, and needs the system alone."""
        if args.windows:
            text = run(args.objdump, "-p", self.library)
            exported = re.findall(r"(?m)^\s*\[\s*\d+\] (\w+)", text.split("Name Pointer] Table")[1])
            self.assertLessEqual({*re.findall(r"DLL Name: (\S+)", text.lower())}, WINDOWS_OWN)
        else:
            exported = re.findall(r"(?:GLOBAL|WEAK) +DEFAULT +\d+ (\w+)@@ZARVO",
                                  run("readelf", "--dyn-syms", "-W", self.library))
            own = {self.library: ["libc.so.6", "libzarvo.so.1"], self.encryption: [
                "libssl.so.3", "libcrypto.so.3", "libc.so.6", "libzarvo_tls.so.1"]}
            for library in filter(Path.exists, own):
                found = re.findall(r"\((?:NEEDED|SONAME)\).*\[(.*)\]", run("readelf", "-dW", library))
                self.assertEqual(found, own[library])
        self.assertEqual(sorted(exported), sorted(self.declared))

    def test_hardening(self):
        shown = [args.objdump, "-p", "-t"] if args.windows else ["readelf", "-dhlW", "--dyn-syms"]
        wanted = ["HIGH_ENTROPY_VA", "DYNAMIC_BASE", "NX_COMPAT", "__stack_chk_fail"] if args.windows \
            else [r"\bDYN\b", "GNU_RELRO", r"\bNOW\b", "UND __stack_chk_fail",
                  r"GNU_STACK\s+(0x\w+\s+){5}RW "]
        for file in [self.library, self.prefix / ("bin/zv.exe" if args.windows else "bin/zv"),
                     *[self.encryption] * self.encryption.exists()]:
            text = run(*shown, file)
            self.assertEqual([word for word in wanted if not re.search(word, text)], [], file.name)
            self.assertNotIn("TEXTREL", text)
        if not args.windows:
            self.assertRegex(run(*shown, self.library), r"UND __mem\w+_chk@")
        # Every exported function begins with a mark that it may be jumped to.
        code = run(args.objdump, "-d", "--no-show-raw-insn", self.library)
        if "%rsp" in code:  # of the processors that know such marks
            self.assertGreaterEqual(code.count("endbr64"), len(self.declared))


if __name__ == "__main__":
    parser = argparse.ArgumentParser()
    for word, kind in (("source", Path), ("build", Path), ("cc", str), ("cxx", str),
                       ("objdump", str), ("--toolchain", str), ("--emulator", str)):
        parser.add_argument(word, type=kind)
    args, tests = parser.parse_known_args()
    args.windows = args.toolchain is not None
    unittest.main(argv=["package_test.py", "-v", *tests])
