"""A terminal on which calls are shown: terminal.py GATEWAYCTL PID-OF-GATEWAY, which ends with it."""
import fcntl
import os
import pty
import re
import select
import signal
import struct
import subprocess
import sys
import termios
import time

PROGRAM, GATEWAY = sys.argv[1], int(sys.argv[2])
LEFT = b"\x1b[?25h\x1b[?1049l"  # the cursor is back, and the first screen


class Screen:
    def __init__(self, *words):
        master, slave = pty.openpty()
        fcntl.ioctl(slave, termios.TIOCSWINSZ, struct.pack("HHHH", 10, 70, 0, 0))
        self.before = termios.tcgetattr(slave)
        self.process = os.fork()
        if self.process == 0:
            self.login(slave)
            os.execv(PROGRAM, [PROGRAM, *words])
        self.master, self.slave, self.seen = master, slave, b""

    @staticmethod
    def login(slave):
        os.setsid()
        fcntl.ioctl(slave, termios.TIOCSCTTY, 0)
        for descriptor in range(3):
            os.dup2(slave, descriptor)

    def wait_for(self, pattern):
        """Until that is shown, from the last that was waited for on."""
        until = time.monotonic() + 20
        while not (found := re.search(pattern, self.seen)):
            assert time.monotonic() < until, f"{pattern} is not in {self.seen}"
            if select.select([self.master], [], [], 0.1)[0]:
                self.seen += os.read(self.master, 65536)
        self.seen = self.seen[found.end():]
        return found

    def key(self, text):
        os.write(self.master, text)

    def expect_end(self, status):
        self.wait_for(re.escape(LEFT))
        _, ended = os.waitpid(self.process, 0)
        assert os.waitstatus_to_exitcode(ended) == status, os.waitstatus_to_exitcode(ended)
        assert termios.tcgetattr(self.slave) == self.before, "the terminal is not as it was"


screen = Screen("top")
screen.wait_for(rb"\x1b\[H" + rb"by age; keys")
screen.wait_for(rb"serving: 1 calls up; 1 placed")
# the packet figures are not measured here, since no media pass through
line = screen.wait_for(rb"\r\n( +1 +\d+ answered[^\x1b]*)\x1b")[1]
assert b"a 4420 - b 4989123" in line and len(line) <= 70, line
screen.key(b"r")
screen.wait_for(rb"by rate; keys")
screen.key(b"s")
screen.wait_for(rb"by quality; keys")
screen.wait_for(rb"by quality; keys")  # by itself
fcntl.ioctl(screen.slave, termios.TIOCSWINSZ, struct.pack("HHHH", 1, 20, 0, 0))
screen.wait_for(rb"\x1b\[Hby quality; keys: a \x1b\[K\x1b\[J")
screen.key(b"q")
screen.expect_end(0)

screen = Screen("top", "--sort", "rate")
screen.wait_for(rb"by rate; keys")
os.kill(screen.process, signal.SIGTERM)
screen.expect_end(0)

screen = Screen("top", "--sort", "name")
screen.wait_for(rb"\x1b\[\?1049h")
screen.expect_end(1)

screen = Screen("top")
screen.wait_for(rb"by age; keys")
subprocess.run([PROGRAM, "drop", "1", "16"], check=True)
os.kill(GATEWAY, signal.SIGTERM)
screen.expect_end(3)
