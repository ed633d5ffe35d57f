#!/usr/bin/env python3
"""How fast lapdread is, compared in one run with a general analyser and with copying the same octets.

    bench/read_speed.py [--frames 1000000] [--rounds 5] [--lapdread build/release/bin/lapdread]

Files are in memory (/dev/shm) and written once before anything is measured. In each round every command runs once, so that all
of them meet the same neighbours. Prints the medians of the rounds, and below them ratios: each is taken within a round, and the
median of the rounds is shown. With one job, ratios are of the processor's time, since a busy machine spoils the time that passes; with
two they are of the time that passes.
"""

import argparse
import os
import pathlib
import shutil
import statistics
import struct
import subprocess
import tempfile
import time

ROOT = pathlib.Path(__file__).resolve().parents[1]
CAT, SUMMARY, VERBOSE = "cat of the decoded text", "tshark, a line a frame", "tshark -V"


def repeated(path, frames):
    """The NET5 example again and again, later each time."""
    data = (ROOT / "examples/net5.pcap").read_bytes()
    packets, at = [], 24
    while at < len(data):
        second, fraction, size, _ = struct.unpack("<IIII", data[at:at + 16])
        packets.append((second, fraction, data[at + 16:at + 16 + size]))
        at += 16 + size
    span = packets[-1][0] - packets[0][0] + 1
    with open(path, "wb") as out:
        out.write(data[:24])
        for i in range(frames):
            second, fraction, octets = packets[i % len(packets)]
            out.write(struct.pack("<IIII", second + i // len(packets) * span, fraction, len(octets), len(octets)) + octets)
    return path


class Row:
    """A command and what it took in each round."""

    def __init__(self, name, words):
        self.name, self.words = name, [str(word) for word in words]
        self.passed, self.worked = [], []  # seconds

    def measure(self, out):
        with open(out, "r+b" if os.path.exists(out) else "wb") as file:
            begin = time.monotonic()
            process = subprocess.Popen(self.words, stdout=file, stderr=subprocess.DEVNULL)
            _, status, usage = os.wait4(process.pid, 0)
        self.passed.append(time.monotonic() - begin)
        self.worked.append(usage.ru_utime + usage.ru_stime)
        if status != 0:
            raise SystemExit(f"{self.words} failed")


def ratio(rows, slow, fast, jobs):
    """How many times as long the slow one takes: the median of the rounds."""
    seconds = (lambda row: row.worked) if jobs == 1 else (lambda row: row.passed)
    pairs = zip(seconds(rows[slow]), seconds(rows[f"lapdread {fast}, {jobs} jobs"]))
    return statistics.median(a / b for a, b in pairs)


def print_ratios(rows, log_size):
    for jobs, share, times in ((1, 50, 12), (2, 85, 20)):
        print(f"decode, {jobs} jobs: {100 * ratio(rows, CAT, 'decode', jobs):.0f} % of cat (target {share}), "
              f"{ratio(rows, VERBOSE, 'decode', jobs):.1f} times tshark -V (target {times})")
    print(f"list, 2 jobs: {ratio(rows, SUMMARY, 'list', 2):.1f} times tshark (target 8)")
    for jobs in (1, 2):
        row = rows[f"lapdread log to pcapng, {jobs} jobs"]
        seconds = statistics.median(row.worked if jobs == 1 else row.passed)
        print(f"log to pcapng, {jobs} jobs: {log_size / seconds / 1e6:.0f} MB of log a second (target 400)")


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--frames", type=int, default=1_000_000)
    parser.add_argument("--rounds", type=int, default=5)
    parser.add_argument("--lapdread", default=ROOT / "build/release/bin/lapdread")
    options = parser.parse_args()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="read-speed.", dir="/dev/shm"))
    try:
        capture = repeated(folder / "capture.pcap", options.frames)
        log, text = folder / "capture.log", folder / "decoded"
        lapdread = options.lapdread
        subprocess.run([lapdread, "convert", "--quiet", "--to", "log", "-o", log, capture], check=True)
        subprocess.run([lapdread, "decode", "--quiet", "-o", text, capture], check=True)
        every = [Row(CAT, ["cat", text]), Row(SUMMARY, ["tshark", "-n", "-r", capture]),
                 Row(VERBOSE, ["tshark", "-n", "-V", "-r", capture])]
        for jobs in (1, 2):
            for words in ("list", "decode", "convert --to jsonl", "convert --to csv", "convert --to pcapng"):
                every.append(Row(f"lapdread {words}, {jobs} jobs",
                                 [lapdread, *words.split(), "--quiet", "--jobs", jobs, capture]))
            every.append(Row(f"lapdread log to pcapng, {jobs} jobs",
                             [lapdread, "convert", "--quiet", "--to", "pcapng", "--jobs", jobs, log]))
        print(f"{options.frames} frames, {log.stat().st_size / 1e6:.0f} MB of log, {os.cpu_count()} processors, load "
              f"{os.getloadavg()[0]:.1f}, {options.rounds} rounds")
        # Each command has an output of its own, which it has written once before.
        for measured in range(-1, options.rounds):
            for number, row in enumerate(every):
                row.measure(folder / f"out{number}")
                if measured < 0:
                    row.passed.clear()
                    row.worked.clear()
        for row in every:
            passed, worked = statistics.median(row.passed), statistics.median(row.worked)
            print(f"{row.name:36} {passed:7.2f} s passed {worked:7.2f} s worked {options.frames / worked / 1e6:7.2f} M frames/s")
        print_ratios({row.name: row for row in every}, log.stat().st_size)
    finally:
        shutil.rmtree(folder)


if __name__ == "__main__":
    main()
