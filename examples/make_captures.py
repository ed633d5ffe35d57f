#!/usr/bin/env python3
"""Makes the captures of this folder from their texts (*.frames), and the software board's built-in capture.

    examples/make_captures.py            writes every *.pcap and softboard/builtin_frames.inc
    examples/make_captures.py --check    names the files that would change; status 1 if there are any

A line of a text is

    SECONDS DIRECTION WHAT ...           # comment

SECONDS counts from the capture's start, in steps of 0.004. DIRECTION is tx (sent by the board, which is the user) or
rx. WHAT is a layer-2 frame, or a layer-3 message with its call reference and elements. This program fills in the
sequence numbers of layer 2, so that a line can be added anywhere.

    0.000 tx sabme                       sabme, disc (commands), ua, dm (answers)
    0.100 rx rr                          rr: acknowledges; poll: a command that asks; final: its answer
    0.200 tx tei-request 1234 ff         TEI management: reference number and action indicator
    0.300 rx setup 0093 bearer=8890 called=80"4021"
    0.400 tx hex 02ff0308011405          a whole frame in hexadecimal

The call reference is written in hexadecimal. Its top bit is set in the frames of the side that did not begin the
call; "-" is the dummy reference. An element is NAME=VALUE, where VALUE is octets in hexadecimal and texts in quotes,
or only a name if the element has one octet. Instead of a name an identifier in hexadecimal may be given. "pd=43" sets
the protocol discriminator.
"""

import pathlib
import re
import struct
import sys

FOLDER = pathlib.Path(__file__).resolve().parent
BUILTIN = FOLDER.parent / "softboard" / "builtin_frames.inc"
BUILTIN_TEXT = "net5"
START = 989_827_200  # Monday 14 May 2001, 08:00:00 UTC

MESSAGES = {
    "alerting": 0x01, "proceeding": 0x02, "progress-message": 0x03, "setup": 0x05, "connect": 0x07,
    "setup-ack": 0x0D, "connect-ack": 0x0F, "user-information": 0x20, "disconnect": 0x45, "restart": 0x46,
    "release": 0x4D, "restart-ack": 0x4E, "release-complete": 0x5A, "facility-message": 0x62, "register": 0x64,
    "notify-message": 0x6E, "status-enquiry": 0x75, "congestion-control": 0x79, "information": 0x7B,
    "status": 0x7D, "service": 0x0F, "service-ack": 0x07,
}
MAINTENANCE = ("service", "service-ack")

ELEMENTS = {
    "change-status": 0x01, "charge": 0x01, "bearer": 0x04, "cause": 0x08, "connected": 0x0C, "call-identity": 0x10,
    "call-state": 0x14, "channel": 0x18, "facility": 0x1C, "progress": 0x1E, "network-facilities": 0x20,
    "notification": 0x27, "display": 0x28, "date": 0x29, "keypad": 0x2C, "signal": 0x34, "calling": 0x6C,
    "calling-subaddress": 0x6D, "called": 0x70, "called-subaddress": 0x71, "original-called": 0x73,
    "redirecting": 0x74, "transit": 0x78, "restart-class": 0x79, "low-layer": 0x7C, "feature": 0x39, "high-layer": 0x7D,
    "user-user": 0x7E,
}
SINGLE = {
    "shift6": 0x96, "shift7": 0x97, "shift6-once": 0x9E, "shift5-locked": 0x95, "more": 0xA0, "complete": 0xA1,
    "congestion": 0xB0,
}

TEI_MANAGEMENT = {
    "tei-request": 1, "tei-assigned": 2, "tei-denied": 3, "tei-check": 4, "tei-check-response": 5, "tei-remove": 6,
}

# Unnumbered frames with P/F set, and whether they are commands.
UNNUMBERED = {"sabme": (0x7F, True), "disc": (0x53, True), "ua": (0x73, False), "dm": (0x1F, False)}


class Link:
    """Layer 2 of SAPI 0, TEI 0: addresses and sequence numbers."""

    def __init__(self):
        self.sent = {"tx": 0, "rx": 0}

    def address(self, direction, command):
        network = direction == "rx"
        return bytes([0x02 if command == network else 0x00, 0x01])

    def unnumbered(self, direction, name):
        control, command = UNNUMBERED[name]
        if name == "sabme":
            self.sent = {"tx": 0, "rx": 0}
        return self.address(direction, command) + bytes([control])

    def expected(self, direction):
        """N(R) of a frame: the number of information frames that the other side has sent so far."""
        return self.sent["rx" if direction == "tx" else "tx"] % 128

    def receive_ready(self, direction, name):
        final = name != "rr"
        return self.address(direction, name == "poll") + bytes([0x01, self.expected(direction) << 1 | final])

    def information(self, direction, message):
        number = self.sent[direction] % 128
        self.sent[direction] += 1
        return self.address(direction, True) + bytes([number << 1, self.expected(direction) << 1]) + message


def octets(value):
    """8890 or 80"4021" or "text"."""
    result = b""
    for hexadecimal, text in re.findall(r'([0-9a-f]+)|"([^"]*)"', value):
        result += bytes.fromhex(hexadecimal) if hexadecimal else text.encode("ascii")
    return result


def element(word):
    if "=" not in word:
        return bytes([SINGLE[word] if word in SINGLE else int(word, 16)])
    name, value = word.split("=", 1)
    identifier = ELEMENTS[name] if name in ELEMENTS else int(name, 16)
    content = octets(value)
    return bytes([identifier, len(content)]) + content


def message(name, words):
    discriminator = 0x03 if name in MAINTENANCE else 0x08
    if words[0].startswith("pd="):
        discriminator = int(words.pop(0)[3:], 16)
    reference = b"" if words[0] == "-" else bytes.fromhex(words[0])
    header = bytes([discriminator, len(reference)]) + reference + bytes([MESSAGES[name]])
    return header + b"".join(element(word) for word in words[1:])


def tei_management(direction, name, words):
    reference, action = bytes.fromhex(words[0]), bytes.fromhex(words[1])
    command = 0xFE if direction == "rx" else 0xFC
    return bytes([command, 0xFF, 0x03, 0x0F]) + reference + bytes([TEI_MANAGEMENT[name]]) + action


def frame(link, direction, name, words):
    if name == "hex":
        return bytes.fromhex(words[0])
    if name in UNNUMBERED:
        return link.unnumbered(direction, name)
    if name in ("rr", "poll", "final"):
        return link.receive_ready(direction, name)
    if name in TEI_MANAGEMENT:
        return tei_management(direction, name, words)
    return link.information(direction, message(name, words))


def read(path):
    """The frames of a text: (ticks of 4 ms, transmitted, octets)."""
    link, frames, last = Link(), [], 0
    for number, line in enumerate(path.read_text().splitlines(), 1):
        words = re.findall(r'(?:[^\s"#]|"[^"]*")+|#.*', line)
        if words and words[-1].startswith("#"):
            words.pop()
        if not words:
            continue
        try:
            milliseconds = round(float(words[0]) * 1000)
            if milliseconds % 4 or milliseconds < last or words[1] not in ("tx", "rx"):
                raise ValueError("time or direction")
            last = milliseconds
            frames.append((milliseconds // 4, words[1] == "tx", frame(link, words[1], words[2], words[3:])))
        except (ValueError, KeyError, IndexError) as error:
            sys.exit(f"{path}:{number}: {error!r}: {line}")
    return frames


def pcap(frames):
    """Link type 177: a pseudo-header of 16 octets, packet type 4 for what this side sent, 0 for what it received."""
    result = struct.pack("<IHHiIII", 0xA1B2C3D4, 2, 4, 0, 0, 65535, 177)
    for ticks, transmitted, data in frames:
        pseudo = struct.pack(">HHH8sH", 4 if transmitted else 0, 0x2000, 1, bytes(8), 0x0030)
        seconds, rest = divmod(ticks, 250)
        size = len(pseudo) + len(data)
        result += struct.pack("<IIII", START + seconds, rest * 4000, size, size) + pseudo + data
    return result


def rows(frames):
    lines = ["// Made by examples/make_captures.py from examples/%s.frames.\n" % BUILTIN_TEXT]
    lines += ['{"%s", %s, %d},\n' % (data.hex(), str(sent).lower(), ticks) for ticks, sent, data in frames]
    return "".join(lines).encode()


def main():
    outputs = {path.with_suffix(".pcap"): pcap(read(path)) for path in sorted(FOLDER.glob("*.frames"))}
    outputs[BUILTIN] = rows(read(FOLDER / (BUILTIN_TEXT + ".frames")))
    changed = [path for path, data in outputs.items() if not path.exists() or path.read_bytes() != data]
    if "--check" in sys.argv[1:]:
        for path in changed:
            print(f"{path} is not what its text says")
        sys.exit(1 if changed else 0)
    for path in changed:
        path.write_bytes(outputs[path])


if __name__ == "__main__":
    main()
