"""The layout of the whole real message set is what the system's C compiler makes of the same structures.

Where nested structures are declared aligned to 8, the C rule and ours agree: then sizeof and every offsetof must be the same.

usage: c_layout_test.py QLTYPES
"""

import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

QLTYPES = sys.argv[1]
PACKAGES = ("std_msgs", "geometry_msgs", "sensor_msgs", "nav_msgs")
FOLDERS = [f"/usr/share/{package}/msg" for package in PACKAGES]

C_TYPES = {
    "double": "double", "single": "float", "boolean": "unsigned char",
    "int8": "int8_t", "int16": "int16_t", "int32": "int32_t", "int64": "int64_t",
    "uint8": "uint8_t", "uint16": "uint16_t", "uint32": "uint32_t", "uint64": "uint64_t",
}


def layout(*arguments):
    return json.loads(subprocess.run([QLTYPES, "layout", "--json", *arguments], check=True, stdout=subprocess.PIPE).stdout)


def in_order_of_need(structures):
    """The structures, each behind those that it contains."""
    by_name = {structure["name"]: structure for structure in structures}
    done = {}

    def add(structure):
        for element in structure["elements"]:
            if element["type"] in by_name and element["type"] not in done:
                add(by_name[element["type"]])
        done[structure["name"]] = structure

    for structure in structures:
        add(structure)
    return list(done.values())


def c_header(structures):
    lines = ["#include <stddef.h>", "#include <stdint.h>"]
    for structure in in_order_of_need(structures):
        name = f"struct {structure['name']}"
        lines.append(f"{name} {{")
        for element in structure["elements"]:
            c_type = C_TYPES.get(element["type"]) or f"struct {element['type']}"
            dimensions = "".join(f"[{dimension}]" for dimension in element["dimensions"])
            lines.append(f"    {c_type} {element['name']}{dimensions};")
        lines.append("} __attribute__((aligned(8)));")
        lines.append(f'_Static_assert(sizeof({name}) == {structure["size"]}, "size of {name}");')
        for element in structure["elements"]:
            lines.append(f'_Static_assert(offsetof({name}, {element["name"]}) == {element["offset"]}, '
                         f'"offset of {name}.{element["name"]}");')
    return "\n".join(lines) + "\n"


def compile_header(header):
    with tempfile.TemporaryDirectory() as folder:
        path = pathlib.Path(folder) / "layout.c"
        path.write_text(header)
        return subprocess.run(["cc", "-std=c11", "-Wall", "-Wextra", "-Werror", "-fsyntax-only", path],
                              capture_output=True, text=True)


class CLayout(unittest.TestCase):
    def test_whole_message_set(self):
        document = layout(*FOLDERS)
        self.assertGreater(len(document["structures"]), 30)
        header = c_header(document["structures"])
        result = compile_header(header)
        self.assertEqual((result.returncode, result.stderr), (0, ""))

    def test_a_wrong_offset_would_be_found(self):
        structures = layout(*FOLDERS)["structures"]
        moved = next(element for structure in structures for element in structure["elements"] if element["moved"])
        moved["offset"] -= 1
        self.assertNotEqual(compile_header(c_header(structures)).returncode, 0)

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
