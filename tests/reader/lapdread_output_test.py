"""What stands in OUT stays there until all inputs are known to be readable, and no input is ever written over."""

import os
import pathlib
import shutil
import signal
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, LIMIT, SOURCE, Folder, environment, run, until

COMMANDS = [("convert", "--to", "pcapng"), ("convert", "--to", "jsonl"), ("list",), ("decode",), ("calls",), ("check",)]


class Output(Folder):
    def setUp(self):
        super().setUp()
        self.text = self.folder / "text"
        self.text.write_text("This is no capture.\n")
        self.silent = self.folder / "silent"
        self.silent.touch()

    def held(self, command):
        """An OUT that the command may write over, and what it holds."""
        out = self.folder / "out"
        out.unlink(missing_ok=True)
        status, before, error = run(*command, "--quiet", EXAMPLES["net5"])
        self.assertEqual((status, error), (0, ""))
        # Text for people is written to a new OUT alone; there it is the absence that stays.
        if command[0] == "convert":
            out.write_bytes(before)
            return out, before
        return out, None

    def untouched(self, out, before):
        return out.read_bytes() == before if before is not None else not out.exists()

    def test_an_input_that_cannot_be_read_leaves_out_as_it_was(self):
        inputs = {"missing": [self.folder / "missing"], "a folder": [self.folder], "of no known form": [self.text],
                  "empty": [self.silent], "the second is of no known form": [EXAMPLES["net5"], self.text],
                  "the second is missing": [EXAMPLES["net5"], self.folder / "missing"]}
        if os.geteuid() != 0:
            closed = self.folder / "closed"
            closed.write_bytes(EXAMPLES["net5"].read_bytes())
            closed.chmod(0)
            inputs["not for us"] = [closed]
        for command in COMMANDS:
            for what, names in inputs.items():
                with self.subTest(command=command, input=what):
                    out, before = self.held(command)
                    status, _, error = run(*command, "-o", out, *names)
                    self.assertEqual(status, 2, error)
                    self.assertTrue(self.untouched(out, before), error)

    def test_a_pipe_of_no_known_form_leaves_out_as_it_was(self):
        for command in COMMANDS:
            for text in (b"", b"This is no capture.\n"):
                with self.subTest(command=command, text=text):
                    out, before = self.held(command)
                    self.assertEqual(run(*command, "-o", out, "-", stdin=text)[0], 2)
                    self.assertTrue(self.untouched(out, before))

    def test_a_signal_before_anything_came_leaves_out_as_it_was(self):
        out, before = self.held(COMMANDS[0])
        lapdread = subprocess.Popen([LAPDREAD, *COMMANDS[0], "--follow", self.silent, out], env=environment())
        self.addCleanup(lapdread.kill)
        opened = pathlib.Path(f"/proc/{lapdread.pid}/fd")
        until(lambda: any(os.path.realpath(link) == str(self.silent) for link in opened.iterdir()), "the input is open")
        lapdread.send_signal(signal.SIGTERM)
        self.assertEqual(lapdread.wait(LIMIT), 0)
        self.assertEqual(out.read_bytes(), before)

    def test_out_that_is_in_is_refused_by_every_way(self):
        same = self.folder / "same.pcap"
        same.write_bytes(EXAMPLES["net5"].read_bytes())
        link = self.folder / "link.pcap"
        link.symlink_to(same)
        hard = self.folder / "hard.pcap"
        hard.hardlink_to(same)
        ways = [f"convert {same} {same}", f"convert {same} {link}", f"convert {hard} {same}",
                f"convert -o {same} {EXAMPLES['ni2']} {same}", f"convert --to pcap -o {same} - < {same}",
                f"convert --to pcap {same} >> {same}", f"list {same} >> {hard}", f"convert --to hex - < {same} >> {same}"]
        for way in ways:
            with self.subTest(way):
                done = subprocess.run(f"{LAPDREAD} {way}", shell=True, env=environment(), cwd=SOURCE, timeout=LIMIT,
                                      capture_output=True, text=True, stdin=subprocess.DEVNULL, check=False)
                self.assertEqual(done.returncode, 2)
                self.assertIn("is read and cannot be written at the same time", done.stderr)
                self.assertEqual(same.read_bytes(), EXAMPLES["net5"].read_bytes())


class Alone(Folder):
    def test_a_program_without_its_module_reads_all_but_stores(self):
        alone = shutil.copy(LAPDREAD, self.folder)
        listed = subprocess.run([alone, "--quiet", EXAMPLES["net5"]], capture_output=True, env=environment(), check=True)
        self.assertEqual(listed.stdout, run("--quiet", EXAMPLES["net5"])[1])
        refused = subprocess.run([alone, "--store", "postgresql://nobody@127.0.0.1:1/lapd"], capture_output=True, text=True,
                                 env=environment(), check=False)
        self.assertEqual((refused.returncode, refused.stdout), (2, ""))
        self.assertIn("the store cannot be read: ", refused.stderr)
        self.assertIn("lib/lapdread/store.so", refused.stderr)


if __name__ == "__main__":
    unittest.main()
