"""The commands of docs/user, run on logs of the software board, print what the pages show.

Before such a block stands a comment that names the trunk: <!-- log: NAME --> or <!-- log: NAME PROTOCOL -->. NAME.frames
in this folder says what passes on it, in the form of examples/make_captures.py.
"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

HERE = pathlib.Path(__file__).resolve().parent
ROOT = HERE.parents[1]
sys.path.insert(0, str(ROOT / "examples"))
import make_captures  # noqa: E402

LIMIT = 120  # seconds
PAGES = ROOT / "docs" / "user"
BLOCK = re.compile(r"<!-- log: (\S+)(?: (\S+))? -->\n\n((?:    .*\n|\n(?=    ))+)")
FUNCTION = re.compile(r"^    (frames\(\) \{\n(?:    .*\n)+?    \}\n)", re.M)

# The last frame is one that is reported on the screen: then all others are decoded.
MARK = (0, False, bytes(300))
MARK_ON_SCREEN = "Frame Error\n"


def blocks():
    """(page, trunk, protocol, what the block shows)"""
    for page in sorted(PAGES.glob("*.md")):
        for name, protocol, text in BLOCK.findall(page.read_text()):
            yield page.name, name, protocol or "net5", re.sub(r"^    ", "", text, flags=re.M)


def session(shown):
    """A block's commands, each with the output shown below it."""
    parts = re.split(r"^\$ (.*)\n", shown, flags=re.M)[1:]
    return list(zip(parts[::2], parts[1::2]))


def without_trailing_blanks(text):
    """Pages have no blanks at the end of lines, although the log has."""
    return re.sub(r"[ \t]+$", "", text, flags=re.M)


class Commands(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="lapdmon-docs-")
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def make_log(self, name, protocol):
        """lapdmon.log, with the frames of the trunk and without the mark."""
        frames = make_captures.read(HERE / f"{name}.frames")
        ticks = frames[-1][0]
        capture = self.folder / "frames.pcap"
        capture.write_bytes(make_captures.pcap([*frames, (ticks, *MARK[1:])]))
        environment = {key: value for key, value in os.environ.items()
                       if key not in ("REMOTE_NORV", "HOST", "LD_LIBRARY_PATH")}
        with subprocess.Popen([os.environ["SOFTBOARD"], "--frames", capture, "--protocol", protocol, "--rate", "max", "--",
                               os.environ["LAPDMON"], "-b1"], cwd=self.folder, env=environment, text=True,
                              stdin=subprocess.PIPE, stdout=subprocess.PIPE) as program:
            for line in program.stdout:
                if line == MARK_ON_SCREEN:
                    break
            program.communicate("q", timeout=LIMIT)
        log = (self.folder / "lapdmon.log").read_bytes()
        end = log.rindex(b"Oversized frame")
        (self.folder / "lapdmon.log").write_bytes(log[:log.rindex(b"\n\n", 0, end) + 1])

    def run_command(self, command):
        function = FUNCTION.search((PAGES / "reading-the-log.md").read_text())[1]
        return subprocess.run(["bash", "-c", function + command], cwd=self.folder, text=True, timeout=LIMIT,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False).stdout

    def test_each_prints_what_the_page_shows(self):
        shown = list(blocks())
        self.assertGreater(len(shown), 10)
        for page, name, protocol, text in shown:
            self.make_log(name, protocol)
            for command, output in session(text):
                with self.subTest(page=page, log=name, command=command):
                    self.assertEqual(without_trailing_blanks(self.run_command(command)), output)


if __name__ == "__main__":
    unittest.main()
