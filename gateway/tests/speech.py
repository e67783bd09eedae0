#!/usr/bin/env python3
"""What was said at one end of a call and what was heard at the other.

    speech.py say SEED SECONDS FILE     writes a WAV of noise that no other seed gives (8 kHz, 16 bits)
    speech.py compare SAID HEARD FRAMES  whether at least so many frames of 20 ms of what was said came through mu-law
                                        without a bit changed, one after the other and none before its turn
"""
import random
import struct
import sys
import wave

FRAME = 160  # samples


def say(seed, seconds, path):
    source = random.Random(seed)
    samples = [source.randint(-12000, 12000) for _ in range(8000 * seconds)]
    with wave.open(path, "wb") as file:
        file.setnchannels(1)
        file.setsampwidth(2)
        file.setframerate(8000)
        file.writeframes(struct.pack("<%dh" % len(samples), *samples))


def read(path):
    """As far as it was written: a phone that is killed leaves a header without a length."""
    with open(path, "rb") as file:
        octets = file.read()[44:]
    octets = octets[: len(octets) // 2 * 2]
    return struct.unpack("<%dh" % (len(octets) // 2), octets)


def through_mu_law(sample):
    """ITU-T G.711: coded and decoded again."""
    magnitude = min(abs(sample), 32635) + 132
    exponent = magnitude.bit_length() - 8
    mantissa = (magnitude >> (exponent + 3)) & 15
    value = (((mantissa << 3) + 132) << exponent) - 132
    return -value if sample < 0 else value


def compare(said_path, heard_path, wanted):
    said = [through_mu_law(sample) for sample in read(said_path)]
    places = {tuple(said[i : i + FRAME]): i for i in range(0, len(said) - FRAME + 1, FRAME)}
    heard = read(heard_path)
    last, whole = -1, 0
    for i in range(0, len(heard) - FRAME + 1, FRAME):
        place = places.get(tuple(heard[i : i + FRAME]))
        if place is None:
            continue
        if place < last:
            sys.exit(f"{heard_path}: a frame comes before its turn")
        last, whole = place, whole + 1
    print(f"{whole} of {len(heard) // FRAME} frames heard are as they were said")
    if whole < wanted:
        sys.exit(f"{heard_path}: that is less than {wanted}")


if sys.argv[1] == "say":
    say(int(sys.argv[2]), int(sys.argv[3]), sys.argv[4])
else:
    compare(sys.argv[2], sys.argv[3], int(sys.argv[4]))
