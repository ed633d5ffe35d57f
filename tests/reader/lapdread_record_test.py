"""The recorder over restarts, triggers and full disks: nothing is recorded twice, nothing is lost unsaid, and what surrounds
a trigger stays. Tests wait for what they expect; LIMIT only ends a test that would wait for ever."""

import json
import os
import signal
import socket
import subprocess
import unittest

from lapdread_harness import LAPDREAD, LIMIT, output, until
from lapdread_live_test import Running

START = 11 * 3600 + 25 * 60 + 33  # a second of 21 November 2026


def frame(second, octets="00010101", direction="TX"):
    """A line with a frame; its second counts from START."""
    at = START + second
    return f"{direction} 2026-11-21T{at // 3600:02}:{at // 60 % 60:02}:{at % 60:02}.000Z {octets}"


def numbered(number, second=0):
    """An I frame with its number in the call reference."""
    return frame(second, f"0001{number % 128 << 1:02x}000802{number:04x}7b")


def in_order(paths):
    """Recordings by their start and the number behind it."""
    def place(path):
        _, start, rest = path.name.split(".", 2)
        number = rest.split(".")[0]
        return start, int(number) if number.isdigit() else 1
    return sorted(paths, key=place)


class Recording(Running):
    def record(self, *words):
        with open(self.folder / "said", "w", encoding="ascii") as said:
            return self.start(LAPDREAD, "record", "--trunk", "t", *words, "t.hex", stderr=said)

    def said(self):
        """What the recorder that was started last has said so far."""
        return (self.folder / "said").read_text()

    def stop(self, recorder, status=0):
        recorder.send_signal(signal.SIGTERM)
        self.assertEqual(recorder.wait(LIMIT), status)

    def state(self):
        return json.loads((self.folder / "t.state.json").read_text())

    def recorded(self, kept=False):
        """The recordings of the trunk, oldest first."""
        return in_order(path for path in self.folder.glob("t.2*") if (".kept." in path.name) == kept)

    def octets(self, *paths):
        """Those of all frames, in order."""
        if not paths:
            return []
        lines = output("convert", "--to", "jsonl", "-o", "-", "--quiet", *paths).splitlines()
        return [json.loads(line)["hex"] for line in lines if '"event"' not in line]

    def numbers(self, *paths):
        return [int(octets[12:16] or "0", 16) for octets in self.octets(*paths)]

    def has(self, count, last=None):
        """Waits until so many frames are in the files, or until this one is the last."""
        def there():
            try:
                numbers = self.numbers(*self.recorded())
            except AssertionError:
                return False  # a file without its head, or one that has just got its name
            return numbers[-1:] == [last] if last is not None else len(numbers) == count
        until(there, f"{count or last} frames are in the files")


class Restart(Recording):
    def test_a_recorder_started_anew_goes_on_where_it_ended(self):
        for form in ("pcapng", "log"):
            with self.subTest(form):
                for path in self.folder.glob("t.*"):
                    path.unlink()
                self.write("t.hex", *map(numbered, range(1, 6)))
                recorder = self.record("--to", form)
                self.has(5)
                self.stop(recorder)
                run = self.state()["run"]
                self.assertEqual(self.state()["next"], 6)
                self.write("t.hex", *map(numbered, range(6, 9)))
                recorder = self.record("--to", form)
                self.has(8)
                self.stop(recorder)
                self.assertEqual(self.numbers(*self.recorded()), [1, 2, 3, 4, 5, 6, 7, 8])
                state = self.state()
                self.assertEqual((state["run"], state["next"]), (run, 9))
                files = [(file["run"], file["first"]) for file in state["files"]]
                self.assertEqual(files, [(run, 1), (run, 6)])

    def test_a_trunk_of_two_merged_inputs_is_recorded_in_the_order_of_its_times(self):
        self.write("a.hex", *[numbered(number, number) for number in (1, 3, 5, 7)])
        self.write("t.hex", *[numbered(number, number) for number in (2, 4, 6, 8)])
        recorder = self.record("--merge", "a.hex")
        self.has(None, last=8)
        self.stop(recorder)
        self.assertEqual(self.numbers(*self.recorded()), [1, 2, 3, 4, 5, 6, 7, 8])
        first = self.state()
        # Which of both inputs a recorder began with cannot be told, so another one begins a new run.
        recorder = self.record("--merge", "a.hex")
        self.has(16)
        self.stop(recorder)
        self.assertNotEqual(self.state()["run"], first["run"])

    def test_a_recorder_that_was_killed_repeats_nothing_and_loses_nothing(self):
        count = 0
        for life in range(6):
            self.write("t.hex", *map(numbered, range(count + 1, count + 41)))
            count += 40
            recorder = self.record("--size", "2000")
            self.has(None, last=count)
            if life % 2:
                (self.folder / "t.state.json").unlink()  # as if it had been killed before it wrote that
                (self.folder / "t.state.json").write_text(json.dumps(self.older))
            self.older = self.state()
            recorder.kill()
            recorder.wait(LIMIT)
        recorder = self.record()
        self.write("t.hex", numbered(count + 1))
        self.has(None, last=count + 1)
        self.stop(recorder)
        numbers = self.numbers(*self.recorded())
        self.assertEqual(sorted(set(numbers)), list(range(1, count + 2)))
        # Whatever was written twice has one number both times.
        state = self.state()
        self.assertEqual(len({file["run"] for file in state["files"]}), 1)
        for file in state["files"]:
            found = self.numbers(self.folder / file["name"])
            self.assertEqual(found, list(range(file["first"], file["first"] + len(found))))
        self.assertEqual(list(self.folder.glob("*.part")), [])

    def test_frames_behind_an_unfinished_file_are_not_repeated(self):
        self.write("t.hex", *map(numbered, range(1, 4)))
        recorder = self.record()
        self.has(3)
        before = self.state()
        self.write("t.hex", *map(numbered, range(4, 6)))
        self.has(5)
        recorder.kill()
        recorder.wait(LIMIT)
        before["next"] = 2
        (self.folder / "t.state.json").write_text(json.dumps(before))
        recorder = self.record()
        self.write("t.hex", numbered(6))
        self.has(6)
        self.stop(recorder)
        self.assertIn("which was left behind", self.said())
        self.assertEqual(self.numbers(*self.recorded()), [1, 2, 3, 4, 5, 6])

    def test_a_log_that_is_replaced_begins_a_new_run_and_a_new_file(self):
        self.write("t.hex", *map(numbered, range(1, 4)))
        recorder = self.record()
        self.has(3)
        first = self.state()["run"]
        self.write("new", numbered(11, second=60), numbered(12, second=60))
        os.rename(self.folder / "new", self.folder / "t.hex")
        self.has(5)
        self.stop(recorder)
        state = self.state()
        self.assertGreater(state["run"], first)
        self.assertEqual(state["next"], 3)
        self.assertEqual([(file["run"], file["first"]) for file in state["files"]], [(first, 1), (state["run"], 1)])
        self.assertEqual([self.numbers(path) for path in self.recorded()], [[1, 2, 3], [11, 12]])

    def test_a_log_that_was_emptied_while_nobody_recorded_begins_a_new_run(self):
        self.write("t.hex", *map(numbered, range(1, 4)))
        recorder = self.record()
        self.has(3)
        self.stop(recorder)
        first = self.state()["run"]
        (self.folder / "t.hex").write_text("")
        self.write("t.hex", *[numbered(number, second=60) for number in range(1, 4)])
        recorder = self.record()
        self.has(6)
        self.stop(recorder)
        self.assertGreater(self.state()["run"], first)
        self.assertEqual(self.numbers(*self.recorded()), [1, 2, 3, 1, 2, 3])

    def test_a_damaged_state_is_said_and_numbers_begin_anew(self):
        for damaged in ("", "{", "[1]", '{"v":2}', '{"v":1,"trunk":"t","run":-1,"next":1,"besides":0,"log":null,"files":[]}',
                        '{"v":1,"trunk":7,"run":1,"next":1,"besides":0,"log":null,"files":[]}', "[" * 100000):
            with self.subTest(damaged[:40]):
                for path in self.folder.glob("t.*"):
                    path.unlink()
                self.write("t.hex", numbered(1))
                (self.folder / "t.state.json").write_text(damaged)
                recorder = self.record()
                self.has(1)
                self.stop(recorder)
                self.assertIn("t.state.json: ", self.said())
                self.assertEqual(self.state()["next"], 2)


class Time(Recording):
    def test_a_file_ends_by_the_clock_though_no_frame_comes(self):
        self.write("t.hex", numbered(1))
        recorder = self.record("--time", "1min")
        until(lambda: (self.folder / "t.20261121T112533Z.pcapng").exists(), "the file is finished")
        self.assertIsNone(recorder.poll())
        self.stop(recorder)

    def test_files_older_than_the_span_are_removed(self):
        self.write("t.hex", *[numbered(minute, second=60 * minute) for minute in range(60)])
        recorder = self.record("--keep", "10min")
        until(lambda: any(path.name == "t.20261121T122433Z.pcapng" for path in self.recorded()), "the last minute")
        self.stop(recorder)
        # Files of a minute each; the oldest holds the time ten minutes before the last frame.
        self.assertEqual(self.numbers(*self.recorded()), list(range(49, 60)))


class Trigger(Recording):
    DISCONNECT = "00010200080200014508028290"  # cause 16

    def test_frames_around_a_cause_are_kept_while_others_are_removed(self):
        lines = [numbered(minute, second=60 * minute) for minute in range(60)]
        lines.insert(30, frame(30 * 60 - 30, self.DISCONNECT.replace("8290", "82a2")))
        lines.insert(10, frame(10 * 60 - 30, self.DISCONNECT))
        self.write("t.hex", *lines)
        recorder = self.record("--time", "1min", "--files", "2", "--on", "cause:34,38,41", "--before", "3min", "--after",
                               "2min")
        until(lambda: any(path.name == "t.20261121T122433Z.pcapng" for path in self.recorded()), "the last minute")
        self.stop(recorder)
        self.assertEqual(self.numbers(*self.recorded()), [58, 59])
        kept = self.recorded(kept=True)
        self.assertEqual([path.name for path in kept], ["t.20261121T115233Z.kept.pcapng"])
        octets = self.octets(*kept)
        self.assertEqual([int(some[12:16], 16) for some in octets if not some.endswith("82a2")], [27, 28, 29, 30, 31])
        self.assertEqual(octets[3][-4:], "82a2")
        self.assertIn("kept because of cause:34,38,41 (frame 32)", output("--columns", "message,details", *kept))

    def test_triggers_close_together_make_one_file(self):
        seconds = [0, 100, 200, 500, 1000]
        self.write("t.hex", *[line for second in seconds for line in (
            numbered(second, second=second), frame(second, self.DISCONNECT.replace("0001", f"{second:04x}")))])
        recorder = self.record("--on", "cause:16", "--before", "10s", "--after", "2min")
        self.has(10)
        self.stop(recorder)
        starts = [path.name.split(".")[1] for path in self.recorded(kept=True)]
        self.assertEqual(starts, ["20261121T112533Z", "20261121T113353Z", "20261121T114213Z"])

    def test_a_signal_keeps_what_surrounds_the_moment(self):
        self.write("t.hex", *map(numbered, range(1, 6)))
        recorder = self.record("--after", "1s")
        self.has(5)
        recorder.send_signal(signal.SIGUSR1)
        # The time after it ends by the host's clock.
        until(lambda: any(not path.name.endswith(".part") for path in self.recorded(kept=True)), "a file is kept")
        self.stop(recorder)
        self.assertIn("t: trigger, what surrounds it is kept: SIGUSR1", self.said())
        self.assertEqual(self.numbers(*self.recorded(kept=True)), [1, 2, 3, 4, 5])

    def test_a_finding_triggers_and_milder_ones_do_not(self):
        # STATUS with cause 98 is a warning.
        lines = [frame(0, "00017f"), frame(0, "000173", "RX"), frame(1, "0001000008020001050403809090180183"),
                 frame(2, "02010002080280017d080282e214010a", "RX")]
        for level, expected in (("error", 0), ("warning", 1)):
            with self.subTest(level):
                for path in self.folder.glob("t.*"):
                    path.unlink()
                self.write("t.hex", *lines)
                recorder = self.record("--on", f"check:{level}")
                self.has(4)
                self.stop(recorder)
                self.assertEqual(len(self.recorded(kept=True)), expected, self.said())

    def test_frames_that_are_recorded_already_trigger_nothing_again(self):
        for second, octets in enumerate((self.DISCONNECT, "00010101")):
            self.write("t.hex", frame(second, octets))
            recorder = self.record("--on", "cause:16")
            self.has(second + 1)
            self.stop(recorder)
            self.assertEqual(len(self.recorded(kept=True)), 1)

    def test_what_is_no_trigger_is_refused(self):
        for words in ("cause", "cause:", "cause:x", "cause:200", "check:bad", "check:", "since:11:00", "no-keepalive:1", ""):
            with self.subTest(words):
                recorder = self.record("--on", words)
                self.assertEqual(recorder.wait(LIMIT), 1)

    def test_a_trigger_goes_with_no_filter_on_calls(self):
        for words in (("--call", "1"), ("--failed",), ("--not", "--unanswered")):
            with self.subTest(words):
                recorder = self.record("--on", "cause:16", *words)
                self.assertEqual(recorder.wait(LIMIT), 1)


class TwoTrunks(Recording):
    def start_recorder(self):
        with open(self.folder / "said", "w", encoding="ascii") as said:
            return self.start(LAPDREAD, "record", "--merge", "--files", "1", "--on", "cause:16", "--before", "10s", "--after",
                              "10s", "a.hex", "b.hex", stderr=said)

    def of(self, trunk, kept=False):
        return in_order(path for path in self.folder.glob(f"{trunk}.2*") if (".kept." in path.name) == kept)

    def hold(self, a, b):
        """Waits until the files of each trunk hold these numbers."""
        def there():
            try:
                return (self.numbers(*self.of("a")), self.numbers(*self.of("b"))) == (a, b)
            except AssertionError:
                return False  # a file without its head, or one that has just got its name or is removed
        until(there, f"the files hold {a} and {b}")

    def states(self):
        return [json.loads((self.folder / f"{trunk}.state.json").read_text()) for trunk in "ab"]

    def test_are_recorded_at_once_each_with_its_files_triggers_and_state(self):
        self.write("a.hex", *[numbered(number, 2 * number) for number in (1, 2, 3)])
        self.write("b.hex", *[numbered(number, 2 * number + 1) for number in (101, 102, 103)],
                   frame(210, Trigger.DISCONNECT.replace("08020001", "08020068")))  # of call 104
        recorder = self.start_recorder()
        self.hold([1, 2, 3], [101, 102, 103, 104])
        recorder.send_signal(signal.SIGHUP)
        until(lambda: not list(self.folder.glob("[ab].2*Z.pcapng.part")), "both files are finished")
        self.write("a.hex", numbered(4, 300))
        self.write("b.hex", numbered(105, 301))
        self.hold([1, 2, 3, 4], [101, 102, 103, 104, 105])  # the kept number of files does not count those being written
        recorder.send_signal(signal.SIGUSR1)
        until(lambda: "b: trigger, what surrounds it is kept: SIGUSR1" in self.said(), "the signal is heeded")
        recorder.send_signal(signal.SIGHUP)
        self.hold([4], [105])
        self.stop(recorder)
        self.assertEqual([line for line in self.said().splitlines() if "trigger" in line],
                         ["lapdread: b: trigger, what surrounds it is kept: cause:16 (frame 7)",
                          "lapdread: a: trigger, what surrounds it is kept: SIGUSR1",
                          "lapdread: b: trigger, what surrounds it is kept: SIGUSR1"])
        self.assertEqual([self.numbers(path) for path in self.of("a", kept=True)], [[4]])
        self.assertEqual([self.numbers(path) for path in self.of("b", kept=True)], [[101, 102, 103, 104], [105]])
        before = self.states()
        self.assertEqual([state["next"] for state in before], [5, 6])
        self.assertEqual([state["trunk"] for state in before], ["a", "b"])
        # Each trunk goes on where it ended, also when only one of them has something new.
        self.write("b.hex", numbered(106, 302))
        recorder = self.start_recorder()
        self.hold([4], [105, 106])
        self.stop(recorder)
        after = self.states()
        self.assertEqual([state["next"] for state in after], [5, 7])
        self.assertEqual([state["run"] for state in after], [state["run"] for state in before])


@unittest.skipUnless(os.geteuid() == 0, "only root can mount a disk that is small enough to be full")
class FullDisk(Recording):
    def setUp(self):
        super().setUp()
        self.disk = self.folder / "disk"
        self.disk.mkdir()
        subprocess.run(["mount", "-t", "tmpfs", "-o", "size=512k", "none", self.disk], check=True)
        self.addCleanup(subprocess.run, ["umount", "--lazy", self.disk], check=True)

    def test_it_goes_on_when_there_is_room_and_says_what_was_lost(self):
        ballast = self.disk / "ballast"
        ballast.write_bytes(bytes(256 * 1024))
        written = 0

        def more(count):
            nonlocal written
            self.write("t.hex", *[numbered(written + i) for i in range(1, count + 1)])
            written += count
        more(100)
        recorder = self.record("--folder", str(self.disk))
        until(lambda: list(self.disk.glob("t.2*.part")), "a file")
        while "No space left on device" not in self.said():
            more(500)
            self.assertLess(written, 1_000_000)
        ballast.unlink()

        def goes_on():
            more(10)
            return "writing works again" in self.said()
        until(goes_on, "writing works again")
        self.stop(recorder, 2)  # frames were lost
        files = in_order(self.disk.glob("t.2*"))
        self.assertFalse([path for path in files if path.name.endswith(".part")])
        lines = [json.loads(line) for line in
                 output("convert", "--to", "jsonl", "-o", "-", "--quiet", *files).splitlines()]
        frames = [line["hex"] for line in lines if "event" not in line]
        lost = sum(line["count"] for line in lines if line.get("event") == "frames-lost")
        self.assertGreater(lost, 0)
        self.assertRegex(self.said(), rf"t: writing works again; frames lost: {lost}\n")
        self.assertEqual(self.said().count("frames lost"), 1)
        state = json.loads((self.disk / "t.state.json").read_text())
        self.assertEqual(state["next"] - 1, len(frames) + lost)
        # The numbers of what was lost are left out: each file begins with the number that its first frame has.
        for file in state["files"]:
            found = self.numbers(self.disk / file["name"])
            self.assertEqual(found, [(file["first"] + i) % 65536 for i in range(len(found))])

    def test_one_that_is_killed_on_a_full_disk_has_lost_and_doubled_nothing_once_there_is_room(self):
        ballast, count = self.disk / "ballast", 4500  # frames for more than the disk has left, and less than the whole disk
        ballast.write_bytes(bytes(256 * 1024))
        self.write("t.hex", *[numbered(number) for number in range(1, count + 1)])
        recorder = self.record("--folder", str(self.disk))
        until(lambda: "No space left on device" in self.said(), "the disk is full")
        recorder.kill()
        recorder.wait(LIMIT)
        self.assertLess(len(self.numbers(*self.disk.glob("t.2*"))), count)
        ballast.unlink()

        def state():
            return json.loads((self.disk / "t.state.json").read_text())
        run = state()["run"]
        recorder = self.record("--folder", str(self.disk))
        self.write("t.hex", numbered(count + 1))
        until(lambda: state()["next"] == count + 2, "all frames are recorded")
        self.stop(recorder)
        listed = [self.disk / file["name"] for file in state()["files"]]
        self.assertEqual(in_order(self.disk.glob("t.2*")), listed)
        self.assertEqual(self.numbers(*listed), list(range(1, count + 2)))
        self.assertEqual({file["run"] for file in state()["files"]}, {run})


class Service(Recording):
    def manager(self):
        """A socket that hears what a service tells its manager, and the variable that names it."""
        manager = socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM)
        self.addCleanup(manager.close)
        manager.settimeout(LIMIT)
        name = "lapdread-record-" + str(os.getpid())
        manager.bind("\0" + name)
        return manager, "NOTIFY_SOCKET=@" + name

    def test_signals_end_no_recorder_that_waits_for_the_writer_of_a_fifo(self):
        manager, variable = self.manager()
        fifo = self.folder / "fifo"
        os.mkfifo(fifo)
        recorder = self.start("env", variable, "WATCHDOG_USEC=300000", LAPDREAD, "record", "--trunk", "t", fifo)
        # It goes on to say that it lives, so it does not wait within open().
        self.assertEqual([manager.recv(100) for _ in range(3)], [b"READY=1"] + 2 * [b"WATCHDOG=1"])
        recorder.send_signal(signal.SIGHUP)
        recorder.send_signal(signal.SIGUSR1)
        for number in (1, 2):  # a writer that goes away ends nothing either
            writer = None

            def opened():
                nonlocal writer
                try:
                    writer = os.open(fifo, os.O_WRONLY | os.O_NONBLOCK)
                except OSError:  # nobody reads it yet
                    return False
                return True
            until(opened, "the recorder reads the FIFO")
            os.write(writer, (numbered(number, number) + "\n").encode())  # and nobody reads what the manager is told
            os.close(writer)
            self.has(number)
        self.stop(recorder)
        self.assertEqual(self.numbers(*self.recorded()), [1, 2])

    def test_the_service_manager_hears_that_the_recorder_is_ready_and_records_on(self):
        manager, variable = self.manager()
        self.write("t.hex", numbered(1))
        recorder = self.start("env", variable, "WATCHDOG_USEC=300000",
                              LAPDREAD, "record", "--trunk", "t", "t.hex")
        told = [manager.recv(100) for _ in range(4)]
        self.assertEqual(told, [b"READY=1"] + 3 * [b"WATCHDOG=1"])
        self.stop(recorder)


if __name__ == "__main__":
    unittest.main()
