"""A general analyser as a second opinion: of every frame of the examples, and of frames made at random for the
variants, it must see the same direction, command or response, P/F, numbers, message, call reference, cause and channel.

docs/internals/decisions.md lists where the two differ, and what is therefore not compared.
"""

import collections
import json
import pathlib
import random
import struct
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LIMIT, Folder, output

USER, NETWORK = 0, 1
DIRECTION = {True: 0, False: 1}  # of lapd.direction: 0 is user to network

FIELDS = ["frame.number", "lapd.sapi", "lapd.tei", "lapd.direction", "lapd.cr", "lapd.control.f", "lapd.control.p",
          "lapd.control.n_s", "lapd.control.n_r", "lapd.control.ftype", "lapd.control.s_ftype",
          "lapd.control.u_modifier_cmd", "lapd.control.u_modifier_resp", "q931.call_ref", "q931.call_ref_flag",
          "q931.message_type", "q931.cause_value", "q931.channel.number", "q931.called_party_number.digits",
          "q931.calling_party_number.digits", "frame.protocols"]

# What a variant's messages carry besides: elements of codeset 0 first, then the codeset and those behind a locking shift
# to it, written down from the octet tables of the variants. Identifiers such as 08 and 70 mean something else there.
OF_VARIANT = {
    "4ess": (["20 02 00 e1", "7b 01 81"], 6, ["01 01 3e", "37 04 00 81 32 33", "08 02 80 91"]),
    "5ess": (["20 02 00 e6", "74 04 21 80 34 35"], 6, ["01 01 00", "70 04 80 31 32 33", "37 03 20 81 39"]),
    "dms100": (["73 06 21 80 38 39 30 31", "1e 02 82 88"], 5, ["32 01 85", "75 03 80 50 01", "08 02 80 91"]),
    "ntt": (["28 04 4e 54 54 31", "01 03 81 82 83"], 5, ["32 01 81", "18 03 a9 83 9f"]),
    "net5": (["1c 09 91 a1 06 02 01 01 02 01 22", "29 05 1a 0b 16 08 1e", "7c 03 80 90 a3"], 7, ["08 02 80 91", "01 01 81"]),
    "ni2": (["1c 09 91 a1 06 02 01 02 02 01 22", "20 02 00 e1"], 5, ["2a 05 80 b1 02 41 42", "7b 01 82", "6c 04 00 80 31 32"]),
}


def analysed(path):
    """What tshark says: a dictionary of the fields of each frame, with a list of values for each."""
    command = ["tshark", "-n", "-r", str(path), "-T", "fields", "-E", "separator=/t", "-E", "occurrence=a",
               "-E", "aggregator=;"]
    for field in FIELDS:
        command += ["-e", field]
    done = subprocess.run(command, capture_output=True, text=True, timeout=LIMIT, check=True)
    rows = []
    for line in done.stdout.splitlines():
        rows.append({name: [v for v in value.split(";") if v != ""] for name, value in
                     zip(FIELDS, line.split("\t"))})
    return rows


def numbers(values):
    return [int(value, 0) for value in values]


def elements(line, identifier, codeset=0):
    return [e for e in line.get("elements", []) if e["id"] == identifier and e["codeset"] == codeset]


def fields(line, identifier, name):
    return [f for e in elements(line, identifier) for f in e["fields"] if f["name"] == name]


class Tshark(Folder):
    maxDiff = None

    def setUp(self):
        super().setUp()
        self.compared = collections.Counter()

    def same(self, what, theirs, ours, where):
        self.assertEqual(theirs, ours, f"{what} of {where}")
        if ours not in ([], None):
            self.compared[what] += 1

    def compare(self, path, variant):
        lines = [json.loads(text) for text in
                 output("convert", "--to", "jsonl", "--variant", variant, path).splitlines()]
        rows = analysed(path)
        self.assertEqual(len(lines), len(rows))
        for line, row in zip(lines, rows):
            where = f"{pathlib.Path(path).name}, frame {line['n']}: {line['hex']}"
            self.header(line, row, where)
            self.message(line, row, where)
        return len(lines)

    def header(self, line, row, where):
        self.same("SAPI", numbers(row["lapd.sapi"]), [line["sapi"]], where)
        self.same("TEI", numbers(row["lapd.tei"]), [line["tei"]], where)
        to_network = (line["dir"] == "tx") == (line["role"] == "user")
        self.same("direction", numbers(row["lapd.direction"]), [DIRECTION[to_network]], where)
        polls = numbers(row["lapd.control.p"])
        finals = numbers(row["lapd.control.f"])
        # The analyser leaves out a P that is clear.
        self.same("P/F", (1 in polls, 1 in finals),
                  (line["pf"] == 1 and line["command"], line["pf"] == 1 and not line["command"]), where)
        self.assertTrue(not finals if line["command"] else not polls, where)
        if line["ns"] is not None:
            self.same("N(S)", numbers(row["lapd.control.n_s"]), [line["ns"]], where)
        if line["nr"] is not None:
            self.same("N(R)", numbers(row["lapd.control.n_r"]), [line["nr"]], where)

    def message(self, line, row, where):
        if "q931" not in row["frame.protocols"][0] or line.get("pd") != 8:
            return
        self.same("message", numbers(row["q931.message_type"]), [line["code"]], where)
        if line["callref"]["length"] > 0:
            value = int(row["q931.call_ref"][0].replace(":", ""), 16)
            self.same("call reference", value, line["callref"]["value"], where)
            self.same("flag", numbers(row["q931.call_ref_flag"]), [line["callref"]["flag"]], where)
        sound = all(e["problem"] in (None, "unknown") for e in line["elements"])
        if not sound:
            return  # the analyser drops what is damaged
        if any(e["codeset"] != 0 for e in line["elements"]):
            self.compared["elements of the variant"] += 1
        causes = [f["value"] for f in fields(line, 0x08, "cause value")]
        self.same("cause", numbers(row["q931.cause_value"]), causes, where)
        called = [f["meaning"] for f in fields(line, 0x70, "digits")]
        self.same("called", row["q931.called_party_number.digits"], called, where)
        calling = [f["meaning"] for f in fields(line, 0x6C, "digits")]
        self.same("calling", row["q931.calling_party_number.digits"], calling, where)
        channels = [f["value"] for f in fields(line, 0x18, "channel number")]
        self.same("channel", [c & 0x7F for c in numbers(row["q931.channel.number"])], channels, where)

    def test_wireshark_and_we_agree_on_the_examples(self):
        for variant, path in EXAMPLES.items():
            with self.subTest(variant):
                self.assertGreater(self.compare(path, variant), 50)
        self.all_was_compared()

    def test_wireshark_and_we_agree_on_frames_made_at_random(self):
        for seed, variant in enumerate(EXAMPLES):
            for role in (USER, NETWORK):
                with self.subTest(variant=variant, role=role):
                    path = self.folder / f"{variant}-{role}.pcap"
                    path.write_bytes(capture(random.Random(seed), role, 400, variant))
                    self.assertEqual(self.compare(path, variant), 400)
                    self.assertGreaterEqual(self.compared.pop("elements of the variant"), 20)
        self.all_was_compared()

    def all_was_compared(self):
        for what in ("SAPI", "TEI", "direction", "P/F", "N(S)", "N(R)", "message", "call reference", "flag", "cause",
                     "called", "calling", "channel"):
            self.assertGreaterEqual(self.compared[what], 20, what)


def capture(dice, role, count, variant):
    """A capture of link type 177 with so many frames of a variant, of which ours are those of one role."""
    packets = [struct.pack("<IHHiIII", 0xA1B2C3D4, 2, 4, 0, 0, 65535, 177)]
    for i in range(count):
        transmitted = dice.random() < 0.5
        octets = frame(dice, variant, sent_by_network=transmitted == (role == NETWORK))
        address = bytes([role, 0, 0, 0, 0, 0, 0, 0])
        data = struct.pack(">HHH", 4 if transmitted else 0, 0, 0) + address + struct.pack(">H", 0x0030) + octets
        packets.append(struct.pack("<IIII", 1000 + i, 0, len(data), len(data)) + data)
    return b"".join(packets)


def frame(dice, variant, sent_by_network):
    kind = dice.choice(["I", "I", "I", "RR", "RNR", "REJ", "SABME", "DISC", "DM", "UA", "UI"])
    command = {"I": True, "UI": True, "SABME": True, "DISC": True, "DM": False, "UA": False}.get(
        kind, dice.random() < 0.5)
    tei = 127 if kind == "UI" else dice.randrange(127)
    address = bytes([2 if command == sent_by_network else 0, tei << 1 | 1])
    p, nr, ns = dice.randrange(2), dice.randrange(128), dice.randrange(128)
    if kind == "I":
        return address + bytes([ns << 1, nr << 1 | p]) + layer3(dice, variant)
    if kind in ("RR", "RNR", "REJ"):
        return address + bytes([{"RR": 1, "RNR": 5, "REJ": 9}[kind], nr << 1 | p])
    control = {"SABME": 0x6F, "DISC": 0x43, "DM": 0x0F, "UA": 0x63, "UI": 0x03}[kind]
    return address + bytes([control | p << 4]) + (layer3(dice, variant) if kind == "UI" else b"")


def layer3(dice, variant):
    length = dice.choice([1, 2, 2])
    reference = bytearray(dice.randbytes(length))
    text = bytes([8, length]) + reference
    kind = dice.choice([0x05, 0x02, 0x01, 0x07, 0x0F, 0x45, 0x4D, 0x5A, 0x7D, 0x7B])
    body = b""
    if kind in (0x45, 0x4D, 0x5A, 0x7D):
        body += bytes([0x08, 2, 0x80 | dice.randrange(11), 0x80 | dice.choice([1, 16, 17, 31, 34, 41, 102])])
    if kind in (0x05, 0x02):
        body += bytes([0x18, 3, 0xA9 if dice.random() < 0.5 else 0xA1, 0x83, 0x80 | dice.randrange(1, 32)])
    if kind == 0x05:
        calling, called = digits(dice), digits(dice)
        body += bytes([0x6C, 2 + len(calling), 0x21, 0x81]) + calling
        body += bytes([0x70, 1 + len(called), 0x80 | dice.choice([0x00, 0x21, 0x41])]) + called
    return text + bytes([kind]) + body + national(dice, variant)


def national(dice, variant):
    """Some of what the variant's messages carry besides."""
    own, codeset, behind = OF_VARIANT[variant]
    some = [octets for octets in own if dice.random() < 0.5]
    shifted = [octets for octets in behind if dice.random() < 0.5]
    body = b"".join(map(bytes.fromhex, some))
    if shifted and dice.random() < 0.5:
        return body + bytes([0x90 | codeset]) + b"".join(map(bytes.fromhex, shifted))
    # A shift that does not lock is for one element alone.
    return body + b"".join(bytes([0x98 | codeset]) + bytes.fromhex(octets) for octets in shifted)


def digits(dice):
    return "".join(dice.choice("0123456789") for _ in range(dice.randrange(1, 16))).encode()


if __name__ == "__main__":
    unittest.main()
