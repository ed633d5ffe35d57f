"""Peers that the daemon could do without: each ends its own connection, with a line in the log, and no more."""

import random
import struct
import unittest

from relay_harness import CLOSE, MESSAGE, OPEN, Relay, RelayTest, frame, message, open_request, words

QUICK = ("--frame-timeout", "0.5", "--write-timeout", "0.2")


class Peers(RelayTest):
    def expect_service(self, relay):
        host = self.host(relay)
        kind, transaction, body = host.ask(18, b"\x07\0\0\0", transaction=4242)
        self.assertEqual((kind, transaction, body[:8]), (19, 4242, b"\x07\0\0\0\x07\0\0\0"))
        host.leave()

    def test_each_ends_its_own_connection_with_a_line_in_the_log(self):
        relay = Relay(self, options=QUICK)
        bystander = self.host(relay)
        cases = [
            (b"GET / HTTP/1.1\r\nHost: board\r\n\r\n", f"a frame with a part of {0x54502F31} octets"),
            (b"\0" * 20, "a frame of type 0 instead of 1003"),
            (b"\0", "no whole frame within 500 ms"),
            (b"", "no whole frame within 500 ms"),
            (words(OPEN, 0, 102401, 0, 0), "a frame with a part of 102401 octets; the most is 102400"),
            (words(OPEN, 0, 0, 0xFFFFFFFF, 0), "a frame with a part of 4294967295 octets; the most is 102400"),
            (frame(CLOSE), "a frame of type 2000 instead of 1003"),
            (open_request() + frame(1002, bytes(20)), "a frame of type 1002 instead of 1001"),
            (open_request() + message(18)[:-1], "no whole frame within 500 ms"),
            (open_request() + frame(MESSAGE, bytes(55)), "a header block of 55 octets"),
            (open_request() + words(MESSAGE, 0, 56, 102401, 0), "a frame with a part of 102401 octets"),
        ]
        for number, (octets, why) in enumerate(cases, 1):
            with self.subTest(why=why, octets=octets[:20]):
                peer = self.peer(relay)
                peer.send(octets)
                peer.ends()
                relay.errors.wait("ended: ", times=number)
                relay.errors.wait("ended: " + why)
                self.expect_service(relay)
        self.assertEqual(bystander.ask(18, b"\x07\0\0\0")[0], 19)
        bystander.leave()
        relay.stops()

    def test_a_peer_that_closes_after_any_octet_is_forgotten(self):
        relay = Relay(self, options=("--max-clients", "1000"))
        whole = open_request() + message(18, b"\x07\0\0\0") + frame(CLOSE)
        for n in range(len(whole)):
            peer = self.peer(relay)
            peer.send(whole[:n])
            peer.close()
        relay.errors.wait("ended: ", times=len(whole))
        self.expect_service(relay)
        relay.stops()

    def test_a_peer_that_sends_octet_by_octet_is_ended(self):
        relay = Relay(self, options=QUICK)
        peer = self.peer(relay)
        ended = False
        for octet in words(OPEN) * 1000:  # no end of it
            try:
                peer.send(bytes([octet]))
            except ConnectionError:
                ended = True
                break
            peer.socket.settimeout(0.02)  # one octet now and then
            try:
                ended = peer.socket.recv(1) == b""
            except TimeoutError:
                continue
            except ConnectionError:
                ended = True
            break
        self.assertTrue(ended)
        relay.errors.wait("ended: ")
        self.expect_service(relay)
        relay.stops()

    def test_a_peer_that_floods_and_takes_no_answers_is_ended(self):
        relay = Relay(self, options=QUICK)
        host = self.host(relay)
        flood = message(20, bytes(100000), source=host.address, target=host.address)  # each comes back
        with self.assertRaises(ConnectionError):
            while True:
                host.send(flood)
        relay.errors.wait("ended: a frame was not taken within 200 ms")
        self.expect_service(relay)
        relay.stops()

    def test_too_many_clients_are_refused(self):
        relay = Relay(self, options=("--max-clients", "2"))
        hosts = [self.host(relay), self.host(relay)]
        self.peer(relay).ends()
        relay.errors.wait("refused: 2 clients already")
        for host in hosts:
            self.assertEqual(host.ask(18, b"\x07\0\0\0")[0], 19)
        relay.stops()

    def test_peers_that_are_not_allowed_are_refused(self):
        relay = Relay(self, options=("--allow", "10.0.0.0/8"))
        self.peer(relay).ends()
        relay.errors.wait("refused: not among those allowed")
        relay.stops()

    def test_damaged_frames(self):
        relay = Relay(self, options=("--max-clients", "1000", "--frame-timeout", "0.5"))
        rng = random.Random(20240611)
        whole = open_request() + b"".join(
            message(kind, rng.randbytes(rng.randrange(40))) for kind in (2, 8, 18, 20, 22, 24, 26, 8388669)) + frame(CLOSE)
        for _ in range(300):
            octets = bytearray(whole)
            for _ in range(rng.randrange(6)):
                octets[rng.randrange(len(octets))] = rng.randrange(256)
            if rng.random() < 0.3:  # sizes, where it hurts
                at = rng.choice((8, 12, 48 + 8, 48 + 12))
                octets[at:at + 4] = struct.pack(">I", rng.choice((0, 1, 102400, 102401, 1 << 31, (1 << 32) - 1)))
            peer = self.peer(relay)
            peer.send(bytes(octets[:rng.randrange(len(octets) + 1)]) if rng.random() < 0.3 else bytes(octets))
            if rng.random() < 0.5:
                peer.close()
        self.expect_service(relay)
        relay.stops()


if __name__ == "__main__":
    unittest.main()
