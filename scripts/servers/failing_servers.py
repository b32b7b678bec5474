"""Servers that are not always there, slow, or gone before they have answered."""
import re
import socket
import threading
import time


class Server:
    """Breaks its first connections off; then `talk` has each, with its lines."""
    location = "http://{}/x"

    def __init__(self, broken=0):
        self.listener = socket.create_server(("127.0.0.1", 0))
        self.url = self.location.format("127.0.0.1:%d" % self.listener.getsockname()[1])
        self.broken = broken
        self.connections = 0
        threading.Thread(target=self.serve, daemon=True).start()

    def serve(self):
        while True:
            with self.listener.accept()[0] as client:
                self.connections += 1
                if self.connections > self.broken:
                    try:
                        self.talk(client, client.makefile("rb"))
                    except OSError:
                        pass


class HttpServer(Server):
    """Sends its body, or takes one, in two halves with a pause between them."""
    BODY = b"1" * 2000000 + b"2" * 1000

    def __init__(self, broken=0, pause=0.0, status=b"200 OK"):
        self.pause, self.status = pause, status
        super().__init__(broken)

    def talk(self, client, lines):
        self.head = b"".join(iter(lines.readline, b"\r\n"))
        length = re.search(rb"(?i)content-length: (\d+)", self.head)
        if length:
            lines.read(int(length[1]) // 2)
            time.sleep(self.pause)
            lines.read(int(length[1]) - int(length[1]) // 2)
            client.sendall(b"HTTP/1.1 201 Created\r\nContent-Length: 0\r\n\r\n")
            return
        client.sendall(b"HTTP/1.0 %s\r\nContent-Length: %d\r\n\r\n" % (self.status, len(self.BODY)))
        client.sendall(self.BODY[:-1000])
        time.sleep(self.pause)
        client.sendall(self.BODY[-1000:])


class MailServer(Server):
    """Is gone once it has a message."""
    messages = 0
    location = "smtp://{}"

    def talk(self, client, lines):
        client.sendall(b"220 here\r\n")
        for command in iter(lines.readline, b""):
            if command.startswith(b"DATA"):
                client.sendall(b"354 go on\r\n")
                for _ in iter(lines.readline, b".\r\n"):
                    pass
                self.messages += 1
                return
            client.sendall(b"250 fine\r\n")
