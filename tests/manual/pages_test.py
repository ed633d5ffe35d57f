"""The manual pages: they have the options that --help has, no formatter complains, and each program has one."""

import gzip
import os
import pathlib
import re
import shutil
import subprocess
import unittest

PAGES = pathlib.Path(os.environ["MADE"]) / "man"
BIN = pathlib.Path(os.environ["BIN"])
SOURCE = pathlib.Path(os.environ["SOURCE"])

# The options of lapdmon, whose page is written by hand; app/arguments.cc reads them.
LAPDMON_OPTIONS = {"-b", "-d", "-i", "-f", "-h", "-?"}


def page(name):
    return gzip.decompress((PAGES / f"{name}.gz").read_bytes()).decode()


def plain(roff):
    """Text of a line of roff without its fonts and escapes."""
    return re.sub(r"\\f[BIR]", "", roff).replace("\\-", "-").replace("\\e", "\\")


def options_of_page(text, title="OPTIONS"):
    """Each option's line, as {"-o, --output OUT"}."""
    section = re.search(rf"^\.SH {title}\n(.*?)(?=^\.SH )", text, re.M | re.S)[1]
    return {plain(line) for line in re.findall(r"^\.TP\n(.*)$", section, re.M)}


def options_of_help(program, *words):
    """The same from --help."""
    told = subprocess.run([BIN / program, *words, "--help"], capture_output=True, text=True, check=True).stdout
    found = set()
    for line in told.splitlines():
        match = re.match(r"  (-[^ ]+(?: [^ ]+)?)(?: \.\.\.)?(?:  |$| )", line)
        if match is None:
            continue
        names, _, form = re.match(r"(\S+)( (\S.*))?$", match[1]).group(1, 2, 3)
        in_order = sorted(names.split(","), key=lambda name: name.startswith("--"))
        found.add(", ".join(in_order) + (" " + form if form else ""))
    return found


def commands():
    told = subprocess.run([BIN / "lapdread", "--help"], capture_output=True, text=True, check=True).stdout
    return re.findall(r"^  (\w+) ", re.search(r"^Subcommands:\n(.*?)\n\n", told, re.M | re.S)[1], re.M)


class Pages(unittest.TestCase):
    def test_softboard_and_kv9relayd_have_the_options_of_their_help(self):
        for name, program in (("softboard.1", "softboard"), ("kv9relayd.8", "kv9relayd")):
            with self.subTest(name):
                self.assertGreater(len(options_of_page(page(name))), 5)
                self.assertEqual(options_of_page(page(name)), options_of_help(program))

    def test_the_fleets_programs_have_the_options_of_their_help_and_of_their_commands(self):
        for name, commands_and_titles in (("lapdship", {"streams": "STREAMS"}),
                                          ("lapdstore", {"migrate": None, "forget": "FORGET", "rewind": None})):
            text = page(f"{name}.8")
            shared = options_of_help(name)
            self.assertGreater(len(shared), 4)
            self.assertEqual(options_of_page(text), shared)
            for command, title in commands_and_titles.items():
                with self.subTest(f"{name} {command}"):
                    # A command's own --help is about the command; the other options are those of the page.
                    own = {line for line in options_of_help(name, command) if "--help" not in line}
                    self.assertEqual(options_of_page(text, title) if title else set(), own)

    def test_each_command_of_lapdread_has_a_page_with_the_options_of_its_help(self):
        self.assertGreater(len(commands()), 5)
        for command in commands():
            with self.subTest(command):
                self.assertEqual(options_of_page(page(f"lapdread-{command}.1")), options_of_help("lapdread", command))

    def test_lapdread_has_the_options_that_all_of_its_commands_have(self):
        shared = set.intersection(*(options_of_help("lapdread", command) for command in commands()))
        self.assertEqual(options_of_page(page("lapdread.1")), shared)

    def test_lapdread_names_all_of_its_commands(self):
        for command in commands():
            self.assertIn(f".BR lapdread\\-{command} (1)\n", page("lapdread.1"))

    def test_lapdmon_has_the_options_that_it_reads(self):
        source = (SOURCE / "app/arguments.cc").read_text()
        self.assertEqual({f"-{letter}" for letter in re.findall(r"case '(.)':", source)}, LAPDMON_OPTIONS)
        section = re.search(r"^\.SH OPTIONS\n(.*?)(?=^\.SH )", page("lapdmon.1"), re.M | re.S)[1]
        lines = [plain(line) for line in re.findall(r"^\.TP\n(.*)$", section, re.M)]
        self.assertEqual({option for line in lines for option in re.findall(r"(?:^|[ ,])\s*(-[\w?])", line)},
                         LAPDMON_OPTIONS)

    def test_softboard_lists_every_fault(self):
        told = subprocess.run([BIN / "softboard", "--help"], capture_output=True, text=True, check=True).stdout
        faults = re.findall(r"^  ([a-z][\w-]*(?:=N)?)  ", re.search(r"^Faults.*?\n\n", told, re.M | re.S)[0], re.M)
        self.assertGreater(len(faults), 10)
        for fault in faults:
            self.assertIn("\\fB" + fault.replace("-", "\\-") + "\\fR", page("softboard.1"))

    def test_each_tells_the_version(self):
        names = sorted(path.name for path in PAGES.glob("*.gz"))
        self.assertGreater(len(names), 10)
        for name in names:
            self.assertIn(f'"lapdmon {os.environ["VERSION"]}"', page(name.removesuffix(".gz")).splitlines()[0])

    @unittest.skipUnless(shutil.which("mandoc"), "there is no mandoc")
    def test_mandoc_complains_about_none(self):
        for path in sorted(PAGES.glob("*.gz")):
            with self.subTest(path.name):
                told = subprocess.run(["mandoc", "-T", "lint", path], capture_output=True, text=True, check=False).stdout
                # A page that is made here and not installed yet is no mistake.
                complaints = [line for line in told.splitlines() if "referenced manual not found" not in line]
                self.assertEqual(complaints, [])

    @unittest.skipUnless(shutil.which("man") and shutil.which("groff"), "there is no man or groff")
    def test_man_warns_about_none(self):
        for path in sorted(PAGES.glob("*.gz")):
            with self.subTest(path.name):
                done = subprocess.run(["man", "--warnings", "-l", path], capture_output=True, text=True, check=False,
                                      env={**os.environ, "MANWIDTH": "80", "LC_ALL": "C.UTF-8", "MANPAGER": "cat"})
                self.assertEqual((done.stderr, done.returncode), ("", 0))
                self.assertIn("NAME", done.stdout)


if __name__ == "__main__":
    unittest.main()
