"""What gdb prints with the printers of the library.

usage: printers_test.py PROGRAM SCRIPT [CMAKE BUILD_FOLDER FOLDER]

With the last three it installs the build into the folder, which is emptied, and looks whether gdb loads them by itself.
"""

import os
import pathlib
import shutil
import subprocess
import sys
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
PROGRAM, SCRIPT, *INSTALLATION = sys.argv[1:]

# Expression, what gdb prints for it.
CASES = [
    ("*structureRecord", '14 "Inner", dtqStruct, 32 bytes = {[0] = "a": type 0, [3], offset 0, [1] = "b": type 1, complex, offset 24}'),
    ("*aliasRecord", '15 "Pair", alias of 14 "Inner"'),
    ("*unsizedRecord", '16 "Later", dtqUnspecified, no size yet'),
    ("*builtIn", '4 "int16", dtqBuiltIn, 2 bytes'),
    ("unset", '"unset": type -10, not laid out'),
    ("plain", "FXP_DT_FIXPT, signed, 16 bits, 2^-7*Q"),
    ("scaled", "FXP_DT_SCALED_DOUBLE, unsigned, 8 bits, 1.25*2^3*Q + -2.5"),
    ("half", "FXP_DT_CUSTOM_FLOAT, signed, 16 bits, 5 of them exponent"),
    ("k", "id 5: K"),
    ("none", "id 0: NOSYMBOLIC"),
]


def gdb(*commands, arguments=(), program=PROGRAM):
    call = ["gdb", "--batch", "--nx", "-iex", "set debuginfod enabled off", *arguments]
    for command in commands:
        call += ["-ex", command]
    environment = {**os.environ, "ASAN_OPTIONS": "detect_leaks=0", "LC_ALL": "C.UTF-8"}
    result = subprocess.run([*call, program], capture_output=True, text=True, env=environment)
    return result.stdout, result.stderr


class Printers(unittest.TestCase):
    maxDiff = None

    @classmethod
    def setUpClass(cls):
        expressions = [expression for expression, _ in CASES] + ["table", "shape", "twice", "expression", "/r plain"]
        commands = [f"source {SCRIPT}", "break stop", "run", "up"]
        for expression in expressions:
            commands += [f"echo >>{expression}\\n", f"print {expression}"]
        out, cls.complaints = gdb(*commands)
        cls.printed = {}
        for part in out.split(">>")[1:]:
            expression, _, value = part.partition("\n")
            cls.printed[expression] = value.strip().partition(" = ")[2]

    def test_values(self):
        for expression, wanted in CASES:
            with self.subTest(expression=expression):
                self.assertEqual(self.printed.get(expression), wanted, self.complaints)

    def test_no_printer_failed(self):
        self.assertNotIn("Python", self.complaints)

    def test_table(self):
        """Of a class of a client: all records in one line each."""
        table = self.printed["table"]
        self.assertTrue(table.startswith("18 types = {"), table)
        for entry in ('[-1] = -1 "auto"', '[0] = 0 "double", dtqBuiltIn, 8 bytes', '[14] = 14 "Inner", dtqStruct, 32 bytes',
                      '[15] = 15 "Pair", alias of 14 "Inner"'):
            self.assertIn(entry, table)

    def test_expressions(self):
        number, _, text = self.printed["twice"].partition(": ")
        self.assertIn(text, ("Multiply(2, K)", "Multiply(K, 2)"))
        self.assertEqual(self.printed["expression"], f"expression {int(number[3:]) + 1}: {text}")
        self.assertTrue(self.printed["shape"].endswith(f": ND(K, {text}, -7, K)"), self.printed["shape"])

    def test_raw(self):
        self.assertIn("WordLength = 16", self.printed["/r plain"])


class AutoLoad(unittest.TestCase):
    def setUp(self):
        if not INSTALLATION:
            self.skipTest("not asked for")
        cmake, build, folder = INSTALLATION
        shutil.rmtree(folder, ignore_errors=True)
        self.prefix = pathlib.Path(folder)
        subprocess.run([cmake, "--install", build, "--prefix", folder], check=True, capture_output=True)
        self.library = next(path for path in self.prefix.rglob("libqltypes.so.*.*") if path.suffix != ".py")

    def look(self, autoload):
        arguments = ["-iex", f"set auto-load safe-path {autoload}", "-iex", f"set auto-load scripts-directory {autoload}"]
        return gdb(f"set environment LD_LIBRARY_PATH={self.library.parent}", "break stop", "run", "up", "info sharedlibrary",
                   "print plain", arguments=arguments)

    def test_with_the_library(self):
        out, complaints = self.look(self.prefix / "share/gdb/auto-load")
        self.assertIn(str(self.library.parent), out)
        self.assertIn("= FXP_DT_FIXPT, signed, 16 bits, 2^-7*Q", out, complaints)

    def test_the_name_is_that_of_the_library(self):
        """Where gdb looks: the folder of the scripts, the path of the library, -gdb.py."""
        scripts = list(self.prefix.rglob("*-gdb.py"))
        self.assertEqual(scripts, [self.prefix / f"share/gdb/auto-load/{str(self.library)[1:]}-gdb.py"])
        self.assertNotIn(str(self.prefix), scripts[0].read_text())


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
