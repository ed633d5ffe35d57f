"""Where the program finds its transport library: built, installed, and with another one in its place."""

import os
import pathlib
import subprocess
import unittest

from harness import LAPDMON, OTHER_LIBRARY, SOFTBOARD, SystemTest, environment

BUILD_TREE = os.environ["BUILD_TREE"]
CMAKE = os.environ["CMAKE"]
BUILT_LIBRARY = os.path.join(BUILD_TREE, "lib/lapdmon/libnorv.so")


class Library(SystemTest):
    def library_of(self, program, **variables):
        """The libnorv.so that the loader takes, a path or "not found"."""
        told = self.run_tool("ldd", program, env=environment(**variables))
        return next(line.split(" => ")[1].split(" (")[0] for line in told.splitlines() if "libnorv.so =>" in line)

    def dynamic_section(self, file):
        return self.run_tool("readelf", "--dynamic", "--wide", file)

    def test_the_program_asks_for_libnorv_and_is_led_to_it_by_RUNPATH(self):
        section = self.dynamic_section(LAPDMON)
        self.assertIn("Shared library: [libnorv.so]", section)
        self.assertIn("Library runpath: [$ORIGIN/../lib/lapdmon]", section)
        self.assertNotIn("RPATH", section)
        self.assertTrue(os.path.samefile(self.library_of(LAPDMON), BUILT_LIBRARY))

    def test_the_library_is_called_libnorv(self):
        for library in (BUILT_LIBRARY, OTHER_LIBRARY):
            self.assertIn("Library soname: [libnorv.so]", self.dynamic_section(library))

    def test_the_program_needs_nothing_but_the_transport_and_the_system(self):
        needed = {line.split("[")[1].rstrip("]") for line in self.dynamic_section(LAPDMON).splitlines()
                  if "(NEEDED)" in line}
        system = {"libstdc++.so.6", "libm.so.6", "libgcc_s.so.1", "libc.so.6", "ld-linux-x86-64.so.2"}
        sanitizers = {name for name in needed if "san.so" in name}
        self.assertEqual(needed - system - sanitizers, {"libnorv.so"})

    def test_the_library_says_that_boards_are_simulated_when_the_program_finds_it_by_itself(self):
        self.file("lapdmon.log", "")
        program = self.start([LAPDMON, "-b1"])
        program.screen.wait("NET5 Switch")
        program.types("q")
        program.ends(errors="softboard: this libnorv.so is the software board's: boards are simulated\n")

    def test_LD_LIBRARY_PATH_puts_another_library_in_its_place(self):
        folder = os.path.dirname(OTHER_LIBRARY)
        self.assertTrue(os.path.samefile(self.library_of(LAPDMON, LD_LIBRARY_PATH=folder), OTHER_LIBRARY))
        program = self.on_other_library()
        program.screen.wait("Frame Error")
        program.quits()
        self.assertEqual(program.talk.lines(), [
            "the other library",
            "heard 8388669", "heard 8388669", "heard 18", "heard 8", "heard 22",
            "heard 26", "heard 8"])
        self.assertIn("DMS100 Switch", program.screen.lines())
        self.assertIn("    0x7f  Set Asynchronous Balanced Mode\n", program.log())


class InstalledTree(SystemTest):
    def setUp(self):
        super().setUp()
        self.prefix = self.folder / "prefix"
        self.run_tool(CMAKE, "--install", BUILD_TREE, "--prefix", str(self.prefix))

    def test_the_program_has_no_path_to_a_library(self):
        section = self.run_tool("readelf", "--dynamic", "--wide", str(self.prefix / "bin/lapdmon"))
        self.assertIn("Shared library: [libnorv.so]", section)
        self.assertNotIn("RUNPATH", section)
        self.assertNotIn("RPATH", section)

    def test_the_program_finds_no_library_by_itself(self):
        done = subprocess.run([self.prefix / "bin/lapdmon", "-b1"], env=environment(), cwd=self.folder, text=True,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=60, check=False)
        self.assertEqual(done.returncode, 127)
        self.assertIn("libnorv.so: cannot open shared object file", done.stdout)
        self.assertFalse((self.folder / "lapdmon.log").exists())

    def test_the_launcher_finds_program_and_library(self):
        self.assertTrue((self.prefix / "lib/lapdmon/libnorv.so").is_file())
        program = self.start([str(self.prefix / "bin/softboard"), "--rate", "max", "--", "lapdmon", "-b1"])
        program.screen.wait("NET5 Switch")
        program.quits()

    def test_no_test_program_is_installed(self):
        installed = [str(path.relative_to(self.prefix)) for path in self.prefix.rglob("*") if path.is_file()]
        self.assertEqual([name for name in installed if "test" in pathlib.Path(name).name], [])


class Launcher(SystemTest):
    def test_it_runs_the_program_from_any_folder(self):
        elsewhere = self.folder / "elsewhere"
        elsewhere.mkdir()
        program = self.start([SOFTBOARD, "--", "lapdmon", "-b1"], cwd=elsewhere)
        program.screen.wait("NET5 Switch")
        program.quits()
        self.assertEqual(os.listdir(elsewhere), ["lapdmon.log"])

    def test_it_runs_the_program_by_a_path_of_its_own_and_through_a_link(self):
        link = self.folder / "board"
        link.symlink_to(SOFTBOARD)
        program = self.start([str(link), "--", LAPDMON, "-b1"])
        program.screen.wait("NET5 Switch")
        program.quits()

    def test_a_bad_option_does_not_start_the_program(self):
        program = self.start([SOFTBOARD, "--frames", "missing.pcap", "--", "lapdmon", "-b1"])
        program.ends(status=2, errors="softboard: missing.pcap: No such file or directory\n")
        self.assertEqual(program.screen.text(), "")
        self.assertEqual(os.listdir(self.folder), [])


if __name__ == "__main__":
    unittest.main()
