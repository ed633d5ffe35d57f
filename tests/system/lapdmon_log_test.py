"""The log: what becomes of frames."""

import re
import time
import unittest
from signal import SIGKILL

from harness import (BANNER, BLANKS, LIMIT, MARK, MARK_IN_LOG, MARK_ON_SCREEN, RECEIVED, TRANSMITTED, SystemTest,
                     capture, time_of)

FRAMES = [
    (TRANSMITTED, bytes.fromhex("00 01 7f")),
    (RECEIVED, bytes.fromhex("00 01 73")),
    (TRANSMITTED, bytes.fromhex("02 01 00 00  08 02 00 01 0f  a1  2c 02 31 32")),
    (RECEIVED, bytes.fromhex("02 01 01 02")),
    (RECEIVED, bytes.fromhex("fc ff 03 0f 12 05 01 ff")),
    (RECEIVED, bytes.fromhex("00 01 02 04  08 01 85 7d  96  6a 02 07 1f")),
]

LOG = (
    "\n"
    + BLANKS + "DATE\n"
    + BLANKS + "TX Frame: Time = 0.0\n"
    + BLANKS + "Response=0    SAPI=0x00\n"
    + BLANKS + "TEI=0x00\n"
    + BLANKS + "    0x7f  Set Asynchronous Balanced Mode\n"
    + BLANKS + "Hex Dump: \n"
    + BLANKS + "00 01 7f \n"
    "\n"
    "DATE\n"
    "RX Frame: Time = 0.200\n"
    "Response=0    SAPI=0x00\n"
    "TEI=0x00\n"
    "    0x73  Unnumbered Acknowledgment\n"
    "Hex Dump: \n"
    "00 01 73 \n"
    "\n"
    + BLANKS + "DATE\n"
    + BLANKS + "TX Frame: Time = 0.400\n"
    + BLANKS + "Command=1   SAPI=0x00\n"
    + BLANKS + "TEI=0x00\n"
    + BLANKS + "0x00 0x00  Information\n"
    + BLANKS + "PD=0x08 Dest=0 CR=0x0001\n"
    + BLANKS + "CALL CONNECT ACKNOWLEDGE(0x0f)\n"
    + BLANKS + "  1:           SENDING COMPLETE(0xa1)\n"
    + BLANKS + "  *Unknown IE: 0x2c\n"
    + BLANKS + "  *Unknown IE Length(0x02)\n"
    + BLANKS + "  *Unknown IE Content(0x31)\n"
    + BLANKS + "  *Unknown IE Content(0x32)\n"
    "\n"
    + BLANKS + "Hex Dump: \n"
    + BLANKS + "02 01 00 00 08 02 00 01 0f a1 \n"
    + BLANKS + "2c 02 31 32 \n"
    "\n"
    "DATE\n"
    "RX Frame: Time = 0.600\n"
    "Command=1   SAPI=0x00\n"
    "TEI=0x00\n"
    "0x01 0x02  Receive Ready\n"
    "Hex Dump: \n"
    "02 01 01 02 \n"
    "\n"
    "DATE\n"
    "RX Frame: Time = 0.800\n"
    "Response=0    SAPI=0x3f\n"
    "TEI=0x7f\n"
    "    0x03  Unnumbered Information\n"
    "    0x0f  Layer ME ID\n"
    "    0x125 Reference Number\n"
    "    0x01 Message ID\n"
    "    0xff Action ID\n"
    "Hex Dump: \n"
    "fc ff 03 0f 12 05 01 ff \n"
    "\n"
    "DATE\n"
    "RX Frame: Time = 1.0\n"
    "Response=0    SAPI=0x00\n"
    "TEI=0x00\n"
    "0x02 0x04  Information\n"
    "PD=0x08 Orig=1CR=0x85\n"
    "STATUS(0x7d)\n"
    "  1:            Locking Shift(0x96)\n"
    "\t     1------- Extension Bit \n"
    "       -001---- Shift Identifier \n"
    "       ----0--- Locking Shift\t\n"
    "      -----110 CODESET 6 \n"
    "  1:           CODESET 6 IE (0x6a)\n"
    "  2:           IE Length(0x02)\n"
    "  3:        0x 7 CODESET 6 IE Content\n"
    "  4:        0x1f CODESET 6 IE Content\n"
    "Hex Dump: \n"
    "00 01 02 04 08 01 85 7d 96 6a \n"
    "02 07 1f \n"
)


class Log(SystemTest):
    def test_a_capture_is_logged_whole(self):
        program = self.traces(frames=capture(*FRAMES, MARK)).quits()
        log = program.log()
        banner = BANNER.match(log)
        self.assertEqual(log[banner.end():],
                         "NET5 Switch \n" + LOG + "\nDATE\nRX Frame: Time = 1.200\n" + MARK_IN_LOG)
        self.assertNotIn("Hex Dump", program.screen.text())

    def test_a_lone_frame_is_in_the_file_while_nothing_more_comes_and_stays_whatever_ends_the_program(self):
        program = self.on_board(frames=capture(FRAMES[1]))
        path, end = self.folder / "lapdmon.log", time.monotonic() + LIMIT
        while not path.exists() or b"00 01 73 \n" not in path.read_bytes():
            self.assertLess(time.monotonic(), end)
            time.sleep(0.005)
        program.gets(SIGKILL)
        program.ends(status=-SIGKILL)
        self.assertTrue(program.log().endswith("\nDATE\nRX Frame: Time = 0.0\nResponse=0    SAPI=0x00\nTEI=0x00\n"
                                               "    0x73  Unnumbered Acknowledgment\nHex Dump: \n00 01 73 \n"))

    def test_a_lone_frame_reaches_the_reader_of_a_FIFO_while_nothing_more_comes(self):
        program = self.on_board(frames=capture(FRAMES[1]), log_fifo=True)
        program.log_lines.wait("00 01 73 \n")
        program.quits()

    def test_an_oversized_frame_is_reported_and_the_next_is_decoded(self):
        program = self.traces(frames=capture(MARK, FRAMES[1], MARK))
        program.screen.wait("Frame Error", times=2)
        program.quits()
        log = program.log()
        self.assertEqual(log[log.index("NET5 Switch \n"):],
                         "NET5 Switch \n"
                         "\nDATE\nRX Frame: Time = 0.0\n" + MARK_IN_LOG +
                         "\nDATE\nRX Frame: Time = 0.200\nResponse=0    SAPI=0x00\nTEI=0x00\n"
                         "    0x73  Unnumbered Acknowledgment\nHex Dump: \n00 01 73 \n"
                         "\nDATE\nRX Frame: Time = 0.400\n" + MARK_IN_LOG)
        self.assertEqual(program.screen.text().count(MARK_ON_SCREEN), 2)

    def test_events_of_another_group_are_reported_whole_and_stay_out_of_the_log(self):
        self.file("frames.pcap", capture(FRAMES[1]))
        scenario = self.file("group.toml", 'frames = "frames.pcap"\nlabel = 3\n')
        program = self.on_board("--scenario", scenario)
        program.errors.wait("********", times=2)
        program.types("q")
        program.ends(errors=re.compile(r"""\A
\*{44}
Unregisterd EventGroup 3
For {TgtDesc: {Node 0 Board 1 Processor 1 Component 21 Instance 1} HostDesc: {Node .*}
{MsgType: 0x20 Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 Instance 0x1} Target: {Node .*} Size: 19 .*}
You may specify your own handler for unregisted events using
Addressable::asyncUnregisteredEvtGroup
\*{44}

\Z"""))
        self.assertTrue(program.log().endswith("NET5 Switch \n"))
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")

    def test_events_that_end_within_their_fields_leave_the_missing_ones_0(self):
        program = self.on_other_library("short")
        program.screen.wait("Frame Error")
        program.quits()
        log = program.log()
        shown = re.split(r"\n(?=(?: {33})?DATE\n)", log[log.index("DMS100 Switch \n") + len("DMS100 Switch \n"):])
        empty = "DATE\nRX Frame: Time = 0.0\nHex Dump: \n\n"
        indented = "".join(BLANKS + line for line in
                           ("DATE\n", "TX Frame: Time = {}\n", "Hex Dump: \n", "\n"))
        cut = "".join(BLANKS + line for line in
                      ("DATE\n", "TX Frame: Time = 1.0\n", "Response=0    SAPI=0x00\n", "0x00 0x00  Information\n",
                       "Hex Dump: \n", "00 \n"))
        whole = "".join(BLANKS + line for line in
                        ("DATE\n", "TX Frame: Time = 1.0\n", "Response=0    SAPI=0x00\n", "TEI=0x00\n",
                         "    0x7f  Set Asynchronous Balanced Mode\n", "Hex Dump: \n", "00 01 7f \n"))
        # In the order in which they came: of 4, 8, 11, 12, 16 and 17 octets, the whole one, the mark.
        self.assertEqual(shown[1:], [
            empty, indented.format("0.0"), indented.format("0.0"), indented.format("1.0"), indented.format("1.0"),
            cut, whole, "DATE\nRX Frame: Time = 2.0\n" + MARK_IN_LOG])

    def test_at_the_highest_rate_each_frame_is_logged_once_and_in_order(self):
        # The last ones only push the others out of the stream's buffer.
        frames = [FRAMES[1 + i % 5] for i in range(3000)]
        program = self.on_board("--rate", "max", log_fifo=True,
                                frames=capture(*frames, *(60 * [(RECEIVED, bytes(250))]), interval=0.1))
        left = len(frames)
        for line in program.log_lines.follow():
            left -= "X Frame: Time = " in line
            if left < 0:
                break
        program.quits()
        log = program.log()
        self.assertNotIn("Enqueue Failed", log)
        shown = re.findall(r"([RT])X Frame: Time = (\S+)\n(?:.*\n)*? *Hex Dump: \n((?:[ 0-9a-f]+\n)+)", log)
        self.assertEqual(
            [(direction, time, bytes.fromhex(dump)) for direction, time, dump in shown[:len(frames)]],
            [("T" if direction == TRANSMITTED else "R", time_of(25 * i), octets)
             for i, (direction, octets) in enumerate(frames)])
        self.assertEqual(program.journal.lines()[-1], "buffers outstanding 0, queues open 0")

    def test_two_processes_trace_two_D_channels(self):
        self.file("first.pcap", capture(FRAMES[0], MARK))
        self.file("second.pcap", capture(FRAMES[1], MARK))
        scenario = self.file("two.toml", """
            [[dchannel]]
            frames = "first.pcap"
            protocol = "ntt"
            [[dchannel]]
            number = 2
            frames = "second.pcap"
            protocol = "ni2"
        """)
        first = self.on_board("--scenario", scenario, run=("lapdmon", "-b1", "-d1", "-f", "one.log"))
        second = self.on_board("--scenario", scenario, run=("lapdmon", "-b1", "-d2", "-f", "two.log"))
        for program in (first, second):
            program.screen.wait("Frame Error")
        first.quits()
        second.quits()
        one, two = first.log("one.log"), second.log("two.log")
        self.assertIn("\nNTT Switch \n", one)
        self.assertIn("Set Asynchronous Balanced Mode", one)
        self.assertNotIn("Unnumbered Acknowledgment", one)
        self.assertIn("\nNI2 Switch \n", two)
        self.assertIn("Unnumbered Acknowledgment", two)
        self.assertNotIn("Set Asynchronous Balanced Mode", two)
        self.assertIn("CCS instance Number{Node 0 Board 1 Processor 1 Component 21 Instance 2}", second.screen.text())

    def test_the_built_in_capture_shows_calls(self):
        program = self.on_board("--rate", "max", "--loop", log_fifo=True)
        for shown in ("SETUP(0x05)", "CALL CONNECT(0x07)", "RELEASE COMPLETE(0x5a)", "Receive Ready"):
            program.log_lines.wait(shown)
        program.quits()


if __name__ == "__main__":
    unittest.main()
