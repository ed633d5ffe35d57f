"""Many hosts at once. RELAY_SOAK_SECONDS makes it last, for example RELAY_SOAK_SECONDS=60."""

import os
import struct
import threading
import time
import unittest

from relay_harness import RECEIVED, TRANSMITTED, Relay, RelayTest

CLIENTS = 50
FRAMES = 200
SECONDS = float(os.environ.get("RELAY_SOAK_SECONDS", "2"))


class Clients(RelayTest):
    def each(self, hosts, act):
        """Has all of them act at once; what fails is thrown here."""
        failures = []

        def run(number, host):
            try:
                act(number, host)
            except BaseException as failure:
                failures.append(failure)

        threads = [threading.Thread(target=run, args=each) for each in enumerate(hosts)]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join()
        for failure in failures:
            raise failure

    def test_nothing_is_lost_or_mixed_up(self):
        frames = [(TRANSMITTED if n % 3 else RECEIVED, struct.pack("<I", n) + bytes(n % 250)) for n in range(FRAMES)]
        relay = Relay(self, ("--frames", self.capture("many.pcap", frames), "--rate", "max"))
        hosts = [self.host(relay) for _ in range(CLIENTS)]
        self.assertEqual(len({host.address for host in hosts}), CLIENTS)
        for host in hosts:
            host.detect_frames()
        expected = [(octets, int(direction == TRANSMITTED)) for direction, octets in frames]

        def trace_once():
            """Every host is shown every frame, in order."""
            def watch(number, host):
                seen = []
                while len(seen) < FRAMES:
                    kind, _, body = host.hear()
                    if kind == 32:
                        _, direction, _, length = struct.unpack("<4I", body[:16])
                        self.assertEqual(length, len(body) - 16)
                        seen.append((body[16:], direction))
                self.assertEqual(seen, expected, f"host {number}")
            hosts[0].tell(8, struct.pack("<II", 10, 1))
            self.each(hosts, watch)
            hosts[0].ask(8, struct.pack("<II", 10, 0))

        def converse(number, host):
            """Every host is answered, with its own transactions and about what it has asked."""
            for n in range(20):
                unknown = 1000 + 100 * number + n  # a parameter that the refusal names
                kind, transaction, body = host.ask(18, struct.pack("<I", unknown), transaction=20000 + unknown)
                self.assertEqual((kind, transaction), (0, 20000 + unknown))
                self.assertEqual(struct.unpack("<3I", body[:12]), (18, 2, unknown))

        end = time.monotonic() + SECONDS
        rounds = 0
        while rounds == 0 or time.monotonic() < end:
            trace_once()
            self.each(hosts, converse)
            rounds += 1
        self.each(hosts, lambda _, host: host.leave())
        log = relay.stops()
        self.assertEqual(log.count(": closed\n"), CLIENTS)
        self.assertNotIn("ended:", log)

    def test_a_host_comes_again_and_again(self):
        relay = Relay(self)
        for round in range(100):
            host = self.host(relay)
            self.assertEqual(host.ask(18, b"\x07\0\0\0", transaction=round + 1)[:2], (19, round + 1))
            if round % 3:
                host.leave()
            else:
                host.close()
        relay.stops()


if __name__ == "__main__":
    unittest.main()
