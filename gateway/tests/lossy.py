"""A wire between a SIP peer and the gateway that loses, doubles and reorders datagrams.

    lossy.py SEED PEER:NEAR:FAR:GATEWAY...

Each argument is one wire of four ports of the loopback: the peer's own; NEAR, which the peer takes for the gateway's; FAR,
which the gateway takes for the peer's; the gateway's own. All have five digits, so that the addresses within messages can
be rewritten in place. Until it is ended by SIGTERM, when it says how many datagrams it saw and what became of them.
"""
import random
import selectors
import signal
import socket
import sys

HOST = "127.0.0.1"
SHARE = 0.1  # of the datagrams, for each of the three
HELD_BACK = 0.05  # seconds, at most


class Direction:
    def __init__(self, receiving, sending, target, replacements):
        self.receiving, self.sending, self.target, self.replacements = receiving, sending, target, replacements
        self.held = []

    def forward(self, data):
        for old, new in self.replacements:
            data = data.replace(b"%s:%d" % (HOST.encode(), old), b"%s:%d" % (HOST.encode(), new))
        self.sending.sendto(data, (HOST, self.target))

    def release(self):
        held, self.held = self.held, []
        for data in held:
            self.forward(data)

    def take(self, data, chance, counts):
        counts["seen"] += 1
        if chance < SHARE:
            counts["lost"] += 1
        elif chance < 2 * SHARE:
            counts["held back"] += 1
            self.held.append(data)
        else:
            self.forward(data)
            if chance < 3 * SHARE:
                counts["doubled"] += 1
                self.forward(data)
            self.release()


def bound(port):
    result = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
    result.bind((HOST, port))
    return result


def main():
    chances = random.Random(int(sys.argv[1]))
    counts = {"seen": 0, "lost": 0, "held back": 0, "doubled": 0}
    selector = selectors.DefaultSelector()
    directions = []
    for wire in sys.argv[2:]:
        peer, near, far, gateway = (int(port) for port in wire.split(":"))
        near_socket, far_socket = bound(near), bound(far)
        directions.append(Direction(near_socket, far_socket, gateway, [(peer, far), (near, gateway)]))
        directions.append(Direction(far_socket, near_socket, peer, [(far, peer), (gateway, near)]))
    for direction in directions:
        selector.register(direction.receiving, selectors.EVENT_READ, direction)

    def end(*_):
        print(", ".join(f"{count} {what}" for what, count in counts.items()), flush=True)
        sys.exit(0)

    signal.signal(signal.SIGTERM, end)
    while True:
        ready = selector.select(HELD_BACK)
        for key, _ in ready:
            key.data.take(key.data.receiving.recv(65536), chances.random(), counts)
        if not ready:
            for direction in directions:
                direction.release()


main()
