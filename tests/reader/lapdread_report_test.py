"""The page of `lapdread report` in a real browser: nothing fails, nothing is asked of a network, charts have the numbers of
`stats`, long tables sort and search, paper and darkness, and no text of a frame becomes markup.
"""

import collections
import json
import re
import sys
import unittest
import xml.etree.ElementTree as xml

from chromium import Browser
from lapdread_harness import EXAMPLES, RECORDED, SOURCE, Folder, output, run

sys.path.insert(0, str(SOURCE / "bench"))
import calls_speed  # noqa: E402

TRAPS = sorted((SOURCE / "tests/reader/data/traps").glob("*.hex"))
SCRIPT = re.compile(r"(<script[^>]*>).*?(</script>)", re.S)
XHTML = "{http://www.w3.org/1999/xhtml}"
SET_UP = ("first response", "progress", "alerting", "alerting after digits", "connect")

browser = None


def setUpModule():
    global browser
    browser = Browser()
    unittest.addModuleCleanup(browser.close)


def figures(*words, **more):
    """The tables of `stats`, each a list of rows."""
    tables = collections.defaultdict(list)
    for line in output("stats", "--quiet", "--jsonl", "--over-time", *words, **more).splitlines():
        row = json.loads(line)
        tables[row["table"]].append(row)
    return tables


def datasets(name):
    """What a chart has drawn: {label: data}; None if there is no chart."""
    found = browser.value(f"(chart => chart ? chart.data.datasets.map(each => [each.label, each.data]) : null)"
                          f"(document.getElementById('chart-{name}') && Chart.getChart('chart-{name}'))")
    return None if found is None else dict(found)


def labels(name):
    return browser.value(f"Chart.getChart('chart-{name}').data.labels")


def column(table, number):
    return browser.value(f"[...document.querySelectorAll('#{table} tbody tr')].map(row => row.cells[{number}].textContent)")


def refused(count, milliseconds=lambda number: 500):
    """So many calls that the peer begins and we refuse, so much later: a line of hexadecimal digits a frame."""
    lines = []
    for number in range(count):
        sent, after, reference = 2 * number % 256, 2 * (number + 1) % 256, f"{number + 1:04x}"
        at = f"2026-11-21T11:{number // 60:02}:{number % 60:02}"
        lines.append(f"RX {at}Z 0201{sent:02x}{sent:02x}0802{reference}0504038090a31803a98381\n")
        lines.append(f"TX {at}.{milliseconds(number):03}Z 0001{sent:02x}{after:02x}0802{number + 0x8001:04x}5a08028081\n")
    return "".join(lines)


class Report(Folder):
    def report(self, *words, **more):
        path = self.folder / "report.html"
        output("report", "--quiet", *words, "-o", path, **more)
        return path

    def assert_well_formed(self, path):
        """The page is XML as well, but for what scripts hold."""
        text = SCRIPT.sub(r"\1\2", path.read_text())
        self.assertTrue(text.startswith("<!DOCTYPE html>\n"))
        root = xml.fromstring(text)
        identifiers = [element.get("id") for element in root.iter() if element.get("id")]
        self.assertEqual(len(identifiers), len(set(identifiers)))
        for table in root.iter(XHTML + "table"):
            self.assertIsNotNone(table.find(XHTML + "caption"))
            width = len(table.find(f"{XHTML}thead/{XHTML}tr"))
            for row in table.find(XHTML + "tbody"):
                self.assertEqual(len(row), width)
        return root


class EveryPage(Report):
    def test_opens_without_an_error_and_asks_no_network(self):
        for path in [*EXAMPLES.values(), *RECORDED, *TRAPS]:
            with self.subTest(path.name):
                page = self.report(path)
                self.assert_well_formed(page)
                browser.open(page)
                self.assertEqual(browser.complaints(), [])
                self.assertEqual(browser.requests(), [page.resolve().as_uri()])

    def test_is_the_same_each_time(self):
        first = self.report(EXAMPLES["net5"]).read_bytes()
        self.assertEqual(self.report(EXAMPLES["net5"]).read_bytes(), first)

    def test_of_an_empty_trace_says_that_there_is_no_call(self):
        (self.folder / "empty.pcap").write_bytes(calls_speed.HEADER)
        page = self.report("empty.pcap", cwd=self.folder)
        self.assert_well_formed(page)
        browser.open(page)
        self.assertEqual(browser.complaints(), [])
        self.assertIn("no call whose beginning", browser.value("document.getElementById('summary').textContent"))


class Drawn(Report):
    """What charts have drawn, against the tables of `stats`."""

    def check_charts(self, tables):
        self.check_use(tables["use"])
        self.check_causes(tables["causes"])
        self.check_times([row for row in tables["times"] if row["measure"] in SET_UP])
        self.check_hours(tables["hours"])
        self.check_links(tables["link_events"])

    def check_use(self, rows):
        drawn = datasets("use")
        if not rows:
            return self.assertIsNone(drawn)
        for key, label in (("mean", "on average"), ("most", "most at once")):
            points = drawn[f"{rows[0]['dchannel']}, {label}"]
            self.assertEqual([point["y"] for point in points], [*(row[key] for row in rows), 0])
            self.assertEqual(points[1]["x"] - points[0]["x"], 1000 * rows[0]["seconds"])

    def check_causes(self, rows):
        counted = collections.Counter()
        for row in rows:
            if row["first"]:
                label = f"{row['cause']} {row['name']}" if row["name"] else row["cause"]
                counted[label, row["location"] or "not said"] += row["first"]
        drawn = datasets("causes")
        if not counted:
            return self.assertIsNone(drawn)
        shown = {(label, location): number for location, data in drawn.items()
                 for label, number in zip(labels("causes"), data) if number}
        self.assertEqual(shown, dict(counted))

    def check_times(self, rows):
        drawn = datasets("times")
        if not rows:
            return self.assertIsNone(drawn)
        self.assertEqual(labels("times"), [f"{row['measure']}, call from {row['from']}" for row in rows])
        self.assertEqual(drawn, {"median": [row["median_s"] for row in rows],
                                 "95 of 100 calls": [row["p95_s"] for row in rows],
                                 "worst": [row["worst_s"] for row in rows]})

    def check_hours(self, rows):
        drawn = datasets("hours")
        if not rows:
            return self.assertIsNone(drawn)
        for key, label in (("seizures_us", "calls begun by us"), ("seizures_peer", "calls begun by the peer"),
                           ("failed", "failed")):
            self.assertEqual([number for number in drawn[label] if number], [row[key] for row in rows if row[key]])

    def check_links(self, rows):
        drawn = datasets("links")
        if not rows:
            return self.assertIsNone(drawn)
        points = sorted((point["x"], point["y"]) for data in drawn.values() for point in data)
        at = browser.value("JSON.parse(document.getElementById('data').textContent)"
                           ".tables.link_events.map(row => row.time.includes('T') ? Date.parse(row.time) : 1000 * row.time)")
        self.assertEqual(points, sorted(zip(at, (row["event"] for row in rows))))


class Charts(Drawn):
    def test_have_the_numbers_of_stats(self):
        # Median, 95 of 100, worst and mean of the times differ here.
        varied = self.folder / "varied.hex"
        varied.write_text(refused(50, lambda number: 10 + number * number % 900))
        for path in [varied, *EXAMPLES.values(), *RECORDED]:
            with self.subTest(path.name):
                browser.open(self.report(path))
                self.check_charts(figures(path))

    def test_say_what_they_leave_out(self):
        """An axis has one clock. Rows of another one are in the tables, and the chart says how many."""
        dated = ("TX 2026-11-21T11:00:00Z 00017f\nRX 2026-11-21T11:00:00.008Z 000173\n"
                 + refused(3))
        counted = re.sub(r"2026-11-21T11:(..):(..)(\.\d+)?Z", lambda time: f"{60 * int(time[1]) + int(time[2])}{time[3] or '.0'}", dated)
        (self.folder / "dated.hex").write_text(dated)
        (self.folder / "counted.hex").write_text(counted)
        notes = "[...document.querySelectorAll('#charts .note')].map(each => each.textContent)"
        for paths, without in ((("dated.hex", "counted.hex"), "a time of day"),
                               (("counted.hex", "dated.hex"), "a time since the first frame")):
            tables = figures(*paths, cwd=self.folder)
            browser.open(self.report(*paths, cwd=self.folder))
            expected = []
            for name, key in (("hours", "hour"), ("link_events", "time")):
                count = sum(("T" in row[key]) != (without == "a time of day") for row in tables[name])
                self.assertGreater(count, 0)
                expected.append(f"Not in the chart, but in the table: {count} {'row' if count == 1 else 'rows'} without {without}.")
            self.assertEqual(browser.value(notes), expected)
            self.assertEqual(sum(datasets("hours")["calls begun by the peer"]), 3)
            browser.value("window.dispatchEvent(new Event('beforeprint'))")  # draws all anew
            self.assertEqual(browser.value(notes), expected)
            self.assertEqual(browser.complaints(), [])
        browser.open(self.report("dated.hex", cwd=self.folder))
        self.assertEqual(browser.value(notes), [])

    def test_fill_the_hours_in_which_nothing_happened(self):
        lines = []
        for number, hour in enumerate((8, 11)):
            setup = f"0201{2 * number:02x}000801{number + 1:02x}0504038090a31803a98381"
            lines.append(f"RX 2026-11-21T{hour:02}:30:00Z {setup}\n")
            lines.append(f"TX 2026-11-21T{hour:02}:30:01Z 0001{2 * number:02x}{2 * number + 2:02x}0801{number + 0x81:02x}"
                         "5a08028081\n")
        (self.folder / "two.hex").write_text("".join(lines))
        browser.open(self.report("two.hex", cwd=self.folder))
        self.assertEqual(labels("hours"), ["11-21 08:00", "11-21 09:00", "11-21 10:00", "11-21 11:00"])
        self.assertEqual(datasets("hours")["calls begun by the peer"], [1, 0, 0, 1])
        self.assertEqual(datasets("hours")["failed"], [1, 0, 0, 1])


class Tables(Drawn):
    def setUp(self):
        super().setUp()
        calls_speed.write(self.folder / "many.pcap", 171_000)
        browser.open(self.report("many.pcap", cwd=self.folder))

    def press(self, table, heading):
        browser.value(f"[...document.querySelectorAll('#{table} thead button')]"
                      f".find(each => each.textContent === '{heading}').click()")

    def search(self, table, text):
        browser.value(f"(field => {{ field.value = {json.dumps(text)}; field.dispatchEvent(new Event('input')); }})"
                      f"(document.querySelector('#{table} input'))")

    def status(self, table):
        return browser.value(f"document.querySelector('#{table} [role=status]').textContent")

    def test_of_ten_thousand_calls_sort_and_search_below_their_charts(self):
        calls = [json.loads(line) for line in
                 output("calls", "--quiet", "--jsonl", "many.pcap", cwd=self.folder).splitlines()]
        self.assertGreater(len(calls), 10_000)
        self.assertEqual(self.status("calls"), f"{len(calls)} calls, 200 shown")
        self.press("calls", "duration")
        self.assertEqual({float(text) for text in column("calls", 9)}, {min(call["duration_ms"] or 10**9 for call in calls) / 1000})
        self.press("calls", "duration")
        self.assertEqual({float(text) for text in column("calls", 9)}, {max(call["duration_ms"] or 0 for call in calls) / 1000})
        self.assertEqual(browser.value("document.querySelectorAll('#calls [aria-sort]').length"), 1)
        self.search("calls", "user BUSY")
        busy = sum(call["outcome"] == "busy" for call in calls)
        self.assertEqual(self.status("calls"), f"{busy} of {len(calls)} calls, 200 shown")
        self.assertEqual(set(column("calls", 10)), {"busy"})
        self.press("calls", "call")
        numbers = [int(text) for text in column("calls", 0)]
        self.assertEqual(numbers, sorted(call["call"] for call in calls if call["outcome"] == "busy")[:200])
        browser.value("[...document.querySelectorAll('#calls .tools button')].pop().click()")
        self.assertEqual(len(column("calls", 0)), busy)
        self.search("calls", "no such words")
        self.assertEqual(column("calls", 0), [])
        self.check_charts(figures("many.pcap", cwd=self.folder))
        self.assertEqual(browser.complaints(), [])


class Ladders(Report):
    def test_of_failed_calls_open_from_their_row(self):
        (self.folder / "failing.hex").write_text(refused(12))
        page = self.report("failing.hex", cwd=self.folder)
        browser.open(page)
        opened = "[...document.querySelectorAll('#ladders details')].filter(each => each.open).map(each => each.id)"
        self.assertEqual(browser.value("document.querySelectorAll('#ladders svg').length"), 12)
        self.assertEqual(len(browser.value(opened)), 3)
        browser.value("document.querySelector('#calls a[href=\"#ladder-9\"]').click()")
        browser.value("new Promise(done => setTimeout(() => requestAnimationFrame(done)))")
        self.assertIn("ladder-9", browser.value(opened))
        self.assertEqual(browser.complaints(), [])

    def test_are_bounded_and_the_page_says_so(self):
        (self.folder / "failing.hex").write_text(refused(507))
        root = self.assert_well_formed(self.report("failing.hex", cwd=self.folder))
        ladders = next(section for section in root.iter(XHTML + "section") if section.get("id") == "ladders")
        self.assertEqual(len(ladders.findall(XHTML + "details")), 500)
        self.assertIn("room for no more: 7 ladders", "".join(ladders.itertext()))
        calls = next(section for section in root.iter(XHTML + "section") if section.get("id") == "calls")
        self.assertEqual(len(calls.findall(f".//{XHTML}tbody/{XHTML}tr")), 507)


class WithoutScript(Report):
    def test_all_tables_and_ladders_can_be_read(self):
        browser.open(self.report(EXAMPLES["net5"]), scripts=False)
        self.assertEqual(len(column("calls", 0)), 6)
        self.assertEqual(browser.value("[...document.querySelectorAll('.chart')].map(each => each.offsetHeight)"), [0] * 5)
        self.assertEqual(browser.value("[...document.querySelectorAll('#charts table')].filter(each => each.offsetHeight > 20).length"), 6)
        self.assertTrue(browser.value("document.querySelector('#ladders svg').getBoundingClientRect().height > 100"))
        self.assertEqual(browser.complaints(), [])


class Looks(Report):
    BACKGROUND = "getComputedStyle(document.body).backgroundColor"

    def test_follow_light_and_dark(self):
        page = self.report(EXAMPLES["net5"])
        browser.open(page)
        self.assertEqual(browser.value(self.BACKGROUND), "rgb(255, 255, 255)")
        light = browser.value("Chart.getChart('chart-use').options.scales.x.ticks.color")
        browser.open(page, dark=True)
        self.assertEqual(browser.value(self.BACKGROUND), "rgb(22, 24, 28)")
        self.assertNotEqual(browser.value("Chart.getChart('chart-use').options.scales.x.ticks.color"), light)
        self.assertEqual(browser.complaints(), [])

    def test_have_contrast(self):
        """Text against its ground: 4.5 to 1 and more (WCAG 2.1, 1.4.3); lines of charts 3 to 1 is out of reach of yellow."""
        contrast = """((a, b) => {
            const light = color => color.match(/\\d+/g).slice(0, 3).map(part => part / 255)
                .map(part => part <= 0.03928 ? part / 12.92 : ((part + 0.055) / 1.055) ** 2.4)
                .reduce((sum, part, i) => sum + part * [0.2126, 0.7152, 0.0722][i], 0);
            const [high, low] = [light(a), light(b)].sort().reverse();
            return (high + 0.05) / (low + 0.05);
        })"""
        for dark in (False, True):
            browser.open(self.report(EXAMPLES["net5"]), dark=dark)
            for selector in ("body", "a", ".note", "caption", "footer"):
                text = f"getComputedStyle(document.querySelector('{selector}')).color"
                self.assertGreaterEqual(browser.value(f"{contrast}({text}, {self.BACKGROUND})"), 4.5, (selector, dark))

    def test_print_on_white_paper_with_every_ladder(self):
        browser.open(self.report(EXAMPLES["net5"]), dark=True)
        self.assertTrue(browser.printed().startswith(b"%PDF-"))
        browser.tell("Emulation.setEmulatedMedia", media="print", features=[{"name": "prefers-color-scheme", "value": "dark"}])
        self.assertEqual(browser.value(self.BACKGROUND), "rgb(255, 255, 255)")
        browser.tell("Emulation.setEmulatedMedia", media="")
        self.assertEqual(browser.complaints(), [])


class Harm(Report):
    EVIL = "</script><img src=x onerror=window.hit=1>{{data}}"

    def evil(self):
        """A SETUP whose numbers and name are markup, refused, so that it has a ladder."""
        text = self.EVIL.encode()
        elements = bytes((0x28, len(text))) + text
        for identifier in (0x6C, 0x70):
            elements += bytes((identifier, len(text) + 1, 0x80)) + text
        setup = bytes.fromhex("020100000802000105") + bytes.fromhex("04038090a31803a98381") + elements
        return f"RX 2026-11-21T11:25:33Z {setup.hex()}\nTX 2026-11-21T11:25:34Z 0001000208028001" + "5a08028081\n"

    def test_no_text_of_a_frame_becomes_markup(self):
        name = "<b>&amp;'\".hex"
        (self.folder / name).write_text(self.evil())
        page = self.report(name, "--trunk", self.EVIL, cwd=self.folder)
        self.assert_well_formed(page)
        browser.open(page)
        self.assertEqual(browser.complaints(), [])
        self.assertEqual(browser.requests(), [page.resolve().as_uri()])
        self.assertEqual(browser.value("[document.images.length, document.querySelectorAll('b').length, window.hit || 0]"), [0, 0, 0])
        self.assertIn(self.EVIL, browser.value("document.querySelector('#calls tbody').textContent"))
        self.assertIn(self.EVIL, browser.value("document.querySelector('#ladders svg').textContent"))
        self.assertIn(self.EVIL, browser.value("JSON.parse(document.getElementById('data').textContent).tables.trunks[0].dchannel"))
        self.assertIn("<b>&amp;'\"", browser.value("document.title"))

    def test_scripts_that_are_not_the_pages_own_do_not_run(self):
        browser.open(self.report(EXAMPLES["net5"]))
        browser.value("(script => { script.textContent = 'window.hit = 1'; document.body.append(script); })"
                      "(document.createElement('script'))")
        self.assertEqual(browser.value("window.hit || 0"), 0)
        self.assertIn("Content Security Policy", json.dumps(browser.complaints()))


class Redacted(Report):
    def test_pages_hold_no_number_and_no_name(self):
        page = self.report("--redact", EXAMPLES["net5"])
        text = page.read_text()
        for original in ("4957414501", "73134483", "0441987654", "73139999", "net5.pcap"):
            self.assertIn(original, self.report(EXAMPLES["net5"]).read_text())
            self.assertNotIn(original, text)
        self.assertIn("trunk1", text)
        browser.open(page)
        self.assertEqual(browser.complaints(), [])
        self.assertEqual(len(column("calls", 0)), 6)

    def test_pages_have_the_pseudonyms_of_the_key(self):
        key = self.folder / "trunk.key"
        first = self.report("--key", key, EXAMPLES["net5"]).read_text()
        self.assertEqual(self.report("--redact", "--key", key, EXAMPLES["net5"]).read_text(), first)
        redacted = self.folder / "redacted.pcapng"
        output("redact", "--quiet", "--key", key, EXAMPLES["net5"], "-o", redacted)
        called = json.loads(output("calls", "--quiet", "--jsonl", redacted).splitlines()[0])["called"]
        self.assertIn(called, first)

    def test_filters_look_at_the_original(self):
        browser.open(self.report("--redact", "--number", "0441987654", EXAMPLES["net5"]))
        self.assertEqual(column("calls", 0), ["4"])

    def test_figures_are_those_of_the_original(self):
        path = EXAMPLES["ni2"]
        browser.open(self.report("--redact", path))
        self.assertEqual(datasets("times")["median"],
                         [row["median_s"] for row in figures(path)["times"] if row["measure"] in SET_UP])


    def test_d_channels_of_a_group_stay_together(self):
        """Their names in --nfas are the original ones, and not in the order in which the channels appear."""
        first, second = (SOURCE / f"tests/reader/data/traps/changeover-{letter}.hex" for letter in "ab")
        words = ("--merge", "--nfas", "changeover-b,changeover-a", first, second)
        trunks = []
        for redact in ((), ("--redact",)):
            browser.open(self.report(*redact, *words))
            self.assertEqual(browser.complaints(), [])
            trunks.append(browser.value("JSON.parse(document.getElementById('data').textContent).tables.trunks"))
        self.assertEqual(len(trunks[0]), 1)
        for row in (trunks[0][0], trunks[1][0]):
            row.pop("dchannel")
        self.assertEqual(trunks[1], trunks[0])


class Filtered(Report):
    def test_pages_have_what_stats_and_calls_have(self):
        browser.open(self.report("--callref", "0379", EXAMPLES["net5"]))
        self.assertEqual(column("calls", 0), ["5"])
        self.assertEqual(sum(datasets("hours")["failed"]), 1)
        self.assertEqual(sum(datasets("hours")["calls begun by us"]), 0)


class Outputs(Report):
    def test_a_report_is_written_over_and_nothing_else_is(self):
        self.report(EXAMPLES["net5"])
        self.report(EXAMPLES["ni2"])
        other = self.folder / "precious.html"
        other.write_text("<!DOCTYPE html>\n<p>mine</p>\n")
        status, _, error = run("report", EXAMPLES["net5"], "-o", other)
        self.assertEqual(status, 2)
        self.assertIn("precious.html", error)
        self.assertEqual(other.read_text(), "<!DOCTYPE html>\n<p>mine</p>\n")


if __name__ == "__main__":
    unittest.main()
