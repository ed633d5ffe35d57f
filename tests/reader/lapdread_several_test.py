"""Several D channels: a line of text names its own where more than one may come, and only there."""

import re
import unittest

from lapdread_harness import EXAMPLES, SOURCE, Folder, output

TRAPS = SOURCE / "tests/reader/data/traps"
BOTH = (TRAPS / "changeover-a.hex", TRAPS / "changeover-b.hex")
NFAS = ("--nfas", "changeover-a,changeover-b", *BOTH)
TWO = (EXAMPLES["net5"], EXAMPLES["5ess"])


class Several(Folder):
    def test_lines_of_calls_frames_and_findings_name_their_d_channel(self):
        for merge in ((), ("--merge",)):
            calls = output("calls", *merge, *TWO).splitlines()
            self.assertIn(" D channel ", calls[0])
            at = calls[0].index("D channel")
            names = [line[at:at + 9].strip() for line in calls[1:]]
            self.assertEqual((names.count("net5"), names.count("5ess")), (6, 4))
            frames = output(*merge, *TWO).splitlines()
            self.assertEqual({line.split()[3] for line in frames}, {"net5", "5ess"})
            findings = output("check", "--quiet", *merge, *TWO).splitlines()[::2]
            self.assertEqual([line.split()[2] for line in findings if "tei-denied" in line], ["5ess"])
            self.assertEqual([line.split()[2] for line in findings if "tei-assigned" in line], ["net5"])
            heads = [line for line in output("ladder", *merge, *TWO).splitlines() if line.startswith("call ")]
            self.assertEqual([" D channel 5ess " in line or line.endswith(" D channel 5ess") for line in heads].count(True), 4)

    def test_one_says_nothing_about_its_name(self):
        (self.folder / "t.20010514T080000Z.pcap").write_bytes(EXAMPLES["net5"].read_bytes())
        (self.folder / "t.20010514T090000Z.pcap").write_bytes(EXAMPLES["5ess"].read_bytes())
        for words in ((EXAMPLES["net5"],), ("--trunk", "mine", *TWO), sorted(self.folder.iterdir())):
            self.assertNotIn("D channel", output("calls", *words))
            self.assertNotIn("D channel", output("ladder", *words))
            self.assertEqual(len(output("--first", "1", "--layer", "2", *words).splitlines()[0].split()), 8)
            self.assertNotRegex(output("check", "--quiet", *words), r"(mine|net5|5ess|\bt) frame")

    def test_a_rotated_log_is_of_the_same_d_channel(self):
        """A call that is cut in two by the rotation is one call, with one number."""
        lines = [line for line in TRAPS.joinpath("changeover-a.hex").read_text().splitlines(keepends=True) if line.strip()]
        (self.folder / "pri1.hex.1").write_text("".join(lines[:-2]))
        (self.folder / "pri1.hex").write_text("".join(lines[-2:]))
        (self.folder / "whole").write_text("".join(lines))
        self.assertEqual(output("calls", self.folder / "pri1.hex.1", self.folder / "pri1.hex"), output("calls", self.folder / "whole"))

    def test_columns_are_the_users_own(self):
        self.assertEqual(output("--columns", "n", "--first", "1", *TWO).split(), ["1"])
        self.assertEqual(output("--wide", "--first", "1", *TWO).split().count("net5"), 1)

    def test_a_ladder_of_a_changeover_tells_the_d_channel_of_each_arrow(self):
        text = output("ladder", "--ascii", "--width", "120", "--dchannels", *NFAS)
        arrows = [line for line in text.splitlines() if re.search(r"[|](<-|<[.]|-|[.])", line)]
        on = [re.search(r"[|]  on changeover-([ab])", line).group(1) for line in arrows]
        self.assertEqual("".join(on), "aaaaaabbb")
        self.assertNotIn("D channel", text)  # the call is of the group
        self.assertNotIn("on changeover", output("ladder", *NFAS))
        for form in ("--svg", "--mermaid"):
            picture = output("ladder", form, *NFAS)
            self.assertEqual((picture.count("on changeover-a"), picture.count("on changeover-b")), (6, 3), form)

    def test_a_ladder_names_the_d_channel_of_each_arrow_if_it_is_told_so(self):
        self.assertIn("|  on net5  speech", output("ladder", "--ascii", "--width", "120", "--dchannels", EXAMPLES["net5"]))
        self.assertNotIn("on net5", output("ladder", "--mermaid", EXAMPLES["net5"]))


if __name__ == "__main__":
    unittest.main()
