"""The blocks of README.md are what the example, its output and the inspector really are.

usage: readme_test.py [QLTYPES]
"""

import pathlib
import re
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]
blocks = re.findall(r"^```\w*\n(.*?)^```$", (ROOT / "README.md").read_text(), re.MULTILINE | re.DOTALL)

for file in ("examples/04_first_structure.cpp", "examples/expected/04_first_structure.txt"):
    assert (ROOT / file).read_text() in blocks, f"README.md does not show {file} as it is"
if len(sys.argv) > 1:
    layout = subprocess.run([sys.argv[1], "layout", ROOT / "examples/outer.json"], check=True, capture_output=True, text=True)
    assert layout.stdout in blocks, "README.md does not show what `layout examples/outer.json` prints"
