"""A short chaos, and that the comparison at its end sees what it looks for."""

import datetime
import os
import sys
import tempfile
import unittest

import chaos
import engines
import fleet
import traffic


class Chaos(unittest.TestCase):
    @unittest.skipIf(engines.missing(), "the engines are not installed")
    def test_nothing_is_lost_or_there_twice_while_the_parts_of_a_fleet_are_killed(self):
        self.assertEqual(chaos.main(["--trunks", os.environ.get("CHAOS_TRUNKS", "20"), "--minutes",
                                     os.environ.get("CHAOS_MINUTES", "2"), "--seed", "1", "--window", "20", "--behind", "0",
                                     "--spare", "site's server, emptied", "--spare", "disk of PostgreSQL",
                                     "--spare", "disk of recordings"]), 0)

    def test_a_row_that_is_lost_changed_more_or_there_twice_is_told(self):
        logged = ["one", "two", "three"]
        for stored, told in ((["one", "three"], "1 of the log are not in the store, 0 "),
                             (["one", "two", "3"], "1 of the log are not in the store, 1 "),
                             (["one", "two", "three", "four"], "0 of the log are not in the store, 1 "),
                             (["one", "two", "two", "three"], "3 in the log, 4 in the store"),
                             (["two", "one", "three"], "3 in the log, 3 in the store"),
                             ([], "3 of the log are not in the store")):
            comparison = fleet.Comparison()
            comparison.compare("pri1, calls", logged, stored)
            self.assertIn(told, comparison.differences[0])
        comparison = fleet.Comparison()
        comparison.compare("pri1, calls", logged, list(logged))
        self.assertEqual(comparison.differences, [])

    def test_only_repeated_faults_of_links_in_the_last_ten_minutes_may_wait(self):
        def found(frame, second, kind="link-flap", clause="Q.921 5.5"):
            at = f"2026-11-22T10:{second // 60:02}:{second % 60:02}.000+00:00"
            return {"frame": frame, "finding": kind, "severity": "error", "clause": clause, "time": at}
        newest = datetime.datetime.fromisoformat("2026-11-22T10:20:00+00:00").timestamp()
        for findings, waiting in (([found(1, 900)], set()),
                                  ([found(1, 0), found(2, 599)], set()),
                                  ([found(1, 0), found(2, 601)], {("2", "link-flap")}),
                                  ([found(1, 900), found(2, 901, "link-refused")], set()),
                                  ([found(1, 900, "timer-102", "Q.850 102"), found(2, 901, "timer-102", "Q.850 102")], set())):
            self.assertEqual(fleet.waiting_in(findings, newest), waiting, findings)

    @unittest.skipIf(engines.missing(), "the engines are not installed")
    def test_a_store_that_is_not_as_its_logs_is_told(self):
        os.environ["TZ"] = "UTC"
        with tempfile.TemporaryDirectory(prefix="fleet-chaos.") as folder, \
                fleet.Fleet(folder, 2, lambda number: traffic.Trunk(number, 2, 3, flaps=(1,)).capture(), ("london",), 1) as small:
            small.play_to_the_end()
            small.await_stored(engines.LIMIT)
            result = small.compare()
            self.assertEqual(result.differences, [])
            self.assertGreater(result.calls, 4)
            self.assertEqual(result.frames, sum(trunk.frames for trunk in small.trunks))
            self.assertGreater(result.findings, 0)
            small.engines.sql("DELETE FROM lapd.frames WHERE number = 9 AND trunk = (SELECT trunk FROM lapd.trunks "
                              "WHERE name = 'pri1')")
            small.engines.sql("UPDATE lapd.calls SET called = '0' WHERE trunk = (SELECT trunk FROM lapd.trunks "
                              "WHERE name = 'pri2') AND first_frame = (SELECT max(first_frame) FROM lapd.calls c "
                              "WHERE c.trunk = calls.trunk)")
            small.engines.sql("DELETE FROM lapd.findings WHERE trunk = (SELECT trunk FROM lapd.trunks WHERE name = 'pri2')")
            told = "\n".join(small.compare().differences)
            self.assertIn("pri1, frames: ", told)
            self.assertIn("pri1, findings: ", told)  # a frame is missing
            self.assertNotIn("pri1, table of calls", told)
            self.assertIn("pri2, table of calls: ", told)
            self.assertNotIn("pri2, frames", told)
            self.assertIn("pri2, table of findings: ", told)
            self.assertNotIn("pri1, table of findings", told)


if __name__ == "__main__":
    sys.exit(unittest.main())
