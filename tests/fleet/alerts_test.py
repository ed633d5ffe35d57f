"""The alerts in packaging/prometheus: Prometheus' own tool takes them, they say what they should, and the figures that
they ask for are figures that the programs offer and the page explains."""

import os
import pathlib
import re
import shutil
import subprocess
import unittest

SOURCE = pathlib.Path(os.environ["SOURCE"])
FOLDER = SOURCE / "packaging/prometheus"
RULES = FOLDER / "alerts.yml"
METRIC = r"\b(?:lapdship|lapdstore)_[a-z_]+\b"


def offered():
    """The names of the metrics of both programs, found in their sources."""
    sources = (SOURCE / "fleet/ship/ShipMetrics.cc", SOURCE / "fleet/store/Figures.cc")
    return {name for source in sources for name in re.findall(f'"({METRIC})"', source.read_text())}


class Names(unittest.TestCase):
    def test_alerts_ask_for_what_the_programs_offer(self):
        asked = set(re.findall(METRIC, "\n".join(
            line for line in RULES.read_text().splitlines() if not re.match(r" +(summary|description|-? ?name):", line))))
        self.assertGreater(len(asked), 10)
        self.assertEqual(asked - offered(), set())

    def test_the_page_explains_every_figure(self):
        page = (SOURCE / "docs/user/fleet-metrics.md").read_text()
        told = {name for name in re.findall(METRIC, page) if not name.endswith("_build_info")}
        self.assertEqual(told, offered())

    def test_the_page_explains_every_alert(self):
        page = (SOURCE / "docs/user/fleet-metrics.md").read_text()
        self.assertEqual(set(re.findall(r"\bLapd[A-Z]\w+", page)), set(re.findall(r"alert: (\w+)", RULES.read_text())))

    def test_what_inhibits_is_an_alert(self):
        named = set(re.findall(r"\bLapd[A-Z]\w+", (FOLDER / "alertmanager.yml").read_text()))
        self.assertGreater(len(named), 3)
        self.assertLessEqual(named, set(re.findall(r"alert: (\w+)", RULES.read_text())))


def run(*words):
    return subprocess.run([*map(str, words)], capture_output=True, text=True, timeout=120, check=False)


@unittest.skipUnless(shutil.which("amtool"), "there is no amtool")
class Amtool(unittest.TestCase):
    CONFIGURATION = FOLDER / "alertmanager.yml"

    def test_takes_the_configuration(self):
        done = run("amtool", "check-config", self.CONFIGURATION)
        self.assertEqual(done.returncode, 0, done.stdout + done.stderr)

    def test_wakes_somebody_for_what_is_critical_and_nobody_else(self):
        for severity, receiver in (("critical", "on-call"), ("warning", "office")):
            done = run("amtool", "config", "routes", "test", f"--config.file={self.CONFIGURATION}", f"severity={severity}",
                       "alertname=LapdRecorderSilent", "site=london")
            self.assertEqual((done.returncode, done.stdout.strip()), (0, receiver), done.stderr)


@unittest.skipUnless(shutil.which("promtool"), "there is no promtool")
class Promtool(unittest.TestCase):
    def expect_good(self, *words):
        done = run("promtool", *words)
        self.assertEqual(done.returncode, 0, done.stdout + done.stderr)

    def test_takes_the_rules(self):
        self.expect_good("check", "rules", RULES)

    def test_takes_the_configuration(self):
        self.expect_good("check", "config", FOLDER / "prometheus.yml")

    def test_finds_that_the_rules_say_what_they_should(self):
        self.expect_good("test", "rules", SOURCE / "tests/fleet/alerts_test.yml")

    def test_every_alert_is_tested(self):
        tested = set(re.findall(r"alertname: (\w+)\n +exp_alerts", (SOURCE / "tests/fleet/alerts_test.yml").read_text()))
        self.assertEqual(tested, set(re.findall(r"alert: (\w+)", RULES.read_text())))


if __name__ == "__main__":
    unittest.main()
