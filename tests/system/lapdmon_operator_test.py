"""What ends a trace: the operator's "q", or a signal."""

import signal
import unittest

from harness import SystemTest

OFF = ["26 CancelEvt {Type 2}", "8 SetParm {Parm 10 Val 0}"]


class Operator(SystemTest):
    def assert_orderly(self, program):
        """Everything was switched off and given back, and the log is whole."""
        screen = program.screen.lines()
        self.assertEqual(screen[-2:], ["One moment. Program Exiting", "general Exception caught in lapdmon(215)"])
        self.assertEqual(program.heard()[-2:], OFF)
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")
        self.assertTrue(program.log().endswith("Frame Error \n"))

    def test_q_ends_the_trace_at_once(self):
        program = self.traces()
        program.types("q\n")
        program.ends()
        self.assertEqual(program.typed_but_unread(), "\n")
        self.assert_orderly(program)

    def test_q_needs_no_line_end(self):
        program = self.traces()
        program.types("q")
        self.assert_orderly(program.ends())

    def test_a_signal_ends_the_trace_in_order(self):
        for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
            with self.subTest(number.name):
                program = self.traces()
                program.gets(number)
                self.assert_orderly(program.ends())

    def test_a_signal_ends_the_pause_after_another_character(self):
        program = self.traces()
        program.types("xq")
        program.wait_until_unread(1)  # x was read: the pause has begun
        program.gets(signal.SIGTERM)
        program.ends()
        self.assertEqual(program.typed_but_unread(), "q")
        self.assert_orderly(program)

    def test_a_capital_Q_is_another_character(self):
        program = self.traces()
        program.types("Qq")
        program.wait_until_unread(1)
        program.gets(signal.SIGINT)
        program.ends()
        self.assertEqual(program.typed_but_unread(), "q")

    def test_the_trace_goes_on_at_the_end_of_input(self):
        program = self.traces("--rate", "50", "--loop")
        program.ends_input()
        seen = sum("Frame Error" in line for line in program.screen.lines())
        program.screen.wait("Frame Error", times=seen + 10)
        program.gets(signal.SIGTERM)
        self.assert_orderly(program.ends())

    def test_a_second_signal_kills_a_shutdown_that_hangs(self):
        for first, second in ((signal.SIGINT, signal.SIGTERM), (signal.SIGTERM, signal.SIGTERM)):
            with self.subTest(f"{first.name}, {second.name}"):
                program = self.on_other_library("silent=26")  # nobody answers CancelEvt
                program.screen.wait("Frame Error")
                program.gets(first)
                program.talk.wait("heard 26")
                program.gets(second)
                program.ends(status=-second)
                self.assertEqual(program.screen.lines()[-1], "One moment. Program Exiting")


if __name__ == "__main__":
    unittest.main()
