"""redact: in no form of output is anything left that names a person, and the key undoes it."""

import csv
import io
import json
import os
import re
import stat
import struct
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, LIMIT, Folder, environment, output, run

FORMS = ("pcapng", "pcap", "jsonl", "csv", "hex", "log")
NUMBER = re.compile(r"^[0-9]{6,}$")
NAME = re.compile(r"[A-Za-z]{4,}")
PERSONAL = re.compile(r"NUMBER|SUBADDRESS|DISPLAY|KEYPAD|USER-USER$|SERVICE PROFILE")
TEXTS = ("digits", "keypad", "subaddress", "display", "user information", "service profile")


def lines(variant, path):
    return [json.loads(line) for line in
            output("convert", "--to", "jsonl", "--variant", variant, path).splitlines()]


def fields(line):
    for element in line.get("elements", ()):
        for field in element["fields"]:
            yield element, field


def people(variant, path):
    """Numbers of six digits and more, and words of names of four letters and more, in what names a person."""
    found = set()
    for line in lines(variant, path):
        for element, field in fields(line):
            if PERSONAL.search(element["name"]) and field["name"] in TEXTS:
                text = field["meaning"]
                found.update([text] if NUMBER.match(text) else NAME.findall(text))
    return found


def values(line):
    """Every value of a JSON object, the names of fields and elements left out."""
    for element, field in fields(line):
        yield str(field["value"])
        yield field["meaning"]
        yield element["hex"]
    yield line.get("hex", "")
    yield from (str(line[key]) for key in ("file", "interface", "text") if key in line)


def frames(variant, path):
    """Direction, octets and the time of each frame."""
    return [(line["dir"], line["time"], bytes.fromhex(line["hex"])) for line in lines(variant, path) if "hex" in line]


class Redact(Folder):
    maxDiff = None

    def setUp(self):
        """By a key of its own: pseudonyms made at random may be somebody else's short number."""
        super().setUp()
        self.key = self.folder / "key-of-the-test"
        self.key.touch(0o600)
        self.key.write_text("lapdread key 1\nkeep-prefix 0\nblank-short no\n" + "5a" * 32 + "\n")

    def redact(self, variant, source, form):
        to = self.folder / f"out-{variant}.{form}"
        output("redact", "--variant", variant, "--trunk", "Gartenstrasse", "--key", self.key, source, "-o", to)
        return to

    def test_leaves_no_number_and_no_name_in_any_form(self):
        counted = 0
        for variant, path in EXAMPLES.items():
            secrets = people(variant, path)
            counted += len(secrets)
            for form in FORMS:
                with self.subTest(variant=variant, form=form):
                    octets = self.redact(variant, path, form).read_bytes()
                    self.assertGreater(len(octets), 1000)
                    for secret in secrets:
                        for written in (secret, secret.encode().hex(), secret.encode().hex(" ")):
                            self.assertNotIn(written.encode(), octets, secret)
                    self.assertNotIn(b"Gartenstrasse", octets)
                    self.assertNotIn(path.name.encode(), octets)
                    self.assertNotIn(os.uname().nodename.encode(), octets)
        self.assertGreater(counted, 40)

    def test_leaves_no_number_and_no_name_in_the_value_of_a_field(self):
        for variant, path in EXAMPLES.items():
            secrets = people(variant, path)
            redacted = self.redact(variant, path, "pcapng")
            for line in lines(variant, redacted):
                for value in values(line):
                    for secret in secrets:
                        self.assertNotIn(secret, value, line["n"])

    def test_keeps_all_but_persons(self):
        kept = ("n", "time", "ticks", "dir", "role", "sapi", "tei", "command", "frame", "ns", "nr", "pf", "pd", "callref",
                "message", "code", "marks", "retransmission", "accepted")
        for variant, path in EXAMPLES.items():
            before, after = lines(variant, path), lines(variant, self.redact(variant, path, "pcapng"))
            self.assertIn("redacted with key", after.pop(0)["text"])
            self.assertEqual(len(before), len(after))
            for one, other in zip(before, after):
                self.assertEqual([one.get(key) for key in kept], [other.get(key) for key in kept])
                self.assertEqual([(e["codeset"], e["id"], e["name"], len(e["hex"]), e["problem"])
                                  for e in one.get("elements", ())],
                                 [(e["codeset"], e["id"], e["name"], len(e["hex"]), e["problem"])
                                  for e in other.get("elements", ())])
            causes = [[f["value"] for e, f in fields(line) if e["name"] in ("CAUSE", "CHANNEL IDENTIFICATION")]
                      for line in before]
            self.assertEqual(causes, [[f["value"] for e, f in fields(line)
                                       if e["name"] in ("CAUSE", "CHANNEL IDENTIFICATION")] for line in after])

    def test_gives_each_form_the_same_frames(self):
        for variant, path in EXAMPLES.items():
            there = [frames(variant, self.redact(variant, path, form)) for form in ("pcapng", "log", "hex")]
            octets = [[octets for *_, octets in each] for each in there]
            self.assertEqual(octets[0], octets[1])
            self.assertEqual(octets[0], octets[2])
            rows = csv.DictReader(io.StringIO(self.redact(variant, path, "csv").read_text()))
            self.assertEqual(len(list(rows)), len(octets[0]))

    def test_leaves_nothing_behind_a_wrong_length(self):
        digits = b"5557654321"
        times = (f"TX 2026-01-05T08:00:{second:02}.000Z " for second in range(60))
        damaged = [
            "00010000080200010504038090a31803a98381200b0c81" + digits.hex(),  # a network with a long name
            "00010202080200020504038090a3180ea98305" + digits.hex(),          # channel numbers without an end
            "00010404080f" + digits.hex(),                                    # a call reference
            "0001af8280000c0502" + digits.hex(),                              # a parameter of XID
        ]
        source = self.folder / "damaged.hex"
        source.write_text("".join(f"{next(times)}{octets}\n" for octets in damaged))
        for form in ("hex", "jsonl"):
            with self.subTest(form=form):
                octets = self.redact("net5", source, form).read_bytes()
                self.assertEqual(octets.count(b"\n"), len(damaged) + octets.count(b"\n#") + octets.startswith(b"#"))
                for secret in (digits, digits[:4], digits[-4:]):
                    for written in (secret, secret.hex().encode(), secret.hex(" ").encode()):
                        self.assertNotIn(written, octets)

    def test_is_undone_by_the_key_but_for_blanks(self):
        for variant, path in EXAMPLES.items():
            redacted = self.redact(variant, path, "pcapng")
            undone = self.folder / f"undone-{variant}.pcapng"
            output("redact", "--variant", variant, "--key", self.key, "--undo", redacted, "-o", undone)
            pseudonyms = 0
            for one, other, again in zip(frames(variant, path), frames(variant, redacted), frames(variant, undone)):
                self.assertEqual(len(one[2]), len(again[2]))
                for was, hidden, now in zip(one[2], other[2], again[2]):
                    if now != was:
                        self.assertIn(hidden, (0x00, 0x30, 0x80, 0xFF))
                        self.assertEqual(now, hidden)
                    pseudonyms += was != hidden and now == was
            self.assertGreater(pseudonyms, 60)
            self.assertTrue(people(variant, path) & people(variant, undone))

    def test_takes_the_form_of_the_input(self):
        key = self.folder / "key"
        for form, beginning in (("pcapng", b"\x0a\x0d\x0d\x0a"), ("hex", b"# lapdread: redacted with key "), ("log", b"\nOrvane KV9")):
            source = self.folder / f"source-{form}"
            output("convert", "--to", form, EXAMPLES["net5"], "-o", source)
            status, out, _ = run("redact", "--key", key, source)
            self.assertEqual(status, 0)
            self.assertTrue(out.startswith(beginning), out[:20])
        status, _, error = run("redact", stdin=b"TX 00017f\n")
        self.assertEqual(status, 1)
        self.assertIn("--to FORM", error)

    def test_one_key_always_gives_the_same_pseudonyms_and_another_key_others(self):
        one, other = self.folder / "one", self.folder / "other"
        first = output("redact", "--to", "hex", "--key", one, EXAMPLES["net5"])
        self.assertEqual(output("redact", "--to", "hex", "--key", one, EXAMPLES["net5"]), first)
        self.assertNotEqual(output("redact", "--to", "hex", "--key", other, EXAMPLES["net5"]), first)
        self.assertNotEqual(output("redact", "--to", "hex", EXAMPLES["net5"]), first)

    def test_redacts_what_the_filters_let_through_of_the_original(self):
        whole = output("redact", "--to", "hex", "--key", self.key, EXAMPLES["net5"]).splitlines()
        some = output("redact", "--to", "hex", "--key", self.key, "--number", "4021", EXAMPLES["net5"]).splitlines()
        self.assertTrue(some)
        self.assertLess(len(some), len(whole))
        self.assertLessEqual(set(some), set(whole))
        self.assertNotIn("34303231", " ".join(some))

    def test_drops_comments_and_the_words_of_the_input(self):
        source = self.folder / "Meier.log"
        log = output("convert", "--to", "log", EXAMPLES["net5"])
        source.write_text("Frau Meier, 0301234567\n" + log + "Herr Schulze\n")
        for form in FORMS:
            out = run("redact", "--to", form, "--key", self.key, source)[1]
            for secret in (b"Meier", b"0301234567", b"Schulze"):
                self.assertNotIn(secret, out, form)

    def test_drops_the_comments_of_a_capture(self):
        def block(kind, content):
            size = len(content) + 12
            return struct.pack("<II", kind, size) + content + struct.pack("<I", size)

        comment = b"call of Frau Meier, 030123456789"
        packet = struct.pack("<IIIII", 0, 0, 7, 3, 3) + b"\x00\x01\x7f\x00" + struct.pack("<HH", 1, 32) + comment
        source = self.folder / "trace.pcapng"
        source.write_bytes(block(0x0A0D0D0A, struct.pack("<IHHq", 0x1A2B3C4D, 1, 0, -1)) +
                           block(1, struct.pack("<HHI", 203, 0, 0)) + block(6, packet))
        self.assertIn("Frau Meier", output("convert", "--to", "jsonl", source))
        for form in FORMS:
            out = run("redact", "--to", form, source)[1]
            self.assertNotIn(b"Meier", out, form)
            self.assertNotIn(b"030123456789", out, form)

    def test_makes_a_key_for_its_owner_and_says_so(self):
        key = self.folder / "key"
        status, _, error = run("redact", "--to", "hex", "--key", key, EXAMPLES["net5"])
        self.assertEqual((status, stat.S_IMODE(key.stat().st_mode)), (0, 0o600))
        self.assertIn(f"made the key {key}", error)
        self.assertNotIn("made the key", run("redact", "--to", "hex", "--key", key, EXAMPLES["net5"])[2])

    def test_refuses_a_key_that_others_may_read_and_leaves_the_output_as_it_was(self):
        key, to = self.folder / "key", self.folder / "out.hex"
        output("redact", "--key", key, EXAMPLES["net5"], "-o", to)
        before = to.read_bytes()
        key.chmod(0o644)
        status, _, error = run("redact", "--key", key, EXAMPLES["net5"], "-o", to)
        self.assertEqual(status, 2)
        self.assertIn("others may read", error)
        self.assertEqual(to.read_bytes(), before)

    def test_undoes_nothing_without_the_key(self):
        status, _, error = run("redact", "--to", "hex", "--undo", EXAMPLES["net5"])
        self.assertEqual(status, 1)
        self.assertIn("--key", error)
        gone = self.folder / "gone"
        self.assertEqual(run("redact", "--to", "hex", "--undo", "--key", gone, EXAMPLES["net5"])[0], 2)
        self.assertFalse(gone.exists())

    def test_undoes_nothing_with_another_key(self):
        other = self.folder / "other"
        output("redact", "--to", "hex", "--key", other, EXAMPLES["net5"])
        for form in ("pcapng", "hex"):
            redacted, to = self.folder / f"redacted.{form}", self.folder / f"undone.{form}"
            output("redact", "--key", self.key, EXAMPLES["net5"], "-o", redacted)
            status, out, error = run("redact", "--undo", "--key", other, redacted, "-o", to)
            self.assertEqual(status, 2)
            self.assertIn("another key", error)
            self.assertEqual(out, b"")
            self.assertFalse(to.exists())
            status, _, error = run("redact", "--undo", "--key", self.key, redacted, "-o", to)
            self.assertEqual((status, "which key" in error), (0, False), error)
            self.assertNotIn("redacted with key", output("convert", "--to", "jsonl", to))

    def test_leaves_the_output_as_it_was_if_an_input_has_another_key(self):
        other, mine, others = self.folder / "other", self.folder / "mine.hex", self.folder / "others.hex"
        output("redact", "--key", self.key, EXAMPLES["net5"], "-o", mine)
        output("redact", "--key", other, EXAMPLES["net5"], "-o", others)
        to = self.folder / "to.hex"
        before = output("convert", "--to", "hex", EXAMPLES["ntt"])
        to.write_text(before)
        for words, stdin in (([others], b""), ([mine, others], b""), (["-"], others.read_bytes())):
            status, _, error = run("redact", "--undo", "--key", self.key, *words, "-o", to, stdin=stdin)
            self.assertEqual((status, "another key" in error), (2, True), error)
            self.assertEqual(to.read_text(), before)
        output("redact", "--undo", "--key", self.key, mine, "-o", to)
        self.assertNotEqual(to.read_text(), before)

    def test_asks_every_pipe_for_its_key_before_anything_is_written(self):
        other, mine, others = self.folder / "other", self.folder / "mine.hex", self.folder / "others.hex"
        output("redact", "--key", self.key, EXAMPLES["net5"], "-o", mine)
        output("redact", "--key", other, EXAMPLES["net5"], "-o", others)
        to = self.folder / "to.hex"
        before = output("convert", "--to", "hex", EXAMPLES["ntt"])
        to.write_text(before)

        def undo(*words):
            command = f'"$0" redact --quiet --undo --key "{self.key}" {" ".join(words)} -o "{to}"'
            return subprocess.run(["bash", "-c", command, LAPDREAD], capture_output=True, text=True, timeout=LIMIT,
                                  env=environment(), check=False)

        for words in ((f"<(cat {mine})", f"<(cat {others})"), ("--merge", f"<(cat {mine})", f"<(cat {others})"),
                      (str(mine), f"<(cat {mine})", f"<(cat {others})")):
            with self.subTest(words):
                done = undo(*words)
                self.assertEqual((done.returncode, "another key" in done.stderr), (2, True), done.stderr)
                self.assertEqual(to.read_text(), before)
        done = undo(f"<(cat {mine})", str(mine), f"<(cat {mine})")
        self.assertEqual((done.returncode, done.stderr), (0, ""))
        alone = self.folder / "alone.hex"
        output("redact", "--undo", "--key", self.key, mine, mine, mine, "-o", alone)
        self.assertEqual(to.read_text(), alone.read_text())
        self.assertEqual(len(frames("net5", to)), 3 * len(frames("net5", mine)))

    def test_says_that_it_cannot_tell_the_key_of_forms_without_comments(self):
        for form in ("pcap", "log"):
            redacted = self.folder / f"redacted.{form}"
            output("redact", "--key", self.key, EXAMPLES["net5"], "-o", redacted)
            status, _, error = run("redact", "--to", "hex", "--undo", "--key", self.key, redacted)
            self.assertEqual(status, 0)
            self.assertIn("does not say with which key", error)

    def test_a_key_keeps_its_settings_and_refuses_others(self):
        key = self.folder / "key"
        kept = output("redact", "--to", "jsonl", "--key", key, "--keep-prefix", "3", EXAMPLES["net5"])
        self.assertIn('"meaning":"731', kept)
        self.assertEqual(output("redact", "--to", "jsonl", "--key", key, EXAMPLES["net5"]), kept)
        for words in (("--keep-prefix", "4"), ("--blank-short",)):
            status, _, error = run("redact", "--to", "hex", "--key", key, *words, EXAMPLES["net5"])
            self.assertEqual(status, 1)
            self.assertIn("another key", error)

    def test_says_what_it_does_not_understand(self):
        for words in (("--keep-prefix", "0"), ("--keep-prefix", "10"), ("--keep-prefix", "x"), ("--to", "doc")):
            self.assertEqual(run("redact", *words, EXAMPLES["net5"])[0], 1, words)


if __name__ == "__main__":
    unittest.main()
