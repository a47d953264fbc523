"""build_reference shows Doxygen what readers of a header see, and complains of what they do not see."""

import importlib.machinery
import importlib.util
import pathlib
import unittest

SCRIPT = str(pathlib.Path(__file__).resolve().parents[2] / "tools/dev/build_reference")
loader = importlib.machinery.SourceFileLoader("build_reference", SCRIPT)
module = importlib.util.module_from_spec(importlib.util.spec_from_loader("build_reference", loader))
loader.exec_module(module)


class ForDoxygen(unittest.TestCase):
    def shown(self, *lines):
        return module.Header("\n".join(lines)).for_doxygen().splitlines()

    def test_the_comment_at_the_top_documents_the_file(self):
        shown = self.shown("// What is here.", "//", "//   code();", "#pragma once")
        self.assertEqual(shown, ["/// What is here.", "///", "///       code();", "/// \\file"])

    def test_a_group_comment_documents_each_function_that_has_no_documentation(self):
        shown = self.shown("#pragma once", "// Reads: unchecked.", "int a();", "/// Own.", "int b();", "int c();")
        self.assertEqual(shown[2:], ["/** Reads: unchecked. */ int a();", "/// Own.", "int b();",
                                     "/** Reads: unchecked. */ int c();"])

    def test_a_heading_documents_nothing(self):
        for heading in ("// Reads.", "// --- Reads ------", "// clang-format off"):
            self.assertEqual(self.shown("#pragma once", heading, "int a();")[2], "int a();")

    def test_a_heading_ends_the_group_before_it(self):
        self.assertEqual(self.shown("// File.", "#pragma once", "// A: b.", "int a();", "// C.", "int c();")[5], "int c();")

    def test_setters_and_overloads_share_documentation(self):
        shown = self.shown("#pragma once", "/// Bytes.", "int getSize();", "void setSize(int);", "int getSize(long);",
                           "int size();")
        self.assertEqual(shown[3:], ["/** Bytes. */ void setSize(int);", "/** Bytes. */ int getSize(long);", "int size();"])

    def test_a_constructor_has_the_documentation_of_its_class(self):
        shown = self.shown("#pragma once", "/// A thing.", "class Thing {", "  public:", "    Thing(int);",
                           "    Thing(const Thing&) = delete;", "};")
        self.assertEqual(shown[4:6], ["/** A thing. */     Thing(int);", "    Thing(const Thing&) = delete;"])

    def test_fields(self):
        shown = self.shown("#pragma once", "struct Thing {", "    int a; // bytes", "    int b;", "};", "class Other {",
                           "    int c = f();", "  protected:", "    int d;", "    int e; // bits", "};")
        self.assertEqual(shown[2:4], ["    int a; ///< bytes", "    int b;"])
        self.assertEqual(shown[6:10:2], ["//    int c = f();", "//    int d;"])
        self.assertEqual(shown[9], "    int e; ///< bits")

    def test_private_functions_are_known(self):
        header = module.Header("#pragma once\nclass Thing {\n    int a();\n  public:\n    int b();\n};\n")
        header.for_doxygen()
        self.assertEqual(header.private, {"a"})

    def test_exported_functions(self):
        names = set(module.exported_functions())
        self.assertLess({"DtGetDataTypeSize", "registerDataType", "DataTypeTable"}, names)
        self.assertFalse(any(name.startswith(("operator", "~", "vtable")) for name in names))


if __name__ == "__main__":
    unittest.main()
