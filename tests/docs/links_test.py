"""Every link in a document of this tree leads to a file that exists, and every anchor to a heading of that file."""

import pathlib
import re
import subprocess
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]

FENCED = re.compile(r"^```.*?^```$", re.M | re.S)
INDENTED = re.compile(r"^    .*$", re.M)
HEADING = re.compile(r"^#+ +(.*?)\s*$", re.M)
LINK = re.compile(r"\]\(([^)\s]+)\)")


def documents():
    """The tree's Markdown files; those of build trees and other people's are not the tree's."""
    names = subprocess.run(["git", "ls-files", "-co", "--exclude-standard", "*.md"], cwd=ROOT, text=True,
                           stdout=subprocess.PIPE, check=False).stdout.split("\n")
    found = [ROOT / name for name in names if name and (ROOT / name).exists()]
    return found or [path for path in ROOT.rglob("*.md") if "build" not in path.relative_to(ROOT).parts]


def prose(path):
    """A document without its code, in which brackets are no links and "#" begins no heading."""
    return INDENTED.sub("", FENCED.sub("", path.read_text()))


def anchors(path):
    """The anchors of a document's headings, as repository browsers make them."""
    made = set()
    for heading in HEADING.findall(prose(path)):
        anchor = re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-")
        repeated, number = anchor, 0
        while repeated in made:
            number += 1
            repeated = f"{anchor}-{number}"
        made.add(repeated)
    return made


def complaint(path, target):
    """What is wrong with a link, or None."""
    if re.match(r"[a-z]+:", target):
        return None  # somewhere else, which no test depends on
    name, _, anchor = target.partition("#")
    leads_to = (path.parent / name) if name else path
    if not leads_to.exists():
        return "there is no such file"
    if anchor and anchor not in anchors(leads_to):
        return "there is no such heading"
    return None


class Links(unittest.TestCase):
    def test_each_leads_to_a_file_or_heading_that_exists(self):
        checked = 0
        for path in documents():
            for target in LINK.findall(prose(path)):
                with self.subTest(document=str(path.relative_to(ROOT)), link=target):
                    self.assertIsNone(complaint(path, target))
                checked += 1
        self.assertGreater(checked, 50)

    def test_a_link_that_leads_nowhere_is_noticed(self):
        readme = ROOT / "README.md"
        self.assertIsNotNone(complaint(readme, "docs/no-such-page.md"))
        self.assertIsNotNone(complaint(readme, "CONTRIBUTING.md#no-such-heading"))
        self.assertIsNone(complaint(readme, "CONTRIBUTING.md#golden-files"))

    def test_each_page_is_reached_from_the_readme(self):
        reached, waiting = set(), [ROOT / "README.md"]
        while waiting:
            path = waiting.pop()
            if path in reached or path.suffix != ".md":
                continue
            reached.add(path)
            for target in LINK.findall(prose(path)):
                if complaint(path, target) is None and not re.match(r"[a-z]+:|#", target):
                    waiting.append((path.parent / target.partition("#")[0]).resolve())
        pages = {path for path in documents() if "docs" in path.relative_to(ROOT).parts[:1]}
        self.assertEqual(pages - reached, set())


if __name__ == "__main__":
    unittest.main()
