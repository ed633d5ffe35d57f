#!/usr/bin/env python3
"""How soon lapdread browse answers a key while a busy trunk comes in, and in how much memory.

    bench/browse_keys.py [--frames 1000000] [--rate 2000] [--keys 400] [--lapdread build/release/bin/lapdread]

The frames come through a FIFO: the first ones as fast as they are read, then `--rate` a second. A key counts as answered when the screen
that it leads to has reached the terminal.
"""

import argparse
import fcntl
import os
import pathlib
import pty
import re
import select
import shutil
import struct
import subprocess
import tempfile
import termios
import threading
import time

import calls_speed
from read_memory import peak
from read_speed import ROOT

LIMIT = 600  # seconds
STEP = 0.01  # between two portions of live frames
# Keys, and what the terminal gets of the screen that they lead to. Only what differs from the screen before is sent, so these are screens
# that differ from each other in every line.
KEYS = [(b"?", b"Key"), (b"q", b"Cal"), (b"3", b"Find"), (b"2", b"Cal")]


def frame_ends(data):
    """The offset at which each frame of a capture ends."""
    ends, at = [], len(calls_speed.HEADER)
    while at < len(data):
        at += 16 + struct.unpack_from("<I", data, at + 8)[0]
        ends.append(at)
    return ends


class Feeder(threading.Thread):
    """Writes the capture into the FIFO, and live frames until it is stopped or they end."""

    def __init__(self, fifo, data, ends, at_once, rate):
        super().__init__(daemon=True)
        self.fifo, self.data, self.ends, self.at_once, self.rate = fifo, data, ends, at_once, rate
        self.is_live, self.stop = threading.Event(), threading.Event()

    def run(self):
        with open(self.fifo, "wb", buffering=0) as out:
            sent = self.ends[self.at_once - 1]
            out.write(self.data[:sent])
            self.is_live.set()
            begin, done = time.monotonic(), self.at_once
            while done < len(self.ends) and not self.stop.wait(STEP):
                wanted = min(self.at_once + int((time.monotonic() - begin) * self.rate), len(self.ends))
                if wanted > done:
                    out.write(self.data[sent:self.ends[wanted - 1]])
                    sent, done = self.ends[wanted - 1], wanted


def start(lapdread, fifo):
    main, terminal = pty.openpty()
    fcntl.ioctl(terminal, termios.TIOCSWINSZ, struct.pack("HHHH", 40, 120, 0, 0))
    process = subprocess.Popen([lapdread, "browse", "--follow", fifo], stdin=terminal, stdout=terminal, start_new_session=True,
                               env={**os.environ, "TERM": "xterm", "LC_ALL": "C.UTF-8"})
    os.close(terminal)
    return process, main


def until(terminal, pattern):
    """Seconds until the program has sent what the pattern says."""
    begin, seen = time.monotonic(), b""
    while not re.search(pattern, seen):
        if time.monotonic() - begin > LIMIT:
            raise SystemExit(f"never showed {pattern}")
        if select.select([terminal], [], [], 1)[0]:
            seen = seen[-200:] + os.read(terminal, 65536)
    return time.monotonic() - begin


def swallow(terminal, seconds):
    end = time.monotonic() + seconds
    while (left := end - time.monotonic()) > 0:
        if select.select([terminal], [], [], left)[0]:
            try:
                os.read(terminal, 65536)
            except OSError:  # the program has ended
                return


def measure(lapdread, folder, options):
    capture = calls_speed.write(folder / "capture", options.frames + options.rate * 60)
    data = capture.read_bytes()
    os.mkfifo(folder / "fifo")
    feeder = Feeder(folder / "fifo", data, frame_ends(data), options.frames, options.rate)
    process, terminal = start(lapdread, folder / "fifo")
    begin = time.monotonic()
    feeder.start()
    while not feeder.is_live.is_set():
        swallow(terminal, 0.1)
    print(f"{options.frames} frames read in {time.monotonic() - begin:.1f} s")
    swallow(terminal, 1)
    times = []
    while len(times) < options.keys and feeder.is_alive():
        for key, answer in KEYS:
            os.write(terminal, key)
            times.append(until(terminal, answer))
            swallow(terminal, 0.03)
    times.sort()
    print(f"{len(times)} keys at {options.rate} frames a second: median {times[len(times) // 2] * 1000:.1f} ms, "
          f"99 % within {times[len(times) * 99 // 100] * 1000:.1f} ms, slowest {times[-1] * 1000:.1f} ms; "
          f"{peak(process):.0f} MB")
    feeder.stop.set()
    os.write(terminal, b"Q")
    threading.Thread(target=swallow, args=(terminal, 2), daemon=True).start()
    process.wait(LIMIT)


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--frames", type=int, default=1_000_000)
    parser.add_argument("--rate", type=int, default=2000)
    parser.add_argument("--keys", type=int, default=400)
    parser.add_argument("--lapdread", default=ROOT / "build/release/bin/lapdread")
    options = parser.parse_args()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="browse-keys.", dir="/dev/shm"))
    try:
        measure(options.lapdread, folder, options)
    finally:
        shutil.rmtree(folder)


if __name__ == "__main__":
    main()
