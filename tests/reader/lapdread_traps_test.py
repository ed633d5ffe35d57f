"""What healthy trunks do that looks like a fault: `check` shows no warning on these files. tests/calls/traps.cc tells
their frames."""

import unittest

from lapdread_harness import SOURCE, output, run

TRAPS = SOURCE / "tests/reader/data/traps"


class Traps(unittest.TestCase):
    def checked(self, *words):
        status, out, error = run("check", "--level", "warning", "--fail-on", "warning", *words)
        self.assertEqual((status, out, error), (0, b"", "lapdread: 0 errors, 0 warnings, 0 notes\n"), words)

    def test_show_no_warning(self):
        paths = sorted(path for path in TRAPS.glob("*.hex") if not path.name.startswith("changeover"))
        self.assertEqual(len(paths), 23)
        for path in paths:
            with self.subTest(path.name):
                self.checked(path)

    def test_a_changeover_shows_no_warning_where_the_d_channels_share_their_calls(self):
        both = [TRAPS / "changeover-a.hex", TRAPS / "changeover-b.hex"]
        nfas = ["--merge", "--nfas", "changeover-a,changeover-b", *both]
        self.checked(*nfas)
        notes = output("check", *nfas)
        self.assertIn("changeover: calls are signalled on changeover-b and not on changeover-a any more; alive: 1", notes)
        self.assertEqual(output("calls", "--csv", *nfas).count("\n") - 1, 1)
        self.assertEqual(output("calls", "--csv", "--merge", *both).count("\n") - 1, 2)

    def test_d_channels_that_share_their_calls_are_read_in_the_order_of_time(self):
        late_first = [TRAPS / "changeover-b.hex", TRAPS / "changeover-a.hex"]
        self.assertEqual(output("calls", "--csv", "--nfas", "changeover-a,changeover-b", *late_first).count("\n") - 1, 1)

    def test_have_as_many_calls_as_their_names_say(self):
        calls = {"no-connect-acknowledge": 1, "hold-and-second-call": 2, "suspend-and-resume": 2, "segments": 2,
                 "register": 1, "overlap": 2, "basic-access-goes-idle": 3, "standby": 0, "three-days": 1}
        for name, count in calls.items():
            with self.subTest(name):
                self.assertEqual(output("calls", "--csv", TRAPS / f"{name}.hex").count("\n") - 1, count)


if __name__ == "__main__":
    unittest.main()
