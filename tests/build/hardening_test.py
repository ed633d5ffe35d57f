"""The programs and the library that are installed are hardened: what the compiler was told, and what came of it."""

import json
import os
import pathlib
import re
import subprocess
import unittest

BUILD = pathlib.Path(os.environ["BUILD_TREE"])
SOURCE = pathlib.Path(os.environ["SOURCE_TREE"])
PROGRAMS = [BUILD / "bin" / name for name in ("lapdmon", "softboard", "kv9relayd", "lapdread", "lapdship", "lapdstore")]
STORE = BUILD / "lib/lapdread/store.so"
LIBRARIES = [BUILD / "lib/lapdmon/libnorv.so", STORE]
LAYERS = ("app", "calls", "capture", "decoder", "fleet", "hostsvc", "isdn", "lapdlog", "reader", "recording", "redaction", "relay",
          "service", "softboard", "vela")


def readelf(*words):
    return subprocess.run(["readelf", "--wide", *words], capture_output=True, text=True, check=True).stdout


class Hardening(unittest.TestCase):
    def each(self, files=(*PROGRAMS, *LIBRARIES)):
        for file in files:
            with self.subTest(file.name):
                yield file

    def test_programs_are_placed_anywhere(self):
        for file in self.each(PROGRAMS):
            self.assertRegex(readelf("--file-header", file), r"Type: +DYN ")
            self.assertRegex(readelf("--dynamic", file), r"FLAGS_1\).*\bPIE\b")

    def test_the_tables_that_the_loader_fills_in_are_read_only(self):
        for file in self.each():
            self.assertIn("GNU_RELRO", readelf("--program-headers", file))
            self.assertRegex(readelf("--dynamic", file), r"FLAGS_1\).*\bNOW\b")

    def test_no_stack_is_executable(self):
        for file in self.each():
            flags = re.search(r"GNU_STACK +(?:0x\w+ +){5}([RWE ]{3})", readelf("--program-headers", file))
            self.assertEqual(flags[1].strip(), "RW")

    def test_a_damaged_stack_is_noticed(self):
        for file in self.each():
            self.assertIn("__stack_chk_fail", readelf("--dyn-syms", file))

    def test_every_source_is_compiled_with_checks_of_the_c_library(self):
        commands = json.loads((BUILD / "compile_commands.json").read_text())
        seen = set()
        for command in commands:
            layer = pathlib.Path(command["file"]).relative_to(SOURCE).parts[0]
            if layer not in LAYERS:
                continue
            seen.add(layer)
            words = command["command"].split()
            for wanted in ("-D_FORTIFY_SOURCE=2", "-fstack-protector-strong"):
                self.assertIn(wanted, words, command["file"])
            self.assertTrue({"-fPIE", "-fPIC"} & set(words), command["file"])
            self.assertTrue({"-O2", "-O3"} & set(words), command["file"])
        self.assertEqual(seen, set(LAYERS))

class Store(unittest.TestCase):
    def test_lapdread_starts_without_the_libraries_of_the_database(self):
        self.assertNotIn("libpq", readelf("--dynamic", BUILD / "bin/lapdread"))
        self.assertIn("libpqxx", readelf("--dynamic", STORE))


if __name__ == "__main__":
    unittest.main()
