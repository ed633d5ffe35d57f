"""lapdmon-trace, the wrapper that the services run: with a program in the place of lapdmon that does what it is told."""

import os
import pathlib
import signal
import subprocess
import tempfile
import unittest

WRAPPER = pathlib.Path(os.environ["SOURCE"]) / "packaging/systemd/lapdmon-trace"

# Counts its runs in "runs"; each run does what the line of that number in "plan" says.
PROGRAM = r"""#!/bin/bash
cd "$(dirname "$0")"
echo "$*" >>runs
plan=$(sed -n "$(wc -l <runs)p" plan)
case $plan in
    fail*) echo "${plan#fail }"; echo "and why" >&2; exit 1 ;;
    trace*) trap 'echo ending; exit "${plan#trace }"' TERM
        echo 'CCS protocol type is 7'; echo 'NET5 Switch'
        while :; do sleep 0.05; done ;;
    break*) echo 'CCS protocol type is 7'; echo 'the board is gone'; exit 1 ;;
esac
"""
NOTE = "lapdmon-trace: trying again until the trace runs; the same reason is not shown again\n"


class Trace(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="lapdmon-trace-")
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)
        program = self.folder / "lapdmon"
        program.write_text(PROGRAM)
        program.chmod(0o755)

    def start(self, *plan, instance="1-2"):
        (self.folder / "plan").write_text("".join(line + "\n" for line in plan))
        process = subprocess.Popen([WRAPPER, instance], stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, env={
            **os.environ, "LAPDMON_PROGRAM": str(self.folder / "lapdmon"), "LAPDMON_LONGEST_PAUSE": "0",
            "TMPDIR": str(self.folder)}, start_new_session=True)
        self.addCleanup(process.stdout.close)
        self.addCleanup(process.wait)
        self.addCleanup(self.kill_with_all_that_it_started, process)
        return process

    @staticmethod
    def kill_with_all_that_it_started(process):
        try:
            os.killpg(process.pid, signal.SIGKILL)
        except ProcessLookupError:
            pass

    def lines_until(self, process, last):
        lines = []
        while not lines or lines[-1] != last:
            lines.append(process.stdout.readline())
            self.assertNotEqual(lines[-1], "", lines)
        return "".join(lines)

    def test_it_splits_board_and_dchannel_and_traces_into_the_fifo(self):
        process = self.start("trace 0")
        self.lines_until(process, "NET5 Switch\n")
        self.assertEqual((self.folder / "runs").read_text(), "-b1 -d2 -f /run/lapdmon/1-2.fifo\n")

    def test_a_signal_ends_the_trace_and_its_status_is_the_wrappers(self):
        for status in (0, 1):
            with self.subTest(status):
                (self.folder / "runs").write_text("")
                process = self.start(f"trace {status}")
                self.lines_until(process, "NET5 Switch\n")
                process.send_signal(signal.SIGTERM)
                self.assertEqual(process.communicate(timeout=60)[0], "ending\n")
                self.assertEqual(process.returncode, status)

    def test_a_reason_is_said_once_and_another_one_again(self):
        process = self.start("fail no board", "fail no board", "fail no board", "fail no relay", "trace 0")
        self.assertEqual(self.lines_until(process, "NET5 Switch\n"),
                         f"no board\nand why\n{NOTE}no relay\nand why\n{NOTE}CCS protocol type is 7\nNET5 Switch\n")
        self.assertEqual(len((self.folder / "runs").read_text().splitlines()), 5)

    def test_a_reason_is_the_same_when_only_its_numbers_differ(self):
        process = self.start("fail Timeout: {Instance 9 Trans: 0x80003d}", "fail Timeout: {Instance 10 Trans: 0x8f003e}", "trace 0")
        self.assertEqual(self.lines_until(process, "NET5 Switch\n"),
                         f"Timeout: {{Instance 9 Trans: 0x80003d}}\nand why\n{NOTE}CCS protocol type is 7\nNET5 Switch\n")

    def test_a_trace_that_breaks_is_started_again_and_its_words_are_all_shown(self):
        process = self.start("break", "fail no board", "fail no board", "trace 0")
        self.assertEqual(self.lines_until(process, "NET5 Switch\n"),
                         "CCS protocol type is 7\nthe board is gone\n"
                         f"no board\nand why\n{NOTE}CCS protocol type is 7\nNET5 Switch\n")

    def test_an_instance_that_is_no_board_and_dchannel_is_refused_for_good(self):
        for instance in ("", "1", "1-", "a-1", "1-2-3", "1_2"):
            with self.subTest(instance):
                process = self.start("trace 0", instance=instance)
                self.assertIn(f'"{instance}" is no board and D channel', process.communicate(timeout=60)[0])
                self.assertEqual(process.returncode, 2)
        self.assertFalse((self.folder / "runs").exists())


if __name__ == "__main__":
    unittest.main()
