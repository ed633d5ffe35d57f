"""lapdread in a terminal: colours, progress, and nothing of a frame that a terminal would obey. tmux is the terminal."""

import os
import time
import unittest

from lapdread_harness import EXAMPLES, LAPDREAD, LIMIT
from tmux import TmuxTest


class Terminal(TmuxTest):
    size = (150, 40)

    def test_colours_are_used_on_a_terminal(self):
        self.type(f"{LAPDREAD} --first 5 {EXAMPLES['net5']}; echo end")
        self.shows("\nend")
        self.assertIn("\x1b[1mSETUP", self.screen("-e"))

    def test_no_colours_are_used_where_the_user_wants_none(self):
        self.type(f"NO_COLOR=1 {LAPDREAD} --first 5 {EXAMPLES['net5']}; echo end")
        self.shows("\nend")
        self.assertNotIn("\x1b[1m", self.screen("-e"))

    def test_text_of_a_frame_commands_no_terminal(self):
        # A SETUP whose display text clears the screen, sets the title, and is red.
        display = b"\x1b[2J\x1b]0;evil\x07\x1b[31mred\x9b1m\n"
        setup = bytes([0x02, 0x01, 0, 0, 8, 1, 1, 5, 0x28, len(display)]) + display
        (self.folder / "evil.hex").write_text(f"RX 2026-11-21T11:25:33Z {setup.hex()}\n")
        commands = ("list", "decode", "explain", "convert --to csv", "convert --to jsonl", "ladder", "ladder --mermaid")
        for number, command in enumerate(commands):
            self.type(f"clear; {LAPDREAD} {command} --quiet --color never evil.hex; echo end{number}")
            screen = self.shows(f"\nend{number}", "-e", "-J")
            self.assertNotIn("\x1b[31m", screen, command)
            self.assertTrue("x1b[31mred" in screen or "u001b[31mred" in screen, screen)
            self.assertNotEqual(self.tmux("display-message", "-p", "#{pane_title}").strip(), "evil", command)

    def test_a_bar_shows_how_far_long_work_has_come(self):
        """The bar is drawn once the work has taken a second: of a FIFO, whose end nobody knows, it shows how much was read."""
        os.mkfifo(self.folder / "fifo")
        self.type(f"{LAPDREAD} convert --follow --to jsonl fifo -o out; echo end")
        line = "TX 2026-11-21T11:25:33Z 00010101\n"
        end = time.monotonic() + LIMIT
        with open(self.folder / "fifo", "w", encoding="ascii") as fifo:
            while "MB read" not in self.screen():
                self.assertLess(time.monotonic(), end, "never showed a bar")
                fifo.write(line * 1000)
                fifo.flush()
            self.tmux("send-keys", "C-c")
        self.shows("\nend")
        self.assertNotIn("MB read", self.screen())


if __name__ == "__main__":
    unittest.main()
