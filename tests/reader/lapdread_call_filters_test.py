"""Filters on calls: every frame belongs to one call or to none, for every command, and live as well."""

import json
import signal
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, LIMIT, RECORDED, SOURCE, output, run
from lapdread_live_test import Running

TRAPS = sorted((SOURCE / "tests/reader/data/traps").glob("*.hex"))
INPUTS = [*EXAMPLES.values(), *RECORDED, *TRAPS]


def numbers(*words):
    """The numbers of the frames that list shows."""
    return [int(line) for line in output("--columns", "n", *words).split()]


def all_calls(path, *words):
    return [json.loads(line) for line in output("calls", "--jsonl", "--quiet", *words, path).splitlines()]


class Frames(unittest.TestCase):
    def test_each_belongs_to_one_call_or_to_none(self):
        for path in INPUTS:
            with self.subTest(path.name):
                calls = [str(call["call"]) for call in all_calls(path)]
                parts = [numbers("--quiet", "--call", call, path) for call in calls]
                rest = numbers("--quiet", *(["--not", "--call", ",".join(calls)] if calls else []), path)
                self.assertEqual(sorted(sum(parts, rest)), numbers("--quiet", path))

    def test_the_frames_that_calls_names_are_those_of_the_call(self):
        for path in INPUTS:
            for call in all_calls(path):
                with self.subTest(path.name, call=call["call"]):
                    self.assertTrue(set(call["frames"]) <= set(numbers("--quiet", "--call", call["call"], path)))

    def test_copies_of_a_message_belong_to_its_call(self):
        path = next(path for path in RECORDED if path.name == "repeated.hex")
        self.assertEqual(numbers("--quiet", "--call", "1", path),
                         [int(line.split()[0]) for line in output("--quiet", path).splitlines() if " 0001" in line])


class Commands(unittest.TestCase):
    """Call 5 of this example is the one that failed."""

    PATH = EXAMPLES["net5"]

    def test_all_show_one_call(self):
        self.assertEqual(numbers("--call", "5", self.PATH), [56, 58])
        self.assertEqual(numbers("--failed", self.PATH), [56, 58])
        for command in ("decode", "explain"):
            text = output(command, "--quiet", "--call", "5", self.PATH)
            self.assertEqual(text, output(command, "--quiet", "--callref", "0379", self.PATH), command)
        for form in ("jsonl", "csv", "hex"):
            text = output("convert", "--quiet", "--to", form, "--failed", self.PATH)
            self.assertEqual(text, output("convert", "--quiet", "--to", form, "--callref", "0379", self.PATH), form)
        self.assertEqual([call["call"] for call in all_calls(self.PATH, "--failed")], [5])

    def test_the_order_of_the_input_is_kept(self):
        shown = numbers("--not", "--failed", self.PATH)
        self.assertEqual(shown, [number for number in numbers(self.PATH) if number not in (56, 58)])

    def test_findings_of_a_call_are_those_of_check_for_it(self):
        """With T303=1ms every SETUP is answered late."""
        words = ("check", "--jsonl", "--timer", "T303=1ms", self.PATH)
        every = [json.loads(line) for line in output(*words).splitlines()]
        calls = {finding["call"] for finding in every if finding["call"]}
        self.assertTrue(calls)
        for call in calls:
            shown = [json.loads(line) for line in output(*words, "--call", call).splitlines()]
            self.assertEqual(shown, [finding for finding in every if finding["call"] == call])
        answered = [json.loads(line) for line in output(*words, "--not", "--unanswered", "--not", "--failed").splitlines()]
        wanted = {call["call"] for call in all_calls(self.PATH, "--not", "--unanswered", "--not", "--failed")}
        key = str
        self.assertEqual(sorted(answered, key=key), sorted(
            (finding for finding in every if not finding["call"] or finding["call"] in wanted), key=key))

    def test_a_number_that_is_none_is_refused(self):
        status, _, error = run("--call", "0x5", self.PATH)
        self.assertEqual(status, 1)
        self.assertIn("--call", error)


class Live(Running):
    SETUP = "TX 2026-11-21T11:25:{}.000Z 000100000802{}0504038090a31803a98381"
    REFUSED = "RX 2026-11-21T11:25:{}.000Z 020100020802{}5a080282a2"

    def test_a_failed_call_is_shown_when_it_has_gone(self):
        self.write("grows.hex", "TX 2026-11-21T11:25:30Z 00017f", "RX 2026-11-21T11:25:30Z 000173",
                   self.SETUP.format(31, "0001"), self.REFUSED.format(32, "8001"))
        lapdread = self.start(LAPDREAD, "--follow", "--failed", "--columns", "n,message", "grows.hex",
                              stdout=subprocess.PIPE, text=True)
        # Nothing more is written: this host's clock tells that no straggler comes.
        self.assertEqual(lapdread.stdout.readline(), "    3 SETUP\n")
        self.assertEqual(lapdread.stdout.readline(), "    4 RELEASE COMPLETE\n")
        lapdread.send_signal(signal.SIGTERM)
        self.assertEqual(lapdread.wait(LIMIT), 0)

    def test_time_goes_on_while_nothing_comes(self):
        self.write("grows.hex", "TX 2026-11-21T11:25:30Z 00017f", "RX 2026-11-21T11:25:30Z 000173",
                   self.SETUP.format(31, "0001"), self.REFUSED.format(32, "8001"),
                   "TX 2026-11-21T11:25:33.000Z 00010202080200020504038090a31803a98381",
                   "RX 2026-11-21T11:25:33Z 00010104")
        lapdread = self.start(LAPDREAD, "check", "--follow", "--timer", "T303=100ms", "--timer", "T203=100ms",
                              "--level", "error", "grows.hex",
                              stdout=subprocess.PIPE, text=True)
        self.assertIn("setup-unanswered", lapdread.stdout.readline())
        lapdread.kill()


if __name__ == "__main__":
    unittest.main()
