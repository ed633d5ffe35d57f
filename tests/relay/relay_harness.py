"""Words for tests of the relay protocol with the real programs. The wire is written here once more, by hand.

A test waits for octets or lines, never for time to pass. LIMIT only ends a test that would wait for ever.
"""

import os
import pathlib
import re
import socket
import struct
import subprocess
import tempfile
import threading
import time
import unittest

LIMIT = 60  # seconds

LAPDMON = os.environ["LAPDMON"]
SOFTBOARD = os.environ["SOFTBOARD"]
RELAY = os.environ["RELAY"]

ENVIRONMENT = {
    **{name: value for name, value in os.environ.items()
       if name not in ("REMOTE_NORV", "HOST", "LD_LIBRARY_PATH", "NOTIFY_SOCKET")},
    "TZ": "UTC",
    "ASAN_OPTIONS": "exitcode=99",
    "UBSAN_OPTIONS": "exitcode=99:print_stacktrace=1",
    "TSAN_OPTIONS": "exitcode=99:report_mutex_bugs=0:halt_on_error=1",
}
SANITIZER_REPORT = re.compile(r"Sanitizer|runtime error:")

MESSAGE, OPENED, OPEN, CLOSE, CLOSED = 1001, 1002, 1003, 2000, 2001

# Node, board, processor, component, instance.
MANAGERS = (0, 1, 0, 0, 0)
CCS = (0, 1, 1, 0x15, 1)

TRANSMITTED, RECEIVED = 4, 0  # as link type 177 has it


def words(*values):
    return struct.pack(f">{len(values)}I", *values)


def frame(kind, data=b"", extra=b"", tran=0, own=0):
    return words(kind, tran, len(data), len(extra), own) + data + extra


def message(kind, body=b"", source=(0, 0, 0, 0, 0), target=CCS, transaction=10000, low=0):
    """A message's frame."""
    node, board, processor, component, instance = source
    to_node, to_board, to_processor, to_component, to_instance = target
    return frame(MESSAGE, words(low, transaction, kind, node, board, processor, to_node, to_board, to_processor,
                                instance, component, to_instance, to_component, len(body)), body)


def open_request(address=(0, 1, 0, 0, 0), size=512, depth=50):
    return frame(OPEN, words(*address, size, depth))


class Peer:
    """One end of a connection."""

    def __init__(self, connection):
        self.socket = connection
        self.socket.settimeout(LIMIT)
        self.socket.setsockopt(socket.IPPROTO_TCP, socket.TCP_NODELAY, 1)

    def send(self, octets):
        self.socket.sendall(octets)

    def read(self, size):
        """So many octets, or fewer when the other end closes."""
        octets = b""
        while len(octets) < size:
            some = self.socket.recv(size - len(octets))
            if not some:
                break
            octets += some
        return octets

    def read_frame(self):
        """(type, transaction, data, extra), or None when the connection has ended."""
        try:
            header = self.read(20)
            if len(header) < 20:
                return None
            kind, tran, size, extra, _ = struct.unpack(">5I", header)
            return kind, tran, self.read(size), self.read(extra)
        except ConnectionError:
            return None

    def ends(self):
        try:
            while self.socket.recv(65536):
                pass
        except ConnectionError:
            pass

    def close(self):
        self.socket.close()


class Host(Peer):
    """A host with a queue open."""

    def __init__(self, port):
        super().__init__(socket.create_connection(("127.0.0.1", port), LIMIT))
        self.send(open_request())
        kind, _, data, _ = self.read_frame()
        assert kind == OPENED
        self.address = struct.unpack(">5I", data)

    def tell(self, kind, body=b"", **more):
        self.send(message(kind, body, source=self.address, **more))

    def hear(self):
        """(message type, transaction, body) of the next message."""
        kind, _, data, body = self.read_frame()
        assert kind == MESSAGE, kind
        block = struct.unpack(">14I", data)
        return block[2], block[1], body

    def ask(self, kind, body=b"", **more):
        self.tell(kind, body, **more)
        return self.hear()

    def detect_frames(self):
        """Has the layer-2 trace events sent here."""
        node, board, processor, component, instance = self.address
        where = struct.pack("<HBBBB", instance, board, processor, component, node)
        kind, _, _ = self.ask(22, where + struct.pack("<II", 2, 0))
        assert kind == 23

    def leave(self):
        self.send(frame(CLOSE, tran=7))
        while True:
            kind, tran, _, _ = self.read_frame()
            if kind == CLOSED:
                assert tran == 7
                break
        self.ends()
        self.close()


class Lines:
    """What a program writes, read as it comes."""

    def __init__(self, file):
        self._lines = []
        self._ended = False
        self._grown = threading.Condition()
        self._thread = threading.Thread(target=self._read, args=[file], daemon=True)
        self._thread.start()

    def _read(self, file):
        with file:
            for line in file:
                with self._grown:
                    self._lines.append(line.decode())
                    self._grown.notify_all()
        with self._grown:
            self._ended = True
            self._grown.notify_all()

    def wait(self, wanted, times=1):
        """The first line that holds the text, once so many do."""
        def found():
            return [line for line in self._lines if wanted in line]
        with self._grown:
            self._grown.wait_for(lambda: self._ended or len(found()) >= times, LIMIT)
            if len(found()) < times:
                raise AssertionError(f"{wanted!r} did not come; there was:\n" + "".join(self._lines))
            return found()[0]

    def text(self):
        self._thread.join(LIMIT)
        return "".join(self._lines)


class Program:
    def __init__(self, test, *command, **variables):
        self._test = test
        self.process = subprocess.Popen(command, stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                        stderr=subprocess.PIPE, cwd=test.folder, env={**ENVIRONMENT, **variables})
        self.screen = Lines(self.process.stdout)
        self.errors = Lines(self.process.stderr)
        test.addCleanup(self.kill)

    def ends(self, status=0):
        code = self.process.wait(LIMIT)
        said = self.errors.text()
        self._test.assertIsNone(SANITIZER_REPORT.search(said), said)
        self._test.assertEqual(code, status, said + self.screen.text())
        return said

    def types(self, text):
        self.process.stdin.write(text.encode())
        self.process.stdin.flush()

    def quits(self):
        self.types("q\n")
        return self.ends()

    def kill(self):
        self.process.kill()
        self.process.wait()
        self.process.stdin.close()
        self.screen.text()
        self.errors.text()


class Relay(Program):
    """kv9relayd on the software board."""

    def __init__(self, test, board=(), options=(), **variables):
        self.journal = test.folder / "relay.journal"
        super().__init__(test, SOFTBOARD, "--journal", str(self.journal), *board, "--", RELAY,
                         "--listen", "127.0.0.1:0", *options, **variables)
        self.port = int(self.screen.wait("listening on").rsplit(":", 1)[1])

    def wait_for(self, wanted, times=1):
        """Until so many lines of the journal hold the text."""
        end = time.monotonic() + LIMIT
        while self.journal.read_text().count(wanted) < times:
            if time.monotonic() > end:
                raise AssertionError(f"{wanted!r} did not come {times} times")
            time.sleep(0.02)

    def stops(self):
        """Ends in an orderly way, and has given back every queue and buffer."""
        self.process.terminate()
        said = self.ends()
        last = self.journal.read_text().splitlines()[-1]
        self._test.assertTrue(last.endswith("buffers outstanding 0, queues open 0"), last)
        return said


class RelayTest(unittest.TestCase):
    maxDiff = None

    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="relay-")
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def host(self, relay):
        host = Host(relay.port)
        self.addCleanup(host.close)
        return host

    def peer(self, relay):
        peer = Peer(socket.create_connection(("127.0.0.1", relay.port), LIMIT))
        self.addCleanup(peer.close)
        return peer

    def capture(self, name, frames, interval=0.0):
        """A pcap file of frames of (direction, octets)."""
        packets = []
        for number, (direction, octets) in enumerate(frames):
            packet = struct.pack(">HHH8sH", direction, 0, 0, bytes(8), 0x30) + octets
            seconds, micros = divmod(round(number * interval * 1_000_000), 1_000_000)
            packets.append(struct.pack("<IIII", seconds, micros, len(packet), len(packet)) + packet)
        path = self.folder / name
        path.write_bytes(struct.pack("<IHHiIII", 0xA1B2C3D4, 2, 4, 0, 0, 65535, 177) + b"".join(packets))
        return str(path)
