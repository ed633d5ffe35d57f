"""Nobody is lost between frames and calls: each message with a reference of its own that layer 2 accepted belongs to one
call, and a call has no other frames."""

import collections
import json
import unittest

from lapdread_harness import EXAMPLES, RECORDED, SOURCE, Folder, output

# A message of segments is heard as a whole, with its last segment.
TRAPS = [path for path in sorted((SOURCE / "tests/reader/data/traps").glob("*.hex")) if path.stem != "segments"]


def objects(*words):
    return [json.loads(line) for line in output(*words).splitlines()]


class Calls(unittest.TestCase):
    def test_share_the_messages_among_them(self):
        for path in [*EXAMPLES.values(), *RECORDED, *TRAPS]:
            with self.subTest(path.name):
                messages = [frame["n"] for frame in objects("convert", "--quiet", "--to", "jsonl", path)
                            if frame.get("pd") == 8 and frame["accepted"] and frame["callref"]["length"] > 0
                            and frame["callref"]["value"] > 0]
                of_calls = collections.Counter(number for call in objects("calls", "--quiet", "--jsonl", path)
                                               for number in call["frames"])
                self.assertEqual(sorted(of_calls), messages)
                self.assertEqual(set(of_calls.values()), {1} if messages else set())


class Recordings(Folder):
    def test_are_read_in_the_order_in_which_they_began_whatever_a_shell_makes_of_their_names(self):
        lines = output("convert", "--quiet", "--to", "hex", EXAMPLES["net5"]).splitlines(keepends=True)
        names = ["t.20010514T080000Z.hex", "t.20010514T080000Z.2.hex", "t.20010514T080000Z.10.hex"]
        for i, name in enumerate(names):
            (self.folder / name).write_text("".join(lines[40 * i:40 * i + 40]))
        words = ("--tz", "UTC", "--columns", "n,time,message")
        self.assertEqual(output(*words, *sorted(names), cwd=self.folder), output(*words, EXAMPLES["net5"]))


if __name__ == "__main__":
    unittest.main()
