"""No time that a capture can hold makes lapdread count wrong, hang or crash: the first and last nanoseconds of 64 bits, clocks that jump
between them, and ticks that fit no clock. In the preset dev the sanitizers find every overflow."""

import struct
import unittest

from lapdread_harness import EXAMPLES, Folder, run

LAST = 2**63 - 1  # nanoseconds, of a signed count
SECOND = 10**9

# For each D channel: the time of a frame that passed t ns after the first one and is frame number n.
CLOCKS = {
    "zero": lambda t, n: 0 if n < 50 else 2**63 + 5,
    "end": lambda t, n: LAST - 100 * SECOND + t,
    "at the end": lambda t, n: LAST,
    "over the end": lambda t, n: LAST - 10 * SECOND + t,
    "over 64 bits": lambda t, n: 2**64 - 10 * SECOND + t,
    "jumps": lambda t, n: 0 if n % 2 else LAST,
    "jumps once": lambda t, n: LAST if n > 50 else t,
    "backwards": lambda t, n: LAST - t,
    "ten years before": lambda t, n: LAST - (10 * 366 * 86400 + 30) * SECOND + t,
    "negative": lambda t, n: 2**63 + t,
    "all ones": lambda t, n: 2**64 - 1,
}
TICKS = {
    "without": lambda t, n: None,
    "sound": lambda t, n: t // 4_000_000,
    "wild": lambda t, n: n * 2654435761 % 2**32,
}


def block(kind, content):
    size = struct.pack("<I", len(content) + 12)
    return struct.pack("<I", kind) + size + content + size


def option(code, value):
    return struct.pack("<HH", code, len(value)) + value + bytes(-len(value) % 4)


def frames():
    """(ns since the first frame, octets with the pseudo-header) of a trace with calls, RESTARTs and a lost link."""
    capture, at, first = EXAMPLES["net5"].read_bytes(), 24, None
    while at < len(capture):
        seconds, micros, size, _ = struct.unpack_from("<IIII", capture, at)
        time = seconds * SECOND + micros * 1000
        first = time if first is None else first
        yield time - first, capture[at + 16:at + 16 + size]
        at += 16 + size


def capture_with(clocks, ticks):
    """A pcapng capture in which each clock has an interface, which is a D channel, with the same frames."""
    out = [block(0x0A0D0D0A, struct.pack("<IHHq", 0x1A2B3C4D, 1, 0, -1))]
    for name in clocks:
        out.append(block(1, struct.pack("<HHI", 177, 0, 0) + option(2, name.encode()) + option(9, b"\x09") + option(0, b"")))
    for n, (t, octets) in enumerate(frames()):
        for interface, clock in enumerate(clocks.values()):
            time, tick = clock(t, n) % 2**64, ticks(t, n)
            packet = struct.pack("<IIIII", interface, time >> 32, time % 2**32, len(octets), len(octets)) + octets
            packet += bytes(-len(octets) % 4)
            if tick is not None:
                packet += option(1, b"lapdmon: ticks %d" % tick) + option(0, b"")
            out.append(block(6, packet))
    return b"".join(out)


class Times(Folder):
    def holds(self, path):
        """Every command that counts with times reads all frames."""
        out = self.folder / "out"
        for words in (("list",), ("list", "--relative", "--since", "+3600", "--not", "--until", "11:30"), ("calls", "--jsonl"),
                      ("check",), ("stats", "--over-time"), ("ladder",), ("report", "-o", out), ("diff", f"{path}#1", f"{path}#2"),
                      ("convert", "--to", "log", "-o", out), ("redact", "--to", "pcapng", "-o", out)):
            with self.subTest(command=words[0]):
                out.unlink(missing_ok=True)
                status, _, error = run(*words, *([] if words[0] == "diff" else [path]))
                self.assertEqual(status, 0, error)

    def test_of_every_kind_are_counted_with(self):
        for name, ticks in TICKS.items():
            with self.subTest(ticks=name):
                path = self.folder / f"{name}.pcapng"
                path.write_bytes(capture_with(CLOCKS, ticks))
                self.holds(path)

    def test_of_one_kind_are_counted_with(self):
        for name in ("over the end", "ten years before"):
            with self.subTest(clock=name):
                path = self.folder / "one.pcapng"
                path.write_bytes(capture_with({name: CLOCKS[name]}, TICKS["without"]))
                self.holds(path)


if __name__ == "__main__":
    unittest.main()
