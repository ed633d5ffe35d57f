"""Kills the parts of a fleet again and again while its trunks run, and compares the store with the logs at the end.

    scripts/fleet-chaos                               100 trunks for 30 minutes
    scripts/fleet-chaos --trunks 20 --minutes 2 --seed 7

Faults come one after another, first one of each kind and then at random, and may overlap: kill -9 of a recorder, of
a shipper, of a server of NATS, of a lapdstore, of PostgreSQL, each started again a while later; the line between a site
and its centre cut; a site's server started with an empty disk; the disk full on which a site's server keeps its stream and
the shipper its places, that of PostgreSQL, or that of some trunks' recordings. These disks are small tmpfs, which only root
can make; otherwise these faults are left out, and that is said. What could not be recorded is not expected in the store.
At last the lines to all sites are cut until each trunk has a day's frames waiting (--behind), and the time is taken
in which the store catches up.

The trunks of one site are redacted by its shipper, and two of the other site are the D channels of an NFAS group, which
change over in the middle.

Exit status 1 if the store has another frame, call or finding than lapdread finds in the logs, a gap or a dead letter,
or if a part has ended that nobody killed.
"""

import argparse
import contextlib
import ctypes
import os
import pathlib
import random
import subprocess
import sys
import tempfile
import time

from catch_up import catch_up
from engines import SERVERS, end_in_order, missing
from fleet import Fleet
from traffic import Trunk as Traffic

SITES = ("london", "leeds")
GROUP = (2, 4)  # numbers of the trunks that are the D channels of an NFAS group
CLONE_NEWNS = 0x00020000
SKIPPED = 77


class Disks:
    """A small tmpfs each, in a mount namespace of this process, so that it is gone when the process ends. `sizes`: megabytes,
    by name."""

    def __init__(self, folder, sizes):
        self._folder, self._names, self.is_real = pathlib.Path(folder), tuple(sizes), False
        for name in sizes:
            self.of(name).mkdir()
        if os.geteuid() != 0 or ctypes.CDLL(None, use_errno=True).unshare(CLONE_NEWNS) != 0:
            return
        words = [["mount", "--make-rprivate", "/"], *(["mount", "-t", "tmpfs", "-o", f"size={size}m,mode=755", "fleet",
                                                       self.of(name)] for name, size in sizes.items())]
        self.is_real = all(subprocess.run(each, check=False, capture_output=True).returncode == 0 for each in words)

    def __enter__(self):
        return self

    def __exit__(self, *_):
        for name in self._names if self.is_real else ():
            subprocess.run(["umount", "--lazy", self.of(name)], check=False)

    def of(self, name):
        return self._folder / f"disk.{name}"

    def fill(self, name):
        """Fills the disk to the last octet."""
        with open(self.of(name) / "ballast", "wb", buffering=0) as file:
            for size in (1 << 20, 1 << 12, 1):
                with contextlib.suppress(OSError):
                    while True:
                        file.write(bytes(size))

    def clear(self, name):
        (self.of(name) / "ballast").unlink()


class Chaos:
    """Makes faults in a running fleet. Each fault is a function that makes it and returns a function that undoes it."""

    def __init__(self, fleet, disks, seed, spare=()):
        self.fleet, self._random, self._disks = fleet, random.Random(seed), disks
        self.faults = {"recorder": self._kill(lambda: self._random.choice(fleet.trunks).recorder, 3),
                       "shipper": self._kill(lambda: self._random.choice(list(fleet.shippers.values())), 3),
                       "centre's server": self._kill(lambda: fleet.engines.nats[self._random.choice(SERVERS)], 8),
                       "site's server": self._kill(lambda: fleet.engines.nats[self._random.choice(SITES)], 8),
                       "lapdstore": self._kill(lambda: self._random.choice(fleet.stores), 5),
                       "PostgreSQL": self._database, "line to a site": self._line}
        self.faults["site's server, emptied"] = self._empty
        if disks.is_real:
            self.faults |= {"disk of a site": self._fill, "disk of PostgreSQL": self._fill_database,
                            "disk of recordings": self._fill_recordings}
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
        self._disks.fill(site)

        def undo():
            self._disks.clear(site)
            self.look(server)
            server.kill()
            server.start()
        return server.name, self._random.uniform(2, 8), undo

    def _empty(self):
        """A site's server comes back on a new disk, and somebody makes its stream anew."""
        site = self._random.choice(SITES)
        server = self.fleet.engines.nats[site]
        if server.name in self._busy or self.fleet.engines.cables[site] in self._busy:
            return None
        self.look(server)
        server.kill()
        self.fleet.engines.empty(site)

        def undo():
            server.start()
            self.fleet.make_site_stream(site)
        return server.name, self._random.uniform(0, 8), undo

    def _fill_database(self):
        """PostgreSQL may end when it cannot write its log, and cannot start before there is room."""
        database = self.fleet.engines.database
        if database.name in self._busy:
            return None
        self._disks.fill("database")

        def undo():
            self._disks.clear("database")
            database.kill()
            self.fleet.engines.start_database()
        return database.name, self._random.uniform(2, 8), undo

    def _fill_recordings(self):
        if "recordings" in self._busy:
            return None
        self._disks.fill("recordings")
        return "recordings", self._random.uniform(10, 30), lambda: self._disks.clear("recordings")


def run(options):
    seconds = options.minutes * 60
    began = time.monotonic()
    megabytes = 64 + int(options.trunks * options.minutes * options.rate)
    sizes = {**dict.fromkeys(SITES, 2 * megabytes), "database": 768, "recordings": megabytes}
    group = Traffic(f"{options.seed} group", seconds, options.rate).captures_of_group(seconds / 2)

    def recordings(number):
        return disks.of("recordings") if number % 10 == 3 and "disk of recordings" not in options.spare else None

    def traffic(number):
        if number in GROUP:
            return group[GROUP.index(number)]
        # A trunk with more traffic fills what its recording has left of a page on a full disk.
        rate = options.rate * (4 if recordings(number) else 1)
        return Traffic(f"{options.seed} {number}", seconds, rate, flaps=(seconds / 3,)).capture()
    with tempfile.TemporaryDirectory(prefix="fleet-chaos.") as folder, Disks(folder, sizes) as disks:
        with Fleet(folder, options.trunks, traffic, SITES, site_folder=disks.of, megabytes=megabytes, recordings=recordings,
                   database_folder=disks.of("database") if disks.is_real else None,
                   resend_window=options.window, groups=dict.fromkeys(GROUP, "nfas-a"), redacted=("leeds",)) as fleet:
            print(f"seed {options.seed}: {options.trunks} trunks at {len(SITES)} sites, {options.minutes:g} minutes; up after "
                  f"{time.monotonic() - began:.0f} seconds", flush=True)
            chaos = Chaos(fleet, disks, options.seed, options.spare)
            chaos.run(seconds)
            calm = time.monotonic()
            chaos.look_at_all()
            fleet.play_to_the_end()
            played = time.monotonic()
            fleet.await_stored(options.patience)
            stored = time.monotonic()
            result = fleet.compare()
            chaos.look_at_all()
            if not disks.is_real:
                print("no disk was filled: only root can mount a tmpfs")
            print("faults: " + ", ".join(f"{name} {count}" for name, count in chaos.count.items()))
            print(f"{result.frames} frames, {result.calls} calls and {result.findings} findings in the logs; gaps {result.gaps}, dead letters "
                  f"{result.dead_letters}; {result.lost} frames of {result.lossy} trunks could not be recorded; all stored {stored - calm:.1f} s after the last fault, {stored - played:.1f} s after "
                  f"the last frame; {time.monotonic() - began:.0f} s in all")
            wrong = [*result.differences, *chaos.unwanted]
            wrong += [f"there were no {what} to compare" for what, count in (("calls", result.calls), ("findings", result.findings))
                      if not count]
            wrong += [f"{result.gaps} gaps"] if result.gaps else []
            print("\n".join(wrong) if wrong else "nothing is lost, nothing is there twice", flush=True)
            if wrong and options.keep:
                subprocess.run(["cp", "-a", folder, options.keep], check=False)
            return bool(wrong)


def run_behind(options):
    said, wrong = catch_up(options.behind)
    print("\n".join([said, *(wrong or ["nothing is lost, nothing is there twice"])]), flush=True)
    return bool(wrong)


def main(words=None):
    parser = argparse.ArgumentParser(prog="scripts/fleet-chaos", description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--trunks", type=int, default=100, metavar="N")
    parser.add_argument("--minutes", type=float, default=30, metavar="M")
    parser.add_argument("--rate", type=float, default=0.25, help="calls a second on each trunk (default: 0.25)")
    parser.add_argument("--seed", type=int, default=random.randrange(1 << 32), help="repeats traffic and order of the faults")
    parser.add_argument("--spare", action="append", default=[], metavar="FAULT", help="leave this fault out, by the name that the end tells")
    parser.add_argument("--window", type=int, default=120, help="seconds; the shippers' resend_window (default: 120)")
    parser.add_argument("--behind", type=int, default=53000, metavar="FRAMES",
                        help="a day of a trunk: frames of each trunk that wait when a cut line is mended, at the end (0: no such cut)")
    parser.add_argument("--patience", type=float, default=600, help="seconds for the store to have all, at the end")
    parser.add_argument("--keep", metavar="FOLDER", help="where everything is copied to if something is wrong")
    options = parser.parse_args(words)
    if missing():
        print(f"not installed: {', '.join(missing())}")
        return SKIPPED
    os.environ["TZ"] = "UTC"
    end_in_order()
    is_wrong = run(options)
    return int(bool(options.behind) and run_behind(options) or is_wrong)


if __name__ == "__main__":
    sys.exit(main())
