"""A soak whose log is not read, until the program loses frames."""

import time

from soak_frames import LIMIT, Checker


class Bound:
    """The log is not read until the program says that it loses frames."""

    def __init__(self, program):
        self._program = program
        self._checker = Checker()
        self._said_lost = 0
        self._rest = b""

    def run(self):
        end = time.monotonic() + 20 * LIMIT
        while not any("too many frames wait" in line for line in self._program.said):
            if time.monotonic() > end:
                raise TimeoutError("it never says that too many frames wait")
            time.sleep(0.1)
        self._full = self._program.sample()
        waited = self._program.taken()
        while self._program.taken() < waited + 1000:
            time.sleep(0.1)
        self._program.types_q()
        while some := self._program.read():
            self._feed(some)
        self._checker.end()
        return self._program.status()

    def idle(self):
        """There is nothing else to end."""

    def _feed(self, some):
        self._checker.feed(some)
        *lines, self._rest = (self._rest + some).split(b"\n")
        self._said_lost += sum(int(line.split()[-1]) for line in lines if line.startswith(b"Frames Lost: "))

    def complaints(self, status):
        said = [line for line in self._program.said if "because too many waited for the log: " in line]
        counted = int(said[0].split()[-1]) if said else 0
        if status != 1:
            yield f"it ended with status {status}"
        if counted == 0 or self._said_lost != counted:
            yield f"standard error says that {counted} frames were lost, the log {self._said_lost}"
        if self._checker.lost > counted or self._checker.disordered or self._checker.wrong:
            yield f"{self._checker.lost} frames were lost, {self._checker.disordered} out of order"

    def report(self):
        yield (f"frames       {self._checker.frames}, lost as it says {self._said_lost}; when too many waited, "
               f"{self._full.used} kB in use, {self._full.resident} kB resident, {self._full.threads} threads")
