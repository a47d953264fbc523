"""Number types and conversions: what is printed where, and how the command ends.

usage: convert_test.py QLTYPES
"""

import array
import json
import subprocess
import sys
import unittest

QLTYPES = sys.argv[1]


def run(*arguments, stdin=b""):
    """Exit code, standard output as bytes, complaints."""
    result = subprocess.run([QLTYPES, *arguments], input=stdin, capture_output=True)
    return result.returncode, result.stdout, result.stderr.decode()


class Type(unittest.TestCase):
    maxDiff = None

    def test_fixed_point(self):
        self.assertEqual(run("type", "sfix16_En7"), (0, b"""\
sfix16_En7
  mode         fixed point
  signedness   signed
  word length  16 bits
  fraction     7 bits
  slope        2^-7
  bias         0
  range        -256 to 255.9921875
  resolution   0.0078125
  identifier   sfix16_En7
  constructor  fixdt(1,16,7)
               fixdt(1,16,0.0078125,0)
""", ""))

    def test_json(self):
        types = json.loads(run("type", "--json", "-", stdin=b"uint64\nfixdt(0,8,1.5,2)\n\nhalf\nfixdt([],8)\n")[1])["types"]
        self.assertEqual([(t["identifier"], t["min"], t["max"], t["resolution"]) for t in types], [
            ("uint64", "0", "18446744073709551615", "1"), ("ufix8_S1p5_B2", "2", "384.5", "1.5"),
            ("half", "-65504", "65504", "0.0009765625"), ("uint8", None, None, "1")])
        self.assertEqual(list(types[0]), [
            "text", "mode", "signedness", "wordLength", "exponentLength", "slopeAdjustmentFactor", "fixedExponent",
            "bias", "overrideOff", "valid", "min", "max", "resolution", "identifier", "constructor",
            "constructorSlopeBias"])

    def test_bad_texts(self):
        for text, complaint in (
                ("bogus", "'bogus' is no identifier of a number type"),
                ("fixdt(1,99999999999)", "a number in 'fixdt(1,99999999999)' is no whole number of 32 bits"),
                ("a\nb", "'a?b' is no identifier of a number type")):
            with self.subTest(text=text):
                self.assertEqual(run("type", "int8", text), (2, b"", f"qltypes: {complaint}\n"))
        self.assertEqual(run("type", "-", stdin=b"int8\n\nx\n"),
                         (2, b"", "qltypes: (standard input):3: 'x' is no identifier of a number type\n"))


class Convert(unittest.TestCase):
    maxDiff = None

    def test_losses_are_counted_and_shown(self):
        self.assertEqual(run("convert", "--from", "double", "--to", "int8", "--rounding", "floor", "--overflow",
                             "saturate", "--", "-128.9", "127.9", "nan", "inf"), (1, b"-128\n127\n0\n127\n", """\
qltypes: 4 of 4 values were lost: 2 by overflow, 1 by precision, 1 no numbers
  [0] -128.9 became -128: overflow
  [1] 127.9 became 127: precision
  [2] nan became 0: nan
  [3] inf became 127: overflow
"""))

    def test_every_mode(self):
        for rounding, wanted in (("zero", b"-1 2"), ("half-up", b"-1 3"), ("ceiling", b"-1 3"), ("floor", b"-2 2"),
                                 ("as-zero", b"-1 2"), ("half-away", b"-2 3"), ("half-even", b"-2 2")):
            with self.subTest(rounding=rounding):
                code, out, _ = run("convert", "--from", "single", "--to", "int8", "--rounding", rounding, "--", "-1.5",
                                   "2.5")
                self.assertEqual((code, out.split()), (1, wanted.split()))
        self.assertEqual(run("convert", "--from", "int16", "--to", "uint8", "--overflow", "wrap", "258")[:2], (1, b"2\n"))

    def test_nothing_lost(self):
        self.assertEqual(run("convert", "--from", "double", "--to", "int8", stdin=b"1 2\n +3"), (0, b"1\n2\n3\n", ""))
        self.assertEqual(run("convert", "--from", "boolean", "--to", "single", "true", "0"), (0, b"1\n0\n", ""))

    def test_json(self):
        code, out, _ = run("convert", "--json", "--from", "double", "--to", "single", "--", "0.5", "1e300")
        self.assertEqual((code, json.loads(out)), (1, {
            "values": [0.5, "inf"], "from": "double", "to": "single", "rounding": "zero", "overflow": "saturate",
            "numValues": 2, "numOverflowed": 1, "numLostPrecision": 0, "numNaN": 0,
            "first": [{"position": 1, "from": "1e+300", "to": "inf", "loss": "overflow"}]}))
        self.assertEqual(json.loads(run("convert", "--json", "--from", "int8", "--to", "int8")[1])["values"], [])

    def test_prediction(self):
        self.assertEqual(run("convert", "--predict", "--from", "double", "--to", "int16", "40000", "3.5"),
                         (1, b"1 of 2 values would overflow\n  [0] 40000 would become 32767\n", ""))
        self.assertEqual(run("convert", "--predict", "--from", "double", "--to", "int16", "3.5")[0], 0)

    def test_large_raw_stream(self):
        source = array.array("d", range(100)) * 10_000  # 8 MB
        source[123_456] = 1000.0
        source[999_999] = 0.5
        code, out, complaint = run("convert", "--raw", "--json", "--from", "double", "--to", "uint8",
                                   stdin=source.tobytes())
        wanted = bytearray(bytes(range(100)) * 10_000)
        wanted[123_456], wanted[999_999] = 255, 0
        self.assertTrue(out == wanted)
        report = json.loads(complaint)
        self.assertEqual((code, report["numValues"], report["numOverflowed"], report["numLostPrecision"]),
                         (1, 1_000_000, 1, 1))
        self.assertEqual([loss["position"] for loss in report["first"]], [123_456, 999_999])

    def test_large_text_stream(self):
        text = "".join(f"{i % 1000}\n" for i in range(200_000)).encode()  # values lie across the chunks that are read
        self.assertEqual(run("convert", "--from", "int32", "--to", "int16", stdin=text), (0, text, ""))

    def test_only_the_first_losses_are_shown(self):
        code, _, complaint = run("convert", "--from", "int16", "--to", "int8", stdin=b"300 " * 25)
        self.assertEqual((code, complaint.count("\n")), (1, 12))
        self.assertTrue(complaint.endswith("  and 15 more\n"), complaint)

    def test_bad_input(self):
        to_int8 = ("convert", "--from", "int8", "--to", "int8")
        for arguments, stdin, complaint in (
                ((*to_int8, "1", "x"), b"", "value 1: 'x' is no value of int8"),
                ((*to_int8, "300"), b"", "value 0: '300' is out of the range of int8"),
                (to_int8, b"1\n  2x", "(standard input):2:3: '2x' is no value of int8"),
                (to_int8, b"9" * 5000, "(standard input):1:1: a value of more than 4096 characters"),
                (("convert", "--from", "uint8", "--to", "int8", "--", "-1"), b"",
                 "value 0: '-1' is out of the range of uint8"),
                (("convert", "--raw", "--from", "double", "--to", "int8"), b"abc",
                 "(standard input): ends inside of a value, 3 bytes into it"),
                ((*to_int8, "--raw", "1"), b"", "--raw reads standard input and takes no values"),
                (("convert", "--from", "int64", "--to", "int8", "1"), b"", "--from: 'int64' is no built-in type"),
                ((*to_int8, "--overflow", "clip", "1"), b"", "--overflow: 'clip' is none of wrap, saturate")):
            with self.subTest(arguments=arguments):
                self.assertEqual(run(*arguments, stdin=stdin), (2, b"", f"qltypes: {complaint}\n"))

    def test_bad_calls(self):
        for arguments in (["type"], ["convert"], ["convert", "--from", "int8"], ["convert", "--yaml"]):
            with self.subTest(arguments=arguments):
                code, out, complaint = run(*arguments)
                self.assertEqual((code, out), (2, b""))
                self.assertNotEqual(complaint, "")


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
