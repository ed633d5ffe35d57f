"""Differences between traces of several calls: how the calls mingle says nothing, what they said does."""

import json

from lapdread_harness import Folder, output, run

BEARER = "04038090a3"


def called(digits):
    return f"70{len(digits) + 1:02x}81{digits.encode().hex()}"


def call(begin, reference, digits, cause=16):
    """The messages of a call from our side: seconds, direction, octets of layer 3."""
    ours, theirs = f"0802{reference:04x}", f"0802{reference | 0x8000:04x}"
    return [(begin, "TX", f"{ours}05{BEARER}{called(digits)}"), (begin + 1, "RX", f"{theirs}01"),
            (begin + 2, "RX", f"{theirs}07"), (begin + 3, "TX", f"{ours}0f"),
            (begin + 9, "RX", f"{theirs}45080282{cause | 0x80:02x}"),
            (begin + 10, "TX", f"{ours}4d"), (begin + 11, "RX", f"{theirs}5a")]


def lines(*calls):
    """What was recorded of them, as lines of hexadecimal digits. Layer 2 numbers and acknowledges."""
    numbers = {"TX": 0, "RX": 0}
    for at, direction, message in sorted(sum(calls, [])):
        address = {"TX": "0001", "RX": "0201"}[direction]
        other = {"TX": "RX", "RX": "TX"}[direction]
        yield (f"{direction} 2026-03-01T10:00:{at:06.3f}Z {address}{numbers[direction] * 2:02x}"
               f"{numbers[other] * 2:02x}{message}\n")
        numbers[direction] += 1


class Traces(Folder):
    def trace(self, name, *calls):
        path = self.folder / f"{name}.hex"
        path.write_text("".join(lines(*calls)))
        return path

    def test_of_calls_that_mingle_in_another_way_are_alike(self):
        apart = self.trace("apart", call(1, 1, "111111"), call(20, 2, "222222"))
        for later in (1.5, 2.5, 9.5):
            mingled = self.trace("mingled", call(1, 1, "111111"), call(later, 2, "222222"))
            for a, b in ((apart, mingled), (mingled, apart)):
                self.assertIn("\n14 alike, 0 differ, 0 only in A, 0 only in B\n",
                              output("diff", "--fail-on-difference", a, b), later)

    def test_show_the_call_that_differs_among_others(self):
        works = self.trace("works", call(1, 1, "111111"), call(2.5, 2, "222222"))
        fails = self.trace("fails", call(1, 7, "111111", cause=41), [m for m in call(1.2, 8, "222222") if m[0] != 2.2])
        found = [json.loads(line) for line in output("diff", "--jsonl", works, fails).splitlines()]
        self.assertEqual([(each["difference"], each["message"], each["a"], each["b"]) for each in found],
                         [("field", "DISCONNECT", "16 normal clearing", "41 temporary failure"),
                          ("message", "ALERTING", None, None)])

    def test_may_come_from_the_standard_input_on_either_side(self):
        path = self.trace("one", call(1, 1, "111111"))
        for words in ((path, "-"), ("-", path)):
            self.assertIn("\n7 alike, 0 differ,", output("diff", *words, stdin=path.read_bytes()))
        self.assertEqual(run("diff", "-", "-", stdin=path.read_bytes())[0], 1)
