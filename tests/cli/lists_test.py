"""Scales of time, the fixed types, the catalogue and the flags.

usage: lists_test.py QLTYPES
"""

import json
import subprocess
import sys
import unittest

QLTYPES = sys.argv[1]


def run(*arguments):
    result = subprocess.run([QLTYPES, *arguments], capture_output=True, text=True)
    return result.returncode, result.stdout, result.stderr


def read(*arguments):
    return json.loads(run(*arguments, "--json")[1])


class Lists(unittest.TestCase):
    def test_scales(self):
        self.assertEqual([(t["name"], t["epoch"], t["storage"]) for t in read("time")["types"]], [
            ("tai", "1970-01-01T00:00:00", "sfix128_En64"), ("gps", "1980-01-06T00:00:19", "sfix128_En64"),
            ("utc", "1972-01-01T00:00:00", "sfix128_En64"), ("posix", "1972-01-01T00:00:00", "uint32"),
            ("jd", "1582-10-15T00:00:00", "double"), ("mjd", "1858-11-17T00:00:00", "double")])

    def test_one_system(self):
        self.assertEqual(run("time", "--scale", "gps", "--epoch", "2000-01-01T12:00", "--storage", "double"), (0, """\
gpse2000-01-01T12:00:00L1980-01-06T00:00:19H145000000000-01-01T00:00:00double
  scale    gps
  epoch    2000-01-01T12:00:00
  first    1980-01-06T00:00:19
  last     145000000000-01-01T00:00:00
  storage  double
""", ""))
        self.assertEqual(run("time", "--zone", "-3:30"), (0, "-03:30: -12600 seconds\n", ""))

    def test_what_is_wrong_with_a_time(self):
        for arguments, complaint in (
                (("--scale", "gps", "--epoch", "1700-01-01"),
                 "--epoch: epoch 1700-01-01T00:00:00 of scale gps lies outside 1980-01-06T00:00:19 to"
                 " 145000000000-01-01T00:00:00"),
                (("--scale", "utc", "--range", "2010-01-01", "2009-01-01"), "--range: the range ends before it starts"),
                (("--scale", "utc", "--epoch", "now"), "--epoch: 'now' is no time such as 1980-01-06T00:00:00"),
                (("--scale", "utc", "--epoch", "2000-13-01"),
                 "--epoch: '2000-13-01': a field of the time is out of its range or is no whole number"),
                (("--scale", "ut1"), "--scale: 'ut1' is none of tai, gps, utc, posix, jd, mjd"),
                (("--epoch", "2000-01-01"), "--epoch, --range and --storage need a --scale"),
                (("--zone", "15:00"), "--zone: '15:00': hours and minutes are no time zone")):
            with self.subTest(arguments=arguments):
                self.assertEqual(run("time", *arguments), (2, "", f"qltypes: {complaint}\n"))

    def test_fixed_types(self):
        types = read("table")["types"]
        self.assertEqual([t["id"] for t in types], list(range(-1, 14)))
        self.assertEqual(types[3], {"id": 2, "name": "int8", "size": 1, "kind": "built-in"})
        self.assertIn("13  timer_uint32_pair     8  predefined\n", run("table")[1])

    def test_messages(self):
        messages = read("messages")["messages"]
        self.assertGreater(len(messages), 50)
        self.assertEqual(read("messages", "invalidtimeepoch")["messages"], [{
            "category": "Quillane:DateTime", "leaf": "InvalidTimeEpoch", "arguments": ["wide text"] * 4,
            "text": "epoch {3} of scale {0} lies outside {1} to {2}"}])
        self.assertEqual(run("messages", "no such thing"), (2, "", "qltypes: no message contains 'no such thing'\n"))

    def test_flags(self):
        flags = read("flags")
        self.assertEqual({f["name"]: f["state"] for f in flags["features"]}["QLInt64"], 4)
        self.assertEqual([h["name"] for h in flags["hooks"]], ["DisplayDynamicMatrixType", "ImageTypeImplementation"])
        self.assertIn("Testing hooks\n", run("flags")[1])


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
