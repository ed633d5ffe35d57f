#!/usr/bin/env python3
"""How many frames a second the analysis of calls takes, and in how much memory: a busy primary rate, as long as one likes.

    bench/calls_speed.py [--frames 10000000] [--rounds 3] [--lapdread build/release/bin/lapdread]

The capture is in memory (/dev/shm), 43 octets a frame. Each command also runs on a tenth of it: if its memory is not flat, the status
is 1.
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

from read_memory import flat, peak
from read_speed import ROOT

HEADER = bytes.fromhex("d4c3b2a1020004000000000000000000ffff0000b1000000")  # pcap, LAPD with its direction
SENT, RECEIVED = (bytes.fromhex(f"000{kind}2000000100000000000000000030") for kind in (4, 0))
CALLS = 32  # of a round: each side sends 4 x 32 = 128 I frames, so that sequence numbers fit the next round
ROUND = 60_000_000  # microseconds
BUSY = 7  # of so many calls one is refused

CAUSE_16, CAUSE_17 = bytes.fromhex("08028090"), bytes.fromhex("08028291")


def channel(call):
    number = call % 30 + 1
    return bytes((0x18, 0x03, 0xA9, 0x83, 0x80 | (number if number < 16 else number + 1)))


def messages(call):
    """Of one call: microseconds since its beginning, whether we send it, type, elements. Four of each side."""
    setup = bytes.fromhex("04038090a3") + channel(call) + b"\x6c\x06\x21\x804021" + b"\x70\x08\xa14957414"
    if call % BUSY == 0:
        return [(0, True, 0x05, setup), (40_000, False, 0x02, channel(call)),
                (300_000, False, 0x03, bytes.fromhex("1e028288")), (400_000, True, 0x7B, b""),
                (900_000, False, 0x45, CAUSE_17), (920_000, True, 0x4D, b""), (940_000, False, 0x5A, b""),
                (2_000_000, True, 0x62, b"\x1c\x01\x91")]  # with the dummy reference
    end = 15_000_000 + call % 5 * 2_000_000
    return [(0, True, 0x05, setup), (40_000, False, 0x02, channel(call)), (400_000, False, 0x01, b""),
            (3_000_000, False, 0x07, b""), (3_020_000, True, 0x0F, b""), (end, True, 0x45, CAUSE_16),
            (end + 20_000, False, 0x4D, b""), (end + 40_000, True, 0x5A, b"")]


def frames_of_a_round():
    """(microseconds, octets with the pseudo-header, call or None), in their order."""
    events = []
    for call in range(CALLS):
        events += [(call * ROUND // CALLS // 2 + at, call, sent, kind, elements)
                   for at, sent, kind, elements in messages(call)]
    events.sort(key=lambda event: event[:2])
    numbers, frames = {True: 0, False: 0}, []
    for at, call, sent, kind, elements in events:
        ns, nr = numbers[sent] % 128, numbers[not sent] % 128
        numbers[sent] += 1
        dummy = kind == 0x62
        reference = b"\x00" if dummy else struct.pack(">BH", 2, call if sent else call | 0x8000)
        octets = bytes((0x00 if sent else 0x02, 0x01, ns << 1, nr << 1, 0x08)) + reference + bytes((kind,)) + elements
        frames.append((at, (SENT if sent else RECEIVED) + octets, None if dummy else call))
        answer = bytes((0x00 if sent else 0x02, 0x01, 0x01, numbers[sent] % 128 << 1))
        frames.append((at + 4_000, (RECEIVED if sent else SENT) + answer, None))
    assert numbers == {True: 4 * CALLS, False: 4 * CALLS}
    for second in (54, 57):  # polls, when the last call has ended
        frames.append((second * 1_000_000, SENT + bytes((0x00, 0x01, 0x01, 0x01)), None))
        frames.append((second * 1_000_000 + 4_000, RECEIVED + bytes((0x00, 0x01, 0x01, 0x01)), None))
    frames.sort(key=lambda frame: frame[0])
    return frames


def write(path, wanted):
    """Writes so many frames, in rounds. The rounds have the same octets except for times and call references."""
    frames = frames_of_a_round()
    round_octets, times, references, at = bytearray(), [], [], 0
    for time, octets, call in frames:
        round_octets += struct.pack("<IIII", 0, 0, len(octets), len(octets)) + octets
        times.append((at, time))
        if call is not None:
            flag = octets[16 + 6] & 0x80
            references.append((at + 16 + 16 + 6, flag << 8, call))
        at = len(round_octets)
    done = 0
    with open(path, "wb") as out:
        out.write(HEADER)
        number = 0
        while done < wanted:
            base = 1_000_000_000_000_000 + number * ROUND
            for place, time in times:
                struct.pack_into("<II", round_octets, place, *divmod(base + time, 1_000_000))
            for place, flag, call in references:
                struct.pack_into(">H", round_octets, place, flag | (1 + (number * CALLS + call) % 0x7FFF))
            count = min(len(frames), wanted - done)
            out.write(round_octets if count == len(frames) else round_octets[:times[count][0]])
            done += count
            number += 1
    return path


def measure(command, rounds):
    """Median seconds that passed, median seconds of the processor, most memory in MB."""
    passed, worked, memory = [], [], 0
    for _ in range(rounds):
        begin = time.monotonic()
        process = subprocess.Popen([str(word) for word in command], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        ended = 0
        while ended == 0:
            memory = max(memory, peak(process) or 0.0)
            time.sleep(0.01)
            ended, status, usage = os.wait4(process.pid, os.WNOHANG)
        passed.append(time.monotonic() - begin)
        worked.append(usage.ru_utime + usage.ru_stime)
        if status != 0:
            raise SystemExit(f"{command} failed")
    return statistics.median(passed), statistics.median(worked), memory


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--frames", type=int, default=10_000_000)
    parser.add_argument("--rounds", type=int, default=3)
    parser.add_argument("--lapdread", default=ROOT / "build/release/bin/lapdread")
    options = parser.parse_args()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="calls-speed.", dir="/dev/shm"))
    bounded = True
    try:
        capture = write(folder / "capture.pcap", options.frames)
        tenth = write(folder / "tenth.pcap", options.frames // 10)
        print(f"{options.frames} frames, {capture.stat().st_size / 1e6:.0f} MB, {os.cpu_count()} processors, load "
              f"{os.getloadavg()[0]:.1f}")
        for jobs in (1, 2):
            for command in ("calls", "check", "stats", "list"):
                words = [options.lapdread, command, "--quiet", "--jobs", jobs]
                passed, worked, memory = measure([*words, capture], options.rounds)
                *_, before = measure([*words, tenth], 1)
                bounded = bounded and flat(before, memory)
                print(f"lapdread {command:6} {jobs} jobs {passed:7.2f} s passed {worked:7.2f} s worked "
                      f"{options.frames / passed / 1e6:6.2f} M frames/s passed {options.frames / worked / 1e6:6.2f} M frames/s "
                      f"worked {memory:6.1f} MB ({before:.1f} MB with a tenth)")
    finally:
        shutil.rmtree(folder)
    return 0 if bounded else 1


if __name__ == "__main__":
    raise SystemExit(main())
