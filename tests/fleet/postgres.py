"""A PostgreSQL server of a test's own, under a temporary folder, on a socket there and nowhere else.

    python3 postgres.py COMMAND...     runs a command with STORE_URL in its environment, and takes the server down

The server never runs as root: it is the user postgres then. It ends with the process that started it, however that
process ends.
"""

import contextlib
import glob
import os
import pathlib
import shutil
import signal
import subprocess
import sys
import tempfile

MISSING = 77  # what ctest takes for "skipped"


def programs():
    """The folder of initdb and postgres; None if there is none."""
    folders = sorted(glob.glob("/usr/lib/postgresql/*/bin"))
    return pathlib.Path(folders[-1]) if folders else None


def as_user(*words, last=False):
    """The command, run as the user postgres if root starts it. `last`: the process ends when this one does."""
    end = ["--pdeathsig", "QUIT"] if last else []
    if os.geteuid() == 0:
        return ["setpriv", "--reuid", "postgres", "--regid", "postgres", "--clear-groups", *end, "--", *map(str, words)]
    return (["setpriv", *end, "--"] if last else []) + [str(word) for word in words]


SETTINGS = {"listen_addresses": "", "fsync": "off", "full_page_writes": "off", "synchronous_commit": "off",
            "max_connections": "200", "shared_buffers": "64MB", "log_min_messages": "fatal", "autovacuum": "off"}


@contextlib.contextmanager
def server(**settings):
    """Gives the URL of its database "postgres", as its superuser, without a password."""
    bin_folder = programs()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="lapd-pg."))
    process = None
    try:
        if os.geteuid() == 0:
            shutil.chown(folder, "postgres", "postgres")
        data = folder / "data"
        subprocess.run(as_user(bin_folder / "initdb", "-D", data, "-U", "owner", "-A", "trust", "-E", "UTF8",
                               "--locale", "C.UTF-8", "--no-sync", "--no-instructions"),
                       check=True, stdout=subprocess.DEVNULL, cwd="/")
        options = {**SETTINGS, **settings, "unix_socket_directories": str(folder)}
        words = [word for name, value in options.items() for word in ("-c", f"{name}={value}")]
        log = folder / "log"
        with open(log, "wb") as said:
            process = subprocess.Popen(as_user(bin_folder / "postgres", "-D", data, *words, last=True), cwd="/",
                                       stderr=said)
        # pg_isready tells when it takes connections.
        while subprocess.run([bin_folder / "pg_isready", "-q", "-h", folder], check=False).returncode != 0:
            try:
                process.wait(0.05)
                raise RuntimeError(f"postgres does not start: {log.read_text()}")
            except subprocess.TimeoutExpired:
                pass
        yield f"postgresql://owner@/postgres?host={folder}"
    finally:
        if process is not None:
            process.send_signal(signal.SIGINT)  # without waiting for those who are connected
            try:
                process.wait(20)
            except subprocess.TimeoutExpired:
                process.kill()
                process.wait()
        shutil.rmtree(folder, ignore_errors=True)


def main():
    if programs() is None:
        print("postgresql is not installed")
        return MISSING
    with server() as url:
        return subprocess.run(sys.argv[1:], env={**os.environ, "STORE_URL": url}, check=False).returncode


if __name__ == "__main__":
    sys.exit(main())
