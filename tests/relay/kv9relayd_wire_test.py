"""The daemon on the software board, octet by octet."""

import unittest

from relay_harness import RECEIVED, TRANSMITTED, Relay, RelayTest

# From D channel 1 of board 1 to the host 1.0.0.0.1.
FROM_CCS = "00000000 00000001 00000001 00000001 00000000 00000000 00000001 00000015 00000001 00000000"
# And back.
TO_CCS = "00000001 00000000 00000000 00000000 00000001 00000001 00000001 00000000 00000001 00000015"


class Wire(RelayTest):
    def test_a_whole_session_has_these_octets(self):
        frames = self.capture("two.pcap", [(TRANSMITTED, b"\x00\x01\x7f"), (RECEIVED, b"\x00\x01\x73")])
        relay = Relay(self, ("--frames", frames, "--rate", "max"))
        peer = self.peer(relay)

        def says(octets):
            peer.send(bytes.fromhex(octets))

        def hears(octets):
            expected = bytes.fromhex(octets)
            self.assertEqual(peer.read(len(expected)).hex(" ", -4), expected.hex(" ", -4))

        says("000003eb 00000005 0000001c 00000000 ffffffff"
             "00000000 00000001 00000000 00000000 00000000 00000200 00000032")
        hears("000003ea 00000005 00000014 00000000 00000000"
              "00000001 00000000 00000000 00000000 00000001")
        # Parameter 7: the trunk's protocol type, 7.
        says("000003e9 00000000 00000038 00000004 00000000"
             "00000000 00002710 00000012" + TO_CCS + "00000004" "07000000")
        hears("000003e9 00000000 00000038 0000000c 00000000"
              "00000000 00002710 00000013" + FROM_CCS + "0000000c" "07000000 07000000 00000000")
        # Events of group 2 to this host, and the trace on.
        says("000003e9 00000000 00000038 0000000e 00000000"
             "00000000 00002711 00000016" + TO_CCS + "0000000e" "010000000001 02000000 00000000")
        hears("000003e9 00000000 00000038 00000000 00000000"
              "00000000 00002711 00000017" + FROM_CCS + "00000000")
        says("000003e9 00000000 00000038 00000008 00000000"
             "00000000 00002712 00000008" + TO_CCS + "00000008" "0a000000 01000000")
        hears("000003e9 00000000 00000038 00000000 00000000"
              "00000000 00002712 00000009" + FROM_CCS + "00000000")
        hears("000003e9 00000000 00000038 00000013 00000000"
              "00000000 00000000 00000020" + FROM_CCS + "00000013" "02000000 01000000 00000000 03000000 00017f")
        hears("000003e9 00000000 00000038 00000013 00000000"
              "00000000 00000000 00000020" + FROM_CCS + "00000013" "02000000 00000000 00000000 03000000 000173")
        says("000007d0 00000009 00000000 00000000 ffffffff")
        hears("000007d1 00000009 00000000 00000000 00000000")
        self.assertEqual(peer.read(1), b"")
        relay.stops()


if __name__ == "__main__":
    unittest.main()
