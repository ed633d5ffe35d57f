"""A short soak, and that a soak sees what it looks for."""

import contextlib
import io
import types
import unittest

import soak
import soak_frames


def checked(numbers):
    checker = soak_frames.Checker()
    for number in numbers:
        checker.frame(number)
    return checker.frames, checker.lost, checker.disordered, checker.wrong


def block(direction, ticks, octets):
    return (f"\nSat Nov 21 11:25:33 2026\n{direction}X Frame: Time = {ticks // 250}.{ticks % 250 * 4}\n"
            "0x00 0x00  Information\nHex Dump: \n" + octets.hex(" ") + " \n").encode()


class Soak(unittest.TestCase):
    def soak(self, *more):
        with contextlib.redirect_stdout(io.StringIO()) as said:
            status = soak.main(["--frames", "10000", "--phase", "500", "--stall", "0.5", "--seed", "1",
                                *more])
        self.assertEqual(status, 0, said.getvalue())
        self.assertNotIn("not judged", said.getvalue())

    def test_nothing_grows_is_lost_or_out_of_order_while_faults_come_and_go(self):
        self.soak("--long-stall", "10")

    def test_the_same_holds_for_a_board_in_another_machine(self):
        self.soak("--long-stall", "10", "--relay")

    def test_what_is_lost_repeated_or_out_of_order_is_told_apart(self):
        self.assertEqual(checked([0, 1, 2, 3]), (4, 0, 0, 0))
        self.assertEqual(checked([0, 1, 3, 4]), (5, 1, 0, 0))
        self.assertEqual(checked([0, 2, 1, 3]), (4, 0, 1, 0))
        self.assertEqual(checked([0, 1, 1, None, 2]), (3, 0, 0, 2))

    def test_a_frame_is_its_direction_its_time_and_its_octets(self):
        log = [(*soak_frames.frame_of(number), number) for number in (0, 1, 2)]
        text = b"".join(block("T" if sent else "R", ticks, octets) for sent, octets, ticks in log)
        for changed, expected in ((text, (3, 0)), (text.replace(b"TX", b"RX"), (3, 1)),
                                  (text.replace(b"02 01 02 00", b"02 01 02 02"), (3, 1)),
                                  (text.replace(b"Time = 0.4\n", b"Time = 0.12\n"), (3, 1))):
            checker = soak_frames.Checker()
            for at in range(0, len(changed), 7):  # as it may come through a FIFO
                checker.feed(changed[at:at + 7])
            checker.end()
            self.assertEqual((checker.frames, checker.wrong), expected)

    def test_everything_that_grows_is_reported(self):
        for name, by, complaint in (("used", 600, "memory grew"), ("descriptors", 1, "descriptors grew"),
                                    ("threads", 101, "threads grew"), ("held", 100, "messages still waited"),
                                    ("used", 0, None)):
            soaked = soak.Soak(types.SimpleNamespace(seed=1), types.SimpleNamespace(said=[]))
            calm = {"used": 9000, "threads": 5, "descriptors": 8, "held": 1}
            more = {**calm, name: calm[name] + by}
            soaked.calm = [types.SimpleNamespace(**each) for each in 3 * [calm] + 3 * [more]]
            soaked.samples = soaked.calm[:1]
            said = list(soaked.complaints(0))
            self.assertEqual(len(said), 1 if complaint else 0, said)
            self.assertIn(complaint or "", "".join(said))


if __name__ == "__main__":
    unittest.main()
