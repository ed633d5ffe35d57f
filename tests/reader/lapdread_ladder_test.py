"""Ladders of whatever there is: they fit their width, pictures are well formed, and no text of a frame gets through."""

import json
import re
import unittest
import xml.etree.ElementTree as xml

from lapdread_harness import EXAMPLES, RECORDED, SOURCE, Folder, output

TRAPS = sorted((SOURCE / "tests/reader/data/traps").glob("*.hex"))
INPUTS = [*EXAMPLES.values(), *RECORDED, *TRAPS]
SVG = "{http://www.w3.org/2000/svg}"
ARROW = re.compile(r"[|](?:<-* [A-Za-z0-9 ]+? -*|-* [A-Za-z0-9 ]+? -*>)[|]")  # of a message, in ASCII


class Ladders(unittest.TestCase):
    def test_fit_the_width(self):
        for path in INPUTS:
            for width in (40, 57, 80, 132):
                with self.subTest(path.name, width=width):
                    lines = output("ladder", "--quiet", "--width", width, path).splitlines()
                    self.assertLessEqual(max(map(len, lines), default=0), width)

    def test_are_ascii_where_the_locale_has_nothing_else(self):
        for more in ({"LC_ALL": "C"}, {"LC_ALL": "", "LC_CTYPE": "", "LANG": ""}, {"LC_ALL": "en_US.ISO-8859-1"}):
            self.assertTrue(output("ladder", EXAMPLES["net5"], **more).isascii(), more)
        self.assertFalse(output("ladder", EXAMPLES["net5"], LC_ALL="", LC_CTYPE="", LANG="de_DE.utf8").isascii())

    def test_show_every_frame_of_every_call_in_its_direction(self):
        for path in INPUTS:
            with self.subTest(path.name):
                frames = {frame["n"]: frame for line in output("convert", "--quiet", "--to", "jsonl", path).splitlines()
                          for frame in [json.loads(line)] if "n" in frame}
                for line in output("calls", "--quiet", "--jsonl", path).splitlines():
                    call = json.loads(line)
                    shown = output("ladder", "--quiet", "--ascii", "--width", "120", "--call", call["call"], path)
                    arrows = ARROW.findall(shown)
                    ours = [arrow for arrow in arrows if arrow.endswith(">|")]
                    listed = [int(word) for word in
                              output("--quiet", "--columns", "n", "--call", call["call"], path).split()]
                    self.assertEqual(len(arrows), len(listed), shown)
                    sent = [number for number in listed if frames[number]["dir"] == "tx"]
                    self.assertEqual(len(ours), len(sent), shown)

    def test_leave_no_empty_line_in_a_note_that_has_no_time(self):
        text = output("ladder", "--quiet", "--mermaid", SOURCE / "tests/reader/data/traps/three-days.hex")
        self.assertRegex(text, r"\n    Note over us,peer: \d{4}-\d\d-\d\d\n")
        self.assertNotIn(": <br/>", text)

    def test_pictures_are_well_formed(self):
        for path in INPUTS:
            with self.subTest(path.name):
                root = xml.fromstring(output("ladder", "--quiet", "--svg", path))
                self.assertEqual(root.tag, SVG + "svg")
                height, width = int(root.get("height")), int(root.get("width"))
                for element in root.iter():
                    for name in ("x", "x1", "x2"):
                        self.assertLessEqual(int(element.get(name, 0)), width)
                    for name in ("y", "y1", "y2"):
                        self.assertLessEqual(int(element.get(name, 0)), height)
                arrows = [line for line in root.iter(SVG + "line") if line.get("class") == "message"]
                whole = output("ladder", "--quiet", "--ascii", "--width", "120", path)
                self.assertEqual(len(arrows), len(ARROW.findall(whole)))


class Texts(Folder):
    # A SETUP whose display text is a command to a terminal, markup, and what Mermaid would obey.
    DISPLAY = b"\x1b[31m</text>&\"#;end\x9b\n%%{x}%%"

    def test_texts_of_frames_do_no_harm(self):
        setup = bytes([0x02, 0x01, 0, 0, 8, 1, 1, 5, 0x28, len(self.DISPLAY)]) + self.DISPLAY
        (self.folder / "evil.hex").write_text(f"RX 2026-11-21T11:25:33Z {setup.hex()}\n")
        text = output("ladder", "--quiet", "--width", "120", "evil.hex", cwd=self.folder)
        self.assertIn(r"\x1b[31m</text>", text)
        self.assertNotIn("\x1b", text)
        picture = output("ladder", "--quiet", "--svg", "evil.hex", cwd=self.folder)
        words = "".join(element.text or "" for element in xml.fromstring(picture).iter(SVG + "text"))
        self.assertIn(r"\x1b[31m</text>&", words)
        diagram = output("ladder", "--quiet", "--mermaid", "evil.hex", cwd=self.folder)
        message = next(line for line in diagram.splitlines() if "SETUP" in line)
        self.assertNotRegex(message.replace("<br/>", "").replace("->>", ""), r"[<>&\"%{}\x1b]")
        self.assertNotRegex(re.sub(r"#\d+;", "", message), "[#;]")


if __name__ == "__main__":
    unittest.main()
