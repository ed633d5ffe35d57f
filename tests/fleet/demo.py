"""Shows what an operator of a fleet asks, and the answers, on this machine.

    scripts/fleet-demo [--trunks N] [--stay]

Starts three servers of NATS and three of sites, PostgreSQL, Prometheus, and N trunks on the software board with their
recorders, shippers and stores; lets calls pass for half a minute; asks ten questions; takes all of it down.
"""

import argparse
import contextlib
import json
import os
import shlex
import subprocess
import sys
import tempfile
import time
import urllib.request

from engines import LIMIT, awaited, end_in_order, missing
from fleet import BINARIES, Fleet
from load import sizes, tell_sizes
from traffic import Trunk as Traffic

SITES = ("london", "leeds", "york")
REDACTED = ("york",)                        # its shipper sends pseudonyms
GROUP, GROUPED = "nfas-1", (4, 7)           # D channels of one NFAS group, at leeds
SECONDS = 30  # of calls
LINES = 20    # of an answer


def traffic(number):
    """Trunk 2 loses its link, trunk 3 finds no channel, and the calls of a group go over from one D channel to the
    other; on the others all is well."""
    if number == 2:
        return Traffic(2, SECONDS, rate=0.1, flaps=(16,)).capture()
    if number in GROUPED:
        return Traffic(GROUP, SECONDS, fails=0.1).captures_of_group(SECONDS / 2)[GROUPED.index(number)]
    if number == 3:
        return Traffic(3, SECONDS, causes=(34,), fails=0.7).capture()
    return Traffic(number, SECONDS, fails=0.1).capture()


def psql(query):
    return f'psql "$STORE" -c "{query}"'


QUESTIONS = (
    ("Which trunks are there, and how new is what we have of them?",
     psql("SELECT site, host, name AS trunk, nfas, redacted, count(*) AS frames, date_trunc('second', to_timestamp(max(time) / 1e9)) "
          "AS newest FROM lapd.frames JOIN lapd.trunks USING (trunk) GROUP BY 1, 2, 3, 4, 5 ORDER BY 1, 3")),
    ("Which calls to 0301... were there in the last week, on any trunk?",
     "lapdread calls --store $STORE --number 0301 --since $WEEK"),
    ("What passed in the first call that failed at york, which sends pseudonyms in place of numbers?",
     "lapdread ladder --store $STORE --site york --failed --first 1"),
    ("Where does cause 34 rise?",
     psql("SELECT site, name AS trunk, date_trunc('minute', began) AS minute, count(*) AS calls FROM lapd.joined_calls "
          "JOIN lapd.trunks USING (trunk) WHERE cause = 34 GROUP BY 1, 2, 3 ORDER BY 4 DESC, 3")),
    ("Which links flapped?",
     psql("SELECT site, name AS trunk, date_trunc('second', at) AS at, left(sentence, 70) AS finding FROM lapd.findings "
          "JOIN lapd.trunks USING (trunk) WHERE kind LIKE 'link-%' ORDER BY at")),
    ("What happened at leeds, where two D channels are an NFAS group, and what is to be looked at?",
     "lapdread check --store $STORE --site leeds"),
    ("Which calls are up just now?",
     psql("SELECT site, name AS trunk, callref, calling, called, channel, began FROM lapd.joined_calls JOIN lapd.trunks USING (trunk) "
          "WHERE ended IS NULL ORDER BY began")),
    ("How well are calls answered, site by site?",
     psql("SELECT site, count(*) AS calls, count(*) FILTER (WHERE outcome = 'answered') AS answered, round(100.0 * count(*) FILTER "
          "(WHERE outcome = 'answered') / count(*)) AS percent, round(avg(alerting_ms)) AS ms_to_ring FROM lapd.joined_calls "
          "JOIN lapd.trunks USING (trunk) WHERE ended IS NOT NULL GROUP BY 1 ORDER BY 1")),
    ("Which alerts fire, and why?",
     "curl -s $PROMETHEUS/api/v1/alerts | jq -r '.data.alerts[] | select(.state == \"firing\") | \"\\(.labels.alertname): "
     "\\(.annotations.summary). \\(.annotations.description)\"'"),
    ("Is anything missing, and how far is the store behind?",
     psql("SELECT (SELECT count(*) FROM lapd.gaps) AS gaps, (SELECT count(*) FROM lapd.dead_letters) AS dead_letters, "
          "(SELECT count(*) FROM lapd.runs WHERE NOT finished AND EXISTS (SELECT FROM lapd.frames f WHERE f.trunk = runs.trunk "
          "AND f.run = runs.run AND f.number > runs.assembled)) AS runs_that_wait, (SELECT round(extract(epoch FROM now()) - "
          "max(time) / 1e9, 1) FROM lapd.frames) AS seconds_since_newest_frame")),
)


def is_alarmed(prometheus):
    """Whether an alert fires."""
    with urllib.request.urlopen(f"{prometheus}/api/v1/alerts", timeout=LIMIT) as answer:
        return any(each["state"] == "firing" for each in json.load(answer)["data"]["alerts"])


def ask(number, question, command, environment):
    print(f"\n{number}. {question}\n\n$ {command}")
    ran = subprocess.run(["bash", "-c", command], env=environment, capture_output=True, text=True, timeout=LIMIT)
    if ran.returncode != 0:
        raise RuntimeError(f"status {ran.returncode}: {ran.stderr}")
    lines = [line.rstrip() for line in ran.stdout.rstrip("\n").splitlines()]
    print("\n".join(lines[:LINES]) or "(nothing)")
    if len(lines) > LINES:
        print(f"... and {len(lines) - LINES} more lines")
    sys.stdout.flush()
    return ran.stdout


def show(fleet, began, stays):
    environment = {**os.environ, "STORE": fleet.url(), "WEEK": time.strftime("%Y-%m-%d", time.gmtime(time.time() - 7 * 86400)),
                   "PATH": f"{BINARIES}:{os.environ['PATH']}", "PAGER": "cat"}
    environment["PROMETHEUS"] = fleet.prometheus
    engines = fleet.engines
    print(f"Up after {time.monotonic() - began:.0f} seconds:\n"
          f"  {len(fleet.trunks)} trunks: softboard -- lapdmon, and lapdread record\n"
          f"  {len(SITES)} sites: lapdship -> nats-server, a leaf of the centre ({', '.join(SITES)})\n"
          f"  centre: nats-server {' '.join(engines.servers())}\n"
          f"          {len(fleet.stores)} x lapdstore -> PostgreSQL\n"
          f"  {GROUP}: {' and '.join(f'pri{number}' for number in GROUPED)} are D channels of one NFAS group; {REDACTED[0]} sends "
          f"pseudonyms in place of numbers\n"
          f"\nThe questions below can be asked in another shell as well, after this:\n"
          f"  export PATH={shlex.quote(str(BINARIES))}:$PATH\n"
          f"  export STORE={shlex.quote(environment['STORE'])}\n"
          f"  export PROMETHEUS={environment['PROMETHEUS']} WEEK={environment['WEEK']}\n"
          f"\nCalls pass for {SECONDS} seconds. Meanwhile a lapdstore and a server of the centre are killed (kill -9), and the\n"
          f"line to {SITES[0]} is cut for 5 seconds.", flush=True)
    time.sleep(SECONDS / 3)
    fleet.stores[0].kill()
    engines.nats["centre-1"].kill()
    engines.cables[SITES[0]].cut()
    time.sleep(5)
    engines.cables[SITES[0]].mend()
    engines.nats["centre-1"].start()
    fleet.stores[0].start()
    awaited(lambda: all(trunk.logged() >= 0.8 * trunk.frames for trunk in fleet.trunks), "the calls")
    awaited(lambda: sum(fleet.stored().values()) >= 0.8 * sum(trunk.frames for trunk in fleet.trunks), "frames in the store")
    with contextlib.suppress(TimeoutError):  # of a machine that was too slow to see the link before it flapped
        awaited(lambda: is_alarmed(fleet.prometheus), "an alert", 20)
    for number, (question, command) in enumerate(QUESTIONS, 1):
        ask(number, question, command, environment)
    fleet.play_to_the_end()
    fleet.await_stored(LIMIT)
    result = fleet.compare()
    print(f"\nAll calls are over. The logs have {result.frames} frames and {result.calls} calls; "
          + ("the store has the same." if not result.differences else "\n".join(["the store differs:", *result.differences])))
    tell_sizes({what: size for what, size in sizes(fleet).items() if "PostgreSQL" not in what and "frame" in what})
    if stays:
        print("\nEverything stays up until Enter, for more questions.", flush=True)
        sys.stdin.readline()
    return 1 if result.differences else 0


def main():
    parser = argparse.ArgumentParser(prog="scripts/fleet-demo", description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--trunks", type=int, default=8, metavar="N", help="8 to 200 (default: 8)")
    parser.add_argument("--stay", action="store_true", help="keep all of it up at the end, until Enter")
    options = parser.parse_args()
    if not 8 <= options.trunks <= 200:
        parser.error("--trunks must be 8 to 200")
    needed = missing("prometheus", "curl", "jq")
    if needed:
        raise SystemExit(f"not installed: {', '.join(needed)}")
    end_in_order()
    os.environ["TZ"] = "UTC"
    began = time.monotonic()
    with tempfile.TemporaryDirectory(prefix="fleet-demo.") as folder:
        with Fleet(folder, options.trunks, traffic, SITES, groups=dict.fromkeys(GROUPED, GROUP), redacted=REDACTED, watched=True) as fleet:
            status = show(fleet, began, options.stay)
    print(f"Everything is taken down again, after {time.monotonic() - began:.0f} seconds.")
    return status


if __name__ == "__main__":
    try:
        sys.exit(main())
    except KeyboardInterrupt:
        sys.exit("ended by the keyboard; everything is taken down")
