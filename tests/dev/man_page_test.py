"""The manual page has every subcommand that the command has, and no other.

usage: man_page_test.py QLTYPES
"""

import pathlib
import re
import subprocess
import sys

PAGE = pathlib.Path(__file__).resolve().parents[2] / "tools/qltypes/qltypes.1"
shown = subprocess.run([sys.argv[1], "--help"], check=True, capture_output=True, text=True).stdout
offered = set(re.findall(r"^  (\w+)  ", shown.split("Subcommands:")[1], re.MULTILINE))
described = set(re.findall(r"^\.TP\n\.B (\w+)$", PAGE.read_text(), re.MULTILINE))
assert offered and offered == described, f"{PAGE.name} and the command differ in {sorted(offered ^ described)}"
