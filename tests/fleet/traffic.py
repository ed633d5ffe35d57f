"""The frames of a simulated trunk: calls with random numbers, causes and channels, and a link that is polled."""

import pathlib
import random
import sys
import tempfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "examples"))
import make_captures  # noqa: E402

FAR, NEAR = 0x8000, 0.012  # the flag of a call reference; an answer of layer 2 or 3 that takes no thinking


def text_of(lines):
    """Lines of a capture's text, in the order of their times in ticks of 4 ms."""
    return "".join(f"{at * 4 / 1000:.3f} {what}\n" for at, what in sorted(lines, key=lambda line: line[0]))


def capture_of(text):
    with tempfile.NamedTemporaryFile("w", suffix=".frames") as file:
        file.write(text)
        file.flush()
        return make_captures.pcap(make_captures.read(pathlib.Path(file.name)))


class Trunk:
    """The same seed gives the same traffic. `rate`: about so many calls a second; `seconds`: new calls begin for so long;
    `fails`: the share of calls that the other side refuses with one of `causes`; `flaps`: when the link is lost and set up
    again."""

    def __init__(self, seed, seconds, rate=0.5, causes=(17, 34, 41, 102, 1), fails=0.25, flaps=()):
        self._random, self._causes, self._fails, self._lines = random.Random(seed), causes, fails, []
        self._say(0, "tx sabme")
        self._say(NEAR, "rx ua")
        at, number = 0.5, 0
        while at < seconds:
            number += 1
            self._call(at, number)
            at += self._random.expovariate(rate)
        for flap in flaps:
            for second in range(4):
                self._say(flap + second, "tx poll")
            self._say(flap + 4, "tx sabme")
            self._say(flap + 4 + NEAR, "rx ua")
        for each in range(10, int(seconds), 10):
            self._say(each, "tx poll")
            self._say(each + NEAR, "rx final")

    def text(self):
        return text_of(self._lines)

    def capture(self):
        return capture_of(self.text())

    def captures_of_group(self, switch):
        """The captures of two D channels of one NFAS group. The first one carries the calls until the second `switch`, then the
        other does. Both links are polled all the time."""
        def is_polling(what):
            return what.endswith(("sabme", "ua", "poll", "final"))
        return [capture_of(text_of(line for line in self._lines if is_polling(line[1]) or (line[0] < switch * 250) == is_first))
                for is_first in (True, False)]

    def _say(self, at, what):
        self._lines.append((round(at * 250), what))

    def _tell(self, at, direction, message):
        """A message, and the acknowledgement of the other side."""
        self._say(at, f"{direction} {message}")
        self._say(at + NEAR, f"{'rx' if direction == 'tx' else 'tx'} rr")

    def _call(self, at, number):
        some = self._random
        ours, theirs = some.choice([("tx", "rx"), ("rx", "tx")])
        mine = f"{number % 0x7fff + 1:04x}"
        far = f"{number % 0x7fff + 1 | FAR:04x}"
        channel = 128 + number % 30 + 1
        called = f"030{some.randrange(10)}{some.randrange(1000):03}"
        self._tell(at, ours, f'setup {mine} bearer=8090a3 channel=a983{channel:02x} calling=2181"49574145{some.randrange(100):02}"'
                             f' called=80"{called}"')
        at += some.uniform(0.04, 0.2)
        self._tell(at, theirs, f"proceeding {far} channel=a983{channel:02x}")
        at += some.uniform(0.2, 1)
        if some.random() < self._fails:
            self._tell(at, theirs, f"disconnect {far} cause=82{0x80 + some.choice(self._causes):02x}")
            self._tell(at + 0.1, ours, f"release {mine}")
            self._tell(at + 0.2, theirs, f"release-complete {far}")
            return
        self._tell(at, theirs, f"alerting {far}")
        at += some.uniform(0.5, 3)
        if some.random() < 0.8:
            self._tell(at, theirs, f"connect {far}")
            self._tell(at + 0.1, ours, f"connect-ack {mine}")
            at += some.uniform(1, 8)
        self._tell(at, ours, f"disconnect {mine} cause=8190")
        self._tell(at + 0.1, theirs, f"release {far}")
        self._tell(at + 0.2, ours, f"release-complete {mine}")


if __name__ == "__main__":
    sys.stdout.write(Trunk(int(sys.argv[1]), float(sys.argv[2])).text())
