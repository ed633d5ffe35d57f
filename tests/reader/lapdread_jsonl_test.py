"""JSON Lines: every line of every example is what the schema says, and what other outputs say of the same frame."""

import csv
import io
import json
import unittest

import jsonschema
from lapdread_harness import EXAMPLES, RECORDED, SOURCE, output

SCHEMA = json.loads((SOURCE / "docs/user/jsonl.schema.json").read_text())
RESULTS = json.loads((SOURCE / "docs/user/results.schema.json").read_text())
NIGHT = sorted((SOURCE / "tests/reader/data/night").glob("*.hex"))


def lines(path, *words):
    return [json.loads(line) for line in output("convert", "--to", "jsonl", *words, path).splitlines()]


class JsonLines(unittest.TestCase):
    def test_every_line_fits_the_schema(self):
        jsonschema.Draft7Validator.check_schema(SCHEMA)
        validator = jsonschema.Draft7Validator(SCHEMA)
        for path in [*EXAMPLES.values(), *RECORDED]:
            for line in lines(path):
                errors = [error.message for error in validator.iter_errors(line)]
                self.assertEqual(errors, [], f"{path.name}, frame {line['n']}: {line}")

    def test_the_schema_finds_what_does_not_fit(self):
        validator = jsonschema.Draft7Validator(SCHEMA)
        sound = lines(EXAMPLES["net5"], "--message", "SETUP")[0]
        wrong = [{"frame": "RRR"}, {"hex": "0"}, {"tei": 128}, {"v": 2}, {"time": "noon"}, {"something": 1}]
        for change in wrong:
            self.assertFalse(validator.is_valid({**sound, **change}), change)

    def test_every_line_of_results_fits_their_schema(self):
        jsonschema.Draft7Validator.check_schema(RESULTS)
        validator = jsonschema.Draft7Validator(RESULTS)
        commands = [[command, "--jsonl", "--quiet", path] for path in [*EXAMPLES.values(), *RECORDED, *NIGHT]
                    for command in ("calls", "check")]
        commands += [["stats", "--over-time", "--jsonl", "--quiet", path] for path in [*EXAMPLES.values(), *RECORDED]]
        commands += [["diff", "--jsonl", "--quiet", EXAMPLES["net5"], EXAMPLES["ni2"]]]
        seen = set()
        for command in commands:
            for text in output(*command).splitlines():
                line = json.loads(text)
                seen.add(line.get("table") or next(key for key in ("finding", "difference", "call") if key in line))
                errors = [error.message for error in validator.iter_errors(line)]
                self.assertEqual(errors, [], f"{command}: {line}")
        known = {form["properties"].get("table", {}).get("const") or form["title"].split()[-1] for form in RESULTS["oneOf"]}
        self.assertEqual(seen, known)

    def test_the_schema_of_results_finds_what_does_not_fit(self):
        validator = jsonschema.Draft7Validator(RESULTS)
        sound = json.loads(output("calls", "--jsonl", EXAMPLES["net5"]).splitlines()[0])
        self.assertTrue(validator.is_valid(sound))
        for change in ({"outcome": "good"}, {"call": 0}, {"callref": "xyz"}, {"more": 1}, {"table": "messages"}):
            self.assertFalse(validator.is_valid({**sound, **change}), change)

    def test_the_octets_of_a_message_are_those_of_its_elements(self):
        for path in [*EXAMPLES.values(), *RECORDED]:
            for line in lines(path, "--layer", "3"):
                self.assertTrue(line["hex"].endswith("".join(element["hex"] for element in line["elements"])),
                                f"{path.name}, frame {line['n']}")

    def test_the_example_of_the_page_is_real(self):
        setup = lines(EXAMPLES["net5"], "--callref", "0378", "--message", "SETUP")[0]
        self.assertEqual((setup["message"], setup["code"], setup["pd"]), ("SETUP", 5, 8))
        self.assertEqual(setup["callref"], {"value": 0x378, "flag": 0, "length": 2})
        self.assertEqual((setup["dir"], setup["role"], setup["command"]), ("rx", "user", True))
        called = [element for element in setup["elements"] if element["id"] == 0x70]
        self.assertEqual([field["meaning"] for field in called[0]["fields"]][-1], "73134483")

    def test_csv_says_the_same(self):
        for path in EXAMPLES.values():
            rows = list(csv.DictReader(io.StringIO(output("convert", "--to", "csv", path))))
            objects = lines(path)
            self.assertEqual(len(rows), len(objects))
            for row, line in zip(rows, objects):
                for key in ("n", "time", "dir", "role", "sapi", "tei", "frame", "ns", "nr", "pf", "hex"):
                    value = "" if line[key] is None else str(line[key])
                    self.assertEqual(row[key], value, f"{path.name}, frame {line['n']}, {key}")
                self.assertEqual(row["message"], line.get("message", ""))
                self.assertEqual(row["marks"], ", ".join(line["marks"]))


if __name__ == "__main__":
    unittest.main()
