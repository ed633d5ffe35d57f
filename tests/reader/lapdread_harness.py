"""Words for tests that run lapdread itself. The environment names the programs: run the tests with ctest."""

import os
import pathlib
import re
import shutil
import subprocess
import tempfile
import time
import unittest

LIMIT = 120  # seconds; only ends a test that would wait for ever
SOURCE = pathlib.Path(os.environ["SOURCE_DIR"])
LAPDREAD = os.environ["LAPDREAD"]

EXAMPLES = {name: SOURCE / f"examples/{name}.pcap" for name in ("4ess", "5ess", "dms100", "ntt", "net5", "ni2")}
RECORDED = sorted((SOURCE / "tests/reader/data").glob("*.hex"))

SANITIZER_REPORT = re.compile(r"Sanitizer|runtime error:")


def environment(**more):
    """What every run has: one time zone, no colours by accident, and lapdread on the PATH."""
    own = {"TZ": "UTC", "TERM": "xterm", "LC_ALL": "C.UTF-8",
           "PATH": os.path.dirname(LAPDREAD) + ":" + os.environ["PATH"]}
    kept = {name: value for name, value in os.environ.items() if name != "NO_COLOR"}
    return {**kept, **own, **more}


def run(*words, stdin=b"", cwd=SOURCE, **more):
    """Runs lapdread; returns its status, standard output (octets) and standard error stream (text)."""
    done = subprocess.run([LAPDREAD, *map(str, words)], input=stdin, capture_output=True, timeout=LIMIT, cwd=cwd,
                          env=environment(**more), check=False)
    error = done.stderr.decode(errors="replace")
    if SANITIZER_REPORT.search(error):
        raise AssertionError(error)
    return done.returncode, done.stdout, error


def output(*words, **more):
    """What lapdread prints when all is well."""
    status, out, error = run(*words, **more)
    if status != 0:
        raise AssertionError(f"lapdread {' '.join(map(str, words))}: status {status}\n{error}")
    return out.decode(errors="surrogateescape")


def until(true, what):
    """Waits until it is so."""
    end = time.monotonic() + LIMIT
    while not true():
        if time.monotonic() > end:
            raise AssertionError(f"never: {what}")
        time.sleep(0.01)


class Folder(unittest.TestCase):
    """A test with a folder of its own."""

    def setUp(self):
        self.folder = pathlib.Path(tempfile.mkdtemp(prefix="lapdread."))
        self.addCleanup(shutil.rmtree, self.folder)
