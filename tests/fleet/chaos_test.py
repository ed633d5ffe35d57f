"""A short chaos, and that the comparison at its end sees what it looks for."""

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
