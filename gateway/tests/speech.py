#!/usr/bin/env python3
"""What was said at one end of a call and what was heard at the other.

    speech.py say SEED SECONDS FILE     writes a WAV of noise that no other seed gives (8 kHz, 16 bits)
    speech.py compare SAID HEARD FRAMES [LAWS]
                                        whether at least so many frames of 20 ms of what was said came through mu-law
                                        without a bit changed, one after the other and none before its turn; LAWS: in
                                        which codecs it was one after the other, "a,mu"
    speech.py channel FILE 0|1 ONE      writes a WAV of one channel of another one
    speech.py speak SEED SECONDS FILE   writes a WAV that sounds like somebody speaking, each seed another one
    speech.py key DIGITS FILE           writes a WAV of these digits as they sound (ITU-T Q.23), after 2 s of silence
    speech.py hum HERTZ SECONDS FILE    writes a WAV of one tone; of silence, for 0 Hz
    speech.py overhear SAID PORT PACKETS
                                        takes so many packets of RTP on a port of 127.0.0.1: whether each is one of SRTP
                                        with mu-law in it, and none bears what was said in the clear
    speech.py tone HEARD HERTZ LEAST MOST
                                        whether a tone is heard in so many frames of 20 ms, and nothing else
    speech.py distance SAID HEARD DECIBELS [OTHER]
                                        whether what was heard sounds like what was said: by how much the levels of 17
                                        bands from 100 Hz to 3.4 kHz differ in the middle of all frames, the general
                                        level aside; of what another one said they must differ more
"""
import cmath
import math
import random
import socket
import struct
import sys
import wave

FRAME = 160  # samples


def say(seed, seconds, path):
    source = random.Random(seed)
    samples = [source.randint(-12000, 12000) for _ in range(8000 * seconds)]
    write(path, samples)


def speak(seed, seconds, path):
    """Syllables of a voice with three formants, and pauses between them."""
    source = random.Random(seed)
    samples = []
    phase = 0.0
    while len(samples) < 8000 * seconds:
        length = source.randint(800, 2400)
        pitch = source.uniform(90, 220)
        glide = source.uniform(-40, 40) / length
        formants = [source.uniform(*band) for band in ((250, 850), (900, 2000), (2100, 3100))]
        gains = [1.0, source.uniform(0.3, 0.9), source.uniform(0.1, 0.5)]
        levels = {}
        for harmonic in range(1, int(3300 / pitch)):
            frequency = harmonic * pitch
            levels[harmonic] = sum(g / (1 + ((frequency - f) / 120) ** 2) for f, g in zip(formants, gains))
        for i in range(length):
            phase += 2 * math.pi * (pitch + glide * i) / 8000
            swell = math.sin(math.pi * i / length) ** 0.5
            samples.append(int(4500 * swell * sum(level * math.sin(h * phase) for h, level in levels.items())))
        samples += [0] * source.randint(200, 1200)
    peak = max(abs(sample) for sample in samples)
    write(path, [sample * 12000 // peak for sample in samples[: 8000 * seconds]])


def key(digits, path):
    samples = [0] * 16000
    for digit in digits:
        row, column = divmod("123A456B789C*0#D".index(digit), 4)
        pair = [(697, 770, 852, 941)[row], (1209, 1336, 1477, 1633)[column]]
        samples += [int(sum(6000 * math.sin(2 * math.pi * f * i / 8000) for f in pair)) for i in range(800)]
        samples += [0] * 1600
    write(path, samples + [0] * 16000)


def write(path, samples):
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


def through_a_law(sample):
    """The same."""
    magnitude = (-sample - 1 if sample < 0 else sample) >> 4
    exponent = max(0, magnitude.bit_length() - 5)
    value = (magnitude >> exponent << exponent + 4) + (8 << exponent)
    return -value if sample < 0 else value


LAWS = {"mu": through_mu_law, "a": through_a_law}


def compare(said_path, heard_path, wanted, laws="mu"):
    """Of two codecs one after the other 8 samples of a frame may differ: each may round what lies between two values of
    its own to either."""
    said = list(read(said_path))
    for law in laws.split(","):
        said = [LAWS[law](sample) for sample in said]
    spare = 0 if laws == "mu" else 8
    piece = FRAME if laws == "mu" else FRAME // 8
    places = {}
    for i in range(0, len(said) - FRAME + 1, piece):
        places[tuple(said[i : i + piece])] = i
    heard = read(heard_path)
    last, whole = -1, 0
    for i in range(0, len(heard) - FRAME + 1, FRAME):
        frame = heard[i : i + FRAME]
        pieces = range(0, FRAME, piece)
        starts = {places[key] - at for at in pieces if (key := tuple(frame[at : at + piece])) in places}
        near = [p for p in starts if p >= 0 and sum(s != h for s, h in zip(said[p:], frame)) <= spare]
        if not near:
            continue
        if near[0] < last:
            sys.exit(f"{heard_path}: a frame comes before its turn")
        last, whole = near[0], whole + 1
    print(f"{whole} of {len(heard) // FRAME} frames heard are as they were said")
    if whole < wanted:
        sys.exit(f"{heard_path}: that is less than {wanted}")


HOP = 160  # samples at 8 kHz
WINDOW = 256
BANDS = [(3 + 6 * i, 9 + 6 * i) for i in range(17)]  # of the bins of a window


def spectrum(values):
    if len(values) == 1:
        return values
    even, odd = spectrum(values[::2]), spectrum(values[1::2])
    half = len(values) // 2
    turned = [cmath.exp(-1j * math.pi * i / half) * odd[i] for i in range(half)]
    return [even[i] + turned[i] for i in range(half)] + [even[i] - turned[i] for i in range(half)]


def band_levels(samples):
    """In decibels, of each hop."""
    shape = [0.5 - 0.5 * math.cos(2 * math.pi * i / WINDOW) for i in range(WINDOW)]
    levels = []
    for at in range(0, len(samples) - WINDOW, HOP):
        bins = spectrum([samples[at + i] * shape[i] for i in range(WINDOW)])
        levels.append([10 * math.log10(sum(abs(b) ** 2 for b in bins[low:high]) + 1e4) for low, high in BANDS])
    return levels


def at_8000(path):
    """The left channel, at 8 kHz: what is said has nothing above."""
    with open(path, "rb") as file:
        header = file.read(44)
    channels, rate = struct.unpack("<HI", header[22:28])
    return read(path)[:: channels * rate // 8000]


def measure(said, heard):
    """At the delay where they are nearest; in the frames in which somebody speaks. 99: they never are near."""
    best = 99.0
    speaking = [i for i, levels in enumerate(heard) if max(levels) > 75]
    if len(speaking) < 50:
        return best
    for delay in range(-len(heard) // 2, len(said) - len(heard) // 2):
        some = [i for i in speaking[:: max(1, len(speaking) // 40)] if 0 <= i + delay < len(said)]
        if len(some) < 20 or median_distance(said, heard, delay, some) > 12:
            continue
        pairs = [i for i in speaking if 0 <= i + delay < len(said)]
        best = min(best, median_distance(said, heard, delay, pairs))
    return best


def median_distance(said, heard, delay, frames):
    distances = []
    for i in frames:
        differences = [h - s for h, s in zip(heard[i], said[i + delay])]
        mean = sum(differences) / len(differences)
        distances.append(math.sqrt(sum((d - mean) ** 2 for d in differences) / len(differences)))
    return sorted(distances)[len(distances) // 2]


def distance(said_path, heard_path, limit, other_path=None):
    heard = band_levels(at_8000(heard_path))[50:200]
    found = measure(band_levels(at_8000(said_path)[: 8000 * 8]), heard)
    print(f"{found:.1f} dB from what was said")
    if found > limit:
        sys.exit(f"{heard_path}: that is more than {limit}")
    if other_path and measure(band_levels(at_8000(other_path)[: 8000 * 8]), heard) < 2 * limit:
        sys.exit(f"{heard_path}: it is as near to {other_path}")


def overhear(said_path, port, wanted):
    codes = {through_mu_law(value): code for code in range(256) for value in [of_mu_law(code)]}
    said = bytes(codes[through_mu_law(sample)] for sample in read(said_path))
    listener = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
    listener.bind(("127.0.0.1", port))
    listener.settimeout(10)
    for _ in range(wanted):
        packet = listener.recv(2000)
        if len(packet) != 12 + FRAME + 10:
            sys.exit(f"a packet has {len(packet)} octets")
        if said.find(packet[12 : 12 + FRAME]) >= 0:
            sys.exit("speech in the clear")
    print(f"{wanted} packets, none in the clear")


def of_mu_law(code):
    code = ~code & 255
    value = (((code & 15) * 2 + 33) << (code >> 4 & 7)) * 4 - 132
    return -value if code & 128 else value


def tone(path, hertz, least, most):
    """Of the frames in which anything is heard."""
    samples = at_8000(path)
    count = others = 0
    for at in range(0, len(samples) - FRAME, FRAME):
        frame = samples[at : at + FRAME]
        energy = sum(s * s for s in frame)
        if energy < FRAME * 10000:
            continue
        part = sum(s * cmath.exp(-2j * math.pi * hertz * i / 8000) for i, s in enumerate(frame))
        if 2 * abs(part) ** 2 / FRAME > 0.8 * energy:
            count += 1
        else:
            others += 1
    print(f"{count} frames of {hertz} Hz, {others} of something else")
    if not least <= count <= most or others > 10:
        sys.exit(f"{path}: expected {least} to {most} and nothing else")


def hum(hertz, seconds, path):
    write(path, [int(8000 * math.sin(2 * math.pi * hertz * i / 8000)) for i in range(8000 * seconds)])


def channel(path, number, one_path):
    write(one_path, read(path)[number::2])


COMMANDS = {
    "channel": lambda path, number, one_path: channel(path, int(number), one_path),
    "hum": lambda hertz, seconds, path: hum(float(hertz), int(seconds), path),
    "tone": lambda heard, hertz, least, most: tone(heard, float(hertz), int(least), int(most)),
    "overhear": lambda said, port, packets: overhear(said, int(port), int(packets)),
    "say": lambda seed, seconds, path: say(int(seed), int(seconds), path),
    "key": key,
    "speak": lambda seed, seconds, path: speak(int(seed), int(seconds), path),
    "compare": lambda said, heard, frames, *laws: compare(said, heard, int(frames), *laws),
    "distance": lambda said, heard, limit, *other: distance(said, heard, float(limit), *other),
}
COMMANDS[sys.argv[1]](*sys.argv[2:])
