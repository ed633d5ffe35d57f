"""The test's end of fault_switch.cc, which is loaded into a program on the software board."""

import os
import socket

LIBRARY = os.environ.get("FAULT_SWITCH_LIBRARY")


class FaultSwitch:
    """To be given to one program: `words` before those that start it, `variables` and `descriptor` to what starts them."""

    def __init__(self, limit, library=LIBRARY):
        self._ours, self._theirs = socket.socketpair()
        self._ours.settimeout(limit)
        self.words = ["env", "LD_PRELOAD=" + library]
        self.descriptor = self._theirs.fileno()
        self.variables = {"FAULT_SWITCH": str(self.descriptor)}

    def given(self):
        """The program has it: from now on its end is noticed."""
        self._theirs.close()

    def ask(self, line):
        self._ours.sendall(line.encode() + b"\n")
        answer = b""
        while not answer.endswith(b"\n"):
            answer += self._ours.recv(100) or b"?\n"
        return answer.decode().strip()

    def held(self):
        return int(self.ask("held"))

    def close(self):
        self._theirs.close()
        self._ours.close()
