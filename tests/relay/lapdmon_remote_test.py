"""lapdmon with its board in another machine."""

import os
import re
import socket
import struct
import unittest

from relay_harness import (CCS, CLOSE, CLOSED, LAPDMON, OPENED, RECEIVED, SOFTBOARD, TRANSMITTED, Peer, Program, Relay,
                           RelayTest, frame, message, words)

# Reported on the screen: whoever sees it knows that the frames before it are in the log.
MARK = (RECEIVED, bytes(300))
DATE = re.compile(r"(Mon|Tue|Wed|Thu|Fri|Sat|Sun) (Jan|Feb|Mar|Apr|May|Jun|Jul|Aug|Sep|Oct|Nov|Dec) "
                  r"[ 123]\d \d\d:\d\d:\d\d \d{4}")

CALL = [
    (TRANSMITTED, bytes.fromhex("00 01 7f")),
    (RECEIVED, bytes.fromhex("00 01 73")),
    (TRANSMITTED, bytes.fromhex("02 01 00 00  08 02 00 01 05  04 03 80 90 a2  18 03 a1 83 81  70 05 80 31 32 33 34")),
    (RECEIVED, bytes.fromhex("02 01 01 02")),
    (RECEIVED, bytes.fromhex("00 01 00 02  08 02 80 01 02  18 03 a9 83 81")),
    (RECEIVED, bytes.fromhex("00 01 02 02  08 02 80 01 45  08 02 80 90")),
]


class SameLog(RelayTest):
    def traced(self, program, name):
        program.screen.wait("Frame Error")
        program.quits()
        return DATE.sub("DATE", (self.folder / name).read_bytes().decode("latin-1"))

    def both(self, board):
        here = Program(self, SOFTBOARD, *board, "--", LAPDMON, "-b1", "-f", "here.log")
        local = self.traced(here, "here.log")
        relay = Relay(self, board)
        there = Program(self, LAPDMON, "-b1", "-f", "there.log", REMOTE_NORV=f"127.0.0.1:{relay.port}")
        remote = self.traced(there, "there.log")
        self.assertEqual(there.screen.text().replace("there", "here"), here.screen.text())
        relay.stops()
        return local, remote

    def test_the_log_is_that_of_the_board_here(self):
        capture = self.capture("call.pcap", CALL * 20 + [MARK], 0.004)
        for rate in ("recorded", "max"):
            local, remote = self.both(("--frames", capture, "--rate", rate))
            self.assertEqual(remote, local)
            self.assertEqual(local.count("Hex Dump"), 120)

    def test_a_host_name_will_do(self):
        relay = Relay(self, ("--frames", self.capture("call.pcap", CALL + [MARK])))
        lapdmon = Program(self, LAPDMON, "-b1", "-f", "name.log", REMOTE_NORV=f"localhost:{relay.port}")
        self.assertEqual(self.traced(lapdmon, "name.log").count("Hex Dump"), 6)
        relay.stops()


class Lost(RelayTest):
    def test_a_relay_that_dies_during_a_trace_ends_it_and_leaves_what_was_recorded(self):
        relay = Relay(self, ("--frames", self.capture("call.pcap", CALL + [MARK])))
        lapdmon = Program(self, LAPDMON, "-b1", "-f", "lost.log", REMOTE_NORV=f"127.0.0.1:{relay.port}")
        lapdmon.screen.wait("Frame Error")
        relay.kill()
        said = lapdmon.ends(status=1).splitlines()
        # There are two queues. The first that is lost ends the trace, before or after the other says the same.
        self.assertEqual(set(line for line in said if not line.startswith("Error communicating")),
                         {f"The connection to the remote message queue on 127.0.0.1:{relay.port} is lost",
                          "lapdmon: the board cannot be reached any more, the trace ends"})
        log = (self.folder / "lost.log").read_text("latin-1")
        self.assertEqual(log.count("Hex Dump"), 6)
        self.assertTrue(log.endswith("Frame Error \n"))
        self.assertEqual(lapdmon.screen.text().count("Addressable::Timeout"), 2)

    def dies_after(self, frames, log):
        """A trace whose relay sends so many frames and is gone at once."""
        listener = socket.create_server(("127.0.0.1", 0))
        self.addCleanup(listener.close)
        lapdmon = Program(self, LAPDMON, "-b1", "-f", log,
                          REMOTE_NORV=f"127.0.0.1:{listener.getsockname()[1]}")
        peers = []
        for instance in (1, 2):
            peers.append(Peer(listener.accept()[0]))
            self.addCleanup(peers[-1].close)
            peers[-1].read(48)
            peers[-1].send(frame(OPENED, words(1, 0, 0, 0, instance)))
            if instance == 1:
                for component in (0x12, 0x15):
                    self.answer(peers[0], 8388615, struct.pack("<HBBBB", component == 0x15, 1, 1, component, 0))
        self.answer(peers[1], 19, struct.pack("<III", 7, 7, 0))
        self.answer(peers[1], 9)
        self.answer(peers[1], 23)
        event = b"".join(message(32, struct.pack("<IIII", 2, 0, 25 * i, 3) + b"\0\1\x73", source=CCS, transaction=0,
                                 target=(1, 0, 0, 0, 2)) for i in range(frames))
        peers[1].send(event)
        for peer in peers:
            peer.close()
        return lapdmon

    def assert_shown(self, log, frames):
        self.assertEqual(re.findall("Time = (\\S+)", log), [f"{i // 10}.{i % 10 * 100}" for i in range(frames)])

    def test_what_arrived_before_the_relay_died_is_shown(self):
        lapdmon = self.dies_after(90, "gone.log")
        said = lapdmon.ends(status=1)
        self.assertIn("lapdmon: the board cannot be reached any more, the trace ends\n", said)
        self.assert_shown((self.folder / "gone.log").read_text("latin-1"), 90)

    def test_what_arrived_before_the_relay_died_waits_for_a_log_that_stalls(self):
        os.mkfifo(self.folder / "log")
        reader = os.open(self.folder / "log", os.O_RDONLY | os.O_NONBLOCK)
        self.addCleanup(os.close, reader)
        lapdmon = self.dies_after(2000, "log")
        lapdmon.screen.wait("Addressable::Timeout", times=2)  # both requests of the end have failed
        os.set_blocking(reader, True)
        text = ""
        while some := os.read(reader, 65536):
            text += some.decode()
        lapdmon.ends(status=1)
        self.assert_shown(text, 2000)

    def answer(self, peer, kind, body=b""):
        _, _, block, _ = peer.read_frame()
        _, transaction, _, *rest = struct.unpack(">14I", block)
        node, board, processor, to_node, to_board, to_processor, instance, component, to_instance, to_component, _ = rest
        peer.send(message(kind, body, source=(to_node, to_board, to_processor, to_component, to_instance),
                          target=(node, board, processor, component, instance), transaction=transaction))


class Stalled(RelayTest):
    """Nobody reads the log for a while: 3000 events come all at once meanwhile."""

    MANY = 3000

    def test_a_log_that_stalls_delays_no_reply_and_costs_no_frame(self):
        path = self.folder / "log"
        os.mkfifo(path)
        reader = os.open(path, os.O_RDONLY | os.O_NONBLOCK)
        self.addCleanup(os.close, reader)
        frames = [(RECEIVED, bytes((2, 1, 1, i % 251))) for i in range(self.MANY)]
        relay = Relay(self, ("--rate", "max", "--fault", f"burst={self.MANY}", "--frames",
                             self.capture("many.pcap", frames, 0.004)), ("--write-timeout", "1"))
        lapdmon = Program(self, LAPDMON, "-b1", "-f", "log", REMOTE_NORV=f"127.0.0.1:{relay.port}")
        relay.wait_for(" EvtDetected ", times=self.MANY)
        lapdmon.types("q\n")
        relay.wait_for(" SetParmCmplt", times=2)
        os.set_blocking(reader, True)
        text = ""
        while some := os.read(reader, 65536):
            text += some.decode()
        self.assertEqual(lapdmon.ends(), "")
        self.assertNotIn("Timeout", lapdmon.screen.text())
        times = [f"{i // 250}.{i % 250 * 4}" for i in range(self.MANY)]
        self.assertEqual(re.findall("Time = (\\S+)", text), times)
        relay.stops()


class NotThere(RelayTest):
    def expect(self, host, reason):
        lapdmon = Program(self, LAPDMON, "-b1", REMOTE_NORV=host)
        self.assertEqual(lapdmon.ends(status=1), f"Cannot open a remote message queue on {host}: {reason}\n")
        self.assertIn("general Exception caught in lapdmon(749)", lapdmon.screen.text())

    def test_a_machine_without_a_relay_is_told(self):
        with socket.create_server(("127.0.0.1", 0)) as listener:
            port = listener.getsockname()[1]
        self.expect(f"127.0.0.1:{port}", "Connection refused")

    def test_a_name_that_nobody_knows_is_told(self):
        self.expect("nobody.invalid", "the name is unknown")


class OnThePeer(RelayTest):
    """The relay is this test."""

    def setUp(self):
        super().setUp()
        self.listener = socket.create_server(("127.0.0.1", 0))
        self.listener.settimeout(60)
        self.addCleanup(self.listener.close)
        port = self.listener.getsockname()[1]
        self.lapdmon = Program(self, LAPDMON, "-b1", REMOTE_NORV=f"127.0.0.1:{port}")
        self.where = f"127.0.0.1:{port}"

    def accept(self):
        connection, _ = self.listener.accept()
        peer = Peer(connection)
        self.addCleanup(peer.close)
        return peer

    def expect_open_request(self, peer):
        request = peer.read(48)
        self.assertEqual(request[:16] + request[20:], words(1003, 0, 28, 0) + words(0, 1, 0, 0, 0, 512, 50))

    def test_the_first_request_and_the_close_octet_by_octet(self):
        peer = self.accept()
        self.expect_open_request(peer)
        peer.send(frame(OPENED, words(1, 2, 3, 4, 0x1234)))
        # Find a component of type 18 on processor 1 of board 1.
        kind, tran, block, body = peer.read_frame()
        self.assertEqual((kind, tran), (1001, 0))
        self.assertEqual(block[4:], words(10000, 8388669, 1, 2, 3, 0, 1, 0, 0x1234, 4, 0, 0, len(body)))
        self.assertEqual(len(block), 56)
        # Not found: the program ends, and closes its queue first.
        error = b"\x3d\0\x80\0" + b"\x04\0\0\0"
        peer.send(frame(1001, block[:4] + words(10000, 0, 0, 1, 0, 1, 2, 3, 0, 0, 0x1234, 4, len(error)), error))
        request = peer.read(20)
        self.assertEqual(request[:16], words(2000, 0, 0, 0))
        peer.send(frame(CLOSED))
        peer.ends()
        self.assertEqual(self.lapdmon.ends(status=1), "")
        self.assertIn("vela Exception caught", self.lapdmon.screen.text())

    def expect_refusal(self, answer):
        peer = self.accept()
        self.expect_open_request(peer)
        peer.send(answer)
        peer.close()
        said = self.lapdmon.ends(status=1)
        self.assertTrue(said.endswith(f"Cannot open a remote message queue on {self.where}: refused by the relay\n"), said)
        self.assertIn("general Exception caught in lapdmon(749)", self.lapdmon.screen.text())

    def test_a_relay_that_closes_at_once(self):
        self.expect_refusal(b"")

    def test_a_relay_that_closes_within_its_answer(self):
        self.expect_refusal(frame(OPENED, words(1, 2, 3, 4, 5))[:-1])

    def test_a_relay_that_answers_with_a_close_request(self):
        self.expect_refusal(frame(CLOSE))

    def test_a_relay_that_answers_garbage(self):
        self.expect_refusal(b"HTTP/1.1 400 Bad Request\r\n\r\n")

    def test_a_relay_that_answers_too_much(self):
        self.expect_refusal(frame(OPENED, bytes(102401)))

    def test_a_relay_that_goes_is_reported_ten_times(self):
        peer = self.accept()
        self.expect_open_request(peer)
        peer.send(frame(OPENED, words(1, 2, 3, 4, 5)))
        peer.read_frame()
        peer.close()
        errors = self.lapdmon.ends(status=1).splitlines()
        self.assertEqual(errors[:10], [f"Error communicating with remote message queue on {self.where}"] * 10)
        self.assertEqual(errors[10:], [f"The connection to the remote message queue on {self.where} is lost"])
        self.assertIn("vela Exception caught", self.lapdmon.screen.text())


if __name__ == "__main__":
    unittest.main()
