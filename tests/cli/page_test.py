"""The page of a table in a real browser, from a file, without a network.

usage: page_test.py QLTYPES
"""

import json
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

from browser import Browser

ROOT = pathlib.Path(__file__).resolve().parents[2]
QLTYPES = sys.argv[1]
EVIL = "</script><script>document.title = 'taken'</script><img src=x onerror=\"document.title = 'taken'\">&'"
DOWN, RIGHT, LEFT, ENTER, ESCAPE = "\ue015", "\ue014", "\ue012", "\ue007", "\ue00c"

ENTRY = "[...document.querySelectorAll('#tree .entry')].find((each) => each.querySelector('.name')?.innerText === arguments[0])"
SELECTED = "return [...document.querySelectorAll('#map .part.selected b')].map((each) => each.innerText)"


def run(*arguments, stdin=""):
    return subprocess.run([QLTYPES, "layout", *map(str, arguments)], input=stdin, capture_output=True, text=True, check=True).stdout


def element(name, type, *dimensions, **more):
    return {"name": name, "type": type, **({"dimensions": list(dimensions)} if dimensions else {}), **more}


GRID = [
    {"name": "Cell", "elements": [element("id", "uint8"), element("level", "Level", unit=EVIL), element("samples", "int16", 3, 2),
                                  element("mode", "Mode")]},
    {"name": "Row", "elements": [element("cells", "Cell", 5), element("one", "Cell", 1, 1), element("n", "single", complex=True)]},
    {"name": "Grid", "elements": [element("rows", "Row", 100), element("image", "uint8", 640, 480),
                                  element("last", "boolean", 3), element("pair", "Pair", 2), element("label", "Label")]},
    {"name": "Pair", "alias": "Cell"},
    {"name": "Level", "alias": "sfix32_En20"},
    {"name": "Label", "string": 32},
    {"name": "Mode", "storage": "int8", "members": [{"name": "Off", "value": 0}, {"name": "On", "value": 3}]},
]


class Page(unittest.TestCase):
    maxDiff = None

    @classmethod
    def setUpClass(cls):
        folder = tempfile.TemporaryDirectory()
        cls.addClassCleanup(folder.cleanup)
        cls.folder = pathlib.Path(folder.name)
        cls.browser = Browser()
        cls.addClassCleanup(cls.browser.__exit__)
        cls.browser.__enter__()

    def open(self, types, hash="", *arguments):
        """The page of some types, or of inputs, in the browser."""
        stdin = "" if isinstance(types, tuple) else json.dumps({"types": types})
        inputs = types if isinstance(types, tuple) else ("-",)
        path = self.folder / f"{self._testMethodName}.html"
        path.write_text(run(*inputs, "--format", "html", *arguments, stdin=stdin))
        self.browser.open("about:blank")
        self.browser.open(f"{path.as_uri()}{hash}")
        self.addCleanup(lambda: self.assertEqual(self.browser.complaints(), []))

    def click_entry(self, name, part=".name"):
        self.browser.run(f"{ENTRY}.querySelector(arguments[1]).click()", name, part)

    def visible(self):
        return self.browser.texts("#tree .entry .name")

    def test_nothing_but_the_file_is_needed(self):
        page = run(ROOT / "examples/drive.json", "--format", "html")
        self.assertEqual(set(re.findall(r"https?:[^\"]*", page)), {"http://www.w3.org/2000/svg"})  # a name
        self.assertIn("default-src 'none'", page)
        self.open((ROOT / "examples/drive.json",))
        self.assertEqual(self.browser.run("return performance.getEntriesByType('resource').length"), 0)
        self.assertEqual(self.browser.text("#title"), "drive.json")
        self.assertEqual(self.browser.text("#name"), "Drive")
        self.assertEqual(self.browser.text("#sentence"), "192 bytes, 11 of them padding; 3 cache lines")

    def test_expand_and_select(self):
        self.open(GRID, "#Grid")
        self.assertNotIn("rows[100]", self.visible())
        self.click_entry("Grid", ".twisty")
        self.click_entry("rows[100]", ".twisty")
        self.click_entry("rows(1)", ".twisty")
        self.assertIn("cells[5]", self.visible())
        self.click_entry("n")
        self.assertEqual(self.browser.text("#name"), "rows(1).n")
        self.assertEqual(self.browser.run(SELECTED), ["n"])
        node = json.loads(run("-", "--only", "Grid", "--node", "rows(1).n", "--json", stdin=json.dumps({"types": GRID})))["node"]
        facts = dict(zip(self.browser.texts("#facts dt"), self.browser.texts("#facts dd")))
        self.assertEqual(facts, {"offset": str(node["offset"]), "size": "8 bytes", "depth-first": str(node["depthFirst"]),
                                 "flat": str(node["flat"]), "raw": f"{node['raw']['first']}\u2013{node['raw']['last']}"})
        self.click_entry("rows(1)", ".twisty")
        self.assertNotIn("cells[5]", self.visible())
        self.assertEqual(self.browser.run("return location.hash"), "#Grid:rows(1).n")

    def test_keyboard(self):
        self.open(GRID, "#Cell")
        self.browser.type("#tree", RIGHT + DOWN + DOWN + ENTER)
        self.assertEqual(self.browser.text("#name"), "level")
        self.browser.type("#tree", LEFT + LEFT)
        self.assertNotIn("level", self.visible())

    def test_search(self):
        self.open(GRID, "#Grid")
        self.browser.type("#search", "cells(4).samples")
        self.browser.wait("return document.querySelector('#found').innerText === '101 results'")
        self.browser.type("#search", ENTER)
        self.assertEqual(self.browser.text("#name"), "cells(4).samples")  # the first is the one of Row
        self.browser.run("document.querySelector('#search').value = ''")
        self.browser.type("#search", "Rows(73) SAMPLES cells(4)")
        self.browser.wait("return document.querySelector('#found').innerText === '1 result'")
        self.assertEqual("".join(self.browser.texts("#tree .entry .name")), "rows(73).cells(4).samples")
        self.assertEqual(set(self.browser.texts("#tree mark")), {"rows(73)", "samples", "cells(4)"})
        self.browser.type("#search", ENTER)
        self.assertEqual(self.browser.text("#name"), "rows(73).cells(4).samples")
        self.assertEqual(self.browser.run(SELECTED), ["samples[3][2]"])
        self.browser.type("#search", ESCAPE)
        self.browser.wait("return document.querySelector('#found').innerText === ''")
        self.assertIn("cells(4)", self.visible())  # the tree is open where the node is
        self.assertEqual(self.browser.texts("#tree .chosen .name"), ["samples[3][2]"])

    def test_nodes_are_those_of_the_library(self):
        """Every number, offset and path that the page finds by itself."""
        self.open(GRID)
        wanted = json.loads(run("-", "--numberings", "--json", stdin=json.dumps({"types": GRID})))["structures"]
        found = self.browser.run("""return model.structures.map((structure) => {
            const nodes = [];
            for (let i = 0; i < structure.numDepthFirst; ++i) {
                const node = model.node(structure, i);
                nodes.push([node.path, node.flat ?? null, node.raw ?? null, node.immediate ?? null, node.offset, node.width,
                    model.find(structure, node.path).depthFirst]);
            }
            return nodes;
        })""")
        self.assertEqual(len(found), 3)
        for structure, nodes in zip(wanted, found):
            self.assertEqual([[node["path"], node["flat"], node["raw"] and [node["raw"]["first"], node["raw"]["last"]],
                               node["immediate"], node["offset"], node["width"], node["depthFirst"]]
                              for node in structure["nodes"]], nodes)

    def test_numberings_and_map_of_real_messages(self):
        folders = tuple(f"/usr/share/{package}_msgs/msg" for package in ("std", "geometry", "sensor", "nav"))
        self.open(folders, "#nav_msgs%2FOccupancyGrid:info.origin.position")
        self.assertEqual(self.browser.run(SELECTED), ["x", "y", "z"])
        self.assertEqual(self.browser.texts("#map .nest.selected.starts b"), ["position"])
        self.browser.click("#tab-numbers")
        self.assertEqual(self.browser.texts("#numbers .chosen span"),
                         ["15", "", "", "", "48", "geometry_msgs/Point", "info.origin.position"])
        self.browser.run("document.querySelector('#numbers [data-node=\"16\"]').click()")
        self.assertEqual(self.browser.text("#name"), "info.origin.position.x")
        self.browser.click("#tab-types")
        types = self.browser.texts("#types tbody td:first-child")
        self.assertIn("geometry_msgs/Quaternion", types)
        self.assertEqual(len(types), len(set(types)))
        self.click_entry("duration")
        self.assertEqual(self.browser.text("#name"), "duration")
        self.assertIn("6 messages that cannot be expressed", self.browser.text("#summary"))

    def test_types(self):
        self.open(GRID, "#Mode")
        self.assertEqual(self.browser.texts("#types tbody")[0].split(), ["Off", "0", "On", "3"])
        self.assertEqual(self.browser.texts("#types tbody")[1].split(), ["Cell", "mode"])
        self.browser.run("document.querySelectorAll('#types .link')[1].click()")
        self.assertEqual(self.browser.text("#name"), "mode")
        self.assertEqual(self.browser.run("return tab"), "map")
        self.open(GRID, "#Level")
        self.assertEqual(self.browser.text("#sentence"), "alias of sfix32_En20")

    def test_map_follows_the_bytes(self):
        """Each row of a map: which leaf or padding has each byte."""
        self.open(GRID)
        description = json.dumps({"types": GRID})
        for structure in json.loads(run("-", "--json", stdin=description))["structures"]:
            if structure["name"] == "Grid":
                continue
            nodes = json.loads(run("-", "--numberings", "--json", "--only", structure["name"], stdin=description))
            sizes = {"uint8": 1, "Level": 4, "int16": 2, "Mode": 1, "single": 4}
            owners = [None] * structure["size"]
            for node in nodes["structures"][0]["nodes"]:
                if node["flat"] is None:
                    continue
                size = sizes[node["type"]] * node["width"] * (2 if node["complex"] else 1)
                owners[node["offset"] : node["offset"] + size] = [node["path"]] * size
            found = self.browser.run("""const structure = model.structures.find((each) => each.label === arguments[0]);
                const owners = [];
                for (let from = 0; from < structure.size; from += 8) {
                    for (const part of model.row(structure, from, from + 8).parts)
                        for (let byte = Math.max(part.start, from); byte < Math.min(part.end, from + 8); ++byte)
                            owners.push(part.isPadding ? null : part.path);
                }
                return owners;""", structure["name"])
            self.assertEqual(found, owners)

    def test_only_what_was_asked_for_is_listed(self):
        self.open(GRID, "", "--only", "Row")
        self.assertEqual(self.browser.text("#name"), "Row")
        self.assertEqual(self.visible()[:2], ["Row", "sfix32_En20"])
        self.open(GRID, "#Cell", "--only", "Row")  # what is nested is there all the same
        self.assertEqual(self.browser.text("#name"), "Cell")

    def test_dimension_facts(self):
        facts = self.folder / "facts.dims"
        facts.write_text("block A.b\ngreater frame, taps\ngreater taps, hop\ngreater frame, hop\nequal frame, size\n"
                         "range taps, 2, 128\nequal bands, channels\nrange? taps\n")
        self.open((ROOT / "examples/outer.json", facts))
        self.browser.click("#tab-dimensions")
        boxes = self.browser.run("""return Object.fromEntries([...document.querySelectorAll('.graph .box')].map((box) =>
            [[...box.querySelectorAll('text')].map((each) => each.textContent).join(' '), box.getBoundingClientRect().top]))""")
        self.assertEqual(sorted(boxes, key=boxes.get), ["frameat least 2 size", "taps2 to 128", "hop"])
        arrows = self.browser.run("return [...document.querySelectorAll('.arrow')].map((each) => each.textContent)")
        self.assertEqual(sorted(arrows), [f"{fact}, stated by A.b" for fact in ("frame > hop", "frame > taps", "taps > hop")])
        self.assertEqual([text.split() for text in self.browser.texts("#dimensions .loose .box")], [["bands", "channels"]])
        self.assertIn(["frame > taps", "A.b"], [row.split("\t") for row in self.browser.texts("#dimensions tbody tr")])
        self.open((facts,))
        self.assertEqual(self.browser.text("#name"), "Dimension facts")
        self.assertEqual(len(self.browser.texts(".arrow")), 3)
        self.open((ROOT / "examples/outer.json",))
        self.assertTrue(self.browser.run("return document.querySelector('#tab-dimensions').hidden"))

    def test_names_and_texts_cannot_become_markup(self):
        self.open(GRID, "#Cell:level")
        self.assertIn(EVIL, self.browser.texts("#facts dd"))
        self.assertEqual(self.browser.run("return document.title"), "standard input \u2013 qltypes")
        self.assertEqual(self.browser.run("return document.images.length + document.scripts.length"), 2)
        self.browser.type("#search", "<img")
        self.browser.wait("return document.querySelector('#found').innerText === '0 results'")

    def test_no_structures(self):
        self.open(GRID[4:5])
        self.assertEqual(self.browser.text("#name"), "sfix32_En20")
        self.open(GRID, "#nothing:of(this")
        self.assertEqual(self.browser.text("#name"), "Cell")

    def test_twenty_thousand_nodes(self):
        """However many there are, the page keeps only what is in sight, and finds the last one at once."""
        flat = [element(f"channel_{i}", "double" if i % 2 else "boolean") for i in range(10_000)]
        self.open([{"name": "Wide", "elements": flat}, GRID[0], GRID[4], GRID[6],
                   {"name": "Many", "elements": [element("cells", "Cell", 2_000)]},
                   {"name": "Huge", "elements": [element("cells", "Cell", 8_000, 10_000)]}], "#Wide")
        count = "return document.querySelectorAll('*').length"
        few = 1200
        self.click_entry("Wide", ".twisty")
        self.assertLess(self.browser.run(count), few)
        self.browser.type("#tree", "\ue010")  # to the end
        self.browser.wait("return document.querySelector('#tree .entry:last-child .name')?.innerText === 'Mode'")
        self.browser.type("#search", "channel_9999")
        self.browser.wait("return document.querySelector('#tree .entry .name')?.innerText === 'channel_9999'")
        self.browser.type("#search", ENTER)
        self.assertEqual(self.browser.run(SELECTED), ["channel_9999"])
        self.browser.click("#tab-numbers")
        self.assertEqual(self.browser.texts("#numbers .chosen span")[-1], "channel_9999")
        self.browser.type("#search", ESCAPE)
        self.browser.wait("return document.querySelector('#found').innerText === ''")  # the tree again, no longer the results
        self.assertEqual(self.browser.texts("#tree .chosen .name"), ["channel_9999"])
        self.assertLess(self.browser.run(count), few)
        for path, offset in (("#Many:cells(1999).mode", 1999 * 24 + 20), ("#Huge:cells(79999999).mode", 79999999 * 24 + 20)):
            self.browser.run("location.hash = arguments[0]", path)
            self.browser.wait("return document.querySelector('#name').innerText === arguments[0]", path.split(":")[1])
            self.assertEqual(self.browser.texts("#facts dd")[0], str(offset))
            self.assertEqual(self.browser.texts("#tree .chosen .name"), ["mode"])
            self.browser.click("#tab-map")
            self.assertEqual(self.browser.run(SELECTED), ["mode"])
            self.browser.click("#tab-numbers")
            self.assertEqual(self.browser.texts("#numbers .chosen span")[-1], path.split(":")[1])
            self.assertLess(self.browser.run(count), few)

    def test_search_of_far_too_many_nodes_ends(self):
        self.open([GRID[0], GRID[4], GRID[6], {"name": "Huge", "elements": [element("cells", "Cell", 8_000, 10_000)]}])
        self.browser.type("#search", "mode")
        self.browser.wait("return document.querySelector('#found').innerText === 'the first 1000 results'")

    def test_narrow_window(self):
        """Nothing is wider than the window, in any tab."""
        self.addCleanup(self.browser.resize, 1280, 860)
        for width in (360, 700, 1280):
            self.browser.resize(width, 800)
            self.open(GRID, "#Grid:rows(3).cells(2).samples")
            for tab in ("map", "numbers", "types"):
                with self.subTest(width=width, tab=tab):
                    self.browser.click(f"#tab-{tab}")
                    self.assertLessEqual(self.browser.run("return document.documentElement.scrollWidth"), width)
                    self.assertLessEqual(self.browser.run("return document.documentElement.scrollHeight"), 800)
                    height = self.browser.run("return document.querySelector(arguments[0]).clientHeight", f"#{tab}")
                    self.assertGreater(height, 100)

    def test_print(self):
        """On paper the lists stand in full, in the light colours."""
        self.open((ROOT / "examples/drive.json",))
        self.browser.run("window.dispatchEvent(new Event('beforeprint'))")
        self.assertEqual(len(self.browser.texts("#map .bytes")), 192 // 8)
        self.browser.run("window.dispatchEvent(new Event('afterprint'))")
        self.assertLess(len(self.browser.texts("#map .bytes")), 192 // 8)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
