"""lapdread browse in a terminal: keys, resizing, live input, saving, and the terminal as it was afterwards. tmux is the terminal."""

import os
import re
import signal
import subprocess
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, LIMIT, SOURCE, environment, output, until
from tmux import PROMPT, TmuxTest

NET5 = EXAMPLES["net5"]
# What the curses library itself leaves behind: for a terminal that it does not know, and of the mouse of the console.
KEPT_BY_CURSES = "ASAN_OPTIONS=detect_leaks=0"


class Browse(TmuxTest):
    shell = "bash --norc"

    def begin(self, words, before=""):
        """Starts browse with its modes of the terminal written down before and after; `pid` is its process."""
        (self.folder / "run").write_text("echo $$ > pid\nexec " + f"{before} {LAPDREAD} browse {words}\n")
        self.type(f"clear; stty -g > before; bash run; echo status $?; stty -g > after; echo end")

    def pid(self):
        return int((self.folder / "pid").read_text())

    def ended(self, status=0):
        screen = self.shows("\nend")
        self.assertIn(f"status {status}", screen)
        self.assertEqual((self.folder / "before").read_text(), (self.folder / "after").read_text())
        self.assertNotIn("Findings", screen)  # its screen is not the terminal's own
        self.assertEqual(self.tmux("display-message", "-p", "#{alternate_on} #{cursor_flag} #{mouse_any_flag}"), "0 1 0\n")

    def test_keys_lead_from_calls_to_a_ladder_to_a_message_and_back(self):
        self.begin(NET5)
        self.shows("Calls: 6")
        self.keys("Enter")
        self.shows("CALL PROCEEDING")
        self.keys("Down", "Enter")
        self.shows("Frame 7 of call 1")
        self.keys("Escape")
        self.shows("Ladder of call 1")
        self.keys("q")
        self.shows("Calls: 6")
        self.keys("Tab")
        self.shows("Findings:")
        self.keys("BTab", "BTab")
        self.shows("1 D channel")
        self.keys("q")
        self.ended()

    def test_function_and_page_keys_are_known(self):
        self.begin(NET5)
        self.shows("Calls: 6")
        self.keys("F1")
        self.shows("On this screen")
        self.keys("Escape", "End")
        self.shows(">     6")
        self.keys("Home")
        self.shows(">     1")
        self.keys("j")
        self.shows(">     2")
        self.keys("Q")
        self.ended()

    def test_the_mouse_moves_the_cursor(self):
        self.begin(NET5)
        self.shows("Calls: 6")
        self.tmux("send-keys", "-l", "\x1b[M" + chr(32) + chr(32 + 10) + chr(32 + 6))
        self.shows(">     3")
        self.keys("q")
        self.ended()

    def test_the_screen_follows_the_size_of_the_terminal(self):
        self.begin(NET5)
        self.shows("Calls: 6")
        self.tmux("resize-window", "-x", "120", "-y", "30")
        self.shows("2001-05-14T08:00:12.000+00:00")
        self.tmux("resize-window", "-x", "40", "-y", "10")
        until(lambda: "2001-05-14" not in self.screen(), "a small screen")
        self.keys("q")
        self.ended()

    def test_every_signal_that_ends_it_gives_the_terminal_back(self):
        for number in (signal.SIGTERM, signal.SIGINT, signal.SIGHUP, signal.SIGQUIT):
            with self.subTest(number):
                self.begin(f"--follow {NET5}")
                self.shows("live")
                os.kill(self.pid(), number)
                self.ended()

    def test_ctrl_c_ends_it(self):
        self.begin(NET5)
        self.shows("Calls: 6")
        self.keys("C-c")
        self.shows("end")
        self.ended()

    def test_a_crash_gives_the_terminal_back(self):
        self.begin(NET5)
        self.shows("Calls: 6")
        os.kill(self.pid(), signal.SIGABRT)
        self.shows("\nend")
        self.assertEqual((self.folder / "before").read_text(), (self.folder / "after").read_text())
        self.assertEqual(self.tmux("display-message", "-p", "#{alternate_on} #{cursor_flag} #{mouse_any_flag}"), "0 1 0\n")

    def test_ctrl_z_stops_it_and_fg_goes_on(self):
        self.type(f"clear; {LAPDREAD} browse {NET5}; echo end")
        self.shows("Calls: 6")
        self.keys("C-z")
        self.shows("Stopped")
        self.type("fg")
        self.shows("Calls: 6")
        self.keys("q")
        self.shows(PROMPT)

    def test_standard_input_is_read_and_keys_come_from_the_terminal(self):
        self.type(f"clear; cat {NET5} | {LAPDREAD} browse -; echo; echo end")
        self.shows("Calls: 6")
        self.shows("standard input")
        self.keys("Enter")
        self.shows("Ladder of call 1")
        self.keys("Q")
        self.shows("\nend")

    def test_a_trunk_is_seen_as_it_runs(self):
        lines = output("convert", "--to", "hex", NET5).splitlines()
        live = self.folder / "live.hex"
        live.write_text("\n".join(lines[:6]) + "\n")
        self.begin(f"--follow {live}")
        self.shows("live")
        self.shows("Calls: 1")
        self.keys("1")
        self.shows("s set-up")
        with live.open("a") as file:
            file.write("\n".join(lines[6:]) + "\n")
        self.keys("2")
        self.shows("Calls: 6")
        self.keys("q")
        self.ended()

    def test_the_oldest_frames_go_and_that_is_said(self):
        many = self.folder / "many.hex"
        lines = [line for line in output("convert", "--to", "hex", NET5).splitlines() if not line.startswith("#")]
        many.write_text("\n".join(lines * 30) + "\n")
        self.begin(f"--frames 1000 {many}")
        self.shows("all read, 3,060 frames, the first")
        self.keys("q")
        self.ended()

    def test_a_call_is_found_and_saved_without_its_numbers(self):
        """The trial of the user's page: the call that failed, redacted, for the carrier."""
        self.begin(SOURCE / "examples/noon.pcap")
        self.shows("Calls: 19")
        self.keys("/")
        self.tmux("send-keys", "-l", "failed T12:")
        self.shows("Calls: 2 of 19")
        self.keys("Enter", "Enter")
        self.shows("Ladder of call 12")
        self.keys("w")
        self.shows("call-12.pcapng")
        self.keys("Tab", "Space")
        self.shows("Redact: yes")
        self.keys("Enter")
        self.shows("redacted, to call-12.pcapng")
        self.keys("Q")
        self.ended()
        saved = output("calls", self.folder / "call-12.pcapng")
        self.assertIn("cause 41 temporary failure, transit network", saved)
        self.assertNotIn("03023125586", saved)

    def test_no_colours_where_the_user_or_the_terminal_has_none(self):
        for before, words in (("NO_COLOR=1", ""), ("", "--color never"), ("TERM=vt100", "")):
            with self.subTest(before + words):
                self.begin(f"{words} {NET5}", before and f"env {before}")
                self.shows("Calls: 6")
                self.assertIsNone(re.search("\x1b\\[[0-9;]*3[0-7]m", self.screen("-e")))
                self.assertIn(">     1", self.screen())
                self.keys("q")
                self.shows("\nend")

    def test_colours_are_those_that_every_terminal_with_colours_has(self):
        for name in ("xterm", "linux", "screen-256color"):  # the first two have eight
            with self.subTest(name):
                self.begin(NET5, f"env {KEPT_BY_CURSES} TERM={name}")
                self.shows("Calls: 6")
                self.assertIsNotNone(re.search("\x1b\\[[0-9;]*3[0-7]m", self.screen("-e")))
                self.assertIsNone(re.search("\x1b\\[[0-9;]*(38;|9[0-7]m)", self.screen("-e")))
                self.keys("q")
                self.shows("\nend")

    def test_a_terminal_without_screens_is_refused(self):
        for name in ("dumb", "nonsense"):
            with self.subTest(name):
                self.begin(NET5, f"env {KEPT_BY_CURSES} TERM={name}")
                self.shows(f"browse cannot show screens on a terminal of the kind TERM={name}")
                self.assertIn("status 2", self.shows("\nend"))

    def test_ascii_where_the_locale_or_the_user_wants_it(self):
        for before, words in (("LC_ALL=C", ""), ("-u LC_ALL LANG=C", ""), ("", "--ascii"),
                              ("TERM=vt100 LC_ALL=C", "")):  # the last one, since it leaves its screen where it was
            with self.subTest(before + words):
                self.begin(f"{words} {NET5}", before and f"env {before}")
                self.shows("Calls: 6")
                self.keys("Enter")
                self.shows("CALL PROCEEDING")
                self.assertTrue(self.screen().isascii(), self.screen())
                self.keys("Q")
                self.shows("\nend")

    def test_what_cannot_be_read_is_said_without_a_screen(self):
        (self.folder / "junk").write_text("nothing that is known\n")
        for words, status, says in (("none.log", 2, "cannot read none.log"), ("junk", 2, "unknown file format"),
                                    (f"-o x {NET5}", 1, "browse shows all there is")):
            with self.subTest(words):
                self.begin(words)
                self.shows(f"status {status}")
                self.shows(says)
                self.shows("\nend")

    def test_without_a_terminal_it_says_so(self):
        done = subprocess.run(["setsid", LAPDREAD, "browse", NET5], stdin=subprocess.DEVNULL, capture_output=True, text=True,
                              timeout=LIMIT, cwd=SOURCE, env=environment(), check=False)
        self.assertEqual(done.returncode, 2)
        self.assertIn("browse needs a terminal", done.stderr)


if __name__ == "__main__":
    unittest.main()
