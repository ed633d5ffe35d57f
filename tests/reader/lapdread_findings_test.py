"""The page of findings explains each finding that the examples and the recorded frames have, and no other."""

import json
import re
import unittest

from lapdread_harness import EXAMPLES, RECORDED, SOURCE, output

PAGE = SOURCE / "docs/user/findings.md"
ROW = re.compile(r"^\| `([^`]+)` \| (\d+) \| `([^`]+)` \| \S", re.M)


class Findings(unittest.TestCase):
    def test_messages_of_the_examples_are_explained(self):
        explained = [(file, int(frame), name) for file, frame, name in ROW.findall(PAGE.read_text())]
        found = []
        for path in [*EXAMPLES.values(), *RECORDED]:
            for line in output("check", "--jsonl", path).splitlines():
                finding = json.loads(line)
                found.append((str(path.relative_to(SOURCE)), finding["frame"], finding["finding"]))
        self.assertTrue(found)
        self.assertEqual(sorted(explained), sorted(found))


if __name__ == "__main__":
    unittest.main()
