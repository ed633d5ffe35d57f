"""Runs the trace at line rate while faults are switched on and off at random, and says what came of it.

    scripts/soak --minutes 30            scripts/soak --frames 10000 --seed 7
    scripts/soak --minutes 30 --long-stall 60            scripts/soak --minutes 30 --long-stall 60 --relay
    scripts/soak --bound

The board plays numbered frames in both directions; the log is read through a FIFO as it is written, and kept
nowhere. Troubled times and calm ones take turns. The exit status is 1 when a frame is lost, damaged or out of order,
when memory, threads, descriptors or waiting messages grow from the first calm times to the last, or when the program
does not end in order. With --bound the log is not read until more records wait than the program keeps: then exactly those
that it says it lost must be missing.
"""

import argparse
import os
import pathlib
import random
import re
import select
import signal
import subprocess
import sys
import tempfile
import threading
import time

from fault_switch import LIBRARY, FaultSwitch
from order import LINE_RATE, MOST_THREADS
from soak_bound import Bound
from soak_frames import LIMIT, Checker, write_capture

QUEUE = 64 + 8       # messages that wait for the program before the board waits, and those on their way through it
ON_THE_WAY = 500     # frames that were read from the board and are not seen in the log: 10 ms of them, and the FIFO's
LONG_STALL_EVERY = 10  # troubled times
GROWTH = 512         # kB of allocated memory that are no growth: messages that are on their way

# Wrong events come beside the right ones, one for each hundred frames (docs/user/softboard.md): name, least and most number.
WRONG_EVENTS = (
    ("event-truncated", 0, 19), ("event-overlong", 1, 2000), ("event-length", 0, 4000), ("event-label", 0, 99),
    ("event-type", 100, 9999), ("event-source", 50, 65535),
)
OTHER_FAULTS = (("burst", 101, 3000), ("silent", 0, 50), ("never-waits", None, None), ("offset-stays-0", None, None))
OUTSIDE = ("the log is not read", "the program is stopped", "the machine is busy")


class Sample:
    """What the program has at a time."""

    def __init__(self, pid, held, used):
        status = pathlib.Path(f"/proc/{pid}/status").read_text()
        self.resident = int(re.search(r"^VmRSS:\s+(\d+)", status, re.M)[1])
        self.threads = int(re.search(r"^Threads:\s+(\d+)", status, re.M)[1])
        self.descriptors = len(os.listdir(f"/proc/{pid}/fd"))
        self.held = held
        self.used = used


class Program:
    """The trace on the software board, its log and its faults. The board may be behind a relay."""

    def __init__(self, options, folder):
        write_capture(folder / "numbered.pcap")
        log = folder / "log"
        os.mkfifo(log)
        self._log = os.open(log, os.O_RDONLY | os.O_NONBLOCK)
        self._held_open = os.open(log, os.O_WRONLY)
        self.said = []
        self._host = FaultSwitch(LIMIT, options.fault_switch)
        board = [options.softboard, "--rate", str(options.rate), "--loop", "--frames", str(folder / "numbered.pcap"), "--"]
        trace = [options.lapdmon, "-b1", "-f", str(log)]
        if options.relay:
            self._board = FaultSwitch(LIMIT, options.fault_switch)
            self._relay = self._start(self._board, board, [options.relay, "--listen", "127.0.0.1:0"], stdout=subprocess.PIPE)
            port = self._relay.stdout.readline().decode().strip().rsplit(":", 1)[1]
            self._process = self._start(self._host, [], trace, REMOTE_NORV=f"127.0.0.1:{port}")
        else:
            self._board, self._relay = self._host, None
            self._process = self._start(self._host, board, trace)
        self.pid = self._process.pid
        self._listeners = [threading.Thread(target=self._listen, args=[each.stderr], daemon=True)
                           for each in (self._process, self._relay) if each]
        for each in self._listeners:
            each.start()

    @staticmethod
    def _start(switch, before, words, stdout=subprocess.DEVNULL, **variables):
        asan = os.environ.get("ASAN_OPTIONS", "") + ":verify_asan_link_order=0"
        process = subprocess.Popen([*before, *switch.words, *words], stdin=subprocess.PIPE, stdout=stdout,
                                   stderr=subprocess.PIPE, pass_fds=[switch.descriptor],
                                   env={**os.environ, **switch.variables, **variables, "ASAN_OPTIONS": asan})
        switch.given()
        return process

    def _listen(self, errors):
        """Keeps what is no report of a wrong event."""
        for line in errors:
            if self.said or re.search(rb"Sanitizer|runtime error:|softboard:|lapdmon:|internal error|communicating|is lost", line):
                self.said.append(line.decode("latin-1"))

    def read(self):
        """Some of the log, b"" at its end."""
        if not select.select([self._log], [], [], LIMIT)[0]:
            raise TimeoutError(f"no frame within {LIMIT} seconds")
        some = os.read(self._log, 1 << 16)
        if self._held_open is not None:  # now the program has it open
            os.close(self._held_open)
            self._held_open = None
        return some

    def set_faults(self, faults):
        self._board.ask("faults " + " ".join(faults))

    def taken(self):
        """Trace events that were read from the board so far."""
        return int(self._board.ask("taken"))

    def calm_sample(self):
        """The board's journal, which grows at first, is none of the program's memory."""
        self._host.ask("settle")
        return self.sample()

    def sample(self):
        return Sample(self.pid, self._board.held(), int(self._host.ask("used")))

    def pause(self, seconds):
        os.kill(self.pid, signal.SIGSTOP)
        time.sleep(seconds)
        os.kill(self.pid, signal.SIGCONT)

    def types_q(self):
        self._process.stdin.write(b"q\n")
        self._process.stdin.flush()

    def status(self):
        status = self._process.wait(LIMIT)
        if self._relay:
            self._relay.terminate()
            status = status or self._relay.wait(LIMIT)
        for each in self._listeners:
            each.join(LIMIT)
        return status

    def end(self):
        for each in (self._process, self._relay):
            if each:
                each.kill()
                each.wait()
                each.stdin.close()
        for each in self._listeners:
            each.join(LIMIT)
        self._process.stderr.close()
        if self._relay:
            self._relay.stderr.close()
            self._relay.stdout.close()
            self._board.close()
        os.close(self._log)
        if self._held_open is not None:
            os.close(self._held_open)
        self._host.close()


class Soak:
    def __init__(self, options, program):
        self._options = options
        self._program = program
        self._random = random.Random(options.seed)
        self._most_wrong = 0
        self._busy = []
        self.checker = Checker()
        self.samples = []
        self.calm = []
        self.times = {}
        self.stalls = []
        self._last_sample = 0

    def run(self):
        start = time.monotonic()
        self._follow(self._options.phase)
        self._catch_up()
        self.calm.append(self._program.calm_sample())
        while self._goes_on(start):
            if self._options.long_stall and len(self.calm) % LONG_STALL_EVERY == 1:
                self._long_stall()
            self._trouble()
            self._calm()
        self.seconds = time.monotonic() - start
        self._program.types_q()
        while some := self._program.read():
            self.checker.feed(some)
        self.checker.end()
        return self._program.status()

    def _goes_on(self, start):
        if self._options.minutes:
            return time.monotonic() - start < 60 * self._options.minutes
        return self.checker.frames < self._options.frames or not self._judges_memory()

    def _follow(self, frames):
        """Reads the log until so many more frames have come."""
        wanted = self.checker.frames + frames
        while self.checker.frames < wanted:
            some = self._program.read()
            if not some:
                raise EOFError("the program has ended")
            self.checker.feed(some)
            if time.monotonic() - self._last_sample > 0.5:
                self._last_sample = time.monotonic()
                self.samples.append(self._program.sample())

    def _catch_up(self):
        """Until the log has what was read from the board, but for what is just on its way."""
        end = time.monotonic() + LIMIT
        while self._program.taken() - self.checker.frames - self.checker.wrong > ON_THE_WAY and time.monotonic() < end:
            self._follow(100)

    def _long_stall(self):
        self._count("a long stall")
        taken = self._program.taken()
        time.sleep(self._options.long_stall)
        self.stalls.append(self._program.taken() - taken)
        self.samples.append(self._program.sample())
        self._catch_up()

    def _trouble(self):
        chance = self._random
        faults, wrong_events = [], 0
        for name, least, most in chance.sample(WRONG_EVENTS + OTHER_FAULTS, chance.randint(1, 4)):
            faults.append(name if least is None else f"{name}={chance.randint(least, most)}")
            wrong_events += name.startswith("event-")
            self._count(name)
        silent = any(fault.startswith("silent") for fault in faults)
        before = self._program.taken()
        self._program.set_faults(faults)
        outside = chance.choice(OUTSIDE)
        self._count(outside)
        self._outside(outside, chance.uniform(0.1, self._options.stall))
        if silent:  # no more frames come than had been sent
            self._program.set_faults([fault for fault in faults if not fault.startswith("silent")])
        self._follow(chance.randint(self._options.phase // 2, 2 * self._options.phase))
        self._program.set_faults([])
        # A fault sends its event before the first frame, too, and those that wait were sent while it stood.
        sent = self._program.taken() - before + self._program.sample().held
        self._most_wrong += wrong_events * (2 + sent // 50)

    def _count(self, name):
        self.times[name] = self.times.get(name, 0) + 1

    def _outside(self, what, seconds):
        if what == "the log is not read":
            time.sleep(seconds)
        elif what == "the program is stopped":
            self._program.pause(seconds)
        else:
            self._busy += [subprocess.Popen([sys.executable, "-c", "while True: pass"])
                           for _ in range(2 * (os.cpu_count() or 1))]

    def _calm(self):
        self.idle()
        self._follow(self._random.randint(self._options.phase // 2, self._options.phase))
        # What had to wait is gone before it is called calm.
        end = time.monotonic() + LIMIT
        while self._program.sample().held > QUEUE and time.monotonic() < end:
            self._follow(100)
        self._catch_up()
        self.calm.append(self._program.calm_sample())

    def idle(self):
        for each in self._busy:
            each.kill()
            each.wait()
        self._busy = []

    def complaints(self, status):
        """What is wrong, a sentence each."""
        checker, calm = self.checker, self.calm
        if status != 0:
            yield f"it ended with status {status}"
        if self._program.said:
            yield "it said:\n" + "".join(self._program.said[:50])
        if checker.lost:
            yield f"{checker.lost} frames were lost"
        if checker.disordered:
            yield f"{checker.disordered} frames were out of order"
        if checker.wrong > self._most_wrong:
            yield f"{checker.wrong} frames were not the board's, of which {self._most_wrong} may be"
        if max(sample.threads for sample in self.samples) > MOST_THREADS:
            yield "there were too many threads"
        if calm[-1].descriptors > calm[0].descriptors:
            yield "descriptors grew"
        if calm[-1].threads > calm[0].threads + 100:
            yield "threads grew"
        if calm[-1].held > QUEUE:
            yield f"{calm[-1].held} messages still waited in calm"
        third = len(calm) // 3
        if self._judges_memory() and (min(sample.used for sample in calm[-third:])
                                      > max(sample.used for sample in calm[:third]) + GROWTH):
            yield "memory grew"

    def _judges_memory(self):
        return len(self.calm) >= 6

    def report(self):
        checker, calm, samples = self.checker, self.calm, self.samples
        yield f"{self.seconds:.0f} seconds, seed {self._options.seed}, {len(calm) - 1} troubled times"
        yield (f"frames       {checker.frames} ({checker.frames / self.seconds:.0f} a second), lost {checker.lost}, "
               f"out of order {checker.disordered}; sent wrong by the board {checker.wrong}")
        for says, name, unit in (("in use", "used", " kB"), ("resident", "resident", " kB"), ("threads", "threads", ""),
                                 ("descriptors", "descriptors", ""), ("waiting", "held", " messages")):
            values = [getattr(sample, name) for sample in samples + calm]
            yield (f"{says:12} {getattr(calm[0], name)} in the first calm, {getattr(calm[-1], name)} in the last, "
                   f"at most {max(values)}{unit}")
        if not self._judges_memory():
            yield "memory is not judged by so few calm times"
        if self.stalls:
            yield (f"long stalls  {len(self.stalls)} of {self._options.long_stall:g} seconds, with at most "
                   f"{max(self.stalls)} frames")
        yield "faults       " + ", ".join(f"{name} {times}" for name, times in sorted(self.times.items()))


def main(arguments):
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--minutes", type=float, help="how long")
    parser.add_argument("--frames", type=int, default=100_000, help="how many frames at least, where no time is given")
    parser.add_argument("--seed", type=int, default=int(time.time()), help="of what is switched when")
    parser.add_argument("--rate", default=LINE_RATE, help="frames a second")
    parser.add_argument("--phase", type=int, default=4000, help="frames of a calm time, about")
    parser.add_argument("--stall", type=float, default=3, help="seconds for which the log is not read, at most")
    parser.add_argument("--long-stall", type=float, default=0,
                        help="seconds for which the log is not read now and then, 0 for never")
    parser.add_argument("--bound", action="store_true", help="see what becomes of more records than are kept")
    parser.add_argument("--relay", nargs="?", const=os.environ.get("RELAY"), help="have the board behind a relay")
    parser.add_argument("--lapdmon", default=os.environ.get("LAPDMON"))
    parser.add_argument("--softboard", default=os.environ.get("SOFTBOARD"))
    parser.add_argument("--fault-switch", default=LIBRARY)
    options = parser.parse_args(arguments)
    options.rate = "max" if options.bound else options.rate
    print(f"seed {options.seed}", flush=True)
    with tempfile.TemporaryDirectory(prefix="soak-") as folder:
        program = Program(options, pathlib.Path(folder))
        soak = Bound(program) if options.bound else Soak(options, program)
        try:
            complaints = list(soak.complaints(soak.run()))
        finally:
            soak.idle()
            program.end()
    print("\n".join(soak.report()))
    good = "what was lost is said" if options.bound else "nothing was lost, nothing out of order, nothing grew"
    print("\n".join(complaints) if complaints else good)
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
