"""Measures how many frames a second come from logs into rows of the store, and how late they come.

    scripts/fleet-load [--trunks 8] [--frames 25000] [--rate 5000] [--seconds 20]

First, logs that are there already: once the stores have their leases, recorders and shippers are started, and the time
is taken until the last frame is a row, with its calls and findings; and how long each kind of program has worked, which
is the same on a busy machine. Then the logs grow by `--rate` frames a second, all together, and four times a second it
is looked up when the newest frame that is stored was written. Both times it is told how long the programs have worked for
a frame, and how much room a frame, a call and a finding take: a trunk's busy hour is `--trunks 50 --frames 1000 --rate 85 --seconds 120`. Everything, engines included,
runs on this machine, with certificates, and three copies of the stream.
"""

import argparse
import contextlib
import itertools
import os
import pathlib
import re
import statistics
import subprocess
import sys
import tempfile
import time

from engines import LIMIT, awaited, end_in_order, missing
from fleet import Fleet, frames_in, program
from traffic import Trunk as Traffic
from traffic import make_captures

SITES = ("london", "leeds")
PARTITIONS = 64
FRAMES_A_CALL, BEFORE_NOW = 18, 86400  # about; seconds


def written_log(folder, frames):
    """Returns the text of a log with about so many frames of yesterday, and their exact number."""
    make_captures.START = int(time.time()) - BEFORE_NOW
    capture, log = folder / "written.pcap", folder / "written.log"
    capture.write_bytes(Traffic(1, frames / FRAMES_A_CALL / 5, rate=5).capture())
    subprocess.run([program("lapdread"), "convert", "--quiet", "--to", "log", "-o", log, capture], check=True)
    return log.read_bytes(), frames_in(capture.read_bytes())


def blocks(log):
    """The log's head, and its frames, each with what is in front of it."""
    parts = re.split(rb"(?<=\n)(?=\n[A-Z][a-z]{2} [A-Z][a-z]{2} [ \d]\d [\d:]{8} \d{4}\n)", log)
    return parts[0], parts[1:]


class WrittenFleet(Fleet):
    """Its logs are written before anything runs."""

    def __init__(self, folder, trunks, log):
        super().__init__(folder, trunks, lambda _: make_captures.pcap([]), SITES, megabytes=4000)
        self._log = log

    def _start(self):
        for trunk in self.trunks:
            trunk.log.write_bytes(self._log)

    def count(self):
        return int(self.engines.sql("SELECT count(*) FROM lapd.frames")[0][0])


def processor_seconds(fleet):
    """Returns the processor time that each kind of program has taken so far, its child processes included."""
    ticks, parents = {}, {}
    for path in pathlib.Path("/proc").glob("[0-9]*/stat"):
        with contextlib.suppress(OSError):
            fields = path.read_text().rsplit(") ", 1)[1].split()
            pid = int(path.parent.name)
            parents[pid], ticks[pid] = int(fields[1]), int(fields[11]) + int(fields[12])
    kinds = {"lapdread record": [trunk.recorder for trunk in fleet.trunks], "lapdship": fleet.shippers.values(),
             "nats-server": fleet.engines.nats.values(), "lapdstore": fleet.stores, "PostgreSQL": [fleet.engines.database]}
    worked = {}
    for kind, processes in kinds.items():
        pids = {each.pid for each in processes if each.is_running()}
        worked[kind] = sum(each for pid, each in ticks.items() if pid in pids or parents[pid] in pids) / os.sysconf("SC_CLK_TCK")
    return worked


def from_logs_to_rows(fleet, frames):
    """Seconds that passed, and those that each kind of program has worked."""
    fleet.start_stores()
    awaited(lambda: fleet.leased() == PARTITIONS, "the leases")
    before, began = processor_seconds(fleet), time.monotonic()
    fleet.start_carrying()
    awaited(lambda: fleet.count() >= frames, "the frames of the logs", 20 * LIMIT)
    took, after = time.monotonic() - began, processor_seconds(fleet)
    return took, {kind: after[kind] - before[kind] for kind in after}


def sizes(fleet):
    """How many octets the recordings have, a copy of the centre's stream, and the tables of PostgreSQL with their indexes; and how
    many frames, calls or findings these are."""
    def table(name):
        size = ("SELECT sum(pg_total_relation_size(oid)) FROM pg_class WHERE relnamespace = 'lapd'::regnamespace AND relkind = 'r' "
                f"AND relname ~ '^{name}'")
        return int(fleet.engines.sql(size)[0][0]), int(fleet.engines.sql(f"SELECT count(*) FROM lapd.{name}")[0][0])
    frames, calls, findings = table("frames"), table("calls"), table("findings")
    recorded = sum(path.stat().st_size for trunk in fleet.trunks for path in trunk.files())
    streamed = sum(path.stat().st_size for path in (fleet.folder / "centre-1").glob("jetstream/**/streams/LAPD/msgs/*.blk"))
    return {"a frame in a recording": (recorded, frames[1]), "a frame in a copy of the stream": (streamed, frames[1]),
            "a frame in PostgreSQL": frames, "a call": calls, "a finding": findings}


def tell_work(worked, frames):
    print("processor time for a frame: " + ", ".join(f"{kind} {seconds / frames * 1e6:.0f} us" for kind, seconds in worked.items())
          + f"; in all {sum(worked.values()) / frames * 1e6:.0f} us", flush=True)


def tell_sizes(after, before=None):
    """Says how large one of each is, on average, of those that have come since `before`."""
    told = {what: (octets - before[what][0], count - before[what][1]) if before else (octets, count)
            for what, (octets, count) in after.items()}
    print("octets: " + ", ".join(f"{what} {octets / count:.0f} ({count} of them)" for what, (octets, count) in told.items() if count),
          flush=True)


def while_logs_grow(fleet, pieces, rate, seconds):
    """How late rows come: a list of seconds, and how many frames a second were written."""
    start, logs, late = fleet.count(), [open(trunk.log, "ab", buffering=0) for trunk in fleet.trunks], []
    began, written, at, looked = time.monotonic(), 0, [], 0
    supply = itertools.cycle(pieces)
    while (now := time.monotonic() - began) < seconds:
        due = int(now * rate) // len(logs)
        if due > written:
            some = b"".join(itertools.islice(supply, due - written))
            for log in logs:
                log.write(some)
            written = due
            at.append((now, written * len(logs)))
        if now > looked:
            looked += 0.25
            stored = fleet.count() - start
            oldest = next((then for then, number in at if number > stored), now)
            late.append(time.monotonic() - began - oldest)
        time.sleep(0.005)
    awaited(lambda: fleet.count() - start >= written * len(logs), "the frames that were written", 20 * LIMIT)
    whole = time.monotonic() - began
    for log in logs:
        log.close()
    return late, written * len(logs) / seconds, whole - seconds


def main():
    parser = argparse.ArgumentParser(prog="scripts/fleet-load", description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    for name, otherwise in (("trunks", 8), ("frames", 25000), ("rate", 5000), ("seconds", 20)):
        parser.add_argument(f"--{name}", type=int, default=otherwise, metavar="N")
    options = parser.parse_args()
    if missing():
        raise SystemExit(f"not installed: {', '.join(missing())}")
    end_in_order()
    os.environ["TZ"] = "UTC"
    with tempfile.TemporaryDirectory(prefix="fleet-load.") as name:
        folder = pathlib.Path(name)
        log, each = written_log(folder, options.frames)
        frames = each * options.trunks
        print(f"{options.trunks} trunks, {each} frames each, {len(log) * options.trunks / 1e6:.0f} MB of logs; "
              f"{os.cpu_count()} processors, load {os.getloadavg()[0]:.1f}", flush=True)
        with WrittenFleet(folder, options.trunks, log) as fleet:
            took, worked = from_logs_to_rows(fleet, frames)
            print(f"from written logs to rows: {took:.1f} s, {frames / took:.0f} frames a second")
            tell_work(worked, frames)
            at_once = sizes(fleet)
            tell_sizes(at_once)
            _, pieces = blocks(log)
            before = processor_seconds(fleet)
            late, rate, rest = while_logs_grow(fleet, pieces, options.rate, options.seconds)
            after = processor_seconds(fleet)
            late.sort()
            print(f"logs growing by {rate:.0f} frames a second: rows {statistics.median(late):.2f} s late, 95 % "
                  f"{late[len(late) * 95 // 100]:.2f} s; all stored {rest:.1f} s after the last was written")
            tell_work({kind: after[kind] - before[kind] for kind in after}, rate * options.seconds)
            tell_sizes(sizes(fleet), at_once)
    return 0


if __name__ == "__main__":
    sys.exit(main())
