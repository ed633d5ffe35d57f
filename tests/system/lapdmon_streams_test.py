"""Standard streams that are closed, or that nobody reads."""

import os
import re
import time
import unittest
from collections import deque
from signal import SIGTERM

from harness import BANNER, LAPDMON, LIMIT, MARK, MARK_IN_LOG, RECEIVED, SystemTest, capture, time_of, wait_until_full
from order import MOST_THREADS

FRAMES = [(RECEIVED, bytes((2, 1, 1, i % 251))) for i in range(250)]
BALANCE = "buffers outstanding 0, queues open 0"


class ClosedStreams(SystemTest):
    def test_the_log_is_the_log_alone_and_the_trace_goes_on_whatever_is_closed(self):
        for closed in ("<&-", ">&-", "2>&-", ">&- 2>&-", "<&- >&- 2>&-"):
            with self.subTest(closed):
                program = self.on_board("--rate", "500", "--loop", "--fault", "event-label=3",
                                        run=("sh", "-c", f'exec "$0" -b1 {closed}', LAPDMON),
                                        frames=capture(*FRAMES, interval=0.004))
                program.journal.wait(" EvtDetected ", times=300)  # with four that are reported
                program.gets(SIGTERM)
                program.ends(errors=re.compile(""))
                self.assertEqual(program.heard()[-2:], ["26 CancelEvt {Type 2}", "8 SetParm {Parm 10 Val 0}"])
                self.assertEqual(program.journal.lines()[-1], BALANCE)
                self.assertNotIn("Unregisterd", "".join(program.journal.lines()))
                log = program.log()
                self.assertRegex(log, BANNER)
                frames = log[BANNER.match(log).end():]
                self.assertRegex(frames, r"\ANET5 Switch \n(\nDATE\nRX Frame: Time = .*\nCommand=1   SAPI=0x00\nTEI=0x00\n"
                                         r"0x01 0x.. .*\nHex Dump: \n02 01 01 .. \n)+\Z")

    def test_a_screen_whose_reader_goes_ends_nothing(self):
        program = self.on_board("--rate", "max", run=("bash", "-c", 'exec "$0" -b1 > >(head -n 1)', LAPDMON),
                                frames=capture(*FRAMES, MARK, interval=0.004))
        program.journal.wait(" EvtDetected ", times=len(FRAMES) + 1)
        program.quits()
        self.assertEqual(program.screen.text(), "filename: lapdmon.log\n")
        self.assertEqual(program.journal.lines()[-1], BALANCE)


class Lines:
    """The lines that somebody wrote to a FIFO, each handed out once: a reader that keeps pace with the writer may get one
    line at a time, so nothing may look at all of them again."""

    def __init__(self, reader):
        os.set_blocking(reader, True)
        self._each = self._read(reader)
        self.octets = 0  # of the lines handed out

    def _read(self, reader):
        rest = b""
        while some := os.read(reader, 65536):
            *lines, rest = (rest + some).split(b"\n")
            for line in lines:
                self.octets += len(line) + 1
                yield line.decode()
        if rest:
            yield f"{rest.decode()} (cut off)"

    def __iter__(self):
        return self._each

    def until(self, pattern, times=1):
        """Goes on behind the line that matches, or the last of so many."""
        end = time.monotonic() + LIMIT
        for line in self:
            times -= bool(re.fullmatch(pattern, line))
            if times == 0:
                return
            if time.monotonic() > end:
                raise AssertionError(f"only other lines than {pattern} come")
        raise AssertionError(f"no more lines like {pattern}")


class StalledStandardError(SystemTest):
    """A terminal that was stopped, say."""

    MANY = 1000

    def stopped(self):
        """A FIFO that nobody reads."""
        path = self.folder / "stopped"
        os.mkfifo(path)
        reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
        self.addCleanup(os.close, reader)
        return reader

    def fill(self, reader):
        writer = os.open(f"/proc/self/fd/{reader}", os.O_WRONLY | os.O_NONBLOCK)
        try:
            while os.write(writer, bytes(512)):
                pass
        except BlockingIOError:
            pass
        os.close(writer)

    def test_reports_that_nobody_reads_make_few_threads(self):
        reader = self.stopped()
        frames = [(RECEIVED, bytes((2, 1, 1, i % 251))) for i in range(self.MANY)]
        self.file("frames.pcap", capture(*frames, interval=0.004))
        scenario = self.file("other.toml", 'frames = "frames.pcap"\nlabel = 3\nrate = "max"\n')
        program = self.on_board("--scenario", scenario, "--fault", f"burst={self.MANY}",
                                run=("sh", "-c", 'exec "$0" -b1 2>stopped', LAPDMON))
        program.journal.wait(" EvtDetected ", times=self.MANY)
        wait_until_full(reader)
        self.assertLessEqual(program.threads, MOST_THREADS)
        lines = Lines(reader)
        lines.until("Unregisterd EventGroup 3", times=self.MANY)
        program.types("q")
        deque(lines, maxlen=0)
        program.ends()
        self.assertEqual(program.journal.lines()[-1], BALANCE)

    def test_reports_that_nobody_reads_delay_no_frame(self):
        reader = self.stopped()
        self.fill(reader)
        program = self.on_board("--rate", "max", "--fault", "event-label=3",
                                run=("sh", "-c", 'exec "$0" -b1 2>stopped', LAPDMON),
                                frames=capture(*FRAMES, MARK, interval=0.004))
        program.screen.wait("Frame Error")
        program.types("q")
        program.journal.wait("SetParmCmplt", times=2)
        deque(Lines(reader), maxlen=0)
        program.ends()
        self.assertEqual(program.log().count("Frame: Time"), len(FRAMES) + 1)


class UnreadStreams(SystemTest):
    """A stream that nobody reads: the screen, while every frame is reported there, or standard error, while every event is
    of a group that nobody registered for."""

    # Faster than anybody reads, but not as fast as possible: what waits inside must be written before the end.
    SCENARIO = 'frames = "frames.pcap"\nrate = 40000\nloop = true\n'
    #             (frames, scenario, what is said of each)
    STREAMS = {
        "1>stopped": (25000 * [MARK], SCENARIO, "Frame Error"),
        "2>stopped": (60 * FRAMES, SCENARIO + "label = 3\n", "Unregisterd EventGroup 3"),
    }
    NOTICE = r"lapdmon: nobody read this stream, lines dropped here: [1-9]\d*"

    def unread(self, stream):
        """A trace whose stream nobody reads, after it had more to say than may wait."""
        path = self.folder / "stopped"
        path.unlink(missing_ok=True)
        os.mkfifo(path)
        reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
        self.addCleanup(os.close, reader)
        frames, scenario, _ = self.STREAMS[stream]
        self.file("frames.pcap", capture(*frames, interval=0.004))
        program = self.on_board("--scenario", self.file("scenario.toml", scenario),
                                run=("sh", "-c", f'exec "$0" -b1 {stream}', LAPDMON))
        program.journal.wait(" EvtDetected ", times=len(frames))
        wait_until_full(reader)
        if stream == "1>stopped":
            self.wait_until_logged(len(frames))
        return program, reader

    def wait_until_logged(self, marks):
        """What has arrived may still wait to be shown: the log says how far the program is. A reader that begins before
        more is shown than may wait can keep pace with the program for ever, and then nothing is ever dropped."""
        end = time.monotonic() + LIMIT
        last = MARK_IN_LOG.splitlines(keepends=True)[-1].encode()
        with open(self.folder / "lapdmon.log", "rb") as log:
            while marks > 0:
                marks -= sum(line == last for line in log)
                self.assertLess(time.monotonic(), end)
                time.sleep(0.01)

    def test_they_delay_neither_frames_nor_requests_nor_the_end(self):
        for stream in self.STREAMS:
            with self.subTest(stream):
                program, _ = self.unread(stream)
                program.types("q")
                program.ends()
                self.assertEqual(program.heard()[-2:], ["26 CancelEvt {Type 2}", "8 SetParm {Parm 10 Val 0}"])
                self.assertEqual(program.journal.lines()[-1], BALANCE)
                if stream == "1>stopped":
                    times = re.findall(r"Time = (\S+)", program.log())
                    self.assertEqual(times[:24000], [time_of(i) for i in range(24000)])

    def test_what_is_dropped_is_counted_and_said_when_they_are_read_again(self):
        for stream, (_, _, said) in self.STREAMS.items():
            with self.subTest(stream):
                program, reader = self.unread(stream)
                lines = Lines(reader)
                lines.until(self.NOTICE)
                self.assertGreater(lines.octets, 1_000_000)
                lines.until(said)
                program.types("q")
                last = deque(lines, maxlen=1)
                program.ends()
                if stream == "1>stopped":
                    self.assertEqual(last.pop(), "general Exception caught in lapdmon(215)")


if __name__ == "__main__":
    unittest.main()
