#!/usr/bin/env python3
"""Encrypted transfers against servers of every kind of fault, each with a certificate made for the
run: what the client says of it.

    encryption_test.py PROGRAM FOLDER [EMULATOR]
"""
import contextlib
import shutil
import socket
import socketserver
import ssl
import subprocess
import sys
import threading
import unittest
from functools import partial
from pathlib import Path

from certificates import Authority
from programs import as_windows, start

TEXT = b"encrypted\n" * 1000
REPLY = b"HTTP/1.1 200 OK\r\nContent-Length: %d\r\n\r\n" % len(TEXT)
NO_LENGTH = b"HTTP/1.1 200 OK\r\n\r\n"
REDIRECT = b"HTTP/1.1 302 Found\r\nContent-Length: 0\r\nLocation: %s://localhost:1/\r\n\r\n"


class Conversation:
    """The server's end of one connection, every byte of which passes through its hands."""

    def __init__(self, connection, context):
        self.connection = connection
        self.arrived, self.leaving = ssl.MemoryBIO(), ssl.MemoryBIO()
        self.tls = context.wrap_bio(self.arrived, self.leaving, server_side=True)
        self.records = -1  # how many go out before everything stalls

    def send(self):
        data = self.leaving.read()
        while data and self.records != 0:
            size = 5 + int.from_bytes(data[3:5], "big")
            self.connection.sendall(data[:size])
            data = data[size:]
            self.records -= 1

    def until(self, step, *arguments):
        """One step of the encryption, with all that it has to send, an alert too, and to receive."""
        while True:
            try:
                return step(*arguments)
            except ssl.SSLWantReadError:
                self.send()
                data = self.connection.recv(65536)
                self.arrived.write(data)
                if not data:
                    self.arrived.write_eof()
            finally:
                self.send()

    def request(self, end=b"\r\n\r\n"):
        text = b""
        while not text.endswith(end):
            piece = self.until(self.tls.read, 65536)
            if not piece:
                raise ConnectionError
            text += piece
        return text

    def write(self, data, piece=16384):
        for i in range(0, len(data), piece):
            self.until(self.tls.write, data[i:i + piece])


def cut(peer, reply=REPLY, sent=len(TEXT), piece=16384, records=-1):
    peer.records = records
    peer.until(peer.tls.do_handshake)
    peer.request()
    peer.write(reply + TEXT[:sent], piece)


def good(peer, **how):
    cut(peer, **how)
    peer.until(peer.tls.unwrap)


def plain(peer, reply=REPLY + TEXT):
    peer.connection.sendall(reply)
    peer.connection.recv(65536)


def refuse(peer, refused):
    """An FTP server without one of the commands."""
    peer.until(peer.tls.do_handshake)
    peer.write(b"220 here\r\n")
    while True:
        command = peer.request(b"\r\n")
        code = 230 if command.startswith(b"USER") else 534 if command.startswith(refused) else 200
        peer.write(b"%d so be it\r\n" % code)


class Server(socketserver.ThreadingTCPServer):
    """Serves each client on a thread of its own until it is told to stop."""
    daemon_threads = True

    def __init__(self, certificate, behave, version=None):
        super().__init__(("127.0.0.1", 0), None)
        self.port = self.server_address[1]
        self.behave = behave
        self.context = ssl.SSLContext(ssl.PROTOCOL_TLS_SERVER)
        self.context.load_cert_chain(certificate)
        if version:
            self.context.set_ciphers("ALL:@SECLEVEL=0")
            self.context.minimum_version = self.context.maximum_version = version
        threading.Thread(target=self.serve_forever, args=[0.02], daemon=True).start()

    def finish_request(self, request, client_address):
        request.settimeout(20)
        request.setsockopt(socket.IPPROTO_TCP, socket.TCP_NODELAY, 1)
        with contextlib.suppress(OSError, ValueError):
            self.behave(Conversation(request, self.context))

    def close(self):
        self.shutdown()
        self.server_close()


class OpensslServer:
    """One that asks for a second handshake once it has the request, as OpenSSL's own can."""

    def __init__(self, certificate):
        self.process = subprocess.Popen(
            ["openssl", "s_server", "-accept", "127.0.0.1:0", "-tls1_2", "-cert", certificate],
            bufsize=0, stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
        self.port = int(next(line for line in self.process.stdout if b"ACCEPT" in line).split(b":")[-1])
        threading.Thread(target=self.converse, daemon=True).start()

    def converse(self):
        with contextlib.suppress(OSError):
            for line in self.process.stdout:
                if b"Connection: close" in line:
                    self.process.stdin.write(b"r\n")

    def close(self):
        self.process.kill()
        self.process.wait()


SILENCE, CANCELLED, CLOSED, REFUSED, ENCRYPTION = 4, 7, 8, 12, 20
TLS_1_1, TLS_1_2 = ssl.TLSVersion.TLSv1_1, ssl.TLSVersion.TLSv1_2
CERTIFICATE, WITH = f"{ENCRYPTION} certificate", f"{ENCRYPTION} encryption with localhost: "

# What a certificate says, who is asked for, and what the client says of it: "" is a good end.
CERTIFICATES = [
    ("DNS:localhost", "LocalHost", ""),
    ("DNS:localhost", "127.0.0.1", "issued for localhost"),
    ("DNS:x.test, DNS:y.test, IP:10.0.0.1", "localhost", "issued for x.test, y.test, 10.0.0.1"),
    ("DNS:localhost", "localhost", "expired on 2021-01-01", {"end": "20210101000000Z"}),
    ("DNS:localhost", "localhost", "not valid before 2098-12-31", {"begin": "20981231000000Z"}),
    ("IP:127.0.0.1", "127.0.0.1", ""),
    ("IP:127.0.0.1", "localhost", "issued for 127.0.0.1"),
    ("DNS:127.0.0.1", "127.0.0.1", "issued for 127.0.0.1"),
    ("", "localhost", "issued for no name", {"subject": "localhost"}),
    ("DNS:*.localhost", "localhost", "issued for *.localhost"),
]

# What a server does, what the client says of it, with which version, by which scheme.
BEHAVIOURS = [
    ("good", good, "0 ", TLS_1_2),
    ("a byte in each record", partial(good, piece=1), "0 "),
    ("no length", partial(good, reply=NO_LENGTH), "0 "),
    ("no announced end, all of the length", cut, "0 "),
    ("no announced end, a part of the length", partial(cut, sent=100),
     f"{CLOSED} GET /f: the connection was closed too early"),
    ("no announced end, no length", partial(cut, reply=NO_LENGTH),
     f"{CLOSED} GET /f: the connection was closed without an announced end"),
    ("in the clear", plain, WITH + "the answer is not encrypted"),
    ("closed", partial(plain, reply=b""), f"{CLOSED} encryption with localhost: the connection was closed"),
    ("old", good, WITH + "it does not speak TLS 1.2 or later", TLS_1_1),
    ("a redirect out of it", partial(good, reply=REDIRECT % b"http"), f"{REFUSED} GET /f: 302 Found"),
    ("no PBSZ", partial(refuse, refused=b"PBSZ"), f"{ENCRYPTION} PBSZ 0: 534 so be it", None, "ftps"),
    ("no PROT", partial(refuse, refused=b"PROT"), f"{ENCRYPTION} PROT P: 534 so be it", None, "ftps"),
]


class Encryption(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir(parents=True)
        cls.authority = Authority(folder)
        cls.certificate = cls.authority.issue("good", "DNS:localhost")

    def expect(self, server, expected, host="localhost", trusted=None, more=(), scheme="https",
               fetch="zarvo_fetch", **environment):
        """Both runs of one handle end so; a file that was there stays but for a good end."""
        copy = folder / "copy"
        copy.write_bytes(b"old")
        trusted = self.authority.certificate if trusted is None else trusted
        paths = [as_windows(path) if emulator and path else path for path in (copy, trusted)]
        found = start(*emulator, programs / (fetch + suffix), f"{scheme}://{host}:{server.port}/f", *paths,
                      *more, env=environment)
        server.close()
        self.assertEqual(found, (0, f"{expected}\n" * 2, ""))
        self.assertEqual(copy.read_bytes(), TEXT if expected == "0 " else b"old")

    def good(self, *behave):
        return Server(self.certificate, *behave or [good])

    def test_certificates(self):
        for names, host, reason, *more in CERTIFICATES:
            with self.subTest(names, host=host):
                heard = []
                server = Server(self.authority.issue("next", names, **dict(*more)),
                                lambda peer: heard.append(good(peer)))
                self.expect(server, f"{CERTIFICATE} of {host}: {reason}" if reason else "0 ", host)
                self.assertEqual(bool(heard), not reason, "a request left")

    def test_trust(self):
        """Without a file it goes by the system's certificates, which on Linux two variables name."""
        itself, ours = self.authority.issue_itself("itself", "localhost"), self.authority.certificate
        self.expect(Server(itself, good), "0 ", trusted=itself)
        self.expect(Server(itself, good), f"{CERTIFICATE} of localhost: signed by itself, and not trusted",
                    SSL_CERT_FILE=str(itself))
        self.expect(self.good(), f"{CERTIFICATE} of localhost: its issuer is not trusted", trusted="")
        if not emulator:
            subprocess.run(["openssl", "rehash", folder], check=True, capture_output=True)
            self.expect(self.good(), "0 ", trusted="", SSL_CERT_FILE=str(ours))
            self.expect(self.good(), "0 ", trusted="", SSL_CERT_DIR=str(folder))

    def test_behaviours(self):
        for name, behave, end, *more in BEHAVIOURS:
            with self.subTest(name):
                version, scheme = [*more, *(None, "https")[len(more):]]
                self.expect(self.good(behave, version), end, scheme=scheme)
        self.expect(OpensslServer(self.certificate), WITH + "it wants a second handshake")
        encrypted = self.good()  # and from http:// into it
        into = (REDIRECT % b"https").replace(b":1/", b":%d/f" % encrypted.port)
        self.expect(self.good(partial(plain, reply=into)), "0 ", scheme="http")
        encrypted.close()

    @unittest.skipIf(len(sys.argv) > 3, "Windows encrypts by itself")
    def test_what_encrypts(self):
        """A program may hold the library inside it, and may be linked to what encrypts. The library
        alone, as its package installs it, does not even connect."""
        self.expect(self.good(), "0 ", fetch="zarvo_fetch_static")
        alone = folder / "alone"
        alone.mkdir()
        shutil.copy(programs.parent / "src/libzarvo.so.1", alone)
        self.expect(self.good(), "0 ", fetch="zarvo_fetch_linked", LD_LIBRARY_PATH=str(alone))
        heard = []
        self.expect(self.good(heard.append), f"{ENCRYPTION} encryption needs libzarvo_tls.so.1, which is "
                    "not installed (package libzarvo-tls1)", LD_LIBRARY_PATH=str(alone))
        self.assertEqual(heard, [])

    def test_stalls(self):
        """A server that says nothing more after so many records of the handshake."""
        silence = f"{SILENCE} encryption with localhost: no reply within 0.3 s"
        for version, records in [(None, 0), (None, 1), *((TLS_1_2, i) for i in range(6))]:
            with self.subTest(version=version, records=records):
                for more, end in ((300,), silence), ((20000, 300), f"{CANCELLED} cancelled"):
                    self.expect(self.good(partial(good, records=records), version), end, more=more)


programs, folder = Path(sys.argv[1]).absolute(), Path(sys.argv[2]).absolute()
emulator, suffix = sys.argv[3:], ".exe" if len(sys.argv) > 3 else ""
unittest.main(argv=["encryption_test.py", "-v"])
