#!/usr/bin/env python3
"""Whether lapdread's memory stays flat: the same commands on few frames and on very many.

    bench/read_memory.py [--few 10000] [--many 10000000] [--lapdread build/release/bin/lapdread]

Makes its inputs itself, in a folder under --folder (default: /dev/shm), one after the other; ten million frames take 0.5 GB as a
capture and 6 GB as a log, so the log is made of a tenth. Prints the most memory that each command held, and fails if that is not flat.
"""

import argparse
import os
import pathlib
import re
import shutil
import subprocess
import sys
import tempfile
import time

from read_speed import ROOT, repeated

MOST = 50.0  # MB
GROWTH = 1.25
UNSEEN = 12.0  # MB that a command may hold that ends before anybody has looked at it
COMMANDS = [["list"], ["decode"], ["convert", "--to", "jsonl"], ["convert", "--to", "pcapng"], ["calls"], ["check"]]


def peak(process):
    """The most memory that a running process has held, in MB; None if it has ended."""
    try:
        status = pathlib.Path(f"/proc/{process.pid}/status").read_text()
    except FileNotFoundError:
        return None
    found = re.search(r"VmHWM:\s+(\d+) kB", status)
    return int(found[1]) / 1024 if found else None


def memory(words):
    """The most memory that the command held, in MB, and how long it took, in seconds of the processor.

    What the system reports at the end counts this program's own memory in, so the process is looked at while it runs. Its last
    hundredth of a second is not seen.
    """
    process = subprocess.Popen([str(word) for word in words], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    most = 0.0
    while True:
        most = max(most, peak(process) or 0.0)
        pid, status, usage = os.wait4(process.pid, os.WNOHANG)
        if pid != 0:
            break
        time.sleep(0.01)
    process.returncode = status
    if status != 0:
        sys.exit(f"{words} failed")
    return most, usage.ru_utime + usage.ru_stime


def flat(few, many):
    """Whether the memory for many frames is below 50 MB, and at most a quarter above what few frames take."""
    return many < MOST and many <= max(few, UNSEEN) * GROWTH


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--few", type=int, default=10_000)
    parser.add_argument("--many", type=int, default=10_000_000)
    parser.add_argument("--folder", default="/dev/shm")
    parser.add_argument("--lapdread", default=ROOT / "build/release/bin/lapdread")
    options = parser.parse_args()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="read-memory.", dir=options.folder))
    held = {}
    try:
        for frames in (options.few, options.many):
            capture, log = folder / "capture.pcap", folder / "capture.log"
            repeated(capture, frames)
            for words in COMMANDS:
                held.setdefault(" ".join(words), []).append(memory([options.lapdread, *words, "--quiet", capture]))
            subprocess.run([options.lapdread, "convert", "--quiet", "--first", str(max(frames // 10, 1)), capture, log],
                           check=True)
            capture.unlink()
            held.setdefault("convert of a log", []).append(
                memory([options.lapdread, "convert", "--quiet", "--to", "pcapng", log]))
            log.unlink()
    finally:
        shutil.rmtree(folder)
    bad = False
    print(f"most memory in MB of {options.few} and {options.many} frames, and seconds of the processor for the latter")
    for name, ((few, _), (many, seconds)) in held.items():
        grows = not flat(few, many)
        bad = bad or grows
        print(f"{name:24} {few:7.1f} {many:7.1f} {seconds:8.1f} s{'   NOT FLAT' if grows else ''}", flush=True)
    return 1 if bad else 0


if __name__ == "__main__":
    sys.exit(main())
