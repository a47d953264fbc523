"""Every installed header compiles alone with clang++, without a warning under the flags that clients use.

usage: headers_test.py CLANG INCLUDE_FOLDER WORK_DIR

That each header includes what it needs of the standard library and Boost is what headers_alone shows, with the same
standard library. So these are compiled once, beforehand, which takes a fifth of the time.
"""

import concurrent.futures
import os
import pathlib
import re
import shutil
import subprocess
import sys

compiler, include, work = sys.argv[1], pathlib.Path(sys.argv[2]), pathlib.Path(sys.argv[3])
FLAGS = [compiler, "-std=c++20", "-Wall", "-Wextra", "-Wpedantic", "-Wshadow", "-Werror", f"-I{include}", "-x"]


def compile_text(text, *arguments):
    return subprocess.run([*FLAGS, *arguments], input=text, capture_output=True, text=True, check=False)


def complaints(header):
    """What the compiler says of a source that includes the header, twice in a row."""
    name = header.relative_to(include).as_posix()
    text = f'#include "{name}"\n#include "{name}"\n'
    result = compile_text(text, "c++", "-fsyntax-only", "-include-pch", work / "others.pch", "-")
    return f"{name}:\n{result.stderr}" if result.returncode else ""


shutil.rmtree(work, ignore_errors=True)
work.mkdir(parents=True)
headers = sorted(include.rglob("*.h"))
assert headers, f"no headers below {include}"
others = {match for header in headers for match in re.findall(r"^#include <.*>$", header.read_text(), re.MULTILINE)}
prepared = compile_text("\n".join(sorted(others)), "c++-header", "-", "-o", work / "others.pch")
assert prepared.returncode == 0, prepared.stderr
with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
    found = [text for text in pool.map(complaints, headers) if text]
print("\n".join(found) or f"{len(headers)} headers: nothing to complain about")
sys.exit(1 if found else 0)
