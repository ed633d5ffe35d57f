"""The log that lapdmon writes of each example, read back: decode gives the same text, and a log comes back from a capture
as it was."""

import os
import re
import subprocess
import time
import unittest

from lapdread_harness import EXAMPLES, LIMIT, Folder, environment, output, run

LAPDMON = os.environ["LAPDMON"]
SOFTBOARD = os.environ["SOFTBOARD"]
TIME_LINES = re.compile(r"\n *(Mon|Tue|Wed|Thu|Fri|Sat|Sun) .{15} \d{4}\n( *[RT]X Frame: Time = )\d+\.\d+\n")
HEAD_LINES = 5  # an empty one, title, notice, version, protocol


def traced(folder, variant):
    """The log of a trace in which the software board has played the example once."""
    log = folder / f"{variant}.log"
    frames = output("--columns", "n", EXAMPLES[variant]).count("\n")
    command = [SOFTBOARD, "--frames", str(EXAMPLES[variant]), "--protocol", variant, "--rate", "max", "--no-loop", "--",
               LAPDMON, "-b1", "-f", str(log)]
    with subprocess.Popen(command, stdin=subprocess.PIPE, stdout=subprocess.DEVNULL, env=environment()) as trace:
        end = time.monotonic() + LIMIT
        while not log.exists() or log.read_bytes().count(b"Hex Dump: \n") < frames:
            if time.monotonic() > end:
                trace.kill()
                raise AssertionError("the trace never came to its end")
            time.sleep(0.01)
        trace.communicate(b"q\n", LIMIT)
    return log


class Log(Folder):
    maxDiff = None

    def test_what_lapdmon_has_written_is_read_and_written_again(self):
        for variant, capture in EXAMPLES.items():
            with self.subTest(variant):
                log = traced(self.folder, variant)
                text = log.read_bytes().decode("latin-1")
                frames = text.split("\n", HEAD_LINES)[HEAD_LINES]
                self.assertEqual(run("decode", log)[1].decode("latin-1"), frames)
                decoded = run("decode", "--variant", variant, capture)[1].decode("latin-1")
                self.assertEqual(TIME_LINES.sub(r"\2", decoded), TIME_LINES.sub(r"\2", frames))
                self.assertEqual(run("convert", "--to", "log", log)[1].decode("latin-1"), text)
                through = self.folder / f"{variant}.pcapng"
                self.assertEqual(run("convert", log, through)[0], 0)
                self.assertEqual(run("convert", "--to", "log", through)[1].decode("latin-1"), text)
                # The ticks of the log are those that the software board made of the capture's times.
                columns = ("--columns", "n,dir,link,frame,ns,nr,pf,ref,message,details,marks", "--layer", "3")
                self.assertEqual(output(*columns, log), output(*columns, "--variant", variant, capture))

    def test_the_variant_is_that_of_the_log(self):
        log = traced(self.folder, "ni2")
        self.assertEqual(run("decode", log)[2], "")
        self.assertEqual(run("decode", EXAMPLES["ni2"])[2],
                         "lapdread: decoded as net5, since the input does not name its variant (--variant does)\n")

    def test_explain_gives_neither_number_nor_direction_to_what_is_no_frame(self):
        log = self.folder / "t.log"
        log.write_bytes(run("convert", "--quiet", "--to", "log", EXAMPLES["net5"])[1])
        self.assertEqual(output("explain", "--quiet", log).splitlines()[:2], [f"-, {log}:1", "-- the recorder started"])


if __name__ == "__main__":
    unittest.main()
