"""Kills the parts of a fleet again and again while its trunks run, and compares the store with the logs at the end.

    scripts/fleet-chaos                               100 trunks for 30 minutes
    scripts/fleet-chaos --trunks 20 --minutes 2 --seed 7

Faults come one after another, first one of each kind and then at random, and may overlap: kill -9 of a recorder, of
a shipper, of a server of NATS, of a lapdstore, of PostgreSQL, each started again a while later; the line between a site
and its centre cut; the disk full on which a site's server keeps its stream and the shipper its places. That disk is a
small tmpfs, which only root can make; otherwise this fault is left out, and that is said.

Exit status 1 if the store has another frame, call or finding than lapdread finds in the logs, a gap or a dead letter,
or if a part has ended that nobody killed.
"""

import argparse
import contextlib
import ctypes
import os
import pathlib
import random
import signal
import subprocess
import sys
import tempfile
import time

from engines import SERVERS, missing
from fleet import Fleet
from traffic import Trunk as Traffic

SITES = ("london", "leeds")
CLONE_NEWNS = 0x00020000
SKIPPED = 77


class Disk:
    """A small tmpfs for each site, in a mount namespace of this process, so that it is gone when the process ends."""

    def __init__(self, folder, megabytes):
        self._folder, self.is_real = pathlib.Path(folder), False
        for site in SITES:
            self.of(site).mkdir()
        if os.geteuid() != 0 or ctypes.CDLL(None, use_errno=True).unshare(CLONE_NEWNS) != 0:
            return
        words = [["mount", "--make-rprivate", "/"], *(["mount", "-t", "tmpfs", "-o", f"size={megabytes}m,mode=755", "fleet",
                                                       self.of(site)] for site in SITES)]
        self.is_real = all(subprocess.run(each, check=False, capture_output=True).returncode == 0 for each in words)

    def __enter__(self):
        return self

    def __exit__(self, *_):
        for site in SITES if self.is_real else ():
            subprocess.run(["umount", "--lazy", self.of(site)], check=False)

    def of(self, site):
        return self._folder / f"disk.{site}"

    def fill(self, site):
        """Fills the site's disk to the last octet."""
        with open(self.of(site) / "ballast", "wb", buffering=0) as file:
            for size in (1 << 20, 1 << 12, 1):
                with contextlib.suppress(OSError):
                    while True:
                        file.write(bytes(size))

    def clear(self, site):
        (self.of(site) / "ballast").unlink()


class Chaos:
    """Makes faults in a running fleet. Each fault is a function that makes it and returns a function that undoes it."""

    def __init__(self, fleet, disk, seed, spare=()):
        self.fleet, self._random, self._disk = fleet, random.Random(seed), disk
        self.faults = {"recorder": self._kill(lambda: self._random.choice(fleet.trunks).recorder, 3),
                       "shipper": self._kill(lambda: self._random.choice(list(fleet.shippers.values())), 3),
                       "centre's server": self._kill(lambda: fleet.engines.nats[self._random.choice(SERVERS)], 8),
                       "site's server": self._kill(lambda: fleet.engines.nats[self._random.choice(SITES)], 8),
                       "lapdstore": self._kill(lambda: self._random.choice(fleet.stores), 5),
                       "PostgreSQL": self._database, "line to a site": self._line}
        if disk.is_real:
            self.faults["disk of a site"] = self._fill
        for name in spare:
            self.faults.pop(name, None)
        self.count = dict.fromkeys(self.faults, 0)
        self.unwanted = []
        self._undo = []  # (when, what, busy)
        self._busy = set()

    def run(self, seconds):
        end, todo = time.monotonic() + seconds, []
        while time.monotonic() < end:
            if not todo:
                todo = self._random.sample(list(self.faults), len(self.faults))
            self._inflict(todo.pop())
            self._until(min(end, time.monotonic() + self._random.uniform(0.5, 6)))
        self._until(None)

    def _inflict(self, name):
        made = self.faults[name]()
        if made is None:
            return
        what, lasts, undo = made
        self._busy.add(what)
        self._undo.append((time.monotonic() + lasts, what, undo))
        self.count[name] += 1

    def _until(self, moment):
        """Undoes the faults that are due before this moment, each at its time, and waits for the moment. Without a moment,
        undoes all of them."""
        for due, what, undo in sorted(self._undo, key=lambda each: each[0]):
            if moment is None or due < moment:
                time.sleep(max(0, due - time.monotonic()))
                undo()
                self._busy.remove(what)
        self._undo = [each for each in self._undo if each[1] in self._busy]
        if moment is not None:
            time.sleep(max(0, moment - time.monotonic()))

    def look(self, process):
        """Notes the process if it has ended although nobody has killed it."""
        if not process.is_running():
            self.unwanted.append(f"{process.name} has ended by itself: ...{process.said()[-300:]}")

    def look_at_all(self):
        fleet = self.fleet
        for each in [*fleet.engines.nats.values(), fleet.engines.database, *fleet.shippers.values(), *fleet.stores,
                     *(trunk.recorder for trunk in fleet.trunks)]:
            self.look(each)

    def _kill(self, choose, longest):
        def inflict():
            process = choose()
            if process.name in self._busy:
                return None
            self.look(process)
            process.kill()
            return process.name, self._random.uniform(0, longest), process.start
        return inflict

    def _database(self):
        engines = self.fleet.engines
        if engines.database.name in self._busy:
            return None
        self.look(engines.database)
        engines.database.kill()
        return engines.database.name, self._random.uniform(0, 5), engines.start_database

    def _line(self):
        site = self._random.choice(SITES)
        cable = self.fleet.engines.cables[site]
        if cable in self._busy:
            return None
        cable.cut()
        return cable, self._random.uniform(1, 15), cable.mend

    def _fill(self):
        """Fills a site's disk. A server whose disk was full may have switched its streams off, so it is started again."""
        site = self._random.choice(SITES)
        server = self.fleet.engines.nats[site]
        if server.name in self._busy:
            return None
        self._disk.fill(site)

        def undo():
            self._disk.clear(site)
            self.look(server)
            server.kill()
            server.start()
        return server.name, self._random.uniform(2, 8), undo


def run(options):
    seconds = options.minutes * 60
    began = time.monotonic()
    megabytes = 64 + int(options.trunks * options.minutes * options.rate)

    def traffic(number):
        return Traffic(f"{options.seed} {number}", seconds, options.rate).capture()
    with tempfile.TemporaryDirectory(prefix="fleet-chaos.") as folder, Disk(folder, 2 * megabytes) as disk:
        with Fleet(folder, options.trunks, traffic, SITES, site_folder=disk.of, megabytes=megabytes,
                   resend_window=options.window) as fleet:
            print(f"seed {options.seed}: {options.trunks} trunks at {len(SITES)} sites, {options.minutes:g} minutes; up after "
                  f"{time.monotonic() - began:.0f} seconds", flush=True)
            chaos = Chaos(fleet, disk, options.seed, options.spare)
            chaos.run(seconds)
            calm = time.monotonic()
            chaos.look_at_all()
            fleet.play_to_the_end()
            played = time.monotonic()
            fleet.await_stored(options.patience)
            stored = time.monotonic()
            result = fleet.compare()
            chaos.look_at_all()
            if not disk.is_real:
                print("no disk was filled: only root can mount a tmpfs")
            print("faults: " + ", ".join(f"{name} {count}" for name, count in chaos.count.items()))
            print(f"{result.frames} frames and {result.calls} calls in the logs; gaps {result.gaps}, dead letters "
                  f"{result.dead_letters}; all stored {stored - calm:.1f} s after the last fault, {stored - played:.1f} s after "
                  f"the last frame; {time.monotonic() - began:.0f} s in all")
            wrong = [*result.differences, *chaos.unwanted]
            if not result.calls:
                wrong.append("there were no calls to compare")
            wrong += [f"{count} {what}" for count, what in ((result.gaps, "gaps"), (result.dead_letters, "dead letters")) if count]
            print("\n".join(wrong) if wrong else "nothing is lost, nothing is there twice", flush=True)
            if wrong and options.keep:
                subprocess.run(["cp", "-a", folder, options.keep], check=False)
            return 1 if wrong else 0


def main(words=None):
    parser = argparse.ArgumentParser(prog="scripts/fleet-chaos", description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--trunks", type=int, default=100, metavar="N")
    parser.add_argument("--minutes", type=float, default=30, metavar="M")
    parser.add_argument("--rate", type=float, default=0.25, help="calls a second on each trunk (default: 0.25)")
    parser.add_argument("--seed", type=int, default=random.randrange(1 << 32), help="repeats traffic and order of the faults")
    parser.add_argument("--spare", action="append", default=[], metavar="FAULT", help="leave this fault out: 'disk of a site'")
    parser.add_argument("--window", type=int, default=120, help="seconds; the shippers' resend_window (default: 120)")
    parser.add_argument("--patience", type=float, default=600, help="seconds for the store to have all, at the end")
    parser.add_argument("--keep", metavar="FOLDER", help="where everything is copied to if something is wrong")
    options = parser.parse_args(words)
    if missing():
        print(f"not installed: {', '.join(missing())}")
        return SKIPPED
    os.environ["TZ"] = "UTC"
    signal.signal(signal.SIGTERM, lambda *_: sys.exit(1))  # takes everything down
    return run(options)


if __name__ == "__main__":
    sys.exit(main())
