"""The blocks of the guide are taken from the examples, every page has its program, and every link leads somewhere.

usage: guide_test.py [QLTYPES]
"""

import pathlib
import re
import subprocess
import sys
import textwrap

ROOT = pathlib.Path(__file__).resolve().parents[2]
PAGES = sorted((ROOT / "docs/guide").glob("*.md"))
CODE = {path.name: path.read_text() for path in (ROOT / "examples").glob("*.cpp")}
PRINTED = [path.read_text() for path in (ROOT / "examples/expected").glob("*.txt")]
if len(sys.argv) > 1:
    script = subprocess.run([sys.argv[1], "dims", "examples/filter_bank.dims"], cwd=ROOT, capture_output=True, text=True)
    PRINTED += [script.stdout, script.stderr]
found = []


def contains(text, block):
    """Whether the lines of the block stand in the text, one after the other, at any indentation."""
    lines = [line.strip() for line in textwrap.dedent(block).splitlines()]
    return "\n".join(lines) in "\n".join(line.strip() for line in text.splitlines())


for page in PAGES:
    text = page.read_text()
    name = page.relative_to(ROOT)
    for language, block in re.findall(r"^```(\w*)\n(.*?)^```$", text, re.MULTILINE | re.DOTALL):
        pool = CODE.values() if language == "cpp" else PRINTED if language == "" and len(sys.argv) > 1 else None
        if pool is not None and not any(contains(candidate, block) for candidate in pool):
            found.append(f"{name}: no example has this block:\n{block}")
    linked = re.findall(r"examples/(\w+\.cpp)", text)
    if "Written by `tools/dev/" not in text and not linked and "```cpp" not in text:
        found.append(f"{name}: names no example")

for page in [*PAGES, *(ROOT / "docs/dev").glob("*.md"), *ROOT.glob("*.md")]:
    for target in re.findall(r"\]\(([^)#:]+)(?:#[^)]*)?\)", page.read_text()):
        if not (page.parent / target).exists():
            found.append(f"{page.relative_to(ROOT)}: leads to {target}, which is not there")

numbers = sorted(name[:2] for name in CODE)
if numbers != [f"{number:02}" for number in range(1, len(CODE) + 1)]:
    found.append(f"the examples are not numbered 01 to {len(CODE):02}: {numbers}")
print("\n".join(found) or "guide: nothing to complain about")
sys.exit(1 if found else 0)
