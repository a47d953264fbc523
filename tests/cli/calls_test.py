"""How the command is called: what it prints where, and how it ends.

usage: calls_test.py QLTYPES
"""

import json
import os
import pathlib
import pty
import subprocess
import sys
import tempfile
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
QLTYPES = sys.argv[1]
OUTER = ROOT / "examples/outer.json"

OUTER_TEXT = """\
Outer
  offset  size  element    type   notes
       0     1  x          int8
       1     7  (padding)
       8    64  y[2]       Inner  aligned to 8: not built-in, size 32
      72    32  z          Inner
  104 bytes, 7 of them padding; elements: 3 immediate, 7 flat, 16 raw, 12 depth-first

Inner
  offset  size  element  type
       0    24  a[3]     double
      24     8  b        complex single
  32 bytes, no padding; elements: 2 immediate, 2 flat, 5 raw, 3 depth-first

2 structures laid out
"""

OUTER_NODES = """\
  depth-first  flat    raw  immediate  offset  path
            0                               0  (the structure)
            1     0      0          0       0  x
            2                       1       8  y
            3                               8  y(0)
            4     1    1-3                  8  y(0).a
            5     2    4-5                 32  y(0).b
            6                              40  y(1)
            7     3    6-8                 40  y(1).a
            8     4   9-10                 64  y(1).b
            9                       2      72  z
           10     5  11-13                 72  z.a
           11     6  14-15                 96  z.b

"""


def run(*arguments, stdin=""):
    result = subprocess.run([QLTYPES, *map(str, arguments)], input=stdin, capture_output=True, text=True)
    return result.returncode, result.stdout, result.stderr


class Calls(unittest.TestCase):
    maxDiff = None

    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def write(self, name, text):
        path = self.folder / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_bytes(text.encode() if isinstance(text, str) else text)
        return path

    def assertBad(self, complaint, *arguments, stdin=""):
        """One line on standard error, nothing on standard output, 2."""
        self.assertEqual(run(*arguments, stdin=stdin), (2, "", complaint + "\n"))

    def assertBadCall(self, *arguments):
        code, out, complaint = run(*arguments)
        self.assertEqual((code, out), (2, ""))
        self.assertNotEqual(complaint, "")

    def test_help_and_version(self):
        for arguments, wanted in ((["--help"], "layout"), (["layout", "--help"], "Examples:"),
                                  (["--version"], "qltypes 0.")):
            with self.subTest(arguments=arguments):
                code, out, complaint = run(*arguments)
                self.assertEqual((code, complaint), (0, ""))
                self.assertIn(wanted, out)

    def test_bad_calls(self):
        for arguments in ([], ["layuot"], ["layout"], ["layout", "--yaml", OUTER], ["layout", OUTER, "--only"],
                          ["layout", OUTER, "--format", "yaml"], ["layout", OUTER, "--padding"],
                          ["layout", OUTER, "--format", "c", "--json"], ["layout", OUTER, "--format", "c", "--numberings"]):
            with self.subTest(arguments=arguments):
                self.assertBadCall(*arguments)

    def test_table(self):
        self.assertEqual(run("layout", OUTER), (0, OUTER_TEXT, ""))

    def test_standard_input(self):
        self.assertEqual(run("layout", "-", stdin=OUTER.read_text()), (0, OUTER_TEXT, ""))

    def test_only(self):
        code, out, _ = run("layout", OUTER, "--only", "Inner")
        self.assertEqual(code, 0)
        self.assertEqual(out, OUTER_TEXT[OUTER_TEXT.index("\nInner\n") + 1:].replace("2 structures", "1 structure"))
        self.assertBad("qltypes: --only: no structure 'Middle' was laid out", "layout", OUTER, "--only", "Inner,Middle")

    def test_json(self):
        code, out, complaint = run("layout", "--json", OUTER)
        self.assertEqual((code, complaint), (0, ""))
        document = json.loads(out)
        self.assertEqual(list(document), ["types", "structures", "refused", "summary"])
        self.assertEqual(document["summary"], {"numMessages": 0, "numStructures": 2, "numRefused": 0})
        outer = document["structures"][0]
        self.assertEqual(outer.pop("elements")[1], {
            "name": "y", "type": "Inner", "dimensions": [2], "complex": False, "sampling": "sample",
            "dimensionsMode": "fixed", "min": None, "max": None, "unit": None, "offset": 8, "size": 64, "padding": 0,
            "moved": {"from": 1, "alignment": 8, "reason": "aligned to 8: not built-in, size 32"}})
        self.assertEqual(outer, {
            "name": "Outer", "label": "Outer", "size": 104, "padding": 7, "numElements": 3, "numFlatElements": 7,
            "numRawElements": 16, "numDFSElements": 12})

    def test_numberings(self):
        code, out, complaint = run("layout", OUTER, "--numberings", "--only", "Outer")
        self.assertEqual((code, complaint), (0, ""))
        self.assertEqual(out, OUTER_TEXT[:OUTER_TEXT.index("Inner\n  offset")] + OUTER_NODES + "1 structure laid out\n")
        outer, inner = json.loads(run("layout", OUTER, "--numberings", "--json")[1])["structures"]
        self.assertEqual([node["path"] for node in inner["nodes"]], ["", "a", "b"])
        self.assertEqual(len(outer["nodes"]), outer["numDFSElements"])
        self.assertEqual(outer["nodes"][5], {
            "path": "y(0).b", "depthFirst": 5, "flat": 2, "raw": {"first": 4, "last": 5}, "immediate": None,
            "type": "single", "complex": True, "offset": 32, "width": 1,
            "parent": {"structure": "Inner", "element": 1}})

    def test_node(self):
        wanted = """\
Outer
  node         y(1).b
  depth-first  8
  flat         4
  raw          9-10
  immediate    none
  type         complex single
  offset       64
  width        1
  parent       Inner, its element 1
"""
        for node in ("8", "y(1).b"):
            with self.subTest(node=node):
                self.assertEqual(run("layout", OUTER, "--only", "Outer", "--node", node), (0, wanted, ""))
        nodes = json.loads(run("layout", OUTER, "--only", "Outer", "--numberings", "--json")[1])["structures"][0]["nodes"]
        for node in nodes:
            asked = [str(node["depthFirst"])] + ([node["path"]] if node["path"] else [])
            for text in asked:
                with self.subTest(text=text):
                    _, out, _ = run("layout", OUTER, "--only", "Outer", "--json", "--node", text)
                    self.assertEqual(json.loads(out), {"structure": "Outer", "node": node})

    def test_unknown_nodes(self):
        for node in ("y(2)", "y(0).c", "Outer", "", "12", "99999999999999999999", "0x1", "y( 1)"):
            with self.subTest(node=node):
                self.assertBad(f"qltypes: --node: Outer has no node '{node}'",
                               "layout", OUTER, "--only", "Outer", "--node", node)
        self.assertBad("qltypes: --node: 2 structures were laid out: name one with --only", "layout", OUTER, "--node", "0")
        self.assertBadCall("layout", OUTER, "--node", "0", "--numberings")

    def test_too_many_nodes(self):
        path = self.write("wide.json", json.dumps({"types": [
            {"name": "Cell", "elements": [{"name": "c", "type": "int8"}]},
            {"name": "Wide", "elements": [{"name": "w", "type": "Cell", "dimensions": [1000, 1000]}]}]}))
        for asked in (["--numberings"], ["--node", "1"]):
            with self.subTest(asked=asked):
                self.assertBad("qltypes: Wide has 2000002 nodes, more than the 1000000 that are numbered",
                               "layout", path, "--only", "Wide", *asked)

    def test_every_property_is_shown(self):
        _, out, _ = run("layout", ROOT / "examples/drive.json")
        self.assertEqual(out, """\
Types that are no structures
  type         size  kind
  sfix32_En20     4  number
  sfix16_En7      2  number
  sfix16_En5      2  number
  half            2  number
  ufix32_En16     4  number
  Speed           4  alias of sfix32_En20
  FaultLog       20  client

Drive
  offset  size  element         type            notes
       0     1  enabled         boolean
       1     3  (padding)
       4     4  speed           Speed           unit rad/s; min -157; max 157; aligned to 4: not built-in, size 4
       8    24  phases[3]       Phase
      32     4  position        ufix32_En16     unit rev
      36     4  (padding)
      40    20  fault           FaultLog        aligned to 8: not built-in, size 20
      60   128  spectrum[8][2]  complex single  frame based
     188     4  (padding)                       size rounded up to a multiple of 8
  192 bytes, 11 of them padding; elements: 6 immediate, 14 flat, 45 raw, 19 depth-first

Phase
  offset  size  element      type        notes
       0     2  current      sfix16_En7  unit A
       2     2  voltage      sfix16_En5  unit V
       4     2  temperature  half        unit degC
       6     2  (padding)                size rounded up to a multiple of 8
  8 bytes, 2 of them padding; elements: 3 immediate, 3 flat, 3 raw, 4 depth-first

2 structures laid out
""")

    def test_enumerations(self):
        path = self.write("gear.json", json.dumps({"types": [
            {"name": "Gear", "storage": "int8", "members": [{"name": "Reverse", "value": -1}, {"name": "Park", "value": 0}]},
            {"name": "Mode", "members": [{"name": "Off", "value": 0}]},
            {"name": "Lever", "elements": [{"name": "gear", "type": "Gear", "dimensions": [3]}, {"name": "mode", "type": "Mode"}]}]}))
        self.assertEqual(run("layout", path), (0, """\
Types that are no structures
  type  size  kind
  Gear     1  enumeration of int8: Reverse -1, Park 0
  Mode     4  enumeration of int32: Off 0

Lever
  offset  size  element    type  notes
       0     3  gear[3]    Gear
       3     1  (padding)
       4     4  mode       Mode  aligned to 4: not built-in, size 4
  8 bytes, 1 of them padding; elements: 2 immediate, 2 flat, 4 raw, 3 depth-first

1 structure laid out
""", ""))
        self.assertEqual(json.loads(run("layout", path, "--json")[1])["types"][0], {
            "name": "Gear", "kind": "enumeration", "aliasOf": None, "size": 1, "storage": "int8",
            "members": [{"name": "Reverse", "value": -1}, {"name": "Park", "value": 0}]})
        header = run("layout", path, "--format", "c")[1]
        self.assertIn("    int8_t gear[3];\n    int32_t mode;\n", header)

    def test_special_types(self):
        path = self.write("special.json", json.dumps({"types": [
            {"name": "Label", "string": 32}, {"name": "Text", "string": "dynamic"},
            {"name": "Curve", "matrix": {"of": "double", "rank": 2}},
            {"name": "Frame", "image": {"format": "RGB", "layout": "row", "base": "uint8", "channels": 3}},
            {"name": "Stamp", "dateTime": "utc"},
            {"name": "P", "elements": [{"name": "l", "type": "Label"}, {"name": "c", "type": "Curve"}]}]}))
        document = json.loads(run("layout", path, "--json")[1])
        self.assertEqual([(each["name"], each["kind"], each["aliasOf"]) for each in document["types"]], [
            ("Label", "string", "str32"), ("Text", "string", "string"), ("Curve", "matrix", "dynmat_double_2d_t"),
            ("Frame", "image", "Image_RGB_Row_uint8"), ("Stamp", "date-time", "utc")])
        sizes = {each["name"]: each["size"] for each in document["types"]}
        elements = document["structures"][0]["elements"]
        self.assertEqual([each["size"] for each in elements], [sizes["Label"], sizes["Curve"]])

    def test_checksum(self):
        path = self.write("sum.json", json.dumps({"types": [{"name": "P", "elements": [
            {"name": "pos", "type": "double", "dimensions": [3]},
            {"name": "iq", "type": "single", "complex": True},
            {"name": "m", "type": "int16", "dimensions": [2, 3]}]}]}))
        structure = json.loads(run("layout", path, "--checksum", "--json")[1])["structures"][0]
        texts = ["double:pos:[ 3 ];", "single:iq:[ 1 ]:complex;", "int16:m:[ 2 3 ];"]
        self.assertEqual(structure["checksum"]["descriptions"], texts)
        digest = structure["checksum"]["digest"]
        self.assertRegex(digest, "^[0-9a-f]{32}$")
        out = run("layout", path, "--checksum")[1]
        for text in texts + ["checksum " + digest]:
            self.assertIn(text, out)
        renamed = self.write("renamed.json", pathlib.Path(path).read_text().replace('"iq"', '"qi"'))
        other = json.loads(run("layout", renamed, "--checksum", "--json")[1])["structures"][0]
        self.assertNotEqual(other["checksum"]["digest"], digest)

    def test_messages(self):
        self.write("demo_msgs/msg/Stamped.msg", "time stamp\nuint8 flag\nint64 count\n")
        self.write("demo_msgs/msg/Named.msg", "Stamped s\nstring name\nfloat32[] values\nStamped[] all\n")
        self.write("demo_msgs/msg/Nothing.msg", "# no field\n")
        code, out, complaint = run("layout", self.folder / "demo_msgs/msg")
        self.assertEqual((code, complaint), (0, ""))
        self.assertEqual(out, """\
Types that are no structures
  type                           size  kind
  int64                             8  number
  string                            8  string
  dynmat_demo_msgs_Stamped_1d_t   104  matrix
  dynmat_single_1d_t              104  matrix

demo_msgs/Named
  offset  size  element  type
       0    24  s        demo_msgs/Stamped
      24     8  name     string
      32   104  values   dynmat_single_1d_t
     136   104  all      dynmat_demo_msgs_Stamped_1d_t
  240 bytes, no padding; elements: 4 immediate, 7 flat, 7 raw, 10 depth-first

demo_msgs/Stamped
  offset  size  element    type   notes
       0     8  stamp      time
       8     1  flag       uint8
       9     7  (padding)
      16     8  count      int64  aligned to 8: not built-in, size 8
  24 bytes, 7 of them padding; elements: 3 immediate, 4 flat, 4 raw, 6 depth-first

time
  offset  size  element  type
       0     4  sec      uint32
       4     4  nsec     uint32
  8 bytes, no padding; elements: 2 immediate, 2 flat, 2 raw, 3 depth-first

Messages that cannot be expressed
  message            why
  demo_msgs/Nothing  it has no fields

3 messages read, 2 laid out, 1 refused: 1 without fields
""")
        self.assertBad("qltypes: --only: demo_msgs/Nothing cannot be expressed: it has no fields",
                       "layout", self.folder / "demo_msgs/msg", "--only", "demo_msgs/Nothing")

    def test_dimension_facts(self):
        facts = self.write("facts.dims", "block Filter\ngreater frame, taps\nequal frame, size\nrange? taps\n")
        self.assertEqual(run("layout", OUTER, facts), (0, OUTER_TEXT.replace("2 structures", f"""\
Known of dimensions: {facts}
  fact           stated by
  frame == size  Filter
  frame > taps   Filter

2 structures"""), ""))
        self.assertEqual(json.loads(run("layout", OUTER, facts, "--json")[1])["dimensions"], [
            {"source": str(facts), "facts": [{"expression": "frame == size", "blocks": ["Filter"]},
                                             {"expression": "frame > taps", "blocks": ["Filter"]}]}])
        self.assertNotIn("dimensions", json.loads(run("layout", OUTER, "--json")[1]))
        for text, complaint in (("greater a, b\ngreater b, a\n", "2:1: refused: b cannot be greater than a"),
                                ("greater a,\n", "1:"), ("grater a, b\n", "1:1: there is no statement 'grater'")):
            with self.subTest(text=text):
                bad = self.write("bad.dims", text)
                code, out, said = run("layout", OUTER, bad)
                self.assertEqual((code, out, said.count("\n")), (2, "", 1))
                self.assertTrue(said.startswith(f"{bad}:{complaint}"), said)

    def test_real_messages(self):
        folders = [f"/usr/share/{package}_msgs/msg" for package in ("std", "geometry", "sensor", "nav")]
        code, out, _ = run("layout", *folders)
        self.assertEqual(code, 0)
        summary = "102 messages read, 96 laid out, 6 refused: 3 without fields, 3 containing a refused one\n"
        self.assertTrue(out.endswith(summary), out[-200:])
        self.assertIn(f"`./run` ends with\n\n```\n{summary}```\n", (ROOT / "README.md").read_text())

    def test_unreadable_inputs(self):
        absent = self.folder / "absent.json"
        self.assertBad(f"{absent}: cannot be read: No such file or directory", "layout", absent)
        message = self.folder / "p/msg/Absent.msg"
        self.assertBad(f"{message}: cannot be read: No such file or directory", "layout", message)
        self.assertBad(f"{self.folder}: the folder has no .msg files", "layout", self.folder)

    def test_nothing_is_printed_of_the_good_inputs_before_a_bad_one(self):
        bad = self.write("bad.json", '{"types": [\n  {"name": "P", "size": 0}\n]}')
        self.assertBad(f"{bad}: /types/0/size: must be a whole number from 1 to 2147483647, not 0", "layout", OUTER, bad)

    def test_types_of_several_inputs_share_one_table(self):
        more = self.write("more.json", '{"types": [{"name": "More", "elements": [{"name": "o", "type": "Outer"}]}]}')
        code, out, _ = run("layout", more, OUTER, "--only", "More")
        self.assertEqual(code, 0)
        self.assertIn("104  o", out)
        self.assertBad(f"{more}: /types/0/elements/0/type: unknown type 'Outer'", "layout", more)
        self.assertBad(f"{OUTER}: /types/0: 'Outer' is described already at {OUTER}: /types/0", "layout", OUTER, OUTER)

    def test_garbage(self):
        for name, content in (("a.json", bytes(range(256)) * 40), ("b.json", b"\0" * 4096), ("p/msg/C.msg", b"\xff\xfe\0")):
            with self.subTest(name=name):
                path = self.write(name, content)
                code, out, complaint = run("layout", path)
                self.assertEqual((code, out), (2, ""))
                self.assertTrue(complaint.startswith(f"{path}:1:1: "), complaint)
                self.assertEqual(complaint.count("\n"), 1)

    def test_a_thousand_deep(self):
        brackets = self.write("brackets.json", '{"types": ' + "[" * 1000 + "]" * 1000 + "}")
        self.assertBad(f"{brackets}: /types/0: must be an object, not an array", "layout", brackets)
        chain = [{"name": f"T{i}", "elements": [{"name": "x", "type": f"T{i + 1}" if i < 999 else "int8"}]}
                 for i in range(1000)]
        path = self.write("chain.json", json.dumps({"types": chain}))
        code, out, complaint = run("layout", "--json", path)
        self.assertEqual((code, complaint), (0, ""))
        self.assertEqual({structure["size"] for structure in json.loads(out)["structures"]}, {8})

    def test_too_large(self):
        path = self.write("large.json", json.dumps({"types": [{"name": "P", "elements": [
            {"name": "x", "type": "double", "dimensions": [2147483647], "complex": True}]}]}))
        code, out, complaint = run("layout", path)
        self.assertEqual((code, out, complaint.count("\n")), (2, "", 1))
        self.assertTrue(complaint.startswith(f"{path}: /types/0: "), complaint)

    def test_full_output(self):
        with open("/dev/full", "w") as full:
            result = subprocess.run([QLTYPES, "layout", OUTER], stdout=full, stderr=subprocess.PIPE, text=True)
        self.assertEqual(result.returncode, 2)
        self.assertEqual(result.stderr, "standard output: No space left on device\n")

    def test_colours_on_a_terminal_only(self):
        self.assertNotIn("\x1b", run("layout", OUTER)[1])
        ours, theirs = pty.openpty()
        with subprocess.Popen([QLTYPES, "layout", OUTER], stdout=theirs) as process:
            os.close(theirs)
            shown = b""
            try:
                while chunk := os.read(ours, 4096):
                    shown += chunk
            except OSError:  # the other side is closed
                pass
            self.assertEqual(process.wait(), 0)
        os.close(ours)
        self.assertIn(b"\x1b[1mOuter\x1b[0m", shown)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
