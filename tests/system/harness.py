"""Words for tests that run the real programs on the software board.

A test waits for what a program writes, never for time to pass. LIMIT only ends a test that would wait for ever.

The programs are named by the environment: run the tests with ctest (ctest --preset dev -R system -V).
"""

import fcntl
import os
import pathlib
import re
import select
import struct
import subprocess
import tempfile
import termios
import threading
import time
import unittest

LIMIT = 120  # seconds

LAPDMON = os.environ["LAPDMON"]
SOFTBOARD = os.environ["SOFTBOARD"]
OTHER_LIBRARY = os.environ["OTHER_LIBRARY"]

SANITIZERS = {
    "ASAN_OPTIONS": "exitcode=99:verify_asan_link_order=0",  # a test may load a library before it
    "UBSAN_OPTIONS": "exitcode=99:print_stacktrace=1",
    "TSAN_OPTIONS": "exitcode=99:report_mutex_bugs=0:halt_on_error=1",
}
SANITIZER_REPORT = re.compile(r"Sanitizer|runtime error:")

DATE = re.compile(r"(Mon|Tue|Wed|Thu|Fri|Sat|Sun) (Jan|Feb|Mar|Apr|May|Jun|Jul|Aug|Sep|Oct|Nov|Dec) "
                  r"[ 123]\d \d\d:\d\d:\d\d \d{4}")

BANNER = re.compile(r"\nOrvane KV9 ISDN Trace Utility\n"
                    r"[^\n]+\n"  # the maker's notice
                    r"[^ \n]+ 1\.00-Build-04 lapdmon\n")

BLANKS = 33 * " "  # the indent of a transmitted frame's lines

RECEIVED, TRANSMITTED = 0, 4  # as link type 177 has it

# A frame that is reported on the screen: whoever sees the report knows that the trace runs and that the frames
# before this one are in the log.
MARK = (RECEIVED, bytes(300))
MARK_ON_SCREEN = "Oversized frame, frame will not be interpreted\nFrame Error\n"
MARK_IN_LOG = "Oversized frame, frame will not be interpreted \nFrame Error \n"


def capture(*frames, interval=0.2):
    """A pcap file's octets: frames of (direction, octets), so many seconds apart."""
    packets = []
    for number, (direction, octets) in enumerate(frames):
        packet = struct.pack(">HHH8sH", direction, 0, 0, bytes(8), 0x30) + bytes(octets)
        micros = round(number * interval * 1_000_000)
        packets.append(struct.pack("<IIII", *divmod(micros, 1_000_000), len(packet), len(packet)) + packet)
    return struct.pack("<IHHiIII", 0xA1B2C3D4, 2, 4, 0, 0, 65535, 177) + b"".join(packets)


def time_of(ticks):
    """The board's time as the log shows it."""
    return f"{ticks // 250}.{ticks % 250 * 4}"


def environment(**more):
    """What the programs run in: the caller's, without what would lead them elsewhere."""
    kept = {name: value for name, value in os.environ.items()
            if name not in ("REMOTE_NORV", "HOST", "LD_LIBRARY_PATH", "OTHER_SCRIPT", "OTHER_TALK")}
    return {**kept, **SANITIZERS, "TZ": "UTC", **more}


class Stream:
    """Lines that a program writes, read as they come."""

    def __init__(self, file):
        self._file = file
        self._lines = []
        self._ended = False
        self._grown = threading.Condition()
        self._thread = threading.Thread(target=self._read, daemon=True)
        self._thread.start()

    def _read(self):
        with self._file:
            for line in self._file:
                with self._grown:
                    self._lines.append(line.decode("latin-1"))
                    self._grown.notify_all()
        with self._grown:
            self._ended = True
            self._grown.notify_all()

    def wait(self, wanted, times=1):
        """Returns once so many lines hold the text."""
        for line in self.follow():
            times -= wanted in line
            if times <= 0:
                return
        raise AssertionError(f"it ended before {wanted!r} came; there was:\n" + "".join(self._lines))

    def follow(self):
        """Each line, as it comes, to the end."""
        at = 0
        while True:
            with self._grown:
                if not self._grown.wait_for(lambda: self._ended or len(self._lines) > at, LIMIT):
                    raise AssertionError("no more lines come after:\n" + "".join(self._lines[-20:]))
                lines = self._lines[at:]
            if not lines:
                return
            yield from lines
            at += len(lines)

    def lines(self):
        with self._grown:
            return [line.rstrip("\n") for line in self._lines]

    def text(self):
        """Everything, once the program has ended."""
        self._thread.join(LIMIT)
        if self._thread.is_alive():
            raise AssertionError("somebody still holds the program's output")
        return "".join(self._lines)


class Fifo:
    """A file that is read while a program writes it."""

    def __init__(self, path):
        os.mkfifo(path)
        reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
        os.set_blocking(reader, True)
        self._held_open = os.open(path, os.O_WRONLY)  # the file does not end while no program has it open
        self.stream = Stream(os.fdopen(reader, "rb"))

    def end(self):
        if self._held_open is not None:
            os.close(self._held_open)
            self._held_open = None
        return self.stream.text()


def wait_until_full(reader):
    """Until whoever writes to a pipe has to wait."""
    writer = os.open(f"/proc/self/fd/{reader}", os.O_WRONLY | os.O_NONBLOCK)
    try:
        room = select.poll()
        room.register(writer, select.POLLOUT)
        end = time.monotonic() + LIMIT
        while room.poll(0):
            if time.monotonic() > end:
                raise AssertionError("the pipe is never full")
            time.sleep(0.005)
    finally:
        os.close(writer)


class Program:
    """A running program."""

    def status(self, name):
        """A line of the system's about the process, or its first thread."""
        status = (pathlib.Path("/proc") / str(self.pid) / "status").read_text()
        return re.search(rf"^{name}:\s+(\S+)", status, re.M)[1]

    def open_files(self):
        folder = pathlib.Path("/proc") / str(self.pid) / "fd"
        return [os.readlink(folder / name) for name in os.listdir(folder)]

    @property
    def threads(self):
        return int(self.status("Threads"))

    def wait_until_idle(self):
        """Until the first thread waits for something that does not come. (A thread that waits for a reply looks for it
        every 10 ms.)"""
        end = time.monotonic() + LIMIT
        seen, times = None, 0
        while times < 20:
            now = self.status("voluntary_ctxt_switches")
            times = times + 1 if now == seen else 0
            seen = now
            if time.monotonic() > end:
                raise AssertionError("the first thread is never idle")
            time.sleep(0.01)

    def __init__(self, test, words, env, cwd, fifos, descriptors=()):
        self._test = test
        self._fifos = fifos
        self._folder = pathlib.Path(cwd)
        self._input, stdin = os.pipe()[::-1]
        self._unread = os.dup(stdin)
        try:
            self._process = subprocess.Popen(words, stdin=stdin, stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                                             env=env, cwd=cwd, pass_fds=descriptors)
        finally:
            os.close(stdin)
        self.screen = Stream(self._process.stdout)
        self.errors = Stream(self._process.stderr)

    @property
    def pid(self):
        return self._process.pid

    @property
    def journal(self):
        return self._fifos["journal"].stream

    @property
    def talk(self):
        return self._fifos["talk"].stream

    @property
    def log_lines(self):
        return self._fifos["log"].stream

    # ---- what is done to it

    def types(self, text):
        os.write(self._input, text.encode())

    def ends_input(self):
        os.close(self._input)
        self._input = None

    def gets(self, number):
        os.kill(self._process.pid, number)

    def typed_but_unread(self):
        octets = fcntl.ioctl(self._unread, termios.FIONREAD, bytes(4))
        return os.read(self._unread, *struct.unpack("i", octets)).decode() if any(octets) else ""

    def wait_until_unread(self, count):
        """The one thing that a program does without a word: it reads its input."""
        end = time.monotonic() + LIMIT
        while struct.unpack("i", fcntl.ioctl(self._unread, termios.FIONREAD, bytes(4)))[0] != count:
            if time.monotonic() > end:
                raise AssertionError(f"there are never {count} unread characters")
            time.sleep(0.005)

    # ---- what becomes of it

    def ends(self, status=0, errors=""):
        """Waits for the end; looks at the status, and for anything on standard error that was not expected."""
        try:
            code = self._process.wait(LIMIT)
        except subprocess.TimeoutExpired:
            self._test.fail("the program does not end; on its screen:\n" + "\n".join(self.screen.lines()))
        for fifo in self._fifos.values():
            fifo.end()
        said = self.errors.text()
        self._test.assertIsNone(SANITIZER_REPORT.search(said), said)
        if isinstance(errors, re.Pattern):
            self._test.assertRegex(said, errors)
        else:
            self._test.assertEqual(said, errors)
        self._test.assertEqual(code, status, said + self.screen.text())
        return self

    def quits(self):
        self.types("q\n")
        return self.ends()

    def kill(self):
        if self._process.poll() is None:
            self._process.kill()
            self._process.wait()
        for end in (self._input, self._unread):
            if end is not None:
                os.close(end)
        for fifo in self._fifos.values():
            fifo.end()
        self.screen.text()
        self.errors.text()

    def log(self, name="lapdmon.log"):
        """The whole log, dates masked."""
        if "log" in self._fifos:
            text = self._fifos["log"].end()
        else:
            text = (self._folder / name).read_bytes().decode("latin-1")
        return DATE.sub("DATE", text)

    def heard(self):
        """What the board was told, in order: "8 SetParm {Parm 10 Val 1}"."""
        return [line.split(" ", 1)[1].split(" from ")[0] for line in self.journal.lines()
                if line.startswith("host->board ")]


class SystemTest(unittest.TestCase):
    """Each test has a folder of its own, where the programs run."""

    maxDiff = None

    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="lapdmon-")
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def fifo(self, fifos, key, name):
        path = self.folder / f"{len(list(self.folder.iterdir()))}-{name}"
        fifos[key] = Fifo(path)
        return str(path)

    def start(self, words, fifos=None, cwd=None, switch=None, **variables):
        descriptors = () if switch is None else (switch.descriptor,)
        program = Program(self, words, environment(**variables), cwd or self.folder, fifos or {}, descriptors)
        self.addCleanup(program.kill)
        return program

    def file(self, name, content):
        path = self.folder / name
        path.write_bytes(content if isinstance(content, bytes) else content.encode())
        return str(path)

    def on_board(self, *board, run=("lapdmon", "-b1"), frames=None, cwd=None, log_fifo=False, switch=None):
        """A program on the software board, with the board's options and the frames it plays; a FaultSwitch is loaded
        into it."""
        fifos = {}
        words = [SOFTBOARD, "--journal", self.fifo(fifos, "journal", "journal"), *board]
        if frames is not None:
            words += ["--frames", self.file(f"frames-{len(list(self.folder.iterdir()))}.pcap", frames)]
        run = list(run)
        if log_fifo:
            run += ["-f", self.fifo(fifos, "log", "log")]
        if switch is None:
            return self.start(words + ["--", *run], fifos, cwd)
        self.addCleanup(switch.close)
        program = self.start(words + ["--", *switch.words, *run], fifos, cwd, switch, **switch.variables)
        switch.given()
        return program

    def traces(self, *board, **more):
        """As on_board, with a capture that is one mark; returns when the trace runs."""
        program = self.on_board(*board, **{"frames": capture(MARK), **more})
        program.screen.wait("Frame Error")
        return program

    def on_other_library(self, script="", run=("-b1",), under=(), **variables):
        """The program on the other transport library, started by the words in `under`."""
        fifos = {}
        talk = self.fifo(fifos, "talk", "talk")
        return self.start([*under, LAPDMON, *run], fifos, LD_LIBRARY_PATH=os.path.dirname(OTHER_LIBRARY),
                          OTHER_SCRIPT=script, OTHER_TALK=talk, **variables)

    def run_tool(self, *words, **options):
        """A program of the system's, run to its end."""
        return subprocess.run(words, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, timeout=LIMIT,
                              check=True, **{"env": environment(), **options}).stdout
