#!/usr/bin/env python3
"""Compares relays of speech: the floor, the media layer, and rtpengine in user space where it is installed.

media.py BUILD_DIRECTORY [--calls N] [--seconds N] [--rounds N]

Each relay gets the same load (two ends a call, 50 packets a second each); the relays take turns in rounds, because the
machine does other things, too, and of each figure the median counts. Says whether the media layer keeps to its limits.
"""
import argparse
import glob
import json
import os
import random
import re
import shutil
import signal
import socket
import statistics
import subprocess
import sys
import time

LIMITS = {"to_floor": 1.4, "delay_us": 2000, "kilobytes_a_call": 64}
FAR_PORT = 10000  # below what the system gives away


def processor_time(pid):
    """Seconds of all threads, to the nanosecond."""
    total = 0
    for path in glob.glob(f"/proc/{pid}/task/*/schedstat"):
        with open(path) as file:
            total += int(file.read().split()[0])
    return total / 1e9


def memory(pid):
    """Kilobytes of its own."""
    with open(f"/proc/{pid}/status") as file:
        text = file.read()
    return int(re.search(r"RssAnon:\s+(\d+)", text)[1])


class LineRelay:
    """One that takes the far ports on its input and tells its own on its output."""

    def __init__(self, name, program, calls):
        self.name = name
        self.process = subprocess.Popen([program], stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)
        time.sleep(0.2)
        self.empty = memory(self.process.pid)
        for call in range(calls):
            self.process.stdin.write(f"{FAR_PORT + 2 * call} {FAR_PORT + 2 * call + 1}\n")
        self.process.stdin.close()
        self.pairs = []
        for call, line in enumerate(iter(self.process.stdout.readline, "ready\n")):
            a, b = line.split()
            self.pairs += [(FAR_PORT + 2 * call, a), (FAR_PORT + 2 * call + 1, b)]

    def end(self):
        self.process.send_signal(signal.SIGTERM)
        return dict(zip(*[iter(self.process.stdout.read().split())] * 2))


class Rtpengine:
    """The packaged relay without its kernel module, spoken to in its control protocol (bencoded)."""

    name = "rtpengine"

    def __init__(self, program, calls):
        self.process = subprocess.Popen(
            [program, "--interface=127.0.0.1", "--listen-ng=127.0.0.1:2223", "--table=-1", "--num-threads=1", "--foreground",
             "--log-stderr", "--log-level=3", "--port-min=30000", "--port-max=39999"],
            stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        time.sleep(1)
        if self.process.poll() is not None:
            raise OSError("rtpengine does not start")
        self.empty = memory(self.process.pid)
        self.control = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
        self.control.connect(("127.0.0.1", 2223))
        self.control.settimeout(5)
        self.pairs = []
        for call in range(calls):
            a, b = FAR_PORT + 2 * call, FAR_PORT + 2 * call + 1
            common = {"call-id": f"call{call}", "from-tag": "a"}
            towards_b = self.ask({**common, "command": "offer", "sdp": self.description(a)})
            towards_a = self.ask({**common, "command": "answer", "to-tag": "b", "sdp": self.description(b)})
            self.pairs += [(a, self.port(towards_a)), (b, self.port(towards_b))]

    @staticmethod
    def description(port):
        return (f"v=0\r\no=- 1 1 IN IP4 127.0.0.1\r\ns=-\r\nc=IN IP4 127.0.0.1\r\nt=0 0\r\n"
                f"m=audio {port} RTP/AVP 8\r\na=rtpmap:8 PCMA/8000\r\n")

    @staticmethod
    def port(answer):
        return re.search(r"m=audio (\d+)", answer)[1]

    @classmethod
    def encode(cls, value):
        if isinstance(value, str):
            return b"%d:%s" % (len(value), value.encode())
        return b"d" + b"".join(cls.encode(key) + cls.encode(value[key]) for key in sorted(value)) + b"e"

    def ask(self, question):
        self.control.send(b"%d " % random.getrandbits(40) + self.encode(question))
        return self.control.recv(65536).decode("latin1")

    def end(self):
        self.process.terminate()
        return {}


def measure(make, build, calls, seconds):
    relay = make()
    try:
        pid = relay.process.pid
        used = memory(pid) - relay.empty
        before = processor_time(pid)
        text = subprocess.run([f"{build}/benchmarks/media/media_load", str(seconds)], capture_output=True, text=True, check=True,
                              input="".join(f"{far} {own}\n" for far, own in relay.pairs)).stdout
        spent = processor_time(pid) - before
        used = max(used, memory(pid) - relay.empty)
    finally:
        more = relay.end()
        relay.process.wait(10)
    load = {key: int(value) for key, value in zip(*[iter(text.split())] * 2)}
    return {"us": spent / max(load["received"], 1) * 1e6, "lost": load["lost"], "p50": load["p50"], "p99": load["p99"],
            "p999": load["p999"], "kilobytes_a_call": used / calls, **{key: int(value) for key, value in more.items()}}


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("build")
    parser.add_argument("--calls", type=int, default=100)
    parser.add_argument("--seconds", type=float, default=8)
    parser.add_argument("--rounds", type=int, default=5)
    options = parser.parse_args()
    programs = f"{options.build}/benchmarks/media"
    makers = {"bare forwarder": lambda: LineRelay("bare forwarder", f"{programs}/bare_forwarder", options.calls),
              "media layer": lambda: LineRelay("media layer", f"{programs}/media_relay", options.calls)}
    rtpengine = shutil.which("rtpengine")
    if rtpengine:
        makers["rtpengine"] = lambda: Rtpengine(rtpengine, options.calls)
    else:
        print("rtpengine is not installed: left out")
    rounds = {name: [] for name in makers}
    for _ in range(options.rounds):
        for name, make in list(makers.items()):
            try:
                rounds[name].append(measure(make, options.build, options.calls, options.seconds))
            except OSError as error:
                print(f"{name}: {error}: left out")
                makers.pop(name)
    result = {name: {key: statistics.median(one[key] for one in all_) for key in all_[0]} for name, all_ in rounds.items() if all_}
    print(f"{options.calls} calls, {options.seconds:g} s, median of {options.rounds} rounds, {os.cpu_count()} cores")
    print(f"{'':16}{'us a packet':>12}{'lost':>8}{'p50 us':>9}{'p99 us':>9}{'p99.9 us':>10}{'kB a call':>11}")
    for name, one in result.items():
        print(f"{name:16}{one['us']:12.2f}{one['lost']:8.0f}{one['p50']:9.0f}{one['p99']:9.0f}{one['p999']:10.0f}"
              f"{one['kilobytes_a_call']:11.1f}")
    ours, floor = result["media layer"], result["bare forwarder"]
    print(f"media layer: {ours['allocations']:.0f} allocations for {ours['packets']:.0f} packets and {ours['news']:.0f} news")
    checks = {f"at most {LIMITS['to_floor']} times the floor: {ours['us'] / floor['us']:.2f}": ours["us"] <= LIMITS["to_floor"] * floor["us"],
              "p99.9 at most 2 ms behind the floor's": ours["p999"] <= floor["p999"] + LIMITS["delay_us"],
              "no allocation for a packet": ours["allocations"] <= 2 * ours["news"] + 100,
              f"at most {LIMITS['kilobytes_a_call']} kB a call": ours["kilobytes_a_call"] <= LIMITS["kilobytes_a_call"]}
    if "rtpengine" in result:
        checks["less than rtpengine"] = ours["us"] < result["rtpengine"]["us"]
    for text, holds in checks.items():
        print(f"{'held  ' if holds else 'MISSED'} {text}")
    with open(f"{options.build}/media.json", "w") as file:
        json.dump(result, file, indent=1)
    return 0 if all(checks.values()) else 1


if __name__ == "__main__":
    sys.exit(main())
