"""JSON Lines: every line of every example is what the schema says, and what other outputs say of the same frame."""

import csv
import io
import json
import unittest

import jsonschema
from lapdread_harness import EXAMPLES, RECORDED, SOURCE, output

SCHEMA = json.loads((SOURCE / "docs/user/jsonl.schema.json").read_text())


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
