"""Completion, asked in bash and in zsh as a user does it: a line is begun and Tab is pressed."""

import os
import pathlib
import re
import shutil
import subprocess
import tempfile
import unittest

MADE = pathlib.Path(os.environ["MADE"])
BIN = pathlib.Path(os.environ["BIN"])
SOURCE = pathlib.Path(os.environ["SOURCE"])

# Asks zsh's own completion in a second zsh, and prints what it would insert or list.
ZSH = r"""
zmodload zsh/zpty
zpty asked zsh -f -i
zpty -w asked "PS1= ; fpath=($1 \$fpath); path=($2 \$path); autoload -Uz compinit; compinit -u -d $3/dump"
zpty -w asked 'zstyle ":completion:*" list-prompt ""; zstyle ":completion:*" list-separator "##"; LISTMAX=10000'
zpty -w asked "cd $3; bindkey '^I' list-choices; bindkey '^X' complete-word; stty cols 300 rows 300"
zpty -w asked "print READY''NOW"
zpty -r asked before '*READYNOW*'
zpty -n -w asked "$4"
zpty -n -w asked "$5"$'\C-a'': ''\C-e'
zpty -n -w asked $'\n'"print ASKED''NOW"$'\n'  # so that the echo of the line is not taken for its output
zpty -r asked answer '*ASKEDNOW*'
print -r -- "$answer"
zpty -d asked
"""


def offers_of_bash(words, folder):
    """What bash's function offers for the last of the words."""
    script = f"""
        source {MADE}/bash/{words[0]}
        PATH={BIN}:$PATH
        COMP_WORDS=("$@") COMP_CWORD=$(($# - 1))
        _{words[0]} 2>/dev/null
        printf '%s\\n' "${{COMPREPLY[@]}}"
    """
    done = subprocess.run(["bash", "--norc", "-c", script, "bash", *words], cwd=folder, capture_output=True, text=True,
                          check=True)
    return set(done.stdout.split())


class Completion(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="lapdmon-completion-")
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)
        (self.folder / "trunk.log").write_text("")
        (self.folder / "traces").mkdir()
        shutil.copy(SOURCE / "examples/net5.pcap", self.folder)

    def bash(self, *words):
        return offers_of_bash(words, self.folder)

    def commands(self):
        told = subprocess.run([BIN / "lapdread", "--help"], capture_output=True, text=True, check=True).stdout
        return set(re.findall(r"^  (\w+) ", re.search(r"^Subcommands:\n(.*?)\n\n", told, re.M | re.S)[1], re.M))


class InBash(Completion):
    def test_commands_and_files_come_first(self):
        self.assertEqual(self.bash("lapdread", ""), self.commands() | {"trunk.log", "traces", "net5.pcap"})
        self.assertEqual(self.bash("lapdread", "exp"), {"explain"})

    def test_a_command_has_its_own_options(self):
        self.assertEqual(self.bash("lapdread", "record", "--fold"), {"--folder"})
        self.assertEqual(self.bash("lapdread", "list", "--fold"), set())
        self.assertEqual(self.bash("lapdread", "--relat"), {"--relative"})

    def test_an_option_offers_its_values(self):
        self.assertEqual(self.bash("lapdread", "--color", ""), {"auto", "always", "never"})
        self.assertEqual(self.bash("lapdread", "--color", "=", "a"), {"auto", "always"})
        self.assertEqual(self.bash("lapdread", "record", "--to", "p"), {"pcapng", "pcap"})
        self.assertIn("jsonl", self.bash("lapdread", "convert", "--to", ""))
        self.assertEqual(self.bash("lapdread", "record", "--folder", ""), {"traces"})
        self.assertEqual(self.bash("lapdread", "--number", ""), set())

    def test_call_references_are_those_of_the_file(self):
        self.assertEqual(self.bash("lapdread", "net5.pcap", "--callref", "037"), {"0378", "0379"})
        self.assertEqual(self.bash("lapdread", "--callref", ""), set())

    def test_softboard_offers_its_options_faults_and_then_a_program(self):
        self.assertEqual(self.bash("softboard", "--sc"), {"--scenario"})
        self.assertEqual(self.bash("softboard", "--fault", "reply-l"), {"reply-lost", "reply-late"})
        self.assertIn("lapdmon", self.bash("softboard", "--", "lapdm"))
        self.assertEqual(self.bash("softboard", "--", "lapdmon", "tru"), {"trunk.log"})

    def test_lapdmon_and_kv9relayd(self):
        self.assertEqual(self.bash("lapdmon", "-"), {"-b", "-d", "-f", "-h"})
        self.assertEqual(self.bash("lapdmon", "-f", "tr"), {"trunk.log", "traces"})
        self.assertEqual(self.bash("kv9relayd", "--all"), {"--allow"})


    def test_programs_that_work_without_a_command_offer_both(self):
        self.assertIn("streams", self.bash("lapdship", "st"))
        self.assertEqual(self.bash("lapdship", "--on"), {"--once"})
        self.assertEqual(self.bash("lapdship", "--repl"), set())
        self.assertEqual(self.bash("lapdship", "streams", "--repl"), {"--replicas"})
        self.assertEqual(self.bash("lapdship", "streams", "--conf"), {"--config"})
        self.assertEqual(self.bash("lapdship", "--config", "tr"), {"trunk.log", "traces"})
        self.assertEqual(self.bash("lapdstore", "mi"), {"migrate"})
        self.assertEqual(self.bash("lapdstore", "forget", "--da"), {"--database", "--days"})
        self.assertEqual(self.bash("lapdstore", "rewind", "--fi"), {"--first"})


@unittest.skipUnless(shutil.which("zsh"), "there is no zsh")
class InZsh(Completion):
    def zsh(self, line):
        """The words that zsh lists for a line."""
        done = subprocess.run(["zsh", "-f", "-c", ZSH, "zsh", MADE / "zsh", BIN, self.folder, line, "\t"],
                              capture_output=True, text=True, timeout=60, check=True)
        return done.stdout

    def test_commands(self):
        shown = self.zsh("lapdread ")
        for command in self.commands():
            self.assertRegex(shown, rf"\b{command} +##")

    def test_options_of_a_command(self):
        self.assertRegex(self.zsh("lapdread record --f"), r"--folder +##")
        self.assertNotIn("--folder", self.zsh("lapdread list --f").replace("list --f", ""))

    def test_values(self):
        shown = self.zsh("lapdread --color ")
        for value in ("auto", "always", "never"):
            self.assertIn(value, shown)
        self.assertIn("reply-late", self.zsh("softboard --fault reply-l"))

    def test_call_references(self):
        self.assertIn("0379", self.zsh("lapdread net5.pcap --callref 0"))

    def test_the_other_programs(self):
        self.assertIn("--max-clients", self.zsh("kv9relayd --"))
        self.assertIn("-b", self.zsh("lapdmon -"))
        self.assertIn("--metrics", self.zsh("lapdstore --"))
        self.assertRegex(self.zsh("lapdstore "), r"\bmigrate +##")
        self.assertRegex(self.zsh("lapdship streams --"), r"--replicas +##")


if __name__ == "__main__":
    unittest.main()
