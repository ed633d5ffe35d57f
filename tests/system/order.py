"""Counts frames that are lost or out of order, at line rate on a busy machine, and what the program takes meanwhile.

    scripts/order --frames 1000000 --busy 4        scripts/order --stall 30

The board plays frames that carry their number in its clock, in both directions in turn, whether or not anybody takes
them; the log is read through a FIFO as it is written. With --stall the reader stops for so many seconds in the middle.
One line of figures; the exit status is 1 when a frame is lost or out of order, or there were too many threads.
"""

import argparse
import os
import pathlib
import re
import signal
import struct
import subprocess
import sys
import tempfile
import threading
import time

LINE_RATE = 2 * 1142  # frames a second: the shortest I frames that a 64 kbit/s channel carries, both ways
ROUND = 50000         # frames in the capture, which is played again and again
PAUSE = 250           # ticks between two rounds
MOST_THREADS = 150    # 100 deliveries at work, those that have not ended yet, and those that are always there
TIME = re.compile(rb"X Frame: Time = (\d+)\.(\d+)\n")


def capture(path, count):
    """A pcap file of frames whose time, in ticks of 4 ms, is their number."""
    with open(path, "wb") as file:
        file.write(struct.pack("<IHHiIII", 0xA1B2C3D4, 2, 4, 0, 0, 65535, 177))
        for i in range(count):
            packet = struct.pack(">HHH8sH", i % 2 * 4, 0, 0, bytes(8), 0x30) + bytes((2, 1, 1, 2 * (i % 127)))
            file.write(struct.pack("<IIII", *divmod(4000 * i, 1_000_000), len(packet), len(packet)) + packet)


def number_of(ticks, count):
    """Which frame of all the rounds has this time."""
    turn, at = divmod(ticks, count - 1 + PAUSE)
    return turn * count + at


class Figures:
    def __init__(self):
        self.frames = self.lost = self.inversions = self.threads = self.resident = 0
        self._next = 0

    def frame(self, number):
        """Numbers that were passed over are lost until they come after all."""
        self.frames += 1
        if number < self._next:
            self.inversions += 1
            self.lost -= 1
        else:
            self.lost += number - self._next
            self._next = number + 1

    def sample(self, pid):
        try:
            status = pathlib.Path(f"/proc/{pid}/status").read_text()
        except (FileNotFoundError, ProcessLookupError):
            return
        self.threads = max(self.threads, int(re.search(r"^Threads:\s+(\d+)", status, re.M).group(1)))
        resident = re.search(r"^VmRSS:\s+(\d+)", status, re.M)
        self.resident = max(self.resident, int(resident.group(1)) if resident else 0)

    def good(self):
        return self.lost == 0 and self.inversions == 0 and self.threads <= MOST_THREADS

    def __str__(self):
        return (f"frames {self.frames}, lost {self.lost}, out of order {self.inversions}, "
                f"threads at most {self.threads}, resident at most {self.resident} kB")


def read_log(log, wanted, figures, count, stall, pid):
    """Reads so many frames; stops for a while halfway."""
    tail = b""
    while figures.frames < wanted:
        if stall and figures.frames >= wanted // 2:
            end = time.monotonic() + stall
            while time.monotonic() < end:
                figures.sample(pid)
                time.sleep(0.05)
            stall = 0
        some = os.read(log, 1 << 16)
        if not some:
            return
        text = tail + some
        at = 0
        for found in TIME.finditer(text):
            figures.frame(number_of(int(found[1]) * 250 + int(found[2]) // 4, count))
            at = found.end()
        tail = text[max(at, len(text) - 100):]
        figures.sample(pid)


def measure(options, folder):
    figures = Figures()
    count = min(ROUND, max(2, options.frames))
    capture(folder / "numbered.pcap", count)
    path = folder / "log"
    os.mkfifo(path)
    log = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
    os.set_blocking(log, True)
    held_open = os.open(path, os.O_WRONLY)
    busy = [subprocess.Popen([sys.executable, "-c", "while True: pass"]) for _ in range(options.busy)]
    program = subprocess.Popen(
        [options.softboard, "--rate", str(options.rate), "--loop", "--fault", "never-waits", "--frames",
         str(folder / "numbered.pcap"), "--", options.lapdmon, "-b1", "-f", str(path)],
        stdin=subprocess.PIPE, stdout=subprocess.DEVNULL)
    try:
        read_log(log, options.frames, figures, count, options.stall, program.pid)
        threading.Thread(target=lambda: [None for _ in iter(lambda: os.read(log, 1 << 16), b"")], daemon=True).start()
        program.communicate(b"q\n")
    finally:
        program.kill()
        for each in busy:
            each.kill()
            each.wait()
        os.close(held_open)
    return figures, program.returncode


def main(arguments):
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--frames", type=int, default=1_000_000)
    parser.add_argument("--rate", default=LINE_RATE, help="frames a second, or max")
    parser.add_argument("--busy", type=int, default=2 * (os.cpu_count() or 1), help="processes that keep the machine busy")
    parser.add_argument("--stall", type=float, default=0, help="seconds for which the log is not read")
    parser.add_argument("--lapdmon", default=os.environ.get("LAPDMON"))
    parser.add_argument("--softboard", default=os.environ.get("SOFTBOARD"))
    options = parser.parse_args(arguments)
    signal.signal(signal.SIGTERM, lambda *_: sys.exit(1))  # what was started is ended all the same
    with tempfile.TemporaryDirectory(prefix="order-") as folder:
        figures, status = measure(options, pathlib.Path(folder))
    print(figures)
    return 0 if figures.good() and status == 0 else 1


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
