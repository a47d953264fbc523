"""The C header of a layout: the system's C compiler agrees with every size and offset that it asserts.

usage: c_layout_test.py QLTYPES
"""

import json
import pathlib
import random
import subprocess
import sys
import tempfile
import unittest

QLTYPES = sys.argv[1]
ROOT = pathlib.Path(__file__).resolve().parents[2]
PACKAGES = ("std_msgs", "geometry_msgs", "sensor_msgs", "nav_msgs")
FOLDERS = [f"/usr/share/{package}/msg" for package in PACKAGES]
SEED = 20240229

NUMBERS = ("double", "single", "half", "boolean", "int8", "uint16", "int32", "int64", "uint64", "sfix16_En7", "ufix24_En3",
           "ufix1", "sfix40_En5", "sfix65_En2", "ufix128", "flts16_En7", "sfix7_S3p2_B2")


def run(*arguments, stdin=""):
    return subprocess.run([QLTYPES, "layout", *arguments], input=stdin, check=True, stdout=subprocess.PIPE, text=True).stdout


def layout(*arguments):
    return json.loads(run("--json", *arguments))


def header(description, *arguments):
    return run("-", "--format", "c", *arguments, stdin=json.dumps(description))


def compile_c(text, *flags):
    with tempfile.TemporaryDirectory() as folder:
        (pathlib.Path(folder) / "layout.h").write_text(text)
        source = pathlib.Path(folder) / "layout.c"
        source.write_text('#include "layout.h"\n#include "layout.h"\n')
        return subprocess.run(["cc", "-std=c11", "-Wall", "-Wextra", "-Werror", "-fsyntax-only", *flags, source],
                              capture_output=True, text=True)


def random_description(generator):
    """Client types, aliases and structures of odd sizes, each of what came before."""
    types = []
    known = list(NUMBERS)
    for i in range(generator.randint(2, 12)):
        name = f"T{i}"
        kind = generator.choice(("client", "alias", "structure", "structure", "structure"))
        if kind == "client":
            types.append({"name": name, "size": generator.randint(1, 41)})
        elif kind == "alias":
            types.append({"name": name, "alias": generator.choice(known)})
        else:
            types.append({"name": name, "elements": [
                {"name": f"e{j}", "type": generator.choice(known), "complex": generator.random() < 0.2,
                 "dimensions": [generator.randint(1, 4) for _ in range(generator.randint(1, 3))]}
                for j in range(generator.randint(1, 7))]})
        known.append(name)
    types.append({"name": "All", "elements": [{"name": f"e{i}", "type": kind} for i, kind in enumerate(known)]})
    generator.shuffle(types)
    return {"types": types}


class CLayout(unittest.TestCase):
    maxDiff = None

    def assertCompiles(self, text, *flags):
        result = compile_c(text, *flags)
        self.assertEqual((result.returncode, result.stderr), (0, ""), text)

    def assertAssertsAll(self, text, structures):
        """The header has an assertion for each size and offset that the layout has."""
        self.assertEqual(text.count("_Static_assert("), sum(1 + len(each["elements"]) for each in structures))

    def test_whole_message_set(self):
        structures = layout(*FOLDERS)["structures"]
        self.assertGreater(len(structures), 30)
        for options in ([], ["--padding"]):
            with self.subTest(options=options):
                text = run(*FOLDERS, "--format", "c", *options)
                self.assertAssertsAll(text, structures)
                self.assertCompiles(text)

    def test_a_wrong_offset_would_be_found(self):
        text = run(*FOLDERS, "--format", "c")
        at = text.index(") == ", text.index("offsetof")) + len(") == ")
        self.assertNotEqual(compile_c(text[:at] + "1" + text[at:]).returncode, 0)

    def test_random_descriptions(self):
        generator = random.Random(SEED)
        texts = {"plain": "", "padding": ""}
        for number in range(40):
            description = random_description(generator)
            for name, options in (("plain", []), ("padding", ["--padding"])):
                text = header(description, *options)
                self.assertAssertsAll(text, [each for each in description["types"] if "elements" in each])
                texts[name] += text.replace("struct T", f"struct D{number}_T").replace("struct All", f"struct D{number}_All")
        for name, text in texts.items():
            with self.subTest(name=name, seed=SEED):
                self.assertIn("packed", text)
                self.assertCompiles(text)
        with self.subTest(seed=SEED): # -Wpadded is quiet only where all padding is declared
            self.assertCompiles(texts["padding"], "-Wpadded")
            self.assertNotEqual(compile_c(texts["plain"], "-Wpadded").returncode, 0)

    def test_header(self):
        description = {"types": [{"name": "Outer", "elements": [
            {"name": "a", "type": "int8"}, {"name": "raw", "type": "Blob"}, {"name": "m", "type": "Inner", "dimensions": [2, 3]},
            {"name": "int", "type": "sfix16_En7", "complex": True}]},
            {"name": "Blob", "size": 3}, {"name": "Inner", "elements": [{"name": "x", "type": "double"}]}]}
        text = header(description, "--padding")
        self.assertCompiles(text)
        self.assertEqual(text, """\
#pragma once

#include <stddef.h>
#include <stdint.h>

/* Inner: 8 bytes */
struct Inner {
    double x;
} __attribute__((aligned(8)));
_Static_assert(sizeof(struct Inner) == 8, "size of struct Inner");
_Static_assert(offsetof(struct Inner, x) == 0, "offset of x in struct Inner");

/* Outer: 64 bytes */
struct Outer {
    int8_t a;
    unsigned char padding_at_1[1];
    unsigned char raw[3];
    unsigned char padding_at_5[3];
    struct Inner m[6]; /* 2 by 3 */
    int16_t x_int[2];
    unsigned char padding_at_60[4];
} __attribute__((packed, aligned(8)));
_Static_assert(sizeof(struct Outer) == 64, "size of struct Outer");
_Static_assert(offsetof(struct Outer, a) == 0, "offset of a in struct Outer");
_Static_assert(offsetof(struct Outer, raw) == 2, "offset of raw in struct Outer");
_Static_assert(offsetof(struct Outer, m) == 8, "offset of m in struct Outer");
_Static_assert(offsetof(struct Outer, x_int) == 56, "offset of x_int in struct Outer");
""")
        text = header(description)
        self.assertCompiles(text)
        self.assertIn("unsigned char raw[3] __attribute__((aligned(2)));", text)

    def test_only_brings_what_it_contains(self):
        text = run(str(ROOT / "examples/drive.json"), "--only", "Drive", "--format", "c")
        self.assertCompiles(text)
        self.assertEqual(text.count("struct Phase {"), 1)

    def test_names_that_c_keeps(self):
        names = ["int", "x_int", "linux", "__LINE__", "_Bool", "NULL", "offsetof", "INT8_MAX", "INT8_C", "int8_t", "_", "auto",
                 "padding_at_1", "x", "alignas"]
        description = {"types": [{"name": name, "elements": [{"name": "v", "type": "int8"}]} for name in names if name != "auto"]}
        description["types"].append({"name": "Names", "elements": [{"name": name, "type": "int8" if i != 1 else "double"}
                                                                   for i, name in enumerate(names)]})
        for options in ([], ["--padding"]):
            for flags in ([], ["-std=gnu11"], ["-std=gnu2x"]):
                with self.subTest(options=options, flags=flags):
                    self.assertCompiles(header(description, *options), *flags)

    def test_every_message_is_laid_out_or_refused(self):
        document = layout(*FOLDERS)
        asked = {f"{package}/{file.stem}" for package in PACKAGES
                 for file in pathlib.Path(f"/usr/share/{package}/msg").glob("*.msg")}
        laid_out = {structure["label"] for structure in document["structures"]}
        refused = {refusal["name"] for refusal in document["refused"]}
        self.assertEqual(laid_out & refused, set())
        self.assertLessEqual(asked, laid_out | refused)
        self.assertEqual(document["summary"]["numMessages"], len((laid_out | refused) - {"time", "duration"}))

    def test_order_of_the_inputs_does_not_matter(self):
        def by_name(*folders):
            return {structure["name"]: structure for structure in layout(*folders)["structures"]}

        self.assertEqual(by_name(*FOLDERS), by_name(*reversed(FOLDERS)))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
