#!/usr/bin/env python3
"""Runs the tool zv as a shell would and looks at what it prints and at its exit codes.

    tool_test.py ZV WORK_FOLDER PLUGINS [EMULATOR]
"""
import json
import os
import shutil
import subprocess
import sys
import unittest
from pathlib import Path

from http_server import HttpServer
from programs import as_windows, start, write_files


class Tool(unittest.TestCase):
    def setUp(self):
        shutil.rmtree(work, ignore_errors=True)
        write_files(work, {"tree/b.txt": "content\r\n\0", "tree/a.TXT": "",
                           "tree/sub/deep.txt": "", "tree/sub/x.bin": ""})

    def zv(self, *words, **environment):
        return start(*emulator, tool, *words, cwd=work, env=environment)

    def check(self, rows):
        """Rows of a command line, its exit code and its output; one that fails says why."""
        for words, code, output in rows:
            with self.subTest(" ".join(words)):
                found = self.zv(*words)
                self.assertEqual(found[:2], (code, output), found[2])
                self.assertEqual(found[2] == "", code == 0 or words[0] in ("match", "path") and
                                 words[1] != "normalize", found[2])

    def test_match_and_paths(self):
        self.check([
            (["match", "picture.png", "*.[pj][np]g"], 0, ""),
            (["match", "picture.png", "*.PNG"], 1, ""),
            (["match", "--", "-x", "-?"], 0, ""),
            (["path", "normalize", r"a\.\b\..\\c\ "], 0, "a/c\n"),
            (["path", "normalize", "a/$ZV_NO_SUCH_NAME/b"], 1, ""),
            (["path", "absolute", "../lib/x.dll", "--base", "D:/app/bin"], 0, "D:/app/lib/x.dll\n"),
            (["path", "absolute", "//srv/share/x", "--base", "D:/app"], 0, "//srv/share/x\n"),
            (["path", "relative", "D:/a", "--base", "D:/A"], 0, ".\n"),
            (["path", "split", "//srv/share/a/b"], 0, "//srv/share/\na\nb\n"),
            (["path", "split", "/a", "--json"], 0, '["/", "a"]\n'),
            (["path", "normalize", r"a\b", "--json"], 0, '"a/b"\n'),
            (["path", "locate", "no-such-program"], 1, ""),
        ])
        path = {"WINEPATH" if emulator else "PATH": seen_by_tool(work / "tree")}
        self.assertEqual(self.zv("path", "locate", "b.txt", **path)[:2],
                         (0, seen_by_tool(work / "tree/b.txt").replace("\\", "/") + "\n"))
        code, _, message = self.zv("path", "split", "x" * 320)
        self.assertEqual(code, 1)
        self.assertIn("319", message)

    def test_scan(self):
        self.check([
            (["scan", "tree"], 0, "a.TXT\nb.txt\nsub\n"),
            (["scan", "tree", "--files", "*.txt", "--match-case"], 0, "b.txt\n"),
            (["scan", "tree", "--dirs", "s*"], 0, "sub\n"),
            (["scan", "tree/", "--recursive", "--files", "*.bin;a*"], 0,
             "tree/a.TXT\ntree/sub/x.bin\n"),
            (["scan", "tree", "--json"], 0, '["a.TXT", "b.txt", "sub"]\n'),
            (["scan", "tree", "--files", "*.no", "--json"], 0, "[]\n"),
            (["scan", "no-such"], 1, ""),
        ])

    @unittest.skipIf(len(sys.argv) > 4, "Windows has no such names")
    def test_json_of_any_name(self):
        """What is no UTF-8 comes back as the very bytes by Python's own way to keep them."""
        names = [b'"\\', b"\t\x7f\x01", "\u00fc\u20ac\U0001f600".encode(), b"\xc3", b"\xff\xfe", b"\xc0\xaf",
                 b"\xed\xa0\x80", b"\xf4\x90\x80\x80", b"\xf0\x9f\x98", b"\xe0\x80\x80", b"a\xe2\x82b"]
        (work / "names").mkdir()
        for name in names:
            (work / "names" / os.fsdecode(name)).write_text("")
        code, output, _ = self.zv("scan", "names", "--json")
        self.assertEqual((code, sorted(map(os.fsencode, json.loads(output)))), (0, sorted(names)))

    def test_copy(self):
        self.check([
            (["copy", "tree/b.txt", "copied"], 0, ""),
            (["copy", "no-such", "kept"], 3, ""),
            (["copy", "tree/b.txt", "no-such/x"], 4, ""),
            (["copy", "http://127.0.0.1:1/x", "partial", "--retries", "1"], 3, ""),
            (["copy", "--quiet", "tree/b.txt", "ftp://127.0.0.1:1/x"], 4, ""),
        ])
        self.assertEqual((work / "copied").read_bytes(), (work / "tree/b.txt").read_bytes())
        self.assertFalse((work / "kept").exists())

    def test_failed_download_is_tried_again(self):
        for retries, code, connections in (("0", 3, 1), ("1", 3, 2), ("2", 0, 3)):
            server = HttpServer(broken=2)
            found = self.zv("copy", server.url, "got", "--retries", retries)
            self.assertEqual((found[0], server.connections), (code, connections), found)
        self.assertEqual((work / "got").read_bytes(), HttpServer.BODY)

    @unittest.skipUnless(len(sys.argv) == 4, "needs a terminal of Linux")
    def test_progress_is_for_a_terminal(self):
        for quiet in ([], ["--quiet"]):
            terminal, end = os.openpty()
            subprocess.run([tool, "copy", HttpServer(0, pause=1.2).url, "got", *quiet], cwd=work,
                           stderr=end, timeout=60, check=True)
            os.write(end, b"#")
            shown = ""
            while not shown.endswith("#"):
                shown += os.read(terminal, 4096).decode()
            self.assertEqual("2.0 MB" in shown, not quiet, shown)
            self.assertRegex(shown, r"(^|\r {5,}\r)#$")  # and nothing of it is left

    def test_remove_asks_first(self):
        code, output, message = self.zv("rm", "tree")  # no terminal here
        self.assertEqual((code, output), (1, ""))
        self.assertIn("--yes", message)
        self.assertTrue((work / "tree/sub/deep.txt").exists())
        self.check([
            (["rm", "/", "--yes"], 1, ""),
            (["rm", "./", "--yes"], 1, ""),
            (["rm", "tree/..", "--yes"], 1, ""),
            (["rm", "tree/b.txt", "--yes"], 1, ""),
            (["rm", "tree", "--yes"], 0, ""),
        ])
        self.assertFalse((work / "tree").exists())

    def test_plugins_without_any(self):
        (work / "img_none.dll").write_text("no library")
        (work / "img_noned.dll").write_text("its debug build")
        code, output, _ = self.zv("plugins", "img.reader")
        self.assertEqual((code, output.split()), (1, "img_none.dll rejected cannot be loaded"
                         " img_noned.dll skipped variant of img_none.dll".split()))
        code, output, _ = self.zv("plugins", "img", "--json")
        self.assertEqual((code, json.loads(output)), (1, [
            {"library": "img_none.dll", "status": "rejected", "reason": "cannot be loaded"},
            {"library": "img_noned.dll", "status": "skipped", "reason": "variant of img_none.dll"}]))
        self.assertEqual(self.zv("plugins", "other", "--json")[:2], (1, "[]\n"))

    @unittest.skipUnless(len(sys.argv) > 3 and sys.argv[3], "the examples are not built")
    def test_plugins_of_the_gallery(self):
        words = ("plugins", "img", "--dir", plugins, "--max", "1")
        code, output, _ = self.zv(*words)
        self.assertEqual(code, 0)
        # A debug build's plugins are named with a "d" at the end.
        self.assertRegex(output, r"(?m)^img_bmpd?\.dll +accepted +version 1  Windows bitmap\|\.bmp\|")
        self.assertRegex(output, r"(?m)^img_tomorrowd?\.dll +rejected  too new: version \d+$")
        found = json.loads(self.zv(*words, "--json")[1])
        bmp, = (plugin for plugin in found if plugin["library"].startswith("img_bmp"))
        self.assertEqual((bmp["status"], bmp["version"], bmp["formats"]),
                         ("accepted", 1, ["Windows bitmap|.bmp|.dib|"]))
        self.assertEqual(self.zv("plugins", "img", "--dir", plugins, "--min", "7", "--max", "5")[0], 1)

    def test_info_and_usage(self):
        _, output, _ = self.zv("info")
        rows = dict(line.split(None, 1) for line in output.splitlines())
        self.assertEqual((rows["version"], rows["release"]), ("1.0.0b", "Beta"))
        self.assertEqual(rows["current"], seen_by_tool(work).replace("\\", "/"))
        self.assertEqual({name: value or "none" for name, value in
                          json.loads(self.zv("info", "--json")[1]).items()}, rows)
        self.assertEqual(self.zv("--version"), (0, "zv 1.0.0b\n", ""))
        for words in ([], ["no-such"], ["copy", "one"], ["copy", "a", "b", "c"], ["match", "a"],
                      ["copy", "a", "b", "--retries", "-1"], ["path"], ["plugins", "a", "--min", "x"]):
            found = self.zv(*words)
            self.assertEqual((*found[:2], found[2][:4]), (2, "", "zv: "), words)

    @unittest.skipUnless(os.path.exists("/dev/full"), "needs a device that is always full")
    def test_results_that_cannot_be_written(self):
        with open("/dev/full", "wb") as full:
            done = subprocess.run([*emulator, tool, "info"], stdout=full,
                                  stderr=subprocess.DEVNULL, timeout=60, check=False)
        self.assertEqual(done.returncode, 1)


def seen_by_tool(path):
    return as_windows(path) if emulator else str(path)


if __name__ == "__main__":
    tool, work = (Path(word).resolve() for word in sys.argv[1:3])
    plugins, emulator = sys.argv[3], sys.argv[4:]
    unittest.main(argv=["tool_test.py", "-v"])
