"""What ends a trace: the operator's "q", or a signal."""

import os
import re
import signal
import unittest

from harness import SystemTest, wait_until_full

OFF = ["26 CancelEvt {Type 2}", "8 SetParm {Parm 10 Val 0}"]


class Operator(SystemTest):
    def assert_orderly(self, program):
        """Everything was switched off and given back, and the log is whole."""
        # The display thread may still be at the oversized frame when the first thread says that it ends.
        oversized = ("Oversized frame, frame will not be interpreted", "Frame Error")
        screen = [line for line in program.screen.lines() if line not in oversized]
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

    def test_a_signal_while_the_trace_is_being_switched_on_switches_it_off_again(self):
        for command in (8, 22):
            with self.subTest(f"message type {command}"):
                program = self.on_other_library(f"interrupt={command}").ends()
                self.assertEqual(program.talk.lines()[-4:], ["heard 8", "heard 22", "heard 26", "heard 8"])
                self.assertIn("One moment. Program Exiting", program.screen.lines())
                self.assertIn("DMS100 Switch \n", program.log())

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
        for first, second in ((signal.SIGINT, signal.SIGTERM), (signal.SIGTERM, signal.SIGTERM),
                              (signal.SIGHUP, signal.SIGINT)):
            with self.subTest(f"{first.name}, {second.name}"):
                program = self.hanging()
                program.gets(first)
                program.talk.wait("heard 26")
                program.gets(second)
                program.ends(status=-second)
                self.assertEqual(program.screen.lines()[-1], "One moment. Program Exiting")

    def test_a_signal_kills_a_shutdown_that_q_began_and_that_hangs(self):
        program = self.hanging()
        program.types("q")
        program.talk.wait("heard 26")
        program.gets(signal.SIGTERM)
        program.ends(status=-signal.SIGTERM)

    def test_a_SIGHUP_never_ends_a_shutdown(self):
        """A terminal that closes sends it twice."""
        program = self.hanging()
        program.gets(signal.SIGHUP)
        program.talk.wait("heard 26")
        program.gets(signal.SIGHUP)
        program.gets(signal.SIGHUP)
        program.talk.wait("heard 8", times=2)  # the request timed out, and the shutdown goes on
        program.ends()
        self.assertEqual(program.screen.lines()[-1], "general Exception caught in lapdmon(215)")

    def test_a_SIGHUP_that_was_ignored_from_the_start_stays_so_whatever_comes(self):
        program = self.hanging(under=("sh", "-c", 'trap "" HUP; exec "$@"', "sh"))
        self.assertTrue(self.ignores_SIGHUP(program))
        program.gets(signal.SIGHUP)
        program.types("q")
        program.talk.wait("heard 26")
        program.gets(signal.SIGHUP)
        self.assertTrue(self.ignores_SIGHUP(program))
        program.gets(signal.SIGINT)
        program.ends(status=-signal.SIGINT)

    def test_a_second_signal_gives_up_a_log_that_nobody_reads(self):
        """The rest is counted, and nothing is killed."""
        for first in ("q", signal.SIGINT):
            with self.subTest(first):
                path = self.folder / f"log-{str(first)[:3]}"
                os.mkfifo(path)
                reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
                self.addCleanup(os.close, reader)
                program = self.on_board("--rate", "max", "--loop", run=("lapdmon", "-b1", "-f", path.name))
                wait_until_full(reader)
                program.journal.wait(" EvtDetected ", times=2000)  # far more than the FIFO holds
                program.types("q") if first == "q" else program.gets(first)
                program.journal.wait("SetParmCmplt", times=2)
                # From here on the shutdown only writes out. It may be some steps before that.
                program.wait_until_idle()
                program.gets(signal.SIGHUP)
                program.gets(signal.SIGTERM)
                program.ends(status=1, errors=re.compile(
                    rf"\A{path.name}: given up, since nobody reads it\n{path.name}: frames lost: [1-9]\d*\n"
                    r"lapdmon: frames lost because the end did not wait for the log: [1-9]\d*\n\Z"))
                self.assert_all_counted(program, reader)
                self.assertEqual(program.heard()[-2:], OFF)
                self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")

    def assert_all_counted(self, program, reader):
        """Each frame that the board sent is in the log, or among those that the program says are lost. The last one in the
        log may be cut, and is lost then."""
        text = b""
        while some := os.read(reader, 65536):
            text += some
        lost = sum(int(line.split()[-1]) for line in program.errors.lines() if "frames lost" in line)
        sent = sum(" EvtDetected " in line for line in program.journal.lines())
        self.assertIn(text.count(b"Frame: Time") + lost - sent, (0, 1))

    def ignores_SIGHUP(self, program):
        return int(program.status("SigIgn"), 16) >> (signal.SIGHUP - 1) & 1 == 1

    def hanging(self, under=()):
        """A trace whose shutdown hangs for 5 seconds: nobody answers CancelEvt."""
        program = self.on_other_library("silent=26", under=under)
        program.screen.wait("Frame Error")
        return program


if __name__ == "__main__":
    unittest.main()
