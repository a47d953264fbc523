"""The JSON Schema and the reader of type descriptions say the same of the same descriptions.

usage: schema_test.py QLTYPES
"""

import json
import pathlib
import subprocess
import sys
import unittest

import jsonschema

ROOT = pathlib.Path(__file__).resolve().parents[2]
QLTYPES = sys.argv[1]


def cases():
    """(line number, verdict, complaint, description) of each row."""
    for number, line in enumerate((ROOT / "tests/data/type_descriptions.tsv").read_text().splitlines(), 1):
        if line and not line.startswith("#"):
            yield number, *line.split("\t")


class Schema(unittest.TestCase):
    def setUp(self):
        schema = json.loads((ROOT / "tools/qltypes/type-description.schema.json").read_text())
        jsonschema.Draft202012Validator.check_schema(schema)
        self.validator = jsonschema.Draft202012Validator(schema)

    def test_schema(self):
        for number, verdict, _, description in cases():
            with self.subTest(line=number, description=description):
                self.assertEqual(self.validator.is_valid(json.loads(description)), verdict != "bad")

    def test_reader(self):
        for number, verdict, complaint, description in cases():
            with self.subTest(line=number, description=description):
                result = subprocess.run([QLTYPES, "layout", "-"], input=description, capture_output=True, text=True)
                if verdict == "good":
                    self.assertEqual((result.returncode, result.stderr), (0, ""))
                else:
                    self.assertEqual(result.stderr, f"(standard input): {complaint}\n")
                    self.assertEqual((result.returncode, result.stdout), (2, ""))

    def test_examples(self):
        examples = sorted((ROOT / "examples").glob("*.json"))
        self.assertTrue(examples)
        for example in examples:
            with self.subTest(example=example.name):
                self.validator.validate(json.loads(example.read_text()))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
