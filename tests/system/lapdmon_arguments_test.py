"""The command line, from a shell's point of view: exact screen, exact log, exit status."""

import os
import unittest

from harness import BANNER, LAPDMON, MARK_IN_LOG, MARK_ON_SCREEN, SystemTest

USAGE = """\
syntax: lapdmon -b# [-f xxxx] [-d#]
   -b#      - board number, required
   -d#      - D-Channel number, optional, default is 1
   -f name  - Enable logging to file, optional 
   -h       - this message

"""


class Arguments(SystemTest):
    def traces_as(self, *arguments, log, dchannel=1):
        """One whole run: everything on the screen and everything in the log."""
        program = self.traces("--dchannels", "2", run=("lapdmon", *arguments))
        program.quits()
        screen = program.screen.text()
        self.assertEqual(screen[:len(f"filename: {log}\n")], f"filename: {log}\n")
        banner = BANNER.match(screen, len(f"filename: {log}\n"))
        self.assertIsNotNone(banner, screen)
        self.assertEqual(
            screen[banner.end():],
            "TSC Component Information{Node 0 Board 1 Processor 1 Component 18 Instance 0}\n"
            f"CCS instance Number{{Node 0 Board 1 Processor 1 Component 21 Instance {dchannel}}}\n"
            "CCS protocol type is 7\n"
            "NET5 Switch\n" + MARK_ON_SCREEN +
            "One moment. Program Exiting\n"
            "general Exception caught in lapdmon(215)\n")
        self.assertEqual(
            program.log(log),
            banner.group() + "NET5 Switch \n"
            "\nDATE\nRX Frame: Time = 0.0\n" + MARK_IN_LOG)
        written = [name for name in os.listdir(self.folder) if not name.endswith((".pcap", "-journal"))]
        self.assertEqual(written, [log])

    def shows_usage(self, *arguments, before=""):
        program = self.start([LAPDMON, *arguments]).ends()
        self.assertEqual(program.screen.text(), before + USAGE)
        self.assertEqual(os.listdir(self.folder), [])

    def test_the_board_alone_traces_D_channel_1_to_the_default_log(self):
        self.traces_as("-b1", log="lapdmon.log")

    def test_options_behind_the_file_name_are_not_read(self):
        self.traces_as("-b1", "-f", "trace.txt", "-d2", log="trace.txt")

    def test_options_before_the_file_name_are_read(self):
        self.traces_as("-b1", "-d2", "-f", "trace.txt", log="trace.txt", dchannel=2)

    def test_a_joined_file_name_loses_its_first_character(self):
        self.traces_as("-b1", "-ftrace.txt", log="race.txt")

    def test_a_missing_file_name_leaves_the_default(self):
        self.traces_as("-B1", "-I2", "-f", log="lapdmon.log", dchannel=2)

    def test_a_log_that_exists_is_emptied(self):
        self.file("lapdmon.log", 100000 * "old\n")
        self.traces_as("-b1", log="lapdmon.log")

    def test_no_board_shows_the_usage(self):
        self.shows_usage("-d2")

    def test_no_argument_shows_the_usage(self):
        self.shows_usage()

    def test_a_help_request_shows_the_usage(self):
        for arguments in (["-h"], ["-H"], ["-?"], ["-h", "-b1"], ["-b1", "-h"]):
            with self.subTest(arguments):
                self.shows_usage(*arguments)

    def test_an_unknown_option_is_told_before_the_usage(self):
        self.shows_usage("-b1", "-x", before="Unknown Option\n")

    def test_a_number_as_a_word_of_its_own_is_not_read(self):
        program = self.on_board("--board", "0", run=("lapdmon", "-b", "1"))
        program.screen.wait("NET5 Switch")
        program.journal.wait("DetectEvtCmplt")
        program.quits()
        self.assertIn("TSC Component Information{Node 0 Board 0 Processor 1 Component 18 Instance 0}",
                      program.screen.lines())

    def test_a_log_that_cannot_be_created_ends_the_program_with_the_reason(self):
        program = self.on_board(run=("lapdmon", "-b1", "-f", "missing/trace.txt")).ends(
            status=1, errors="lapdmon: cannot open missing/trace.txt: No such file or directory\n")
        self.assertEqual(program.screen.text(), "filename: missing/trace.txt\n")
        self.assertEqual(program.heard(), [])

    def test_a_log_that_another_trace_writes_is_refused_and_left_as_it_is(self):
        first = self.traces()
        second = self.on_board().ends(status=1, errors="lapdmon: cannot open lapdmon.log: another trace writes to it\n")
        self.assertEqual(second.screen.text(), "filename: lapdmon.log\n")
        self.assertEqual(second.heard(), [])
        self.assertTrue(first.quits().log().endswith("Frame Error \n"))


if __name__ == "__main__":
    unittest.main()
