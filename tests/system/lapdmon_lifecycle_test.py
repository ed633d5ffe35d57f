"""What passes between program and board from start to stop, and what happens when the board does not play along."""

import re
import signal
import unittest

from harness import SystemTest

ADDRESS = r"{Node \w+ Board \w+ Processor \w+ Component \w+ Instance \w+}"
CCS = "{Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x1}"


def refusal(command):
    """The report of an error reply, as a regular expression."""
    octets = "".join(f"{octet:#x} " if octet else "0 " for octet in (command, 0, 0, 0, 0xE9, 3, 0, 0))
    return (f"vela Exception caught\nAddressable::UnexpectedMsg ObjSource: {{TgtDesc: {CCS} HostDesc: {ADDRESS} "
            f"CmdMsgType {command:#x} RespMsg: {{MsgType: 0 Source: {CCS} Target: {ADDRESS} Size: 8 Trans: \\d+ "
            f"Body: {{ByteData {{{octets}}}}}}}\n")


class Lifecycle(SystemTest):
    def test_the_board_hears_start_and_stop_in_order(self):
        program = self.traces().quits()
        host = re.search(r"RetAddr (\S+)", "\n".join(program.heard())).group(1)
        self.assertEqual(program.heard(), [
            "8388669 CompFind {CompStart 0/1/1/255/0 attr [0=18]}",
            "8388669 CompFind {CompStart 0/1/255/255/1 attr [0=21]}",
            "18 GetParm {Num 7}",
            "8 SetParm {Parm 10 Val 1}",
            f"22 DetectEvt {{RetAddr {host} EvtType 2 EvtGroup 0}}",
            "26 CancelEvt {Type 2}",
            "8 SetParm {Parm 10 Val 0}",
        ])

    def test_events_go_to_the_queue_that_subscribed(self):
        program = self.traces().quits()
        journal = program.journal.lines()
        subscribed = next(line for line in journal if " DetectEvt " in line)
        event = next(line for line in journal if " EvtDetected " in line)
        host = re.search(r"RetAddr (\S+)", subscribed).group(1)
        self.assertIn(f" from {host} ", subscribed)
        self.assertIn(f" to {host} ", event)

    def test_buffers_and_queues_are_given_back(self):
        program = self.traces("--rate", "max", "--loop")
        program.screen.wait("Frame Error", times=100)
        program.quits()
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")

    def test_a_board_that_is_not_there_is_reported(self):
        program = self.on_board(run=("lapdmon", "-b2")).ends(status=1)
        self.assertRegex("\n".join(program.screen.lines()[5:]) + "\n",
                         r"\Avela Exception caught\n"
                         r"Addressable::Timeout ObjSource: {TgtDesc: {Node 0 Board 2 Processor 0 Component 0 Instance 0}"
                         r" HostDesc: {Node \d+ Board \d+ Processor \d+ Component \d+ Instance \d+}"
                         r" CmdMsgType: 0x80003d RetMsgType: 0x800007 Trans: 10000 Timeout: 5000ms\n\Z")
        self.assertEqual(program.heard(), [])
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")

    def test_a_D_channel_that_is_not_there_is_reported(self):
        program = self.on_board(run=("lapdmon", "-b1", "-d9")).ends(
            status=1, errors="lapdmon: board 1 found no D channel 9\n")
        screen = program.screen.lines()
        self.assertEqual(screen[5], "TSC Component Information{Node 0 Board 1 Processor 1 Component 18 Instance 0}")
        self.assertEqual(screen[6], "vela Exception caught")
        self.assertRegex(screen[7], r"^Addressable::UnexpectedMsg ObjSource: .* CmdMsgType 0x80003d RespMsg: ")
        self.assertEqual(len(screen), 8)
        self.assertEqual([command.split()[1] for command in program.heard()], ["CompFind", "CompFind"])
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")

    def test_a_refusal_at_the_start_is_reported_and_ends_the_program(self):
        for name, command in (("GetParm", 18), ("SetParm", 8), ("DetectEvt", 22)):
            with self.subTest(name):
                program = self.on_other_library(f"error={command}").ends(status=1)
                self.assertRegex(program.screen.text(), refusal(command) + r"\Z")
                self.assertNotIn("One moment", program.screen.text())

    def test_a_start_that_fails_switches_off_what_may_be_on(self):
        for script in ("error=8", "error=22", "silent=22"):
            with self.subTest(script):
                program = self.on_other_library(script).ends(status=1)
                talk = program.talk.lines()
                self.assertEqual(talk[talk.index("heard 8"):],
                                 ["heard 8", *(["heard 22"] if "22" in script else []), "heard 26", "heard 8"])

    def test_a_start_that_fails_while_events_come_ends_the_program(self):
        program = self.on_other_library("flood error=22")
        program.ends(status=1, errors=re.compile(r"\A(\n\*{44}\nUnregisterd |\Z)"))
        self.assertRegex(program.screen.text(), r"\nvela Exception caught\nAddressable::.*\n\Z")

    def test_a_refusal_during_the_shutdown_does_not_keep_the_next_step_from_being_taken(self):
        program = self.on_other_library("error=26")
        program.screen.wait("Frame Error")
        program.quits()
        self.assertRegex(program.screen.text(),
                         r"One moment. Program Exiting\n" + refusal(26) +
                         r"general Exception caught in lapdmon\(215\)\n\Z")
        self.assertEqual(program.talk.lines()[-2:], ["heard 26", "heard 8"])
        self.assertTrue(program.log().endswith("Frame Error \n"))

    def test_an_exit_switches_the_trace_off_too(self):
        program = self.on_other_library("exits")
        program.screen.wait("Frame Error")
        program.gets(signal.SIGUSR1)
        program.ends(status=5)
        self.assertEqual(program.screen.lines()[-2:],
                         ["One moment. Program Exiting", "general Exception caught in lapdmon(215)"])
        self.assertEqual(program.talk.lines()[-2:], ["heard 26", "heard 8"])
        self.assertTrue(program.log().endswith("Frame Error \n"))

    def test_the_log_is_closed_before_the_board_is_waited_for(self):
        program = self.on_other_library("stuck-close")
        program.screen.wait("Frame Error")
        program.types("q")
        program.talk.wait("the last queue")
        self.assertTrue(program.log().endswith("Frame Error \n"))
        self.assertNotIn(str(self.folder / "lapdmon.log"), program.open_files())

    def test_a_library_that_opens_no_queue_is_reported(self):
        program = self.on_other_library("no-queue").ends(status=1)
        self.assertEqual(program.screen.lines()[5:], ["general Exception caught in lapdmon(749)"])

    def test_a_library_without_message_buffers_is_reported(self):
        program = self.on_other_library("no-memory").ends(status=1)
        self.assertEqual(program.screen.lines()[5:], ["general Exception caught in lapdmon(749)"])


if __name__ == "__main__":
    unittest.main()
