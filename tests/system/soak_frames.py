"""The frames that a soak plays, and the search for them in the log."""

import re
import struct

from order import PAUSE, number_of

ROUND = 20000  # frames in the capture, which is played again and again
LIMIT = 120    # seconds without a frame, after which none is waited for

HEADER = re.compile(rb"([RT])X Frame: Time = (\d+)\.(\d+)\n")
DUMP = re.compile(rb"Hex Dump: \n((?: *(?:[0-9a-f]{2} )+\n)+)")


def frame_of(number):
    """Direction (whether transmitted) and octets: the shortest frames, and every tenth a message with its number."""
    at = number % ROUND
    octets = bytes((2, 1, 2 * (at % 127), 2 * (at // 127 % 127)))
    if at % 10 == 0:
        octets += bytes((8, 2, at >> 8, at & 0xFF, 0x7D))
    return at % 2 == 1, octets


def write_capture(path):
    """A pcap file of one round, 4 ms from frame to frame, so that the board's time is the number."""
    with open(path, "wb") as file:
        file.write(struct.pack("<IHHiIII", 0xA1B2C3D4, 2, 4, 0, 0, 65535, 177))
        for number in range(ROUND):
            transmitted, octets = frame_of(number)
            packet = struct.pack(">HHH8sH", 4 if transmitted else 0, 0, 0, bytes(8), 0x30) + octets
            file.write(struct.pack("<IIII", *divmod(4000 * number, 1_000_000), len(packet), len(packet)) + packet)


class Checker:
    """Looks for each frame in its turn; what else is in the log must be what the board sent wrong."""

    def __init__(self):
        self.frames = self.lost = self.disordered = self.wrong = 0
        self._text = b""

    def feed(self, some):
        text = self._text + some
        headers = list(HEADER.finditer(text))
        for header, following in zip(headers, headers[1:]):
            self._block(header, text[header.end():following.start()])
        self._text = text[headers[-1].start():] if headers else text

    def end(self):
        header = HEADER.match(self._text)
        if header:
            self._block(header, self._text[header.end():])

    def _block(self, header, text):
        ticks = int(header[2]) * 250 + int(header[3]) // 4
        dump = DUMP.search(text)
        octets = bytes.fromhex(dump[1].decode()) if dump else b""
        number = number_of(ticks, ROUND)
        in_round = ticks % (ROUND - 1 + PAUSE) < ROUND
        self.frame(number if in_round and frame_of(number) == (header[1] == b"T", octets) else None)

    def frame(self, number):
        """The next in the log; None is one that the board never had."""
        if number is None or number == self.frames - 1:
            self.wrong += 1
        elif number >= self.frames:
            self.lost += number - self.frames
            self.frames = number + 1
        else:
            self.disordered += 1
            self.lost -= 1
