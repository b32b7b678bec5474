"""A server that is not always there."""
import socket
import threading
import time


class HttpServer:
    """Breaks its first connections off; then answers each with a body that comes in two halves."""
    BODY = b"1" * 2000000 + b"2" * 1000

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
                client.sendall(b"HTTP/1.0 200 OK\r\nContent-Length: %d\r\n\r\n" % len(self.BODY))
                client.sendall(self.BODY[:-1000])
                time.sleep(self.pause)
                client.sendall(self.BODY[-1000:])
