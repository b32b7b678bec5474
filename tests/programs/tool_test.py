#!/usr/bin/env python3
"""Runs the tool zv as a shell would and looks at what it prints and at its exit codes.

    tool_test.py ZV WORK_FOLDER [EMULATOR]
"""
import os
import shutil
import socket
import subprocess
import sys
import tempfile
import threading
import time
import unittest
from pathlib import Path


class HttpServer:
    """Breaks its first connections off; then answers each with a body that comes in two halves."""

    def __init__(self, broken, pause=0.0):
        self.listener = socket.create_server(("127.0.0.1", 0))
        self.url = "http://127.0.0.1:%d/x" % self.listener.getsockname()[1]
        self.broken = broken
        self.pause = pause
        self.connections = 0
        threading.Thread(target=self.serve, daemon=True).start()

    def serve(self):
        while True:
            with self.listener.accept()[0] as client:
                self.connections += 1
                if self.connections <= self.broken:
                    continue
                client.recv(4096)
                client.sendall(b"HTTP/1.0 200 OK\r\nContent-Length: 2001000\r\n\r\n" + b"1" * 2000000)
                time.sleep(self.pause)
                client.sendall(b"2" * 1000)


class Tool(unittest.TestCase):
    def setUp(self):
        shutil.rmtree(work, ignore_errors=True)
        for name in ("tree/b.txt", "tree/a.TXT", "tree/sub/deep.txt", "tree/sub/x.bin"):
            path = work / name
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_bytes(b"content of " + name.encode() + b"\r\n\0")

    def zv(self, *words, **environment):
        """Exit code, standard output and standard error, line ends as on Linux. Both go to files:
        a pipe would stay open as long as the emulator's own processes, which outlive the tool."""
        with tempfile.TemporaryFile() as output, tempfile.TemporaryFile() as messages:
            done = subprocess.run([*emulator, tool, *words], cwd=work, stdin=subprocess.DEVNULL,
                                  stdout=output, stderr=messages, timeout=60, check=False,
                                  env=dict(os.environ, **environment))
            texts = []
            for file in (output, messages):
                file.seek(0)
                texts.append(file.read().decode().replace("\r\n", "\n"))
        return (done.returncode, *texts)

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
            (["match", "", ""], 0, ""),
            (["match", "--", "-x", "-?"], 0, ""),
            (["path", "normalize", r"a\.\b\..\\c\ "], 0, "a/c\n"),
            (["path", "normalize", "D:/a/../.."], 1, ""),
            (["path", "normalize", "a/$ZV_NO_SUCH_NAME/b"], 1, ""),
            (["path", "absolute", "../lib/x.dll", "--base", "D:/app/bin"], 0, "D:/app/lib/x.dll\n"),
            (["path", "absolute", "//srv/share/x", "--base", "D:/app"], 0, "//srv/share/x\n"),
            (["path", "relative", "/a/b/f.txt", "--base", "/a/c"], 0, "../b/f.txt\n"),
            (["path", "relative", "D:/a", "--base", "D:/A"], 0, ".\n"),
            (["path", "split", "//srv/share/a/b"], 0, "//srv/share/\na\nb\n"),
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
            (["scan", "tree", "--files", "*.txt"], 0, "a.TXT\nb.txt\n"),
            (["scan", "tree", "--files", "*.txt", "--match-case"], 0, "b.txt\n"),
            (["scan", "tree", "--dirs", "s*"], 0, "sub\n"),
            (["scan", "tree/", "--recursive", "--files", "*.bin;a*"], 0,
             "tree/a.TXT\ntree/sub/x.bin\n"),
            (["scan", "no-such"], 1, ""),
            (["scan", "tree/b.txt"], 1, ""),
        ])

    def test_copy(self):
        self.check([
            (["copy", "tree/b.txt", "copied"], 0, ""),
            (["copy", "no-such", "kept"], 3, ""),
            (["copy", "tree/b.txt", "no-such/x"], 4, ""),
            (["copy", "tree/b.txt", "tree/b.txt"], 4, ""),
            (["copy", "http://127.0.0.1:1/x", "partial", "--retries", "1"], 3, ""),
            (["copy", "--quiet", "tree/b.txt", "ftp://127.0.0.1:1/x"], 4, ""),
            (["copy", "smtp://127.0.0.1/x", "y"], 3, ""),
        ])
        self.assertEqual((work / "copied").read_bytes(), b"content of tree/b.txt\r\n\0")
        self.assertEqual((work / "tree/b.txt").read_bytes(), b"content of tree/b.txt\r\n\0")
        self.assertFalse((work / "kept").exists())

    def test_failed_download_is_tried_again(self):
        for retries, code, connections in (("0", 3, 1), ("1", 3, 2), ("2", 0, 3)):
            with self.subTest(retries=retries):
                server = HttpServer(broken=2)
                self.assertEqual(self.zv("copy", server.url, "got", "--retries", retries)[0], code)
                self.assertEqual(server.connections, connections)
        self.assertEqual((work / "got").read_bytes(), b"1" * 2000000 + b"2" * 1000)

    @unittest.skipUnless(os.name == "posix" and len(sys.argv) == 3, "needs a terminal of Linux")
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
            (["rm", "tree", "--yes"], 1, ""),
        ])
        self.assertFalse((work / "tree").exists())

    def test_plugins_without_any(self):
        (work / "img_none.dll").write_text("no library")
        (work / "img_noned.dll").write_text("its debug build")
        code, output, _ = self.zv("plugins", "img.reader")
        self.assertEqual((code, output.split()), (1, "img_none.dll rejected cannot be loaded"
                         " img_noned.dll skipped variant of img_none.dll".split()))
        self.assertEqual(self.zv("plugins", "other")[0], 1)

    @unittest.skipUnless("ZV_TEST_PLUGINS" in os.environ, "the examples are not built")
    def test_plugins_of_the_gallery(self):
        folder = os.environ["ZV_TEST_PLUGINS"]
        code, output, _ = self.zv("plugins", "img", "--dir", folder, "--max", "1")
        self.assertEqual(code, 0)
        # A debug build's plugins are named with a "d" at the end.
        lines = {line.split()[0].replace("d.dll", ".dll"): " ".join(line.split()[1:])
                 for line in output.splitlines()}
        self.assertRegex(lines["img_bmp.dll"], r"^accepted version 1 .*\|\.bmp\|")
        self.assertRegex(lines["img_tomorrow.dll"], r"^rejected too new: version \d")
        self.assertEqual(self.zv("plugins", "img", "--dir", folder, "--min", "7", "--max", "5")[0], 1)

    def test_info_and_usage(self):
        code, output, _ = self.zv("info")
        self.assertEqual(code, 0)
        self.assertIn("version  1.0.0b (Beta)\n", output)
        self.assertIn("current  " + seen_by_tool(work).replace("\\", "/") + "\n", output)
        self.assertEqual(self.zv("--version"), (0, "zv 1.0.0b\n", ""))
        self.assertIn("copy", self.zv("--help")[1])
        for words in ([], ["no-such"], ["copy", "one"], ["copy", "a", "b", "c"], ["match", "a"],
                      ["copy", "a", "b", "--retries", "-1"], ["path"], ["plugins", "a", "--min", "x"]):
            with self.subTest(words):
                code, output, message = self.zv(*words)
                self.assertEqual((code, output), (2, ""))
                self.assertTrue(message.startswith("zv: "), message)

    @unittest.skipUnless(os.path.exists("/dev/full"), "needs a device that is always full")
    def test_results_that_cannot_be_written(self):
        with open("/dev/full", "wb") as full:
            done = subprocess.run([*emulator, tool, "info"], stdout=full,
                                  stderr=subprocess.DEVNULL, timeout=60, check=False)
        self.assertEqual(done.returncode, 1)


def seen_by_tool(path):
    """A path of this machine as the tool writes it: under the emulator / is drive Z."""
    return "Z:" + str(path).replace("/", "\\") if emulator else str(path)


if __name__ == "__main__":
    tool = Path(sys.argv[1]).resolve()
    work = Path(sys.argv[2]).resolve()
    emulator = sys.argv[3:]
    unittest.main(argv=["tool_test.py", "-v"])
