"""A terminal for tests: tmux, with a shell in a temporary folder."""

import subprocess
import time

from lapdread_harness import LIMIT, SANITIZER_REPORT, Folder, environment

PROMPT = "ready>"


class TmuxTest(Folder):
    """A derived class may set another size and another shell."""

    size = (80, 24)  # columns, lines
    shell = "sh"

    def setUp(self):
        super().setUp()
        self.socket = str(self.folder / "tmux")
        columns, lines = map(str, self.size)
        self.tmux("-f", "/dev/null", "new-session", "-d", "-x", columns, "-y", lines, f"env PS1='{PROMPT}' {self.shell}")
        self.addCleanup(self.tmux, "kill-server")
        self.shows(PROMPT)

    def tmux(self, *words):
        done = subprocess.run(["tmux", "-S", self.socket, *words], env=environment(), cwd=self.folder, text=True,
                              capture_output=True, timeout=LIMIT, check=True)
        return done.stdout

    def screen(self, *options):
        """The text on the screen. Fails if a sanitizer's report is there."""
        screen = self.tmux("capture-pane", "-p", *options)
        self.assertIsNone(SANITIZER_REPORT.search(screen), screen)
        return screen

    def shows(self, text, *options):
        """Waits until the text is on the screen. Returns the screen."""
        end = time.monotonic() + LIMIT
        while text not in self.screen(*options):
            self.assertLess(time.monotonic(), end, f"never showed {text!r}:\n{self.screen()}")
            time.sleep(0.02)
        return self.screen(*options)

    def keys(self, *keys):
        self.tmux("send-keys", *keys)

    def type(self, text):
        """Types the text and Enter."""
        self.tmux("send-keys", "-l", text)
        self.tmux("send-keys", "Enter")
