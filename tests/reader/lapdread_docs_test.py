"""Commands in the user page, "    $ lapdread ...", print what stands below them there. UPDATE_GOLDEN=1 writes it."""

import os
import unittest

from lapdread_golden_test import told
from lapdread_harness import SOURCE

PAGE = SOURCE / "docs/user/lapdread.md"
INDENT = "    "


def refreshed(text):
    """The page with the output of each command as it is now. An example ends at the first line without indent."""
    lines, result, skipping = text.splitlines(), [], False
    for line in lines:
        if skipping and (line.startswith(INDENT) or line == ""):
            continue
        if skipping:
            result.append("")
        skipping = False
        result.append(line)
        if line.startswith(INDENT + "$ "):
            output = told(line[len(INDENT) + 2:])
            result.extend((INDENT + out).rstrip() for out in output.rstrip("\n").splitlines())
            skipping = True
    return "\n".join(result) + "\n"


class Page(unittest.TestCase):
    maxDiff = None

    def test_shows_what_the_commands_print(self):
        now = refreshed(PAGE.read_text())
        if os.environ.get("UPDATE_GOLDEN") == "1":
            PAGE.write_text(now)
        self.assertGreater(now.count("\n    $ lapdread"), 8)
        self.assertEqual(PAGE.read_text(), now)


if __name__ == "__main__":
    unittest.main()
