"""What commands print, held against golden/*.golden: "$ command" (run in the tree's root by a shell), then what it
prints. Lines that begin with "! " stand for the standard error stream, "? N" for a status that is not 0.

UPDATE_GOLDEN=1 rewrites the texts that differ; the difference is reviewed like code.
"""

import os
import pathlib
import subprocess
import unittest

from lapdread_harness import LIMIT, SANITIZER_REPORT, SOURCE, environment

GOLDEN = pathlib.Path(__file__).parent / "golden"


def told(command):
    done = subprocess.run(["sh", "-c", command], stdin=subprocess.DEVNULL, capture_output=True, timeout=LIMIT,
                          cwd=SOURCE, env=environment(), check=False)
    text = done.stdout.decode(errors="backslashreplace")
    error = done.stderr.decode(errors="backslashreplace")
    if SANITIZER_REPORT.search(error):
        raise AssertionError(error)
    if text and not text.endswith("\n"):
        text += "\n"
    text += "".join(f"! {line}\n" for line in error.splitlines())
    if done.returncode != 0:
        text += f"? {done.returncode}\n"
    return text


def commands(text):
    """The text before the first command, and then each command with what follows it."""
    blocks = [[]]
    for line in text.splitlines(keepends=True):
        if line.startswith("$ "):
            blocks.append([])
        blocks[-1].append(line)
    return "".join(blocks[0]), [(block[0][2:].rstrip("\n"), "".join(block[1:])) for block in blocks[1:]]


class Golden(unittest.TestCase):
    maxDiff = None

    def test_commands_print_what_is_written_down(self):
        paths = sorted(GOLDEN.glob("*.golden"))
        self.assertTrue(paths)
        for path in paths:
            with self.subTest(path.name):
                before, blocks = commands(path.read_bytes().decode())
                self.assertTrue(blocks)
                now = before + "".join(f"$ {command}\n{told(command)}" for command, _ in blocks)
                if os.environ.get("UPDATE_GOLDEN") == "1":
                    path.write_bytes(now.encode())
                self.assertEqual(path.read_bytes().decode(), now)


if __name__ == "__main__":
    unittest.main()
