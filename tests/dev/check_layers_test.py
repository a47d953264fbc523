"""check_layers finds each kind of include that it exists to find, and accepts the others."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

TOOLS = pathlib.Path(__file__).resolve().parents[2] / "tools/dev"


class CheckLayers(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.root = pathlib.Path(folder.name)
        (self.root / "tools/dev").mkdir(parents=True)
        rules = (TOOLS / "layers.txt").read_text().splitlines()
        rules = [rule for rule in rules if not rule.startswith("allow")]
        (self.root / "tools/dev/layers.txt").write_text("\n".join(rules) + "\n")

    def write(self, file, *lines):
        path = self.root / file
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text("\n".join(lines) + "\n")

    def allow(self, line):
        with open(self.root / "tools/dev/layers.txt", "a") as layers:
            layers.write(line + "\n")

    def check(self):
        result = subprocess.run([sys.executable, TOOLS / "check_layers", self.root], capture_output=True, text=True)
        self.assertEqual(result.stderr, "")
        return result.returncode, result.stdout.splitlines()

    def assertComplaint(self, start):
        code, lines = self.check()
        self.assertEqual((code, len(lines)), (1, 1), lines)
        self.assertTrue(lines[0].startswith(start), lines[0])

    def test_includes_downwards_and_beside_are_allowed(self):
        self.write("qltypes/types/DataTypeTable.h", '#include "qlplatform/memory/Memory.h"', "#include <vector>")
        self.write("qltypes/types/DataTypeTable.cpp", '#include "qltypes/host/Failure_internal.h"')
        self.write("qltypes/image/ImageDataType.cpp", '#include "qltypes/dynamic_matrix/DynamicMatrix.h"')
        self.write("tests/types/DataType_test.cpp", '#include "qltypes/types/Rows_internal.h"', "#include <gtest/gtest.h>")
        self.assertEqual(self.check(), (0, ["layers: every include is allowed"]))

    def test_include_of_a_higher_layer(self):
        self.write("qltypes/types/DataTypeTable.cpp", "", '#include "qltypes/structures/StructDataType.h"')
        self.assertComplaint("qltypes/types/DataTypeTable.cpp:2: qltypes/structures/StructDataType.h: types (layer 3) ")

    def test_platform_knows_nothing_of_the_library(self):
        self.write("qlplatform/memory/Memory.cpp", '#include "qltypes/host/Messages.h"')
        self.assertComplaint("qlplatform/memory/Memory.cpp:1:")

    def test_include_of_an_unrelated_group_of_the_same_layer(self):
        self.write("qltypes/dynamic_matrix/DynamicMatrix.cpp", '#include "qltypes/image/ImageDataType.h"')
        self.assertComplaint("qltypes/dynamic_matrix/DynamicMatrix.cpp:1:")

    def test_hidden_header_in_a_public_one(self):
        self.write("qltypes/types/DataType.h", '#include "qltypes/types/RecordFields_internal.h"')
        self.assertComplaint("qltypes/types/DataType.h:1:")

    def test_hidden_header_in_a_tool(self):
        self.write("tools/qltypes/main.cpp", '#include "qltypes/host/Failure_internal.h"')
        self.assertComplaint("tools/qltypes/main.cpp:1:")

    def test_foreign_library_in_a_public_header(self):
        self.write("qltypes/types/DataType.h", "#include <fmt/format.h>", "#include <boost/function.hpp>")
        self.assertComplaint("qltypes/types/DataType.h:1:")

    def test_own_header_in_angle_brackets(self):
        self.write("qltypes/types/DataType.cpp", "#include <qltypes/types/DataType.h>")
        self.assertComplaint("qltypes/types/DataType.cpp:1:")

    def test_file_without_a_group(self):
        self.write("qltypes/novel/Thing.h", "")
        self.assertComplaint("qltypes/novel/Thing.h:1: no group")

    def test_picture_that_is_not_that_of_the_list(self):
        marks = ["<!-- layers: written by tools/dev/check_layers --update -->", "<!-- end of layers -->"]
        self.write("docs/dev/architecture.md", "# Head", *marks, "Tail")
        self.assertComplaint("docs/dev/architecture.md:")
        subprocess.run([sys.executable, TOOLS / "check_layers", "--update", self.root], check=True, capture_output=True)
        self.assertEqual(self.check()[0], 0)
        lines = (self.root / "docs/dev/architecture.md").read_text().splitlines()
        self.assertEqual((lines[0], lines[-1]), ("# Head", "Tail"))
        self.assertIn("    image --> dynamic_matrix", lines)

    def test_allowance(self):
        self.write("qltypes/types/DataTypeTable.cpp", '#include "qltypes/structures/StructDataType.h"')
        self.allow("allow qltypes/types/DataTypeTable.cpp -> qltypes/structures/StructDataType.h : makes the records")
        self.assertEqual(self.check()[0], 0)

    def test_allowance_that_nothing_needs(self):
        self.write("qltypes/types/DataTypeTable.cpp", "")
        self.allow("allow qltypes/types/DataTypeTable.cpp -> qltypes/structures/StructDataType.h : makes the records")
        self.assertComplaint("tools/dev/layers.txt:")

    def test_allowance_without_a_reason_cannot_be_read(self):
        self.allow("allow qltypes/types/DataTypeTable.cpp -> qltypes/structures/StructDataType.h")
        result = subprocess.run([sys.executable, TOOLS / "check_layers", self.root], capture_output=True, text=True)
        self.assertNotEqual(result.returncode, 0)
        self.assertIn("cannot be read", result.stderr)


if __name__ == "__main__":
    unittest.main()
