"""The engines of a fleet on this machine: three NATS servers of a centre, one for each site, PostgreSQL, and Prometheus.

    with Engines(folder) as engines:          everything is up, and is taken down however the block ends
        engines.nats["centre-1"].kill()       as kill -9
        engines.nats["centre-1"].start()

All of them listen on a loopback address that no other process uses, keep their files below the folder, know each other
by certificates of scripts/fleet-certificates, and run as the users of their Debian packages if root starts them. Each
is killed by the kernel when the thread that started it ends, so start them on the main thread.
"""

import argparse
import contextlib
import csv
import glob
import io
import json
import os
import pathlib
import pwd
import select
import shutil
import signal
import socket
import subprocess
import sys
import tempfile
import time
import urllib.request

from cable import Cable

ROOT = pathlib.Path(__file__).resolve().parents[2]
LIMIT = 120  # seconds for an engine to start; nothing waits so long when all is well
SERVERS = ("centre-1", "centre-2", "centre-3")
CLIENTS = ("admin", "shipper", "store", "lapdstore", "keeper", "reads")
CLIENT_PORT, CLUSTER_PORT, LEAF_PORT, CABLE_PORT = 24222, 26222, 27422, 28422
DATABASE_PORT, PROMETHEUS_PORT = 25432, 29090


def own_address():
    """A loopback address of this process: fixed ports are free there, and a port stays ours while an engine is dead."""
    pid = os.getpid()
    return f"127.{64 + (pid >> 16) % 64}.{pid >> 8 & 255}.{pid & 255}"


def missing(*more):
    """The names of programs that are needed and not installed."""
    paths = os.pathsep.join([os.environ.get("PATH", ""), "/usr/sbin", database_programs()])
    return [name for name in ("nats-server", "postgres", "initdb", "psql", "openssl", "setpriv", *more)
            if shutil.which(name, path=paths) is None]


def database_programs():
    """The folder of initdb and postgres; empty if there is none."""
    return max(glob.glob("/usr/lib/postgresql/*/bin"), default="")


def awaited(condition, what, limit=LIMIT):
    """Waits until condition() is true, and returns its value."""
    end = time.monotonic() + limit
    while not (found := condition()):
        if time.monotonic() > end:
            raise TimeoutError(f"{what}: not within {limit} seconds")
        time.sleep(0.05)
    return found


class Process:
    """A program that can be killed and started again. Its output is added to NAME.log. `last`: the signal by which it is
    taken down, if a killed one would leave something on the machine."""

    def __init__(self, name, words, folder, user=None, last=signal.SIGKILL, **more):
        self.name, self.log, self._last = name, folder / f"{name}.log", last
        as_user = []
        if user and os.geteuid() == 0:
            as_user = ["--reuid", user, "--regid", str(pwd.getpwnam(user).pw_gid), "--clear-groups"]
        self._words = ["setpriv", *as_user, "--pdeathsig", last.name.removeprefix("SIG"), "--", *map(str, words)]
        self._more, self._process, self.starts = more, None, 0

    def start(self):
        with open(self.log, "ab") as log:
            self._process = subprocess.Popen(self._words, stdin=subprocess.DEVNULL, stdout=log, stderr=log, **self._more)
        self.starts += 1
        return self

    @property
    def pid(self):
        return self._process.pid

    def is_running(self):
        return self._process is not None and self._process.poll() is None

    def wait(self, limit=LIMIT):
        """Its exit status."""
        return self._process.wait(limit)

    def kill(self):
        self.end(signal.SIGKILL)

    def end(self, number=signal.SIGTERM, limit=LIMIT):
        """Ends the process and returns its exit status. Kills it if it does not end in time, and says so."""
        if self._process is None:
            return None
        self._process.send_signal(number)
        try:
            return self._process.wait(limit)
        except subprocess.TimeoutExpired:
            self._process.kill()
            self._process.wait()
            raise TimeoutError(f"{self.name} did not end within {limit} seconds of signal {number}") from None

    def take_down(self):
        if self.is_running():
            with contextlib.suppress(TimeoutError):
                self.end(self._last, 20)

    def said(self):
        return self.log.read_text(errors="replace") if self.log.exists() else ""


class Assembled:
    """What consists of parts: `_assemble` begins them and puts each on `_down`. They are taken down in the opposite order,
    when the block ends or if one of them fails to begin."""

    def __init__(self):
        self._down = contextlib.ExitStack()

    def __enter__(self):
        try:
            self._assemble()
            return self
        except BaseException:
            self.take_down()
            raise

    def __exit__(self, *_):
        self.take_down()

    def take_down(self):
        """Whoever is impatient at the keyboard would leave a part of it behind."""
        impatience = signal.signal(signal.SIGINT, signal.SIG_IGN)
        try:
            self._down.close()
        finally:
            signal.signal(signal.SIGINT, impatience)


class Engines(Assembled):
    """`sites`: their names; each gets a server that is a leaf of the centre's three, behind a cable that can be cut.
    `site_folder(name)`: where a site's stream is kept, and `database_folder`: where the database is; below the folder unless
    told."""

    def __init__(self, folder, sites=("london",), site_folder=None, database_folder=None):
        super().__init__()
        self.folder, self.sites, self.address = pathlib.Path(folder), tuple(sites), own_address()
        self.certificates = self.folder / "certificates"
        self._site_folder = site_folder or (lambda site: self.folder / site)
        self._database_folder = database_folder or self.folder / "database"
        self.nats, self.cables, self.database, self.prometheus = {}, {}, None, None

    def _assemble(self):
        os.umask(0o022)  # the engines' users read what is written for them; keys have modes of their own
        os.chmod(self.folder, 0o755)
        self._make_certificates()
        self._start_database()
        for number, name in enumerate(SERVERS, 1):
            self._start_nats(name, number, self.folder / name, self._centre(number))
        for number, site in enumerate(self.sites, len(SERVERS) + 1):
            self.cables[site] = self._down.enter_context(
                Cable([((self.address, CABLE_PORT + 10 * number + i), (self.address, LEAF_PORT + i)) for i in (1, 2, 3)]))
            self._start_nats(site, number, self._site_folder(site), self._leaf(site, number))
        self.await_ready()

    # What programs are told.

    def servers(self, site=None):
        """URLs of the centre's servers, or of a site's."""
        numbers = [len(SERVERS) + 1 + self.sites.index(site)] if site else range(1, len(SERVERS) + 1)
        return [f"tls://{self.address}:{CLIENT_PORT + number}" for number in numbers]

    def certificate(self, user):
        """A client's three files: the authority that it trusts, its certificate and its key."""
        return [self.certificates / name for name in ("authority.pem", f"{user}.pem", f"{user}.key")]

    def database_url(self, user):
        authority, certificate, key = self.certificate(user)
        return (f"postgresql://{user}@{self.address}:{DATABASE_PORT}/lapd?sslmode=verify-full&sslrootcert={authority}"
                f"&sslcert={certificate}&sslkey={key}")

    @property
    def owner_url(self):
        return f"postgresql://owner@/lapd?host={self.folder}/database&port={DATABASE_PORT}"

    def sql(self, query, database="lapd"):
        """Runs a query as the owner, and returns its rows as lists of texts."""
        said = subprocess.run(["psql", "-Xtq", "--csv", "-v", "ON_ERROR_STOP=1", "-h", self.folder / "database", "-p",
                               str(DATABASE_PORT), "-U", "owner", "-d", database, "-c", query],
                              check=True, capture_output=True, text=True, timeout=LIMIT).stdout
        return list(csv.reader(io.StringIO(said)))

    # The engines.

    def _own(self, path, user):
        """Makes the folder unless the path exists, and lets only this user read what is there."""
        if not path.exists():
            path.mkdir(parents=True)
        os.chmod(path, 0o700 if path.is_dir() else 0o600)
        if os.geteuid() == 0:
            shutil.chown(path, user, pwd.getpwnam(user).pw_gid)
        return path

    def _make_certificates(self):
        subprocess.run([ROOT / "scripts/fleet-certificates", self.certificates, f"server:{self.address}",
                        *(f"client:{name}" for name in (*CLIENTS, *self.sites))], check=True)
        os.chmod(self.certificates, 0o755)
        for path in self.certificates.glob("*.pem"):
            os.chmod(path, 0o644)
        for user in ("postgres", "nats"):
            for ending in (".key", ".pem"):
                copy = self.certificates / f"{user}.server{ending}"
                shutil.copy(self.certificates / f"{self.address}{ending}", copy)
                self._own(copy, user)
        for site in self.sites:
            self._own(self.certificates / f"{site}.key", "nats")

    def _tls(self, name, more):
        return (f'tls {{ cert_file: "{self.certificates}/{name}.pem", key_file: "{self.certificates}/{name}.key", '
                f'ca_file: "{self.certificates}/authority.pem", {more} }}')

    def _users(self, stream):
        consumer = "$JS.API.CONSUMER"
        return ('authorization { users: [ { user: admin }, '
                f'{{ user: shipper, permissions: {{ publish: [ "lapd.>", "$JS.API.STREAM.INFO.{stream}" ], '
                'subscribe: "_INBOX.>" } }, '
                f'{{ user: store, permissions: {{ publish: [ "{consumer}.DURABLE.CREATE.LAPD.*", "{consumer}.CREATE.LAPD.>", '
                f'"{consumer}.INFO.LAPD.*", "{consumer}.MSG.NEXT.LAPD.*", "$JS.API.STREAM.INFO.LAPD", "$JS.ACK.>", '
                '"lapd-dead.>" ], subscribe: "_INBOX.>" } } ] }')

    def _centre(self, number):
        routes = ", ".join(f'"nats://{self.address}:{CLUSTER_PORT + i}"' for i in (1, 2, 3) if i != number)
        leaves = ", ".join(f"{{ user: {site} }}" for site in self.sites)
        return ["domain: centre", self._tls("nats.server", "verify_and_map: true"), self._users("LAPD"),
                f'cluster {{ name: centre, listen: "{self.address}:{CLUSTER_PORT + number}", routes: [ {routes} ], '
                f'{self._tls("nats.server", "verify: true")} }}',
                f'leafnodes {{ listen: "{self.address}:{LEAF_PORT + number}", no_advertise: true, '
                f'authorization {{ users: [ {leaves} ] }}, {self._tls("nats.server", "verify_and_map: true")} }}']

    def _leaf(self, site, number):
        urls = ", ".join(f'"tls://{self.address}:{CABLE_PORT + 10 * number + i}"' for i in (1, 2, 3))
        return [f"domain: {site}", self._tls("nats.server", "verify_and_map: true"), self._users("LAPD_SITE"),
                f'leafnodes {{ reconnect: 1, remotes: [ {{ urls: [ {urls} ], deny_exports: [ "lapd.>" ], '
                f'{self._tls(site, "timeout: 5")} }} ] }}']

    def _start_nats(self, name, number, store, rules):
        configuration = self.folder / f"{name}.conf"
        domain, *others = rules
        self._own(store, "nats")
        configuration.write_text("\n".join([
            f'server_name: "{name}"', f'listen: "{self.address}:{CLIENT_PORT + number}"',
            f'jetstream {{ store_dir: "{store}", {domain} }}', *others]) + "\n")
        engine = self.nats[name] = Process(name, ["nats-server", "-c", configuration], self.folder, "nats", cwd="/")
        self._down.callback(engine.take_down)
        engine.start()

    def _start_database(self):
        programs, folder = pathlib.Path(database_programs()), self.folder / "database"
        data = self._database_folder / "data"
        self._own(folder, "postgres")
        self._own(self._database_folder, "postgres")
        initdb = Process("initdb", [programs / "initdb", "-D", data, "-U", "owner", "-A", "trust", "-E", "UTF8",
                                    "--locale", "C.UTF-8", "--no-sync", "--no-instructions"], self.folder, "postgres", cwd="/")
        if initdb.start().wait() != 0:
            raise RuntimeError(initdb.said())
        (data / "pg_hba.conf").write_text(f"local all owner trust\nhostssl lapd all 127.0.0.0/8 cert\n")
        settings = {"listen_addresses": self.address, "port": DATABASE_PORT, "unix_socket_directories": folder, "ssl": "on",
                    "ssl_cert_file": self.certificates / "postgres.server.pem",
                    "ssl_key_file": self.certificates / "postgres.server.key",
                    "ssl_ca_file": self.certificates / "authority.pem", "max_connections": 60, "shared_buffers": "64MB",
                    # What a killed process has written is not lost; only a machine that fails needs the disk for it.
                    "fsync": "off", "full_page_writes": "off"}
        words = [word for key, value in settings.items() for word in ("-c", f"{key}={value}")]
        # Killed, it would leave shared memory behind.
        self.database = Process("postgres", [programs / "postgres", "-D", data, *words], self.folder, "postgres",
                                last=signal.SIGQUIT, cwd="/")
        self._down.callback(self.database.take_down)
        self.start_database()
        self.sql("CREATE DATABASE lapd", "postgres")

    def empty(self, site):
        """Removes what the killed server of a site has stored."""
        for path in self._site_folder(site).glob("jetstream"):
            shutil.rmtree(path)

    def start_database(self):
        """Starts PostgreSQL, as often as it takes: it refuses while children of a killed server still run."""
        def is_up():
            if not self.database.is_running():
                self.database.start()
            return subprocess.run([f"{database_programs()}/pg_isready", "-q", "-h", self.folder / "database", "-p",
                                   str(DATABASE_PORT)], check=False).returncode == 0
        awaited(is_up, "PostgreSQL")

    def start_prometheus(self, targets):
        """With the alerts of the tree. `targets`: addresses that are asked, by the name of their program."""
        folder, configuration = self._own(self.folder / "prometheus", "prometheus"), self.folder / "prometheus.yml"
        # Its user may not be able to enter the tree's folder.
        rules = shutil.copyfile(ROOT / "packaging/prometheus/alerts.yml", self.folder / "alerts.yml")
        jobs = [{"job_name": job, "static_configs": [{"targets": each}]} for job, each in targets.items()]
        configuration.write_text(json.dumps({
            "global": {"scrape_interval": "1s", "evaluation_interval": "1s"},
            "rule_files": [str(rules)], "scrape_configs": jobs}))  # JSON is YAML as well
        self.prometheus = Process("prometheus", ["prometheus", f"--config.file={configuration}",
                                                 f"--storage.tsdb.path={folder}",
                                                 f"--web.listen-address={self.address}:{PROMETHEUS_PORT}"],
                                  self.folder, "prometheus", cwd="/")
        self._down.callback(self.prometheus.take_down)
        self.prometheus.start()
        url = f"http://{self.address}:{PROMETHEUS_PORT}"
        # It takes rules that it cannot read for none.
        awaited(lambda: has_rules(url) or fail_if_ended(self.prometheus), "Prometheus with its alerts")
        return url

    def await_ready(self):
        for number, engine in enumerate(self.nats.values(), 1):
            awaited(lambda: answers(self.address, CLIENT_PORT + number) or fail_if_ended(engine), engine.name)  # noqa: B023


def end_in_order():
    """Makes the signals that end a program, or that a terminal sends when it is closed, take everything down."""
    for number in (signal.SIGTERM, signal.SIGHUP):
        signal.signal(number, lambda *_: sys.exit(1))


def fail_if_ended(engine):
    if not engine.is_running():
        raise RuntimeError(f"{engine.name} has ended: {engine.said()}")


def has_rules(prometheus):
    with contextlib.suppress(OSError), urllib.request.urlopen(f"{prometheus}/api/v1/rules", timeout=LIMIT) as answer:
        return bool(json.load(answer)["data"]["groups"])
    return False


def answers(address, port):
    """Whether a NATS server takes connections there: it speaks first."""
    with contextlib.suppress(OSError), socket.create_connection((address, port), 1) as connection:
        return bool(select.select([connection], [], [], 1)[0]) and connection.recv(4) == b"INFO"
    return False


def main():
    parser = argparse.ArgumentParser(
        prog="scripts/fleet-engines",
        description="Starts the engines of a fleet on this machine: three servers of NATS as a centre, one for each site, and "
                    "PostgreSQL. Prints where they are, and takes them down at Enter or a signal.")
    parser.add_argument("sites", nargs="*", metavar="SITE", help="names of sites (default: london)")
    options = parser.parse_args()
    end_in_order()
    with contextlib.suppress(KeyboardInterrupt), tempfile.TemporaryDirectory(prefix="fleet-engines.") as folder, \
            Engines(folder, options.sites or ["london"]) as engines:
        print(f"centre: {' '.join(engines.servers())}")
        for site in engines.sites:
            print(f"site {site}: {' '.join(engines.servers(site))}")
        print(f"certificates: {engines.certificates} (clients: {', '.join(CLIENTS)})")
        print(f"database, as its owner:            '{engines.owner_url}'")
        print(f"database, as a role that you make: '{engines.database_url('reads')}'")
        print("Enter, or a signal, takes all of it down.", flush=True)
        sys.stdin.readline()


if __name__ == "__main__":
    sys.exit(main())
