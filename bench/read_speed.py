#!/usr/bin/env python3
"""How fast lapdread is, compared in one run with a general analyser and with copying the same octets.

    bench/read_speed.py [--frames 1000000] [--rounds 5] [--lapdread build/release/bin/lapdread]

Files are in memory (/dev/shm) and written once before anything is measured. Prints medians: of the time that passed, which a
busy machine spoils, and of the processor's time.
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


def measure(command, out, rounds):
    """Median seconds that passed, median seconds of the processor, most memory in MB."""
    passed, worked, memory = [], [], 0
    for _ in range(rounds):
        with open(out, "r+b" if os.path.exists(out) else "wb") as file:
            begin = time.monotonic()
            process = subprocess.Popen([str(word) for word in command], stdout=file, stderr=subprocess.DEVNULL)
            _, status, usage = os.wait4(process.pid, 0)
            passed.append(time.monotonic() - begin)
            worked.append(usage.ru_utime + usage.ru_stime)
            memory = max(memory, usage.ru_maxrss / 1024)
            if status != 0:
                raise SystemExit(f"{command} failed")
    return statistics.median(passed), statistics.median(worked), memory


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--frames", type=int, default=1_000_000)
    parser.add_argument("--rounds", type=int, default=5)
    parser.add_argument("--lapdread", default=ROOT / "build/release/bin/lapdread")
    options = parser.parse_args()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="read-speed.", dir="/dev/shm"))
    try:
        capture = repeated(folder / "capture.pcap", options.frames)
        log, text, out = folder / "capture.log", folder / "decoded", folder / "out"
        lapdread = options.lapdread
        subprocess.run([lapdread, "convert", "--quiet", "--to", "log", "-o", log, capture], check=True)
        subprocess.run([lapdread, "decode", "--quiet", "-o", text, capture], check=True)
        shutil.copy(text, out)
        rows = [("cat of the decoded text", ["cat", text]),
                ("tshark, a line a frame", ["tshark", "-n", "-r", capture]),
                ("tshark -V", ["tshark", "-n", "-V", "-r", capture])]
        for jobs in (1, 2):
            for words in ("list", "decode", "convert --to jsonl", "convert --to csv", "convert --to pcapng"):
                rows.append((f"lapdread {words}, {jobs} jobs",
                             [lapdread, *words.split(), "--quiet", "--jobs", jobs, capture]))
            rows.append((f"lapdread log to pcapng, {jobs} jobs",
                         [lapdread, "convert", "--quiet", "--to", "pcapng", "--jobs", jobs, log]))
        print(f"{options.frames} frames, {log.stat().st_size / 1e6:.0f} MB of log, {os.cpu_count()} processors, load "
              f"{os.getloadavg()[0]:.1f}")
        for name, command in rows:
            passed, worked, memory = measure(command, out, options.rounds)
            print(f"{name:36} {passed:7.2f} s passed {worked:7.2f} s worked {options.frames / worked / 1e6:7.2f} M frames/s "
                  f"{memory:6.1f} MB")
    finally:
        shutil.rmtree(folder)


if __name__ == "__main__":
    main()
