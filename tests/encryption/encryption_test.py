#!/usr/bin/env python3
"""Encrypted transfers against servers of every kind of fault, each with a certificate made for the
run: what the client says of it.

    encryption_test.py PROGRAM FOLDER [EMULATOR]
"""
import contextlib
import shutil
import socket
import ssl
import subprocess
import sys
import threading
import time
import unittest
from pathlib import Path

from certificates import Authority

sys.path.append(str(Path(__file__).resolve().parents[1] / "programs"))
from programs import as_windows, start  # noqa: E402  pylint: disable=wrong-import-position

TEXT = b"encrypted\n" * 1000
REPLY = b"HTTP/1.1 200 OK\r\nContent-Length: %d\r\n\r\n" % len(TEXT)
NO_LENGTH = b"HTTP/1.1 200 OK\r\n\r\n"


class Conversation:
    """The server's end of one connection, every byte of which passes through its hands."""

    def __init__(self, connection, context):
        self.connection = connection
        self.arrived, self.leaving = ssl.MemoryBIO(), ssl.MemoryBIO()
        self.tls = context.wrap_bio(self.arrived, self.leaving, server_side=True)
        self.records = None  # how many go out before everything stalls

    def send(self):
        data = self.leaving.read()
        while data and self.records != 0:
            size = 5 + int.from_bytes(data[3:5], "big")
            self.connection.sendall(data[:size])
            data = data[size:]
            if self.records is not None:
                self.records -= 1

    def until(self, step, *arguments):
        """One step of the encryption, with all that it has to send and receive."""
        while True:
            try:
                result = step(*arguments)
                self.send()
                return result
            except ssl.SSLWantReadError:
                self.send()
                data = self.connection.recv(65536)
                if not data:
                    raise ConnectionError from None
                self.arrived.write(data)
            except ssl.SSLError:
                self.send()  # the alert
                raise

    def request(self):
        text = b""
        while b"\r\n\r\n" not in text:
            text += self.until(self.tls.read, 65536)
        return text

    def write(self, data, piece=16384):
        for i in range(0, len(data), piece):
            self.until(self.tls.write, data[i:i + piece])

    def finish(self):
        with contextlib.suppress(ssl.SSLError, ConnectionError):
            self.until(self.tls.unwrap)


def good(peer, reply=REPLY, piece=16384):
    peer.until(peer.tls.do_handshake)
    peer.request()
    peer.write(reply + TEXT, piece)
    peer.finish()


def cut(peer, reply=REPLY, sent=len(TEXT)):
    peer.until(peer.tls.do_handshake)
    peer.request()
    peer.write(reply + TEXT[:sent])


def redirect(peer):
    good(peer, b"HTTP/1.1 302 Found\r\nLocation: http://localhost:1/\r\nContent-Length: 0\r\n\r\n")


def stall(peer, records):
    peer.records = records
    good(peer)


def plain(peer):
    peer.connection.sendall(REPLY + TEXT)
    peer.connection.recv(65536)


def closed(peer):
    peer.connection.recv(65536)


class Server:
    """Serves each client on a thread of its own until it is told to stop."""

    def __init__(self, certificate, behave, version=None):
        self.behave = behave
        self.context = ssl.SSLContext(ssl.PROTOCOL_TLS_SERVER)
        self.context.load_cert_chain(certificate)
        if version:
            self.context.set_ciphers("ALL:@SECLEVEL=0")
            self.context.minimum_version = self.context.maximum_version = version
        self.listener = socket.create_server(("127.0.0.1", 0))
        self.port = self.listener.getsockname()[1]
        self.sessions = 0
        threading.Thread(target=self.serve, daemon=True).start()

    def serve(self):
        with contextlib.suppress(OSError):
            while True:
                connection, _ = self.listener.accept()
                threading.Thread(target=self.converse, args=[connection], daemon=True).start()

    def converse(self, connection):
        connection.settimeout(20)
        connection.setsockopt(socket.IPPROTO_TCP, socket.TCP_NODELAY, 1)
        with connection, contextlib.suppress(OSError, ValueError):
            peer = Conversation(connection, self.context)
            self.behave(peer)
            self.sessions += peer.tls.session_reused or 0

    def close(self):
        self.listener.shutdown(socket.SHUT_RDWR)
        self.listener.close()


class OpensslServer:
    """One that asks for a second handshake once it has the request, as OpenSSL's own can."""

    def __init__(self, certificate):
        with socket.create_server(("127.0.0.1", 0)) as probe:
            self.port = probe.getsockname()[1]
        self.process = subprocess.Popen(
            ["openssl", "s_server", "-accept", f"127.0.0.1:{self.port}", "-tls1_2", "-cert",
             certificate], stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
        self.wait_for(b"ACCEPT")
        threading.Thread(target=self.converse, daemon=True).start()

    def wait_for(self, text):
        for line in self.process.stdout:
            if text in line:
                return

    def converse(self):
        with contextlib.suppress(OSError):
            for _ in range(2):
                self.wait_for(b"Connection: close")
                self.process.stdin.write(b"r\n")
                self.process.stdin.flush()

    def close(self):
        self.process.kill()
        self.process.communicate()


CLOSED, ENCRYPTION, SILENCE, CANCELLED, REFUSED = 8, 20, 4, 7, 12
TLS_1_1, TLS_1_2 = ssl.TLSVersion.TLSv1_1, ssl.TLSVersion.TLSv1_2

# What a certificate says, who is asked for, and what the client says of it: "" is a good end.
CERTIFICATES = [
    ("good", "localhost", ""),
    ("good", "LocalHost", ""),
    ("good", "127.0.0.1", "certificate of 127.0.0.1: issued for localhost"),
    ("others", "localhost", "certificate of localhost: issued for example.test, b.test, 10.0.0.1"),
    ("expired", "localhost", "certificate of localhost: expired on 2026-01-01"),
    ("early", "localhost", "certificate of localhost: not valid before 2098-12-31"),
    ("address", "127.0.0.1", ""),
    ("address", "localhost", "certificate of localhost: issued for 127.0.0.1"),
    ("written", "127.0.0.1", "certificate of 127.0.0.1: issued for 127.0.0.1"),
    ("common", "localhost", "certificate of localhost: issued for no name"),
    ("wild", "localhost", "certificate of localhost: issued for *.localhost"),
    ("itself", "localhost", "certificate of localhost: signed by itself, and not trusted"),
]

# What a server does, with which version, and what the client says of it.
BEHAVIOURS = [
    ("good", good, TLS_1_2, 0, ""),
    ("a byte in each record", lambda peer: good(peer, piece=1), None, 0, ""),
    ("no length", lambda peer: good(peer, NO_LENGTH), None, 0, ""),
    ("no announced end, all of the length", cut, None, 0, ""),
    ("no announced end, a part of the length", lambda peer: cut(peer, sent=100), None, CLOSED,
     "GET /f: the connection was closed too early"),
    ("no announced end, no length", lambda peer: cut(peer, NO_LENGTH), None, CLOSED,
     "GET /f: the connection was closed without an announced end"),
    ("in the clear", plain, None, ENCRYPTION,
     "encryption with localhost: the answer is not encrypted"),
    ("closed", closed, None, CLOSED, "encryption with localhost: the connection was closed"),
    ("old", good, TLS_1_1, ENCRYPTION,
     "encryption with localhost: it does not speak TLS 1.2 or later"),
    ("a redirect out of it", redirect, None, REFUSED, "GET /f: 302 Found"),
]


class Encryption(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir(parents=True)
        authority = Authority(folder)
        cls.trusted = authority.certificate
        cls.certificates = {
            "good": authority.issue("good", "DNS:localhost"),
            "others": authority.issue("others", "DNS:example.test, DNS:b.test, IP:10.0.0.1"),
            "expired": authority.issue("expired", "DNS:localhost", end="20260101000000Z"),
            "early": authority.issue("early", "DNS:localhost", begin="20981231000000Z"),
            "address": authority.issue("address", "IP:127.0.0.1"),
            "written": authority.issue("written", "DNS:127.0.0.1"),
            "common": authority.issue("common", subject="localhost"),
            "wild": authority.issue("wild", "DNS:*.localhost"),
            "itself": authority.issue_itself("itself", "localhost"),
        }

    def expect(self, server, expected, host="localhost", trusted=None, more=(),
               scheme="https"):
        """Both runs of one handle end so; a file that was there stays but for a good end."""
        copy = folder / "copy"
        copy.write_bytes(b"old")
        name, file = (as_windows(copy), as_windows(trusted or self.trusted)) if emulator else \
            (copy, trusted or self.trusted)
        try:
            code, output, messages = start(*emulator, program, f"{scheme}://{host}:{server.port}/f",
                                           name, "" if trusted == "" else file, *more)
        finally:
            server.close()
        self.assertEqual((code, output, messages), (0, f"{expected}\n" * 2, ""))
        self.assertEqual(copy.read_bytes() == TEXT, expected == "0 ")
        self.assertIn(copy.read_bytes(), (TEXT, b"old"))

    def test_certificates(self):
        for name, host, reason in CERTIFICATES:
            with self.subTest(name, host=host):
                heard = []
                server = Server(self.certificates[name], lambda peer: heard.append(good(peer)))
                self.expect(server, f"{ENCRYPTION if reason else 0} {reason}", host)
                self.assertEqual(bool(heard), not reason, "a request left")
        with self.subTest("by itself, and trusted"):
            self.expect(Server(self.certificates["itself"], good), "0 ",
                        trusted=self.certificates["itself"])
        with self.subTest("the system's certificates"):
            self.expect(Server(self.certificates["good"], good),
                        f"{ENCRYPTION} certificate of localhost: its issuer is not trusted",
                        trusted="")

    def test_behaviours(self):
        for name, behave, version, cause, reason in BEHAVIOURS:
            with self.subTest(name):
                self.expect(Server(self.certificates["good"], behave, version), f"{cause} {reason}")
        with self.subTest("a second handshake"):
            self.expect(OpensslServer(self.certificates["good"]),
                        f"{ENCRYPTION} encryption with localhost: it wants a second handshake")

    def test_redirect(self):
        """From http:// into encryption, on the way back to http:// it would be refused."""
        encrypted = Server(self.certificates["good"], good)
        to_it = b"HTTP/1.1 302 Found\r\nLocation: https://localhost:%d/f\r\n\r\n" % encrypted.port
        clear = Server(self.certificates["good"], lambda peer: (
            peer.connection.recv(65536), peer.connection.sendall(to_it)))
        self.expect(clear, "0 ", scheme="http")
        encrypted.close()

    @unittest.skipIf(len(sys.argv) > 3, "Windows encrypts by itself")
    def test_without_what_encrypts(self):
        """The library alone, as its package installs it, does not even connect."""
        alone = folder / "alone"
        alone.mkdir()
        shutil.copy(program.parents[1] / "src/libzarvo.so.1", alone)
        heard = []
        server = Server(self.certificates["good"], heard.append)
        found = start(program, f"https://localhost:{server.port}/f", folder / "copy", "",
                      env={"LD_LIBRARY_PATH": str(alone)})
        server.close()
        self.assertEqual(found, (0, f"{ENCRYPTION} encryption needs libzarvo_tls.so.1, which is not "
                                 "installed (package libzarvo-tls1)\n" * 2, ""))
        self.assertEqual(heard, [])

    def test_stalls(self):
        """A server that says nothing more after so many records of the handshake."""
        for version, most in ((None, 1), (TLS_1_2, 5)):
            for records in range(most + 1):
                with self.subTest(version=version, records=records):
                    for more, end in (((300,), f"{SILENCE} encryption with localhost: no reply "
                                       "within 0.3 s"), ((20000, 300), f"{CANCELLED} cancelled")):
                        self.expect(Server(self.certificates["good"],
                                           lambda peer: stall(peer, records), version),
                                    end, more=more)


program, folder = Path(sys.argv[1]), Path(sys.argv[2]).absolute()
emulator = sys.argv[3:]
unittest.main(argv=["encryption_test.py", "-v"])
