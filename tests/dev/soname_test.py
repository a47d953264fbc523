"""Both libraries are versioned files, and their soname is lib<name>.so.<major>.

usage: soname_test.py BUILD_DIR VERSION
"""

import pathlib
import re
import subprocess
import sys

build, version = pathlib.Path(sys.argv[1]), sys.argv[2]
major = version.split(".")[0]
for folder, name in (("qlplatform", "libqlplatform.so"), ("qltypes", "libqltypes.so")):
    link = build / folder / name
    dynamic = subprocess.run(["readelf", "--dynamic", "--wide", link], check=True, capture_output=True, text=True).stdout
    soname = re.search(r"\(SONAME\).*\[(.*)\]", dynamic)
    assert soname and soname[1] == f"{name}.{major}", f"soname of {link}: {soname and soname[1]}"
    assert link.resolve().name == f"{name}.{version}", f"{link} leads to {link.resolve()}"
    needed = re.findall(r"\(NEEDED\).*\[(.*)\]", dynamic)
    assert folder == "qlplatform" or f"libqlplatform.so.{major}" in needed, f"{link} needs {needed}"
