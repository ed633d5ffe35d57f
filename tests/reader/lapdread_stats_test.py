"""stats: its figures are those that one computes from the calls and frames themselves."""

import collections
import csv
import io
import json
import unittest

from lapdread_harness import EXAMPLES, Folder, output, run


def objects(*words):
    return [json.loads(line) for line in output(*words).splitlines()]


def table(path, name):
    return [row for row in objects("stats", "--quiet", "--jsonl", path) if row["table"] == name]


def calls(path):
    return objects("calls", "--quiet", "--jsonl", path)


class Figures(unittest.TestCase):
    def test_of_messages_are_those_of_the_frames(self):
        for path in EXAMPLES.values():
            counted = collections.Counter((frame["message"] + (" (protocol 43)" if frame["pd"] == 0x43 else ""), frame["dir"])
                                          for frame in objects("convert", "--quiet", "--to", "jsonl", path)
                                          if frame.get("message") and frame["accepted"])
            told = collections.Counter()
            for row in table(path, "messages"):
                told[row["message"], "tx"] += row["sent"]
                told[row["message"], "rx"] += row["received"]
            self.assertEqual({key: told[key] for key in counted}, dict(counted))

    def test_tell_the_two_maintenance_protocols_apart(self):
        names = [row["message"] for row in table(EXAMPLES["4ess"], "messages")]
        self.assertEqual(len(names), len(set(names)), names)
        self.assertLess({"SERVICE", "SERVICE (protocol 43)"}, set(names))

    def test_of_causes_are_those_of_the_calls(self):
        for path in EXAMPLES.values():
            first = collections.Counter(str(call["cause"]) for call in calls(path) if call["cause"] is not None)
            told = collections.Counter()
            for row in table(path, "causes"):
                told[row["cause"]] += row["first"]
            del told["none"]
            self.assertEqual(+told, first)

    def test_of_traffic_and_times_are_those_of_the_calls(self):
        for path in EXAMPLES.values():
            rows = {row["figure"]: row for row in table(path, "traffic")}
            times = {(row["measure"], row["from"]): row for row in table(path, "times")}
            for side in ("us", "peer"):
                own = [call for call in calls(path) if call["origin"] == side]
                tried = [call for call in own if call["kind"] == "call" and call["outcome"] != "open" and
                         not {"before-trace", "glare"} & set((call["flags"] or "").split())]
                answered = [call for call in tried if call["outcome"] == "answered"]
                self.assertEqual((rows["seizures"][side], rows["answered"][side]), (len(tried), len(answered)))
                if tried:
                    ratio = float(rows["answer-seizure ratio %"][side])
                    self.assertAlmostEqual(ratio, 100 * len(answered) / len(tried), delta=0.051)
                for measure, key in (("alerting", "alerting_ms"), ("connect", "connect_ms"), ("conversation", "duration_ms"),
                                     ("first response", "first_response_ms")):
                    values = [call[key] for call in own if call[key] is not None]
                    row = times.get((measure, side))
                    self.assertEqual(row["count"] if row else 0, len(values), (path, measure, side))
                    if values:
                        self.assertAlmostEqual(row["worst_s"], max(values) / 1000, delta=0.001)
                        self.assertAlmostEqual(row["mean_s"], sum(values) / len(values) / 1000, delta=0.001)


class WithoutTimes(Folder):
    def setUp(self):
        super().setUp()
        self.path = self.folder / "bare.hex"
        lines = [line.split() for line in output("convert", "--to", "hex", EXAMPLES["net5"]).splitlines()]
        self.path.write_text("".join(f"{words[0]} {words[2]}\n" for words in lines if words[0] in ("TX", "RX")))

    def test_no_duration_is_made_up(self):
        status, out, error = run("calls", "--csv", self.path)
        self.assertEqual(status, 0)
        rows = list(csv.DictReader(io.StringIO(out.decode() if isinstance(out, bytes) else out)))
        self.assertEqual(len(rows), 6)
        for row in rows:
            self.assertEqual({row[key] for key in row if key.endswith("_ms") or key in ("start", "end")}, {""})
        self.assertEqual(error.count("no times"), 1)

    def test_figures_that_need_time_are_absent(self):
        self.assertEqual(table(self.path, "times") + table(self.path, "hours"), [])
        for name in ("trunks", "channels"):
            for row in table(self.path, name):
                self.assertEqual({row[key] for key in row if key.endswith("_s") or key == "erlangs"}, {None})
        self.assertIn("no times", run("stats", self.path)[2])
        self.assertNotIn("no times", run("stats", EXAMPLES["net5"])[2])


if __name__ == "__main__":
    unittest.main()
