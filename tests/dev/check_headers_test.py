"""check_headers finds what it exists to find, and accepts a clean header."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECK = pathlib.Path(__file__).resolve().parents[2] / "tools/dev/check_headers"
CLEAN = ["// What is here.", "#pragma once", "", "#define QL_THING 1", "namespace QLTypeSys {}"]


class CheckHeaders(unittest.TestCase):
    def check(self, lines, file="qltypes/types/Thing.h"):
        with tempfile.TemporaryDirectory() as folder:
            path = pathlib.Path(folder) / file
            path.parent.mkdir(parents=True)
            path.write_text("\n".join(lines) + "\n")
            result = subprocess.run([sys.executable, CHECK, folder], capture_output=True, text=True, check=False)
        self.assertEqual(result.stderr, "")
        return result.returncode, result.stdout.splitlines()

    def test_clean_header(self):
        self.assertEqual(self.check(CLEAN), (0, ["headers: nothing to complain about"]))

    def test_what_is_found(self):
        cases = (
            (CLEAN[1:], 1, "comment"),
            (CLEAN[:1] + CLEAN[2:], 1, "#pragma once"),
            (CLEAN + ["    using  namespace std;"], 6, "using namespace"),
            (CLEAN + ["# define MAX(a, b) ((a) > (b) ? (a) : (b))"], 6, "macro MAX "),
        )
        for lines, number, what in cases:
            with self.subTest(what=what):
                code, found = self.check(lines)
                self.assertEqual((code, len(found)), (1, 1))
                self.assertTrue(found[0].startswith(f"qltypes/types/Thing.h:{number}: "), found[0])
                self.assertIn(what, found[0])

    def test_hidden_headers_are_not_looked_at(self):
        self.assertEqual(self.check(["#define MAX 1"], "qltypes/types/Thing_internal.h")[0], 0)


if __name__ == "__main__":
    unittest.main()
