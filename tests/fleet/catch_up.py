"""How fast a fleet catches up after the line between its sites and the centre was cut for a day, and that nothing is lost."""

import contextlib
import pathlib
import re
import tempfile
import time
import urllib.request

from engines import LIMIT, awaited
from load import WrittenFleet, written_log

TRUNKS = 8


def has_shipped(fleet, site, frames):
    """Whether the shipper of a site has read so many frames, and the site's stream has all of them."""
    with contextlib.suppress(OSError):
        with urllib.request.urlopen(f"http://{fleet.metrics(site)}/metrics", timeout=LIMIT) as answer:
            text = answer.read().decode()

        def total(name):
            return sum(int(value) for value in re.findall(rf"^{name}{{.*}} (\d+)$", text, re.MULTILINE))
        return total("lapdship_frames_total") == frames and total("lapdship_waiting_parcels") == 0
    return False


def catch_up(frames):
    """Each trunk has about so many frames. Returns a line that says how fast it was, and the differences to the logs."""
    with tempfile.TemporaryDirectory(prefix="fleet-behind.") as name:
        folder = pathlib.Path(name)
        log, each = written_log(folder, frames)
        with WrittenFleet(folder, TRUNKS, log) as fleet:
            for cable in fleet.engines.cables.values():
                cable.cut()
            fleet.start_stores()
            fleet.start_carrying()
            for site in fleet.engines.sites:
                own = each * sum(trunk.site == site for trunk in fleet.trunks)
                awaited(lambda: has_shipped(fleet, site, own), f"the frames of {site}", 20 * LIMIT)  # noqa: B023
            began = time.monotonic()
            for cable in fleet.engines.cables.values():
                cable.mend()
            awaited(lambda: fleet.count() >= each * TRUNKS, "the frames of the cut", 20 * LIMIT)
            took = time.monotonic() - began
            result = fleet.compare()
            return (f"after a cut with {each * TRUNKS} frames behind it: all of them are rows {took:.1f} s later, "
                    f"{each * TRUNKS / took:.0f} frames a second"), result.differences
