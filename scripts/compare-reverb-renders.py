#!/usr/bin/env python3
"""Renders the same material through "Reverb" with two builds of zenfx and
compares the outputs sample by sample.

    scripts/compare-reverb-renders.py OLD_ZENFX NEW_ZENFX [--keep DIR]

Each zenfx loads the library beside it. Every scenario is reported as
bit-exact or with its largest difference in dB below the old render's peak;
the exit status is 1 when any scenario differs by more than -100 dB.
"""
import argparse
import array
import math
import os
import struct
import subprocess
import sys
import tempfile

LIMIT_DB = -100.0

# (name, rate, channels, block, settings: PARAM=VALUE or preset:NAME)
SCENARIOS = [
    ("default", 48000, 2, 512, []),
    ("fully wet", 48000, 2, 512, ["Dry/Wet=100"]),
    ("odd blocks", 48000, 2, 333, ["Dry/Wet=100"]),
    ("one-frame blocks", 48000, 1, 1, ["Dry/Wet=80"]),
    ("mono 44.1 kHz", 44100, 1, 512, ["Dry/Wet=100"]),
    ("96 kHz", 96000, 2, 512, ["Dry/Wet=100"]),
    ("192 kHz, odd blocks", 192000, 2, 250, ["Dry/Wet=100"]),
    ("eight channels", 48000, 8, 512, ["Dry/Wet=100"]),
    ("five channels", 48000, 5, 480, ["Dry/Wet=70"]),
    ("small bright room", 48000, 2, 512,
     ["Room Length=3", "Room Width=4", "Room Height=2.5", "Brightness=100", "Dry/Wet=100"]),
    ("large dark hall", 48000, 2, 512,
     ["Room Length=60", "Room Width=95", "Room Height=25", "T@-60dB=8", "Brightness=10", "Dry/Wet=100"]),
    ("deep modulation, pre-delay, distance", 48000, 2, 512,
     ["Modulation=10", "Pre-Delay=35", "Distance=20", "Dry/Wet=100"]),
    ("preset Studio Live Room", 48000, 2, 512, ["preset:Studio Live Room"]),
    ("preset Cathedral", 48000, 2, 512, ["preset:Cathedral"]),
    ("tone controls and gains", 48000, 2, 512,
     ["Early Refl. Low Gain=9", "Early Refl. High Gain=-12", "Early Refl. Low Freq=120",
      "Early Refl. High Freq=4000", "Late Rev. Low Gain=-6", "Late Rev. High Gain=6",
      "Late Rev. Low Freq=500", "Late Rev. High Freq=8000", "Direct Gain=-6",
      "Early Refl. Gain=3", "Late Rev. Gain=-3", "Dry/Wet=40"]),
]

SECONDS = 3.0


def material(rate, channels):
    """Impulses, noise bursts and silence, planar, deterministic."""
    frames = int(SECONDS * rate)
    seed = 12345
    out = []
    for ch in range(channels):
        x = [0.0] * frames
        x[ch * 7] = 1.0
        for start, length, level in ((0.3, 0.25, 0.5), (1.0, 0.05, 0.9), (1.2, 0.4, 0.2)):
            begin = int(start * rate)
            for i in range(begin, min(frames, begin + int(length * rate))):
                seed = (seed * 1664525 + 1013904223) & 0xFFFFFFFF
                x[i] = level * (seed / 2147483648.0 - 1.0)
        out.append(x)
    return out


def write_wav(path, planar, rate):
    channels, frames = len(planar), len(planar[0])
    data = array.array("f", (planar[c][f] for f in range(frames) for c in range(channels)))
    if sys.byteorder != "little":
        data.byteswap()
    payload = data.tobytes()
    with open(path, "wb") as f:
        f.write(b"RIFF" + struct.pack("<I", 36 + len(payload)) + b"WAVE")
        f.write(b"fmt " + struct.pack("<IHHIIHH", 16, 3, channels, rate, rate * channels * 4, channels * 4, 32))
        f.write(b"data" + struct.pack("<I", len(payload)) + payload)


def read_wav(path):
    with open(path, "rb") as f:
        blob = f.read()
    if blob[:4] != b"RIFF" or blob[8:12] != b"WAVE":
        raise ValueError(path + ": not a WAV file")
    pos, bits, data = 12, None, None
    while pos + 8 <= len(blob):
        tag, size = blob[pos:pos + 4], struct.unpack("<I", blob[pos + 4:pos + 8])[0]
        body = blob[pos + 8:pos + 8 + size]
        if tag == b"fmt ":
            bits = struct.unpack("<H", body[14:16])[0]
        elif tag == b"data":
            data = body
        pos += 8 + size + (size & 1)
    if bits != 32 or data is None:
        raise ValueError(path + ": expected 32-bit float samples")
    samples = array.array("f")
    samples.frombytes(data)
    if sys.byteorder != "little":
        samples.byteswap()
    return samples


def render(zenfx, source, target, block, settings):
    command = [zenfx, "process", source, "-o", target, "--format", "float", "--block", str(block),
               "--plugin", "Reverb"]
    for s in settings:
        command += ["--preset", s[len("preset:"):]] if s.startswith("preset:") else ["--set", s]
    subprocess.run(command, check=True, stdout=subprocess.DEVNULL)
    return read_wav(target)


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("old")
    parser.add_argument("new")
    parser.add_argument("--keep", help="write the renders here instead of a temporary folder")
    args = parser.parse_args()
    workdir = args.keep or tempfile.mkdtemp(prefix="reverb-renders-")
    os.makedirs(workdir, exist_ok=True)
    worst = -math.inf
    for index, (name, rate, channels, block, settings) in enumerate(SCENARIOS):
        source = os.path.join(workdir, "input-%d-%d.wav" % (rate, channels))
        if not os.path.exists(source):
            write_wav(source, material(rate, channels), rate)
        old = render(args.old, source, os.path.join(workdir, "old-%d.wav" % index), block, settings)
        new = render(args.new, source, os.path.join(workdir, "new-%d.wav" % index), block, settings)
        if len(old) != len(new):
            print("%-40s lengths differ: %d and %d samples" % (name, len(old), len(new)))
            worst = math.inf
            continue
        peak = max(abs(v) for v in old)
        largest = max(abs(a - b) for a, b in zip(old, new))
        if largest == 0.0:
            print("%-40s bit-exact" % name)
            continue
        db = 20.0 * math.log10(largest / peak)
        worst = max(worst, db)
        print("%-40s largest difference %+.1f dB re. the old peak" % (name, db))
    return 1 if worst > LIMIT_DB else 0


if __name__ == "__main__":
    sys.exit(main())
