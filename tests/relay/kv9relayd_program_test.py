"""The daemon as a program."""

import os
import signal
import socket
import struct
import unittest

from relay_harness import CLOSE, RELAY, SOFTBOARD, Host, Program, Relay, RelayTest


class TheProgram(RelayTest):
    def test_it_does_not_open_the_board_to_the_world_by_itself(self):
        program = Program(self, RELAY, "--listen", "0.0.0.0:0")
        self.assertEqual(program.ends(status=2),
                         "kv9relayd: --listen 0.0.0.0:0 would let everyone who reaches this machine drive its boards: "
                         "say with --allow CIDR who may (for example --allow 192.168.1.0/24), or listen on 127.0.0.1 "
                         "and let hosts come through SSH\n")

    def test_a_bad_command_line(self):
        program = Program(self, RELAY, "--max-clients", "none")
        self.assertIn("--max-clients", program.ends(status=2))

    def test_a_time_that_is_out_of_its_range(self):
        for option in ("--frame-timeout", "--write-timeout"):
            for seconds in ("0", "0.0009", "-1", "3600.1", "nan", "inf", "soon"):
                with self.subTest(option, seconds=seconds):
                    self.assertIn(option, Program(self, RELAY, f"{option}={seconds}").ends(status=2))

    def test_help_and_version(self):
        for option, said in (("--help", "--listen ADDR[:PORT]"), ("--version", "kv9relayd " + os.environ["VERSION"])):
            program = Program(self, RELAY, option)
            program.ends()
            self.assertIn(said, program.screen.text())

    def test_a_port_that_is_taken(self):
        taken = socket.create_server(("127.0.0.1", 0))
        self.addCleanup(taken.close)
        port = taken.getsockname()[1]
        program = Program(self, RELAY, "--listen", f"127.0.0.1:{port}")
        self.assertEqual(program.ends(status=1),
                         f"kv9relayd: listening on 127.0.0.1:{port}: Address already in use\n")

    def test_signals_have_it_close_its_connections_and_end(self):
        for number in (signal.SIGTERM, signal.SIGINT):
            relay = Relay(self)
            host = self.host(relay)
            relay.process.send_signal(number)
            self.assertEqual(host.read_frame()[0], CLOSE)
            self.assertIsNone(host.read_frame())
            relay.ends()

    def test_it_serves_on_when_nobody_reads_its_lines(self):
        os.mkfifo(self.folder / "gone")
        name = "kv9relayd-test-" + str(os.getpid())
        for streams in ("2>gone", "2>&-", ">&- 2>&-", "<&- >&- 2>&-"):
            with self.subTest(streams), socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM) as manager:
                reader = os.open(self.folder / "gone", os.O_RDONLY | os.O_NONBLOCK)
                manager.settimeout(60)
                manager.bind("\0" + name)
                port = self.free_port()
                relay = Program(self, SOFTBOARD, "--", "sh", "-c", f'exec "$0" --listen 127.0.0.1:{port} {streams}', RELAY,
                                NOTIFY_SOCKET="@" + name)
                self.assertEqual(manager.recv(100), b"READY=1")
                os.close(reader)
                for _ in range(3):
                    host = Host(port)
                    self.addCleanup(host.close)
                    self.assertEqual(host.ask(18, struct.pack("<I", 7))[0], 19)
                    host.leave()
                relay.process.terminate()
                relay.ends()

    def free_port(self):
        with socket.create_server(("127.0.0.1", 0)) as server:
            return server.getsockname()[1]

    def test_the_service_manager_is_told(self):
        for name in (str(self.folder / "notify"), "\0kv9relayd-test-" + str(os.getpid())):
            manager = socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM)
            self.addCleanup(manager.close)
            manager.settimeout(60)
            manager.bind(name)
            relay = Relay(self, NOTIFY_SOCKET=name.replace("\0", "@"))
            self.assertEqual(manager.recv(100), b"READY=1")
            relay.stops()
            self.assertEqual(manager.recv(100), b"STOPPING=1")

    def test_the_service_manager_hears_that_the_relay_serves_on(self):
        manager = socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM)
        self.addCleanup(manager.close)
        manager.settimeout(60)
        name = "kv9relayd-beat-" + str(os.getpid())
        manager.bind("\0" + name)
        relay = Relay(self, NOTIFY_SOCKET="@" + name, WATCHDOG_USEC="300000")
        told = [manager.recv(100) for _ in range(4)]
        self.assertEqual(told, [b"READY=1"] + 3 * [b"WATCHDOG=1"])
        relay.stops()


if __name__ == "__main__":
    unittest.main()
