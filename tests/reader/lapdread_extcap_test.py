"""What `cmake --install` puts down offers logs to Wireshark: the script, run from the folder that Wireshark looks into, and
tshark, which asks it."""

import os
import pathlib
import shutil
import subprocess
import unittest

from lapdread_harness import LAPDREAD, LIMIT, Folder, environment

OFFERED = "interface {value=lapdmon}{display=ISDN D channel, from the log of lapdmon}"
LISTED = r"(?m)^\d+\. lapdmon \(ISDN D channel, from the log of lapdmon\)$"


class Installed(Folder):
    def setUp(self):
        super().setUp()
        prefix = self.folder / "prefix"
        # The component's own rules: what else the tree installs need not be built for this.
        install = subprocess.run(["cmake", "-DCMAKE_INSTALL_PREFIX=" + str(prefix), "-P",
                                  pathlib.Path(os.environ["BUILD_DIR"]) / "reader/cmake_install.cmake"],
                                 capture_output=True, text=True, timeout=LIMIT, check=False)
        self.assertEqual(install.returncode, 0, install.stderr)
        self.program = prefix / "bin/lapdread"
        scripts = list(prefix.glob("lib*/**/wireshark/extcap/lapdread-extcap"))
        self.assertEqual(len(scripts), 1, install.stdout)
        self.script = scripts[0]

    def run_here(self, *words, **more):
        """As somebody who has the installed program on the PATH; the analyser heeds folders of one's own only then."""
        self.folder.chmod(0o755)
        here = environment(PATH=str(self.program.parent) + ":" + os.environ["PATH"], HOME=str(self.folder), **more)
        somebody = ["setpriv", "--reuid=65534", "--regid=65534", "--clear-groups"] if os.geteuid() == 0 else []
        return subprocess.run([*somebody, *map(str, words)], env=here, cwd=self.folder, capture_output=True, text=True,
                              timeout=LIMIT, check=False)

    def test_the_program_and_the_script_can_be_run(self):
        self.assertEqual(self.run_here(self.program, "--version").stdout,
                         subprocess.run([LAPDREAD, "--version"], capture_output=True, text=True, check=True).stdout)
        told = self.run_here(self.script, "--extcap-interfaces", "--extcap-version=4.0")
        self.assertEqual((told.returncode, told.stderr), (0, ""))
        self.assertIn(OFFERED, told.stdout.splitlines())

    def test_the_script_tells_what_it_captures_and_its_settings(self):
        dlts = self.run_here(self.script, "--extcap-dlts", "--extcap-interface", "lapdmon")
        self.assertEqual(dlts.stdout, "dlt {number=177}{name=LINUX_LAPD}{display=LAPD with its direction}\n")
        settings = self.run_here(self.script, "--extcap-config", "--extcap-interface", "lapdmon")
        self.assertEqual([line.split("}")[1] for line in settings.stdout.splitlines()], ["{call=--log", "{call=--tz"])

    def test_the_analyser_lists_and_captures_what_is_installed(self):
        folder = {"WIRESHARK_EXTCAP_DIR": str(self.script.parent)}
        listed = self.run_here("tshark", "-D", **folder)
        self.assertRegex(listed.stdout, LISTED, listed.stderr)
        log = self.folder / "lapdmon.log"
        log.write_text("TX 2026-11-21T11:25:33.000Z 00017f\nRX 2026-11-21T11:25:33.008Z 000173\n")
        seen = self.run_here("tshark", "-n", "-i", "lapdmon", "-c", "2", "-T", "fields", "-e", "lapd.direction",
                             LAPDMON_LOG=str(log), **folder)
        self.assertEqual(seen.stdout, "0\n1\n", seen.stderr)

    def test_without_the_script_nothing_is_listed(self):
        empty = self.folder / "none"
        empty.mkdir()
        shutil.copy("/bin/true", empty)
        self.assertNotRegex(self.run_here("tshark", "-D", WIRESHARK_EXTCAP_DIR=str(empty)).stdout, LISTED)


if __name__ == "__main__":
    unittest.main()
