"""A fleet on this machine: engines, trunks on the software board with their recorders, shippers and stores."""

import contextlib
import csv
import datetime
import io
import json
import os
import pathlib
import subprocess

from engines import LIMIT, Assembled, Engines, Process, awaited, fail_if_ended
from traffic import Trunk as Traffic

BINARIES = pathlib.Path(os.environ.get("FLEET_BINARIES", pathlib.Path(__file__).resolve().parents[2] / "build/release/bin"))

SHIP_METRICS, STORE_METRICS = 29470, 29480  # ports


def program(name):
    return str(BINARIES / name)


def lapdread(*words):
    """Returns what lapdread prints. Fails if lapdread fails or writes to the standard error stream."""
    ran = subprocess.run([program("lapdread"), *map(str, words), "--quiet"], capture_output=True, text=True, timeout=10 * LIMIT)
    if ran.returncode != 0 or ran.stderr:
        raise RuntimeError(f"lapdread {' '.join(map(str, words))}: status {ran.returncode}: {ran.stderr}")
    return ran.stdout


def frames_in(capture):
    """How many packets a pcap file has."""
    count, at = 0, 24
    while at < len(capture):
        at += 16 + int.from_bytes(capture[at + 8:at + 12], "little")
        count += 1
    return count


class Trunk:
    """A trace on the software board, whose log is kept, and the recorder that follows the log."""

    def __init__(self, name, site, number, folder, capture, group, recordings):
        self.name, self.site, self.number, self.group = name, site, number, group
        self.log, self.recordings = folder / f"{name}.lapdmon.log", recordings
        self.recordings.mkdir(exist_ok=True)
        frames = folder / f"{name}.pcap"
        frames.write_bytes(capture)
        self.frames = frames_in(capture)
        self.trace = Process(f"{name}.trace", [program("softboard"), "--frames", frames, "--dchannels", 1, "--", program("lapdmon"),
                                               "-b1", "-d1", "-f", self.log], folder)
        self.recorder = Process(f"{name}.recorder", [program("lapdread"), "record", "--follow", "--folder", self.recordings,
                                                     "--trunk", name, "--size", "200k", self.log], folder)

    def logged(self):
        """How many frames the log has."""
        return self.log.read_bytes().count(b"Hex Dump: \n") if self.log.exists() else 0

    def recorded(self):
        """How many frames the recorder says that it has read."""
        state = self.recordings / f"{self.name}.state.json"
        return json.loads(state.read_text())["next"] - 1 if state.exists() else 0

    def files(self):
        """The recordings, the last one perhaps unfinished."""
        listed = json.loads((self.recordings / f"{self.name}.state.json").read_text())["files"]
        named = [self.recordings / each["name"] for each in listed]
        return [path if path.exists() else path.with_name(f"{path.name}.part") for path in named]


class Fleet(Assembled):
    """`traffic(number)`: the capture that trunk `number` plays, from 1. Trunks are shared out among the sites.
    `groups`: names of NFAS groups, by the numbers of trunks. `redacted`: sites whose shippers send pseudonyms.
    `recordings(number)`: the folder of a trunk's recordings, unless it is None. `watched`: Prometheus runs from the beginning,
    at the URL `prometheus`."""

    def __init__(self, folder, trunks, traffic, sites=("london", "leeds"), stores=2, site_folder=None,
                 megabytes=200, resend_window=120, groups=None, redacted=(), recordings=None,
                 database_folder=None, watched=False):
        super().__init__()
        self.folder = pathlib.Path(folder)
        self.engines = Engines(self.folder, sites, site_folder, database_folder)
        self.shippers, self.stores, self.trunks = {}, [], []
        self._plan = (trunks, traffic, stores)
        self._recordings = recordings or (lambda number: None)
        self._is_watched, self.prometheus = watched, None
        self._groups, self._redacted, self.key = groups or {}, redacted, self.folder / "redaction.key"
        self._megabytes, self._resend_window = megabytes, resend_window  # of a site's stream; of a shipper, in seconds
        self._state_folder = site_folder or (lambda site: self.folder / site)

    def _assemble(self):
        self._down.enter_context(self.engines)
        self._make_streams()
        self._make_tables()
        if self._is_watched:
            self.prometheus = self._start_prometheus()
        self._make_trunks()
        self._start()

    def url(self, user="reads"):
        return self.engines.database_url(user)

    def metrics(self, site=None, store=0):
        """Where the shipper of a site, or a store, offers its figures."""
        return f"{self.engines.address}:{STORE_METRICS + store if site is None else SHIP_METRICS + self.engines.sites.index(site)}"

    def _start_prometheus(self):
        """Starts Prometheus and returns its URL."""
        return self.engines.start_prometheus({
            "lapdship": [self.metrics(site) for site in self.engines.sites],
            "lapdstore": [self.metrics(store=number) for number in range(1, self._plan[2] + 1)]})

    # Setting it up, as the pages say.

    def _toml(self, site, user, trunks=()):
        authority, certificate, key = self.engines.certificate(user)
        servers = ", ".join(f'"{each}"' for each in self.engines.servers(site))
        state = self._state_folder(site) / "shipper" if site else self.folder
        state.mkdir(parents=True, exist_ok=True)
        text = (f'site = "{site or "centre"}"\nhost = "h1"\nservers = [ {servers} ]\nstate = "{state}"\n'
                f'metrics = "{self.metrics(site)}"\nresend_window = {self._resend_window}\n'
                f'[tls]\nauthority = "{authority}"\ncertificate = "{certificate}"\nkey = "{key}"\n')
        if site in self._redacted:
            text = f'redact = "{self.key}"\n{text}'
        for trunk in trunks:
            text += (f'[[dchannel]]\nboard = "{trunk.number}"\ndchannel = "1"\ntrunk = "{trunk.name}"\n'
                     f'folder = "{trunk.recordings}"\n' + (f'group = "{trunk.group}"\n' if trunk.group else ""))
        if not trunks:  # only streams are made, but the file names a D channel
            text += '[[dchannel]]\nboard = "0"\ndchannel = "1"\ntrunk = "none"\nlog = "/dev/null"\n'
        path = self.folder / f"{site or 'centre'}.{user}.toml"
        path.write_text(text)
        return path

    def _has_made(self, *words, site=None):
        ran = subprocess.run([program("lapdship"), "streams", *words, "-c", self._toml(site, "admin")], capture_output=True,
                             text=True, timeout=LIMIT)
        return ran.returncode == 0

    def make_site_stream(self, site):
        awaited(lambda: self._has_made("site", "--size", str(self._megabytes), site=site), f"the stream of {site}")

    def _make_streams(self):
        for site in self.engines.sites:
            self.make_site_stream(site)
        sites = [word for site in self.engines.sites for word in ("--from", site)]
        # The three servers choose a leader before they make streams.
        awaited(lambda: self._has_made("centre", "--replicas", "3", *sites), "the streams of the centre")

    def _make_tables(self):
        subprocess.run([program("lapdstore"), "--database", self.engines.owner_url, "migrate"], check=True, capture_output=True,
                       timeout=LIMIT)
        self.engines.sql("CREATE ROLE lapdstore LOGIN; GRANT lapd_writer TO lapdstore; CREATE ROLE reads LOGIN; "
                         "GRANT lapd_reader TO reads")

    def _make_trunks(self):
        trunks, traffic, _ = self._plan
        folder = self.folder / "trunks"
        folder.mkdir()
        for number in range(1, trunks + 1):
            site = self.engines.sites[number % len(self.engines.sites)]
            self.trunks.append(Trunk(f"pri{number}", site, number, folder, traffic(number), self._groups.get(number),
                                     self._recordings(number) or folder / "recordings"))
        if self._redacted:
            lapdread("redact", "--key", self.key, "-o", self.folder / "nothing.pcap", self.folder / "trunks/pri1.pcap")

    def _add(self, process):
        self._down.callback(process.take_down)
        return process

    def _start(self):
        for trunk in self.trunks:
            self._add(trunk.trace).start()
        for trunk in self.trunks:
            awaited(lambda: trunk.log.exists() or fail_if_ended(trunk.trace), f"the log of {trunk.name}")  # noqa: B023
        self.start_stores()
        self.start_carrying()

    def start_carrying(self):
        """Starts the programs that bring frames from the logs to the stores."""
        for trunk in self.trunks:
            self._add(trunk.recorder).start()
        for site in self.engines.sites:
            own = [trunk for trunk in self.trunks if trunk.site == site]
            self.shippers[site] = self._add(Process(f"lapdship.{site}", [program("lapdship"), "-c",
                                                                         self._toml(site, "shipper", own)], self.folder)).start()

    def start_stores(self):
        authority, certificate, key = self.engines.certificate("store")
        nats = [word for server in self.engines.servers() for word in ("--nats", server)]
        words = [program("lapdstore"), "--database", self.url("lapdstore"), *nats, "--authority", authority, "--certificate",
                 certificate, "--key", key, "--again-after", "5"]
        for number in range(1, self._plan[2] + 1):
            own = [*words, "--metrics", self.metrics(store=number)]
            self.stores.append(self._add(Process(f"lapdstore.{number}", own, self.folder)).start())

    def leased(self):
        """How many partitions of the stream are leased to a store."""
        return len(self.engines.sql("SELECT 1 FROM pg_locks WHERE locktype = 'advisory' AND granted AND objid < 64"))

    # Ending it, and what came of it.

    def play_to_the_end(self):
        """Waits until each log has all frames that its trunk plays, and each trace has ended in order."""
        for trunk in self.trunks:
            awaited(lambda: trunk.logged() >= trunk.frames, f"{trunk.name} plays", 10 * LIMIT)  # noqa: B023
        for trunk in self.trunks:
            if trunk.trace.end() != 0:
                raise RuntimeError(f"{trunk.trace.name}: {trunk.trace.said()}")

    def stored(self):
        """How many frames the store has of each trunk."""
        rows = self.engines.sql("SELECT name, count(frames.*) FROM lapd.trunks LEFT JOIN lapd.frames USING (trunk) GROUP BY 1")
        return {name: int(count) for name, count in rows}

    def await_stored(self, limit):
        """Waits until the store has as many frames as the logs, or as the recordings if less could be recorded, or the time is
        over."""
        for trunk in self.trunks:
            awaited(lambda: trunk.recorded() >= trunk.logged(), f"the recordings of {trunk.name}")  # noqa: B023
        wanted = {trunk.name: trunk.logged() - self.lost(trunk) for trunk in self.trunks}
        with contextlib.suppress(TimeoutError):
            awaited(lambda: self.stored() == wanted, "the frames of all trunks", limit)

    def lost(self, trunk):
        """How many frames of the log could not be recorded. The recorder has read all of it."""
        if self._recordings(trunk.number) is None:
            return 0
        recorded = lapdread("convert", "--to", "hex", "-o", "-", *trunk.files()).splitlines()
        return trunk.logged() - sum(not line.startswith("#") for line in recorded)

    def evidence(self, trunk):
        """The trunk's log, or its recordings if they lack frames; with pseudonyms if its site sends them."""
        files = trunk.files() if self.lost(trunk) else [trunk.log]
        if trunk.site not in self._redacted:
            return files
        redacted = trunk.log.with_suffix(".redacted.pcapng")
        if not redacted.exists():
            lapdread("redact", "--key", self.key, "-o", redacted, *files)
        return [redacted]

    def compare(self):
        """Reads the logs and the store, and returns the Comparison."""
        result = Comparison()
        for trunk in self.trunks:
            result.of(trunk, self)
            lost = self.lost(trunk)
            result.lost += lost
            result.lossy += 1 if lost else 0
            result.gaps += 0 if lost else len(self.engines.sql("SELECT 1 FROM lapd.gaps JOIN lapd.trunks USING (trunk) "
                                                               f"WHERE name = '{trunk.name}'"))
        for group in sorted(set(self._groups.values())):
            result.of_group([trunk for trunk in self.trunks if trunk.group == group], self)
        for count, reason, subject in self.engines.sql("SELECT count(*), reason, min(subject) FROM lapd.dead_letters GROUP BY reason"):
            result.dead_letters += int(count)
            result.differences.append(f"dead letters: {count} of {subject} because {reason}")
        return result


# Columns of lapdread calls --csv that the table of calls has in the same words.
COLUMNS = ("callref", "origin", "dir", "kind", "calling", "called", "bearer", "channel_asked", "channel", "first_response_ms",
           "progress_ms", "alerting_ms", "connect_ms", "duration_ms", "outcome", "ended_by", "cleared_by", "cause", "location",
           "made", "causes", "first_frame", "last_frame", "flags")


class Comparison:
    """The logs and the store, read by lapdread, and the table of calls. `differences` are lines for people."""

    def __init__(self):
        self.frames = self.calls = self.findings = self.lost = self.lossy = self.gaps = self.dead_letters = 0
        self.differences = []

    def of(self, trunk, fleet):
        """The same trunk, on both sides."""
        def both(*words):
            return [lapdread(*words, "--trunk", trunk.name, *where)
                    for where in (evidence, ["--store", fleet.url()])]
        # In what is read a frame's number is its place; in the tables it is the number in the run, with those that are lost.
        evidence, without = fleet.evidence(trunk), ("first_frame", "last_frame") if fleet.lost(trunk) else ()
        frames, stored = ([line for line in text.splitlines() if not line.startswith("# lapdread: redacted with")]
                          for text in both("convert", "--to", "hex", "-o", "-"))
        self.compare(f"{trunk.name}, frames", frames, stored)
        self.frames += sum(not line.startswith("#") for line in frames)
        calls, stored = (list(csv.DictReader(io.StringIO(text))) for text in both("calls", "--csv"))
        self.compare(f"{trunk.name}, calls", [row_of(call) for call in calls], [row_of(call) for call in stored])
        self.calls += len(calls)
        self.compare(f"{trunk.name}, findings", *(text.splitlines() for text in both("check")))
        if trunk.group:
            return  # its calls may begin on one D channel and end on another
        if not without:  # sentences name frames
            self.compare(f"{trunk.name}, table of findings", *self._findings(trunk, fleet))
        columns = [column for column in COLUMNS if column not in without]
        table = fleet.engines.sql(f"SELECT {', '.join(columns)} FROM lapd.calls JOIN lapd.trunks USING (trunk) "
                                  f"WHERE name = '{trunk.name}' ORDER BY last_frame, first_frame")
        calls.sort(key=lambda call: (int(call["last_frame"]), int(call["first_frame"])))
        for call in calls:  # the end of a log ends its calls; the store waits for more
            if call["ended_by"] == "open":
                call["outcome"] = "open"
        self.compare(f"{trunk.name}, table of calls", [[call[column] for column in columns] for call in calls], table)

    def _findings(self, trunk, fleet):
        """Those of lapdread check on the log, and the rows of the table."""
        found = [json.loads(line) for line in
                 lapdread("check", "--jsonl", "--trunk", trunk.name, *fleet.evidence(trunk)).splitlines()]
        self.findings += len(found)
        severities = ("note", "warning", "error")
        rows = fleet.engines.sql(f"SELECT frame, kind, severity, count, sentence FROM lapd.findings JOIN lapd.trunks USING (trunk) "
                                 f"WHERE name = '{trunk.name}'")
        logged = [[str(each["frame"]), each["finding"], str(severities.index(each["severity"])), str(each["count"]),
                   each["sentence"]] for each in found]
        newest = float(fleet.engines.sql("SELECT max(time) / 1e9 FROM lapd.frames JOIN lapd.trunks USING (trunk) "
                                         f"WHERE name = '{trunk.name}'")[0][0] or 0)
        waiting = waiting_in(found, newest)
        return [sorted(row for row in side if (row[0], row[1]) not in waiting) for side in (logged, rows)]

    def of_group(self, trunks, fleet):
        """The D channels of an NFAS group, which share their calls."""
        names = ",".join(trunk.name for trunk in trunks)
        logs = [log for trunk in trunks for log in fleet.evidence(trunk)]
        rows = [csv.DictReader(io.StringIO(lapdread("calls", "--csv", *where))) for where in
                (["--nfas", ",".join(log.stem for log in logs), "--merge", *logs], ["--trunk", names, "--store", fleet.url()])]
        # Frames of two D channels that have the same time have no order.
        self.compare(f"{names}, calls of the group", *(sorted(row_of(call, "call", "dchannel", "first_frame", "last_frame")
                                                              for call in each) for each in rows))

    def compare(self, what, expected, got):
        if expected == got:
            return
        here, there = set(map(str, expected)), set(map(str, got))
        lost, more = [row for row in expected if str(row) not in there], [row for row in got if str(row) not in here]
        self.differences.append(f"{what}: {len(expected)} in the log, {len(got)} in the store; {len(lost)} of the log are not in "
                                f"the store, {len(more)} of the store not in the log")
        for where, rows in (("log", lost), ("store", more)):
            self.differences += [f"    only in the {where}: {row}" for row in rows[:3]]


def waiting_in(found, newest):
    """Frame and kind of the findings that may only be counted as yet: a fault of a link that comes again is told ten minutes
    later, or at the end of a log, and the store waits for more. `newest`: when the last frame was, in seconds since 1970."""
    told, waiting = set(), set()
    for each in found:
        kind = (each["finding"], each["severity"])
        at = datetime.datetime.fromisoformat(each["time"]).timestamp()
        is_of_a_link = each["clause"].startswith("Q.921") or each["finding"] == "board-restarted"
        if is_of_a_link and kind in told and at > newest - 600:
            waiting.add((str(each["frame"]), each["finding"]))
        told.add(kind)
    return waiting


def row_of(call, *without):
    """A call without the column that says where it was read, and without these."""
    return [value for key, value in call.items() if key not in ("file", *without)]
