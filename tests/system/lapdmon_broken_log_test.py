"""A log that cannot be written, or not now: what is said, what stays, and that the trace goes on."""

import os
import re
import time
import unittest

from fault_switch import FaultSwitch
from harness import LAPDMON, LIMIT, MARK, MARK_IN_LOG, RECEIVED, SystemTest, capture, time_of, wait_until_full
from order import MOST_THREADS

FRAMES = 250
NUMBERED = [(RECEIVED, bytes((2, 1, 1, i % 251))) for i in range(FRAMES)]
DAY = capture(*NUMBERED, MARK, interval=0.004)
BALANCE = "buffers outstanding 0, queues open 0"

# One frame of the log, whole.
ENTRY = re.compile(r"\nDATE\nRX Frame: Time = (\S+)\n(?:Command=1   SAPI=0x00\nTEI=0x00\n0x01 0x.. .*\nHex Dump: \n"
                   r"02 01 01 .. \n|Oversized frame, frame will not be interpreted \nFrame Error \n)")
GAP = re.compile(r"Frames Lost: (\d+) \n")


class BrokenLog(SystemTest):
    def entries(self, text):
        """The times of the frames in a text of whole frames, and how many it says are lost."""
        at, times, lost = 0, [], 0
        while at < len(text):
            if gap := GAP.match(text, at):
                lost += int(gap[1])
                at = gap.end()
                continue
            entry = ENTRY.match(text, at)
            self.assertIsNotNone(entry, "no whole frame: " + text[at:at + 300])
            times.append(entry[1])
            at = entry.end()
        return times, lost

    def frames_of(self, text):
        head, _, rest = text.partition("NET5 Switch \n")
        self.assertIn("Version", head)
        return self.entries(rest)

    def traced_whole(self, program):
        self.assertEqual(program.journal.lines()[-1], BALANCE)
        self.assertEqual(sum(" EvtDetected " in line for line in program.journal.lines()), FRAMES + 1)

    def test_a_full_disk_is_said_once_when_it_is_full_and_at_the_end(self):
        program = self.on_board("--rate", "max", run=("lapdmon", "-b1", "-f", "/dev/full"), frames=DAY)
        program.errors.wait("/dev/full: No space left on device")
        program.screen.wait("Frame Error")
        program.types("q")
        program.ends(status=1, errors="/dev/full: No space left on device\n"
                                      f"/dev/full: frames lost: {FRAMES + 1}\n")
        self.traced_whole(program)

    def test_a_disk_that_is_full_is_said_of_a_frame_that_comes_alone(self):
        program = self.on_board(run=("lapdmon", "-b1", "-f", "/dev/full"), frames=capture(MARK))
        program.screen.wait("Frame Error")
        program.types("q")
        program.ends(status=1, errors="/dev/full: No space left on device\n/dev/full: frames lost: 1\n")

    def test_a_start_that_fails_on_a_full_disk_says_so_too(self):
        program = self.on_board("--protocol", "5", run=("lapdmon", "-b1", "-f", "/dev/full"))
        program.ends(status=1, errors="Unknow Protocol -- I don't know how to interprete. Program is terminating!\n"
                                      "/dev/full: No space left on device\n/dev/full: frames lost: 0\n")

    def test_a_file_that_reaches_its_limit_keeps_whole_frames(self):
        limited = ("sh", "-c", 'ulimit -f 16; exec "$0" -b1', LAPDMON)
        program = self.on_board("--rate", "max", run=limited, frames=DAY)
        program.errors.wait("lapdmon.log: File too large")
        program.screen.wait("Frame Error")
        program.types("q")
        program.ends(status=1, errors=re.compile(r"\Alapdmon.log: File too large\nlapdmon.log: frames lost: \d+\n\Z"))
        lost = int(program.errors.lines()[-1].split()[-1])
        times, said = self.frames_of(program.log())
        self.assertEqual(len(times) + lost, FRAMES + 1)
        self.assertGreater(len(times), 20)
        expected = [time_of(i) for i in range(FRAMES + 1)]
        if said == 0:
            self.assertEqual(times, expected[:len(times)])
        else:  # the last few found room again
            self.assertEqual(said, lost)
            self.assertEqual(times, [t for t in expected if t in set(times)])
        self.traced_whole(program)

    def test_a_frame_that_is_too_long_is_in_a_file_that_reaches_its_limit_whole_or_not_at_all(self):
        many = 100
        for blocks in range(9, 16):
            with self.subTest(blocks):
                program = self.on_board("--rate", "max", frames=capture(*many * [MARK], interval=0.004),
                                        run=("sh", "-c", f'ulimit -f {blocks}; exec "$0" -b1', LAPDMON))
                program.screen.wait("Frame Error", times=many)
                program.types("q")
                program.ends(status=1, errors=re.compile(r"\Alapdmon.log: File too large\n.*: frames lost: \d+\n\Z"))
                times, _ = self.frames_of(program.log())
                self.assertEqual(len(times) + int(program.errors.lines()[-1].split()[-1]), many)

    def test_a_pipe_whose_reader_goes_is_said_once_and_its_next_reader_gets_whole_frames(self):
        path = self.folder / "pipe"
        os.mkfifo(path)
        reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
        program = self.on_board("--rate", "500", "--loop", run=("lapdmon", "-b1", "-f", "pipe"),
                                frames=capture(*NUMBERED, interval=0.004))
        program.screen.wait("NET5 Switch")  # it has the pipe open
        os.set_blocking(reader, True)
        os.read(reader, 100)
        os.close(reader)
        program.errors.wait("pipe: Broken pipe")
        with open(path, "rb") as pipe:
            text = ""
            while len(re.findall(r"Frame: Time", text[text.find("Frames Lost"):])) < 50 or "Frames Lost" not in text:
                text += os.read(pipe.fileno(), 65536).decode()
            program.types("q")
            text += pipe.read().decode()
        program.ends(status=1, errors=re.compile(r"\Apipe: Broken pipe\npipe: frames lost: \d+\n\Z"))
        lost = int(program.errors.lines()[-1].split()[-1])
        text = re.sub(r"\w{3} \w{3} [ \d]\d \d\d:\d\d:\d\d \d{4}", "DATE", text)
        _, said = self.entries(text[text.index("Frames Lost"):])
        self.assertEqual(said, lost)

    def test_a_log_may_be_a_FIFO(self):
        program = self.on_board("--rate", "max", frames=DAY, log_fifo=True)
        program.screen.wait("Frame Error")
        program.quits()
        self.assertEqual(self.frames_of(program.log()), ([time_of(i) for i in range(FRAMES + 1)], 0))

    def test_a_log_may_be_a_descriptor_with_a_rotating_writer_behind_it(self):
        """As docs/user/log-format.md shows: bash makes /dev/fd/N of it."""
        rotating = ("bash", "-c", 'exec "$0" -b1 -f >(exec split --lines=100 - part.)', LAPDMON)
        program = self.on_board("--rate", "max", run=rotating, frames=DAY)
        program.screen.wait("filename: /dev/fd/")
        program.screen.wait("Frame Error")
        program.quits()
        end = time.monotonic() + LIMIT  # the writer ends after the program
        wanted = [time_of(i) for i in range(FRAMES + 1)]
        while True:
            parts = sorted(self.folder.glob("part.*"))
            text = "".join(part.read_text() for part in parts)
            if re.findall(r"Time = (\S+)", text) == wanted and text.endswith("Frame Error \n"):
                break
            self.assertLess(time.monotonic(), end, text[-500:])
            time.sleep(0.01)
        self.assertGreater(len(parts), 10)


class FewMeans(SystemTest):
    def test_frames_for_which_the_queue_has_no_memory_are_counted_and_the_status_is_1(self):
        program = self.on_board("--rate", "max", frames=DAY, run=(
            "env", "LD_PRELOAD=" + os.environ["FEW_THREADS_LIBRARY"], "FEW_NODES_FROM=1", "FEW_NODES_TO=3", LAPDMON, "-b1"))
        program.screen.wait("Frame Error")
        program.types("q")
        program.ends(status=1, errors="lapdmon: frames lost for want of threads or memory: 3\n")
        log = program.log()
        self.assertEqual(log.count("Enqueue Failed \n"), 3)
        self.assertEqual(len(re.findall(r"Frame: Time", log)), FRAMES + 1 - 3)
        self.assertEqual(program.journal.lines()[-1], BALANCE)

    def test_frames_for_which_the_system_has_no_thread_are_counted_and_the_status_is_1(self):
        program = self.on_board("--rate", "max", frames=DAY, run=(
            "env", "LD_PRELOAD=" + os.environ["FEW_THREADS_LIBRARY"], "FEW_FROM=100", "FEW_TO=109", LAPDMON, "-b1"))
        program.screen.wait("Frame Error")
        program.types("q")
        program.ends(status=1, errors=re.compile(
            r"\A(\(EvtCallback_Class214\) vela internal error\nvela::Thread::CreationError\n){10}"
            r"lapdmon: frames lost for want of threads or memory: 10\n\Z"))
        times = re.findall(r"Time = (\S+)", program.log())
        wanted = [time_of(i) for i in range(FRAMES + 1)]
        at = next(i for i in range(FRAMES) if times[i] != wanted[i])
        self.assertEqual(times, wanted[:at] + wanted[at + 10:])
        self.assertEqual(program.journal.lines()[-1], BALANCE)

    def test_frames_that_are_lost_last_are_said_at_the_end_of_the_log(self):
        program = self.on_board("--rate", "max", frames=DAY, run=(
            "env", "LD_PRELOAD=" + os.environ["FEW_THREADS_LIBRARY"], "FEW_FROM=100", "FEW_TO=9999", LAPDMON, "-b1"))
        program.journal.wait(" EvtDetected ", times=FRAMES + 1)
        program.types("q")
        program.ends(status=1, errors=re.compile(r"lapdmon: frames lost for want of threads or memory: \d+\n\Z"))
        lost = int(program.errors.lines()[-1].split()[-1])
        log = program.log()
        self.assertTrue(log.endswith(f"\nFrames Lost: {lost} \n"), log[-300:])
        self.assertEqual(re.findall(r"Time = (\S+)", log), [time_of(i) for i in range(FRAMES + 1 - lost)])


class StalledLog(SystemTest):
    """Nobody reads the FIFO for a while: 3000 events come all at once meanwhile."""

    MANY = 3000

    def stalled(self):
        """Everything has been taken from the transport, the last frame is a mark, and the log takes nothing."""
        path = self.folder / "log"
        os.mkfifo(path)
        self.reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
        self.addCleanup(os.close, self.reader)
        frames = [(RECEIVED, bytes((2, 1, 1, i % 251))) for i in range(self.MANY)]
        switch = FaultSwitch(LIMIT)
        program = self.on_board("--rate", "max", "--fault", f"burst={self.MANY}", run=(LAPDMON, "-b1", "-f", "log"),
                                frames=capture(*frames, MARK, interval=0.004), switch=switch)
        program.journal.wait(" EvtDetected ", times=self.MANY + 1)
        wait_until_full(self.reader)
        end = time.monotonic() + LIMIT
        while switch.held() > 0:
            self.assertLess(time.monotonic(), end, "the program does not take the events")
            time.sleep(0.005)
        return program

    def assert_whole(self, program, text):
        self.assertEqual(re.findall(r"Time = (\S+)", text), [time_of(i) for i in range(self.MANY + 1)])
        self.assertNotIn("Enqueue Failed", text)
        self.assertNotIn("Frames Lost", text)
        self.assertEqual(program.journal.lines()[-1], BALANCE)

    def test_no_frame_is_lost_threads_are_bounded_and_the_trace_catches_up(self):
        program = self.stalled()
        most = program.threads
        os.set_blocking(self.reader, True)
        text = ""
        while not text.endswith(MARK_IN_LOG):
            text += os.read(self.reader, 65536).decode()
            most = max(most, program.threads)
        self.assertLessEqual(most, MOST_THREADS)
        program.quits()
        self.assert_whole(program, text)

    def test_the_end_comes_at_once_and_writes_the_frames_that_have_arrived(self):
        program = self.stalled()
        program.types("q")
        program.journal.wait("SetParmCmplt", times=2)  # nothing on its way has held up the replies
        os.set_blocking(self.reader, True)
        text = ""
        while some := os.read(self.reader, 65536):
            text += some.decode()
        program.ends()
        self.assertNotIn("Timeout", program.screen.text())
        self.assert_whole(program, text)


if __name__ == "__main__":
    unittest.main()
