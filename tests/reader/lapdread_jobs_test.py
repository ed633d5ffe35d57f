"""Many frames: the same octets come out whatever the number of threads, and memory does not grow with the input."""

import os
import struct
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, Folder, environment, run

HEADER = 24  # octets of a pcap file's head
FLAT = 50 * 1024 * 1024  # octets of memory; sanitizers take more, see below


def repeated(path, frames):
    """A capture that repeats the NET5 example, later each time."""
    data = EXAMPLES["net5"].read_bytes()
    packets, at = [], HEADER
    while at < len(data):
        second, fraction, size, _ = struct.unpack("<IIII", data[at:at + 16])
        packets.append((second, fraction, data[at + 16:at + 16 + size]))
        at += 16 + size
    span = packets[-1][0] - packets[0][0] + 1
    with open(path, "wb") as out:
        out.write(data[:HEADER])
        for i in range(frames):
            second, fraction, octets = packets[i % len(packets)]
            second += i // len(packets) * span
            out.write(struct.pack("<IIII", second, fraction, len(octets), len(octets)) + octets)
    return path


class Jobs(Folder):
    def test_every_number_of_threads_gives_the_same_octets(self):
        capture = repeated(self.folder / "many.pcap", 5000)
        commands = [["list"], ["list", "--no-keepalive", "--not", "--callref", "0378"], ["list", "--first", "700"], ["decode"],
                    ["convert", "--to", "jsonl"], ["convert", "--to", "csv"], ["convert", "--to", "pcapng"],
                    ["convert", "--to", "log"], ["explain", "--cause", "any"]]
        for command in commands:
            alone = run(*command, "--quiet", "--jobs", "1", capture)
            self.assertEqual(alone[0], 0, alone[2])
            self.assertGreater(len(alone[1]), 1000)
            for jobs in ("2", "3", "7"):
                self.assertEqual(run(*command, "--quiet", "--jobs", jobs, capture), alone, f"{command}, {jobs} threads")

    @unittest.skipIf(os.environ.get("SANITIZED") == "1", "memory of a sanitizer says nothing about the program")
    def test_memory_does_not_grow_with_the_input(self):
        capture = repeated(self.folder / "many.pcap", 300_000)
        for command in (["list"], ["decode"], ["convert", "--to", "pcapng"]):
            process = subprocess.Popen([LAPDREAD, *command, "--quiet", capture], stdout=subprocess.DEVNULL, env=environment())
            _, process.returncode, usage = os.wait4(process.pid, 0)
            self.assertEqual(process.returncode, 0)
            self.assertLess(usage.ru_maxrss * 1024, FLAT, command)


if __name__ == "__main__":
    unittest.main()
