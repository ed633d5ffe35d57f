"""Each line that the program writes to the standard error stream is explained in docs/user/operating.md."""

import pathlib
import re
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
PAGE = ROOT / "docs/user/operating.md"
HEADING = "## What the standard error stream says"

LITERAL = re.compile(r'"((?:[^"\\\n]|\\.)*)"')
COMMENT = re.compile(r"//.*$", re.M)
STATEMENT = re.compile(r"(?:std::cerr|\breport\()[^;]*;")
# From a line that begins in the first column to the next closing brace there.
FUNCTION = re.compile(r"^\w[^\n]*\{\n.*?^\}", re.M | re.S)
FOR_THE_SCREEN = {"CCS protocol type is "}


def sources(folder):
    for path in sorted((ROOT / folder).glob("*.cc")):
        yield path.name, COMMENT.sub("", path.read_text())


def words_in(code):
    """The literals that are more than one word."""
    return {text.removesuffix("\\n").strip(" :") for text in LITERAL.findall(code)
            if re.search(r"\w\w \w", text) and text not in FOR_THE_SCREEN}


def said():
    """What is said in words, with the source that says it. The program's own functions take their words from several
    statements; in the layers below each is one."""
    for name, code in sources("app"):
        for function in FUNCTION.findall(code):
            if "std::cerr" in function or '"lapdmon: ' in function:
                yield from ((name, words) for words in words_in(function))
    for folder in ("vela", "hostsvc"):
        for name, code in sources(folder):
            for statement in STATEMENT.findall(code):
                yield from ((name, words) for words in words_in(statement))


def explained():
    section = PAGE.read_text().split(HEADING + "\n", 1)[1].split("\n## ", 1)[0]
    return re.sub(r"\s+", " ", section)


class Messages(unittest.TestCase):
    def test_each_is_explained(self):
        section = explained()
        messages = set(said())
        self.assertGreater(len(messages), 20)
        for source, words in sorted(messages):
            with self.subTest(source, words=words):
                self.assertIn(words, section)


if __name__ == "__main__":
    unittest.main()
