"""A relay between one client after the other and a server, which counts octets: what an attacker and its victim exchange.

relay.py ADDRESS PORT SERVER SERVER-PORT FILE: writes "IN OUT" to the file whenever something has passed: the octets towards the
server, and those back."""
import os
import select
import socket
import sys

address, port, server, server_port, file = sys.argv[1:]
inside = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
inside.setsockopt(socket.SOL_SOCKET, socket.SO_RCVBUF, 1 << 22)
inside.bind((address, int(port)))
outside = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
outside.setsockopt(socket.SOL_SOCKET, socket.SO_RCVBUF, 1 << 22)
outside.bind((address, 0))
outside.connect((server, int(server_port)))
client, sent, received = None, 0, 0
while True:
    for ready in select.select([inside, outside], [], [])[0]:
        try:
            if ready is inside:
                data, client = inside.recvfrom(65536)
                outside.send(data)
                sent += len(data)
            else:
                data = outside.recv(65536)
                received += len(data)
                inside.sendto(data, client)
        except OSError:
            continue
        with open(file + ".new", "w") as out:
            out.write(f"{sent} {received}\n")
        os.replace(file + ".new", file)
