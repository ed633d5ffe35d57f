"""The protocol type that the trunk reports."""

import unittest

from harness import MARK, SystemTest, capture


class Protocol(SystemTest):
    def reports(self, protocol, number, screen, log):
        program = self.traces("--protocol", protocol).quits()
        lines = program.screen.text().split("\n")
        at = lines.index(f"CCS protocol type is {number}")
        self.assertEqual(lines[at + 1], screen)
        self.assertEqual(program.log().split("\n")[4], log)

    def test_4ess(self):
        self.reports("4ess", 1, "4ESS Switch ", "4ESS Switch ")

    def test_5ess(self):
        self.reports("5ess", 2, "5ESS Switch ", "5ESS Switch ")

    def test_dms100(self):
        self.reports("dms100", 3, "DMS100 Switch", "DMS100 Switch ")

    def test_ntt(self):
        self.reports("ntt", 4, "NTT Switch", "NTT Switch ")

    def test_net5(self):
        self.reports("net5", 7, "NET5 Switch", "NET5 Switch ")

    def test_ni2(self):
        self.reports("ni2", 12, "NI2 Switch", "NI2 Switch ")

    def test_an_unknown_type_ends_the_program_before_anything_is_switched_on(self):
        for number in ("5", "10", "0", "4294967295"):
            with self.subTest(number):
                program = self.on_board("--protocol", number)
                program.ends(status=1, errors="Unknow Protocol -- I don't know how to interprete. "
                                              "Program is terminating!\n")
                self.assertEqual(program.screen.lines()[-1], f"CCS protocol type is {number}")
                self.assertEqual([command.split()[1] for command in program.heard()],
                                 ["CompFind", "CompFind", "GetParm"])
                self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")
                self.assertTrue(program.log().endswith(" 1.00-Build-04 lapdmon\n"))

    def test_the_frames_are_decoded_as_the_type_says(self):
        # Codeset 7 shows on one of the trunks only.
        frame = (0, bytes.fromhex("020100020801010597"))
        for protocol, shown in (("4ess", True), ("net5", False)):
            with self.subTest(protocol):
                program = self.traces("--protocol", protocol, frames=capture(frame, MARK)).quits()
                self.assertEqual("  1:           CODESET 7(0x97)\n" in program.log(), shown)


if __name__ == "__main__":
    unittest.main()
