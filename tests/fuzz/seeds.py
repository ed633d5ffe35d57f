#!/usr/bin/env python3
"""Inputs to start each fuzz target with, from the golden files and the examples: seeds.py FOLDER.

Writes FOLDER/<target>/<number>. The corpora in the repository have grown from these.
"""

import json
import pathlib
import re
import struct
import sys

TREE = pathlib.Path(__file__).resolve().parents[2]
EXAMPLES = TREE / "examples"

FAMILIES = ("standard_resource", "tsc", "ccs", "ccs_events", "resource_mgr", "cluster_mgr", "cluster")


def packets(path):
    """The frames of a capture: (seconds, micros, pseudo-header, octets)."""
    octets = path.read_bytes()
    at = 24
    while at < len(octets):
        seconds, micros, held, _ = struct.unpack_from("<IIII", octets, at)
        packet = octets[at + 16:at + 16 + held]
        yield seconds, micros, packet[:16], packet[16:]
        at += 16 + held


def golden_frames():
    """Every golden input of the decoder as a frame."""
    for path in sorted((TREE / "tests/decoder/golden").glob("*.golden")):
        for case in re.split(r"^== ", path.read_text("latin-1"), flags=re.M)[1:]:
            head = case.split("\n--\n")[0].split("\n")[1:]
            inputs = []
            for line in head:
                if line.startswith("octets"):
                    inputs.append(bytes.fromhex(line[6:]))
                elif line.startswith("more"):
                    inputs[-1] += bytes.fromhex(line[4:])
            for octets in inputs:
                if "frame" in head:
                    yield octets
                elif "message" in head:
                    yield bytes.fromhex("00010000") + octets
                else:
                    yield bytes.fromhex("00010000 0802008105") + octets


def frames():
    yield from golden_frames()
    for path in sorted(EXAMPLES.glob("*.pcap")):
        for *_, octets in packets(path):
            yield octets
    yield bytes(257)
    yield bytes(258)


def elements():
    """Every frame, and the golden elements of isdn as frames: the codeset is shifted to."""
    yield from frames()
    for path in sorted((TREE / "tests/isdn/golden").glob("*.golden")):
        for case in re.split(r"^== ", path.read_text("latin-1"), flags=re.M)[1:]:
            head = dict(line.partition(" ")[::2] for line in case.split("\n--\n")[0].split("\n")[1:])
            if "frame" in head:
                yield bytes.fromhex(head["frame"])
            elif "element" in head:
                shift = bytes([0x98 + int(head.get("codeset", 0))]) if "codeset" in head else b""
                yield bytes.fromhex("00010000 0802008105") + shift + bytes.fromhex(head["element"])


def trunks():
    """A variant, and frames behind their directions and lengths."""
    for number, name in enumerate(("net5", "ni2", "4ess", "5ess", "dms100", "ntt")):
        some = list(packets(EXAMPLES / f"{name}.pcap"))
        for first in range(0, len(some), 30):
            yield bytes([number]) + b"".join(bytes([int(pseudo[1] == 4), len(octets)]) + octets
                                             for *_, pseudo, octets in some[first:first + 30] if len(octets) < 256)
    for number, octets in enumerate(elements()):
        if len(octets) < 256:
            yield bytes([number % 6, number % 2, len(octets)]) + octets


def events():
    for number, (*_, octets) in enumerate(packets(EXAMPLES / "net5.pcap")):
        yield struct.pack("<IIII", 2, number % 2, number, len(octets)) + octets
    for length in (0, 3, 257, 258, 0xFFFFFFFF):
        yield struct.pack("<IIII", 2, 1, 0xFFFFFFFF, length) + bytes(5)
    yield struct.pack("<IIII", 3, 1, 1, 1) + bytes(1)
    yield struct.pack("<IIII", 2, 0, 7, 300) + bytes(300)


def messages():
    index = 0
    for family in FAMILIES:
        text = (TREE / "tests/vela/golden" / f"{family}.golden").read_text("latin-1")
        for block in re.split(r"^== ", text, flags=re.M)[1:]:
            octets = bytes.fromhex(re.search(r"^octets\n((?:  .*\n)*)calls", block, re.M).group(1))
            for manner in (0, 1):
                yield bytes([index, manner]) + octets
            index += 1


def relay_frame(kind, transaction=0, data=b"", extra=b""):
    return struct.pack(">IIIII", kind, transaction, len(data), len(extra), 0) + data + extra


def header_block(body, *words):
    return struct.pack(">14I", *words, *range(len(words), 13), len(body))


def connections():
    request = struct.pack(">7I", 1, 0, 0, 0, 0, 50, 50)
    opened = struct.pack(">5I", 1, 0, 0, 0, 2)
    body = struct.pack("<II", 10, 1)
    message = relay_frame(1001, 0, header_block(body, 0x5A, 0x123456, 8), body)
    yield relay_frame(1003, 7, request) + message + message + relay_frame(2000, 8)
    yield relay_frame(1002, 7, opened) + relay_frame(1001, 0, header_block(b"", 0, 0, 32)) + relay_frame(2001)
    yield relay_frame(1001, 1, header_block(b"ab"), b"abc")
    yield struct.pack(">IIIII", 1001, 0, 102401, 0, 0) + bytes(10)
    yield struct.pack(">IIIII", 1001, 0, 0x80000000, 0xFFFFFFFF, 0)
    yield relay_frame(1001)[:19]
    yield relay_frame(1001, 0, bytes(300), bytes(2000)) + relay_frame(2000)


def pcap(octets, order="<", magic=0xA1B2C3D4, link=177):
    text = struct.pack(order + "IHHiIII", magic, 2, 4, 0, 0, 65535, link)
    for seconds, micros, pseudo, frame in octets:
        packet = (pseudo if link == 177 else b"") + frame
        text += struct.pack(order + "IIII", seconds, micros, len(packet), len(packet)) + packet
    return text


def block(kind, content):
    content += bytes(-len(content) % 4)
    size = len(content) + 12
    return struct.pack("<II", kind, size) + content + struct.pack("<I", size)


def pcapng(octets):
    text = block(0x0A0D0D0A, struct.pack("<IHHq", 0x1A2B3C4D, 1, 0, -1)) + block(1, struct.pack("<HHI", 177, 0, 65535))
    for seconds, micros, pseudo, frame in octets:
        stamp = seconds * 1_000_000 + micros
        packet = pseudo + frame
        text += block(6, struct.pack("<IIIII", 0, stamp >> 32, stamp & 0xFFFFFFFF, len(packet), len(packet)) + packet)
    return text


def captures():
    for path in sorted(EXAMPLES.glob("*.pcap")):
        yield pcap(list(packets(path))[:8])
    some = list(packets(EXAMPLES / "net5.pcap"))[:6]
    yield pcap(some, ">")
    yield pcap(some, "<", 0xA1B23C4D)
    yield pcap(some, "<", link=203)
    yield pcap(some, "<", link=1)
    yield pcap(some)[:-3]
    yield pcap([])
    yield pcapng(some)
    yield pcapng(some)[:-9]


def inputs():
    """Captures, and the other forms of input."""
    yield from captures()
    comments = b"".join(struct.pack("<HH", 1, len(text)) + text + bytes(-len(text) % 4)
                        for text in (b"lapdmon: Frames Lost: 17", b"lapdmon: ticks 75 written 1795260333", b"lapdmon: head net5"))
    packet = struct.pack("<IIIII", 0, 0, 7, 3, 3) + b"\x00\x01\x7f\x00" + struct.pack("<HHI", 2, 4, 2) + comments
    yield (block(0x0A0D0D0A, struct.pack("<IHHq", 0x1A2B3C4D, 1, 0, -1)) +
           block(1, struct.pack("<HHI", 203, 0, 0) + struct.pack("<HH4sHHB", 2, 4, b"day1", 9, 1, 9)) + block(6, packet) +
           block(3, struct.pack("<I", 3) + b"\x00\x01\x73\x00") + block(5, struct.pack("<IQHHQ", 0, 0, 5, 8, 3)))
    yield b"TX 2026-11-21T11:25:33.3Z 00 01 7f\nRX 12.5 000173\n0 1095 00019009 # note\n1 11:25:33 02\n"
    yield b"[2026-11-21 11:25:33.250] x > [ 00 01 7f ]\n[Nov 21 23:59:59] < [ 00 01\n 73 ]\n> [ 00"
    head = (b"\nOrvane KV9 ISDN Trace Utility\nRecords the D-channel signalling of one trunk, decoded.\n"
            b"Version 1.00-Build-04 lapdmon\n")
    indent = b" " * 33
    received = (b"\nSat Nov 21 11:25:33 2026\nRX Frame: Time = 0.300\nResponse=0    SAPI=0x00\nTEI=0x00\n"
                b"    0x73  Unnumbered Acknowledgment\nHex Dump: \n00 01 73 \n")
    sent = b"\n" + b"".join(indent + line + b"\n" for line in (
        b"Sat Nov 21 11:25:33 2026", b"TX Frame: Time = 0.304", b"Command=1   SAPI=0x00", b"TEI=0x00",
        b"0x01 0x05  Receive Ready", b"Hex Dump: ", b"02 01 01 05 "))
    oversized = (b"\nSat Nov 21 11:25:33 2026\nRX Frame: Time = 0.308\n"
                 b"Oversized frame, frame will not be interpreted \nFrame Error \n")
    whole = head + b"NET5 Switch \n" + received + sent + b"Enqueue Failed \nFrames Lost: 17 \n" + oversized
    yield whole
    # As editors of other systems leave them: line ends of two octets, and a byte order mark.
    yield whole.replace(b"\n", b"\r\n")
    yield b"\xef\xbb\xbf" + whole
    yield b"\xef\xbb\xbfTX 2026-11-21T11:25:33.3Z 00 01 7f\r\nRX 12.5 000173\r\n"
    yield head + b"Get iemsg failed \n" + received[:-9]
    yield received[30:] + b"stray\n" + sent + received + head + b"NI2 Switch \n"


def scenarios():
    yield (EXAMPLES / "two-dchannels.toml").read_bytes()
    for text in ('protocol = "ntt"\nboard = 2\nlabel = 3\njournal = "j"\n[[dchannel]]\nnumber = 4\nprotocol = 99\n',
                 "board = 1\nboard = 2\n", 'loop = "yes"\n', "board = 256\n", "dchannels = 3\nrate = 2.5\n", "rate = 0\n",
                 'rate = "max"\n', 'frames = "gone.pcap"\n', "[[dchannel]]\n[[dchannel]]\nnumber = 1\n", "dchannel = 3\n",
                 "a = [1, {b = 0x1F, c = 1979-05-27T07:32:00Z}]\n", "a.b.c = '''x\ny'''\n", "label = 1e3\nx = inf\n", 'faults = ["reply-lost=3", "burst"]\n', "faults = [1]\n",
                 '"\\u00e9" = "\\t"\n'):
        yield text.encode()


def handovers():
    frame = {"transmitted": True, "ticks": 7, "octets": "00ff"}
    channel = {"board": 1, "number": 2, "protocol": 7, "rate": 1, "perSecond": 2.5, "loop": True, "label": 2, "capture": 0}
    whole = {"journal": b"/tmp/j".hex(), "captures": [[frame], []], "channels": [channel],
             "faults": ["reply-lost=3", "never-waits"]}
    yield json.dumps(whole).encode()
    yield json.dumps({**whole, "captures": []}).encode()
    yield json.dumps({**whole, "channels": [{**channel, "board": 256, "number": -1, "rate": 9}]}).encode()
    yield json.dumps({**whole, "captures": [[{**frame, "octets": "0g"}, {**frame, "ticks": 1e99}]]}).encode()
    yield json.dumps({**whole, "faults": ["reply-lost=0", "no-such"]}).encode()
    yield b"{}"
    yield b"[[[[]]]]"


def command_lines():
    lapdmon = ("-b1", "-b12 -d34", "-b1 -f trace.txt", "-b1 -fxtrace.txt -d2", "-h", "-?", "-x -b1", "-b1 -f " + "n" * 120,
               "-b -d +8", "")
    softboard = ("--frames day.pcap --protocol ni2 --rate 20 --loop -- lapdmon -b1", "--help", "--version", "-- lapdmon",
                 "--board 3 --dchannels 2 --rate max --no-loop -- lapdmon -b3 -d2", "--rate=0 -- x", "--board 300 -- x",
                 "--scenario two.toml --journal talk.txt -- lapdmon", "--protocol 9 --rate recorded -- x", "stray -- x",
                 "--fault reply-lost=3 --fault burst -- x", "--fault no-such -- x", "--fault silent=x -- x")
    relay = ("--listen 0.0.0.0:6554 --allow 192.168.1.0/24", "--help", "--version", "--listen 127.0.0.1:0",
             "--max-clients 3 --frame-timeout 0.5 --write-timeout 3600", "--allow 1.2.3.4 --allow 10.0.0.0/8",
             "--listen 256.1.1.1", "--allow 1.2.3.0/33", "--frame-timeout nan", "--frame-timeout 1e9")
    for program, lines in enumerate((lapdmon, softboard, relay)):
        for line in lines:
            yield bytes([program]) + line.replace(" ", "\n").encode()


SEEDS = {
    "frame": frames, "isdn": elements, "redact": trunks, "event": events, "message": messages, "relay": connections, "capture": captures, "input": inputs,
    "scenario": scenarios, "handover": handovers, "command_line": command_lines,
}


def main(folder):
    for target, seeds in SEEDS.items():
        to = pathlib.Path(folder) / target
        to.mkdir(parents=True, exist_ok=True)
        for number, octets in enumerate(seeds()):
            (to / f"{number:04}").write_bytes(octets)


if __name__ == "__main__":
    main(*sys.argv[1:])
