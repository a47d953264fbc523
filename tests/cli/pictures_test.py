"""Pictures of structures: well-formed, true to the layout, legible, and the committed one is what the command draws.

usage: pictures_test.py QLTYPES
"""

import json
import pathlib
import re
import subprocess
import sys
import unittest
import xml.etree.ElementTree as ElementTree

ROOT = pathlib.Path(__file__).resolve().parents[2]
QLTYPES = sys.argv[1]
SVG = "{http://www.w3.org/2000/svg}"
BYTE_WIDTH, ROW_HEIGHT = 72, 38
MESSAGES = [f"/usr/share/{package}_msgs/msg" for package in ("std", "geometry", "sensor", "nav")]
CHARACTER = {"name": 7.25, "type": 6.35, "gap-text": 6.35, "line-name": 6.35}  # width in a monospaced font


def run(*arguments, stdin=""):
    result = subprocess.run([QLTYPES, *map(str, arguments)], input=stdin, capture_output=True, text=True)
    return result.returncode, result.stdout, result.stderr


def rectangles(path):
    """Corners of an outline: what "M.. ..H..V..Z" goes through."""
    x = y = None
    corners = []
    for command, numbers in re.findall(r"([MHVZ])([^MHVZ]*)", path):
        if command == "M":
            x, y = map(float, numbers.split())
        elif command == "H":
            x = float(numbers)
        elif command == "V":
            y = float(numbers)
        corners.append((x, y))
    return corners


def area(corners):
    pairs = zip(corners, corners[1:] + corners[:1])
    return abs(sum(ax * by - bx * ay for (ax, ay), (bx, by) in pairs)) / 2


def luminance(colour):
    channels = [int(colour[i : i + 2], 16) / 255 for i in (1, 3, 5)]
    red, green, blue = (c / 12.92 if c <= 0.03928 else ((c + 0.055) / 1.055) ** 2.4 for c in channels)
    return 0.2126 * red + 0.7152 * green + 0.0722 * blue


def contrast(one, other):
    dark, light = sorted((luminance(one), luminance(other)))
    return (light + 0.05) / (dark + 0.05)


class Pictures(unittest.TestCase):
    maxDiff = None

    def draw(self, *arguments, stdin=""):
        code, out, complaint = run("layout", *arguments, "--format", "svg", stdin=stdin)
        self.assertEqual((code, complaint), (0, ""))
        return out, ElementTree.fromstring(out)

    def test_committed_picture(self):
        out, _ = self.draw(ROOT / "examples/drive.json")
        self.assertEqual(out, (ROOT / "docs/guide/pictures/drive.svg").read_text(),
                         "write it anew: qltypes layout examples/drive.json --format svg > docs/guide/pictures/drive.svg")

    def test_blocks_are_the_elements(self):
        """Each element is drawn once, as large as it is, at its place, and the padding behind it too."""
        code, out, _ = run("layout", ROOT / "examples/drive.json", "--only", "Phase", "--json")
        elements = json.loads(out)["structures"][0]["elements"]
        wanted = {}
        for element in elements:
            wanted[f"{element['name']}: {element['type']}"] = (element["offset"], element["size"])
            if element["padding"]:
                wanted["(padding)"] = (element["offset"] + element["size"], element["padding"])
        _, picture = self.draw(ROOT / "examples/drive.json", "--only", "Phase")
        cells = {}
        for group in picture.iter(SVG + "g"):
            about = group.find(SVG + "title").text.split("\n")
            corners = rectangles(group.find(SVG + "path").get("d"))
            cells[about[0]] = (about[1], min(corners)[0], area(corners))
        left = min(x for _, x, _ in cells.values())
        self.assertEqual({name: (f"offset {offset}, {size} byte{'s' if size > 1 else ''}", left + offset * BYTE_WIDTH,
                                 size * BYTE_WIDTH * ROW_HEIGHT) for name, (offset, size) in wanted.items()}, cells)

    def test_area_is_the_size(self):
        """Where nothing is left out, leaves and padding together are as large as the structure, and none is beyond it."""
        for structure, size in (("Outer", 104), ("Inner", 32)):
            with self.subTest(structure=structure):
                _, picture = self.draw(ROOT / "examples/outer.json", "--only", structure)
                shapes = [rectangles(group.find(SVG + "path").get("d")) for group in picture.iter(SVG + "g")
                          if group.find(SVG + "path") is not None]
                self.assertEqual(sum(map(area, shapes)), size * BYTE_WIDTH * ROW_HEIGHT)
                width, height = float(picture.get("width")), float(picture.get("height"))
                for x, y in sum(shapes, []):
                    self.assertTrue(0 <= x <= width and 0 <= y <= height, (x, y))

    def test_cache_lines(self):
        text, _ = self.draw(ROOT / "examples/outer.json", "--only", "Outer")
        self.assertEqual(re.findall(r">(lines? [^<]*)<", text), ["line 0", "line 1"])
        text, _ = self.draw(ROOT / "examples/drive.json", "--only", "Drive")
        self.assertEqual(re.findall(r">(lines? [^<]*)<", text), ["line 0", "line 1", "line 2"])

    def test_texts_stay_in_their_boxes(self):
        """Of every message there is; names that are cut are told in full below."""
        out, picture = self.draw(*MESSAGES)
        width = float(picture.get("width"))
        for group in picture.iter(SVG + "g"):
            shape = group.find(SVG + "path")
            nest = group.find(SVG + "rect")
            if shape is not None:
                right = max(x for x, _ in rectangles(shape.get("d")))
            else:
                right = float(nest.get("x")) + float(nest.get("width"))
            for text in group.iter(SVG + "text"):
                end = float(text.get("x")) + len(text.text) * CHARACTER[text.get("class")]
                self.assertLessEqual(end, right, text.text)
        for text in picture.iter(SVG + "text"):
            if text.get("class") in ("line-name", "note", "about"):
                self.assertLessEqual(float(text.get("x")) + len(text.text) * 6.35, width, text.text)
        self.assertIn(">do_rec\u2026<", out)
        self.assertIn(">at 16: do_rectify, boolean<", out)

    def test_nothing_is_fetched(self):
        out, _ = self.draw(ROOT / "examples/drive.json")
        self.assertEqual(re.findall(r"https?:[^\"]*", out), ["http://www.w3.org/2000/svg"])
        self.assertNotIn("<script", out)

    def test_markup_in_texts(self):
        evil = "</title><script>alert(1)</script>&\"'"
        out, picture = self.draw("-", stdin=json.dumps({"types": [
            {"name": "P", "elements": [{"name": "x", "type": "double", "unit": evil}]}]}))
        self.assertNotIn("<script", out)
        self.assertIn("unit " + evil, picture.find(f".//{SVG}g/{SVG}title").text)

    def test_twenty_thousand_elements(self):
        description = json.dumps({"types": [{"name": "Wide", "elements": [
            {"name": f"e{i}", "type": "double"} for i in range(20000)]}]})
        out, _ = self.draw("-", stdin=description)
        self.assertIn("18000 more elements", out)
        self.assertLess(len(out), 1_500_000)

    def test_contrast(self):
        """Texts on every ground, in light and in dark."""
        style = (ROOT / "tools/qltypes/picture/map.css").read_text()
        light, dark = style.split("@media screen and (prefers-color-scheme: dark)")
        grounds = ("ground", "float", "integer", "boolean", "fixed-point", "enumeration", "structure", "other", "nest",
                   "nest-1", "padding", "unused")
        for scheme in (light, dark):
            colours = {}
            for selectors, body in re.findall(r"([^{}]+)\{([^{}]*)\}", scheme):
                for selector in selectors.split(","):
                    if fill := re.search(r"fill: (#[0-9a-f]{6})", body):
                        colours[selector.strip().lstrip(".")] = fill[1]
            for ground in grounds:
                for text in ("text", "type"):
                    with self.subTest(ground=ground, text=text):
                        self.assertGreaterEqual(contrast(colours[ground], colours[text]), 4.5)

    def test_contrast_of_the_page(self):
        style = (ROOT / "tools/qltypes/picture/page/page.css").read_text()
        light, dark = re.findall(r":root \{([^}]*)\}", style)
        grounds = ("ground", "panel", "chosen", "float", "integer", "boolean", "fixed-point", "enumeration", "structure",
                   "other", "nest", "mark")
        for scheme in (light, dark):
            colours = dict(re.findall(r"--([\w-]+): (#[0-9a-f]{6})", scheme))
            for ground in grounds:
                for text in ("text",) if ground == "mark" else ("text", "dim"):
                    with self.subTest(ground=ground, text=text):
                        self.assertGreaterEqual(contrast(colours[ground], colours[text]), 4.5)
            for ground in ("ground", "panel"):
                self.assertGreaterEqual(contrast(colours[ground], colours["accent"]), 4.5)

    def test_bad_calls(self):
        outer = ROOT / "examples/outer.json"
        for arguments in (["--format", "svg", "--json"], ["--format", "svg", "--numberings"],
                          ["--format", "svg", "--node", "0"]):
            with self.subTest(arguments=arguments):
                self.assertEqual(run("layout", outer, *arguments)[:2], (2, ""))
        self.assertEqual(run("layout", outer, "--format", "svg", "--padding"),
                         (2, "", "qltypes: --padding: only with --format c\n"))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
