"""What is followed comes out while it is written: through a pipe into tshark, as an interface of Wireshark, and into
files that begin anew. Tests wait for what they expect; LIMIT only ends a test that would wait for ever."""

import json
import os
import pathlib
import shutil
import signal
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, LIMIT, SOURCE, Folder, environment, output, run, until

EXTCAP = SOURCE / "reader/extcap"
LINES = ["TX 2026-11-21T11:25:33.000Z 00017f", "RX 2026-11-21T11:25:33.008Z 000173",
         "TX 2026-11-21T11:25:34.000Z 00010101", "RX 2026-11-21T11:25:34.008Z 00010101"]


class Running(Folder):
    """Starts programs, and ends them however the test ends."""

    def setUp(self):
        super().setUp()
        self.started = []
        self.addCleanup(self.end_all)

    def end_all(self):
        for process in self.started:
            if process.poll() is None:
                process.kill()
            process.wait()
            for stream in (process.stdin, process.stdout, process.stderr):
                if stream is not None and not stream.closed:
                    stream.close()

    def start(self, *words, **more):
        process = subprocess.Popen([str(word) for word in words], env=environment(), cwd=self.folder, **more)
        self.started.append(process)
        return process

    def write(self, name, *lines):
        with open(self.folder / name, "a", encoding="ascii") as file:
            file.writelines(line + "\n" for line in lines)


class Live(Running):
    def test_a_line_comes_as_soon_as_it_is_written(self):
        self.write("grows.hex", LINES[0])
        lapdread = self.start(LAPDREAD, "--follow", "--columns", "n,frame", "grows.hex", stdout=subprocess.PIPE, text=True)
        self.assertEqual(lapdread.stdout.readline(), "    1 SABME\n")
        self.write("grows.hex", LINES[1])
        self.assertEqual(lapdread.stdout.readline(), "    2 UA\n")
        lapdread.send_signal(signal.SIGTERM)
        self.assertEqual(lapdread.wait(LIMIT), 0)

    def test_a_file_that_is_replaced_is_followed(self):
        self.write("grows.hex", LINES[0])
        lapdread = self.start(LAPDREAD, "--follow", "--columns", "n,frame,message", "grows.hex", stdout=subprocess.PIPE,
                              text=True)
        self.assertEqual(lapdread.stdout.readline(), "    1 SABME\n")
        self.write("new.hex", LINES[1])
        os.rename(self.folder / "new.hex", self.folder / "grows.hex")
        self.assertIn("-- the file was replaced or emptied", lapdread.stdout.readline())
        self.assertEqual(lapdread.stdout.readline(), "    2 UA\n")

    def test_a_pipe_is_read_while_it_is_written(self):
        lapdread = self.start(LAPDREAD, "--columns", "n,frame", "-", stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                              text=True)
        for number, (line, frame) in enumerate(zip(LINES, ["SABME", "UA", "RR", "RR"]), 1):
            lapdread.stdin.write(line + "\n")
            lapdread.stdin.flush()
            self.assertEqual(lapdread.stdout.readline(), f"    {number} {frame}\n")
        lapdread.stdin.close()
        self.assertEqual(lapdread.wait(LIMIT), 0)

    def test_a_reader_that_goes_ends_the_program_quietly(self):
        lapdread = self.start(LAPDREAD, EXAMPLES["net5"], EXAMPLES["ni2"], stdout=subprocess.PIPE, stderr=subprocess.PIPE)
        lapdread.stdout.close()
        self.assertEqual(lapdread.wait(LIMIT), 0)
        self.assertEqual(lapdread.stderr.read(), b"")

    def test_an_analyser_shows_frames_as_they_come(self):
        self.write("grows.hex", *LINES[:2])
        lapdread = self.start(LAPDREAD, "convert", "--follow", "--to", "pcapng", "grows.hex", "-",
                              stdout=subprocess.PIPE)
        tshark = self.start("tshark", "-n", "-l", "-r", "-", "-T", "fields", "-e", "frame.number", "-e", "lapd.direction",
                            stdin=lapdread.stdout, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
        lapdread.stdout.close()
        self.assertEqual(tshark.stdout.readline(), "1\t0\n")
        self.assertEqual(tshark.stdout.readline(), "2\t1\n")
        self.write("grows.hex", LINES[2])
        self.assertEqual(tshark.stdout.readline(), "3\t0\n")
        lapdread.send_signal(signal.SIGINT)
        self.assertEqual(lapdread.wait(LIMIT), 0)
        self.assertEqual(tshark.wait(LIMIT), 0)

    def test_wireshark_offers_a_log_as_an_interface(self):
        """The analyser looks for interfaces in a folder of one's own only if it is not run by root."""
        self.write("lapdmon.log", *LINES)
        self.folder.chmod(0o755)
        extcap = self.folder / "extcap"
        extcap.mkdir()
        shutil.copy(EXTCAP / "lapdread-extcap", extcap)
        here = environment(WIRESHARK_EXTCAP_DIR=str(extcap), LAPDMON_LOG=str(self.folder / "lapdmon.log"),
                           LAPDREAD=shutil.copy(LAPDREAD, self.folder / "lapdread"), HOME=str(self.folder))
        somebody = ["setpriv", "--reuid=65534", "--regid=65534", "--clear-groups"] if os.geteuid() == 0 else []

        def tshark(*words):
            return subprocess.run([*somebody, "tshark", *words], env=here, cwd=self.folder, capture_output=True, text=True,
                                  timeout=LIMIT, check=False)

        listed = tshark("-D")
        self.assertRegex(listed.stdout, r"(?m)^\d+\. lapdmon \(ISDN D channel, from the log of lapdmon\)$", listed.stderr)
        seen = tshark("-n", "-i", "lapdmon", "-c", "4", "-T", "fields", "-e", "lapd.direction")
        self.assertEqual(seen.stdout, "0\n1\n0\n1\n", seen.stderr)


class Record(Running):
    def record(self, *words):
        return self.start(LAPDREAD, "record", "--verbose", *words, "grows.hex", stdout=subprocess.PIPE,
                          stderr=subprocess.PIPE, text=True)

    def files(self):
        """The recordings; beside them is the recorder's state."""
        return sorted(path.name for path in self.folder.iterdir()
                      if path.name != "grows.hex" and not path.name.endswith(".state.json"))

    def test_an_end_in_order_names_the_file_after_trunk_and_start(self):
        self.write("grows.hex", *LINES)
        recorder = self.record("--trunk", "pri1")
        part = self.folder / "pri1.20261121T112533Z.pcapng.part"
        until(lambda: part.exists() and part.stat().st_size > 300, "the frames are in the unfinished file")
        self.assertEqual(self.files(), [part.name])
        recorder.send_signal(signal.SIGTERM)
        self.assertEqual(recorder.wait(LIMIT), 0)
        self.assertEqual(self.files(), ["pri1.20261121T112533Z.pcapng"])
        listed = output("--columns", "trunk,frame", self.folder / "pri1.20261121T112533Z.pcapng")
        self.assertEqual(listed, "pri1     SABME\npri1     UA\npri1     RR\npri1     RR\n")

    def test_sighup_begins_a_new_file_with_its_own_head(self):
        self.write("grows.hex", *LINES[:2])
        recorder = self.record("--trunk", "b1.d1", "--to", "log")
        first = self.folder / "b1.d1.20261121T112533Z.log"
        until(lambda: pathlib.Path(str(first) + ".part").exists(), "the first file")
        until(lambda: pathlib.Path(str(first) + ".part").stat().st_size > 300, "its frames")
        recorder.send_signal(signal.SIGHUP)
        until(first.exists, "the first file is finished")
        self.write("grows.hex", *LINES[2:])
        second = self.folder / "b1.d1.20261121T112534Z.log"
        until(lambda: pathlib.Path(str(second) + ".part").exists(), "the second file")
        until(lambda: pathlib.Path(str(second) + ".part").stat().st_size > 300, "its frames")
        recorder.send_signal(signal.SIGINT)
        self.assertEqual(recorder.wait(LIMIT), 0)
        for path in (first, second):
            self.assertIn("Orvane KV9 ISDN Trace Utility", path.read_text())
        joined = output("--columns", "trunk,frame", "--type", "SABME,UA,RR", first, second)
        self.assertEqual(joined, "b1.d1    SABME\nb1.d1    UA\nb1.d1    RR\nb1.d1    RR\n")

    def test_files_end_by_size_and_time_and_the_oldest_go(self):
        for minute in range(6):
            self.write("grows.hex", *(line.replace("T11:25", f"T11:{25 + minute}") for line in LINES))
        recorder = self.record("--trunk", "t", "--time", "1min", "--files", "2")
        until(lambda: (self.folder / "t.20261121T113033Z.pcapng.part").exists(), "the last minute's file")
        recorder.send_signal(signal.SIGTERM)
        self.assertEqual(recorder.wait(LIMIT), 0)
        self.assertEqual(self.files(), ["t.20261121T112933Z.pcapng", "t.20261121T113033Z.pcapng"])
        recorder = self.record("--trunk", "s", "--size", "500")
        until(lambda: len([name for name in self.files() if name.startswith("s.")]) > 3, "files of 500 octets")
        recorder.send_signal(signal.SIGTERM)
        self.assertEqual(recorder.wait(LIMIT), 0)
        names = [self.folder / name for name in self.files() if name.startswith("s.")]
        frames = [json.loads(line)["hex"] for line in
                  output("convert", "--to", "jsonl", "-o", "-", *names).splitlines() if '"event"' not in line]
        self.assertEqual(len(frames), 24)

    def test_a_trunk_cannot_name_a_place_elsewhere(self):
        self.write("grows.hex", *LINES)
        recorder = self.record("--trunk", "../../etc/x y")
        name = ".._.._etc_x_y".replace(".", "_", 1)
        until(lambda: any(name in file for file in self.files()), "a file in the folder")
        recorder.send_signal(signal.SIGTERM)
        self.assertEqual(recorder.wait(LIMIT), 0)

    def test_a_folder_that_is_not_there_is_refused(self):
        self.write("grows.hex", *LINES)
        status, _, error = run("record", "--folder", "nowhere", "grows.hex", cwd=self.folder)
        self.assertEqual((status, error), (2, "lapdread: cannot write into nowhere: no such folder\n"))


if __name__ == "__main__":
    unittest.main()
