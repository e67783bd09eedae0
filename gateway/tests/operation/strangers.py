"""Clients of the page of figures that mean no good, and one that does: it must have its answer within some seconds."""
import os
import resource
import socket
import sys
import time

PORT = int(sys.argv[1])
SILENT = 1000
resource.setrlimit(resource.RLIMIT_NOFILE, (min(4096, resource.getrlimit(resource.RLIMIT_NOFILE)[1]),) * 2)


def connect():
    return socket.create_connection(("127.0.0.1", PORT), 20)


def ask(request):
    """The first line of the answer."""
    with connect() as client:
        client.settimeout(20)
        try:
            client.sendall(request)
            answer = b""
            while piece := client.recv(65536):
                answer += piece
        except (ConnectionResetError, BrokenPipeError):
            pass
        return answer.split(b"\r\n")[0].decode()


silent = [connect() for _ in range(SILENT)]
start = time.monotonic()
assert ask(b"GET /metrics HTTP/1.0\r\n\r\n") == "HTTP/1.1 200 OK"
print(f"answered among {SILENT} who are silent after {time.monotonic() - start:.3f} s")
assert ask(b"GET /metrics HTTP/1.1\r\n\r\n") == "HTTP/1.1 400 Bad Request", "without a Host"
assert ask(b"GET /else HTTP/1.0\r\n\r\n") == "HTTP/1.1 404 Not Found"
assert ask(b"POST /metrics HTTP/1.0\r\nContent-Length: 3\r\n\r\nabc") == "HTTP/1.1 405 Method Not Allowed"
assert ask(b"PRI * HTTP/2.0\r\n\r\n") == "HTTP/1.1 400 Bad Request"
assert ask(b"GET / HTTP/2.0\r\n\r\n") == "HTTP/1.1 505 HTTP Version Not Supported"
assert ask(b"GET /" + b"a" * 8192) == "HTTP/1.1 431 Request Header Fields Too Large"
assert ask(b"GET / HTTP/1.0\r\nx: " + b"a" * 1000000) in ("HTTP/1.1 431 Request Header Fields Too Large", "")
for _ in range(300):
    with connect() as client:
        client.sendall(os.urandom(600))
assert ask(b"HEAD /metrics HTTP/1.1\r\nHost: localhost\r\n\r\n") == "HTTP/1.1 200 OK"
