"""Every promise in docs/internals/promises.md names a test that exists."""

import pathlib
import re
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]


class Promises(unittest.TestCase):
    def test_each_names_a_test_that_exists(self):
        rows = re.findall(r"^\| (?!Promise|---)(.*?) \| (.*?) \|$", (ROOT / "docs/internals/promises.md").read_text(), re.M)
        self.assertGreater(len(rows), 10)
        for promise, shown in rows:
            with self.subTest(promise):
                named = re.fullmatch(r"`(\S+)`: `(\w+)`", shown)
                self.assertIsNotNone(named, shown)
                text = (ROOT / named[1]).read_text()
                self.assertRegex(text, rf"(def |TEST\w*\([^)]*\b){named[2]}\b")


if __name__ == "__main__":
    unittest.main()
