"""cpack makes three Debian packages that together hold exactly what `cmake --install` installs, each its own part.

usage: packages_test.py WORK_DIR BUILD_DIR STAGED_TREE LIBRARY_FOLDER VERSION
"""

import os
import pathlib
import re
import shutil
import subprocess
import sys

work, build, staged = (pathlib.Path(argument) for argument in sys.argv[1:4])
library_folder, version = sys.argv[4:]
major = version.split(".")[0]
RUNTIME, DEVELOPMENT, TOOLS = f"libqltypes{major}", "libqltypes-dev", "qltypes"
LIBRARY = re.escape(library_folder)
# Which package has a file whose path below /usr matches; the first pattern that matches counts.
HOME = ((rf"{LIBRARY}/lib\w+\.so\.", RUNTIME), (rf"{LIBRARY}/lib\w+\.so$", DEVELOPMENT), (r"include/", DEVELOPMENT),
        (rf"{LIBRARY}/(cmake|pkgconfig)/", DEVELOPMENT), (r"share/(qltypes/)?gdb/", DEVELOPMENT),
        (r"bin/|share/qltypes/|share/man/", TOOLS))


def run(*command):
    return subprocess.run([str(part) for part in command], check=True, capture_output=True, text=True).stdout


def files_below(folder):
    """Paths; of the script that gdb reads, the one part that follows from the prefix is left out."""
    paths = (path.relative_to(folder).as_posix() for path in folder.rglob("*") if path.is_symlink() or path.is_file())
    return {re.sub(r"(share/gdb/auto-load/).*/", r"\1", path) for path in paths}


shutil.rmtree(work, ignore_errors=True)
work.mkdir(parents=True)
subprocess.run(["cpack", "-G", "DEB", "--config", build / "CPackConfig.cmake", "-B", work], check=True, cwd=work,
               stdout=subprocess.DEVNULL)
archives = {path.name.split("_")[0]: path for path in work.glob("*.deb")}
assert set(archives) == {RUNTIME, DEVELOPMENT, TOOLS}, f"the packages are {sorted(archives)}"

contents = {}
for name, archive in archives.items():
    run("dpkg-deb", "-x", archive, work / name)
    contents[name] = {file.removeprefix("usr/") for file in files_below(work / name)}
    field = lambda key: run("dpkg-deb", "-f", archive, key).strip()
    assert field("Version") == version, f"{name} says it has version {field('Version')}"
    assert field("Architecture") == run("dpkg", "--print-architecture").strip(), f"architecture of {name}"
    if name != RUNTIME:
        assert f"{RUNTIME} (= {version})" in field("Depends"), f"{name} depends on {field('Depends')}"
needs = run("dpkg-deb", "-f", archives[RUNTIME], "Depends")
assert re.search(r"libc6.*libflint", needs), f"{RUNTIME} depends on {needs}"
assert "libboost" in run("dpkg-deb", "-f", archives[DEVELOPMENT], "Depends"), "headers without Boost"

wanted = files_below(staged)
packed = set().union(*contents.values())
assert packed == wanted, f"packages and installation differ: {sorted(packed ^ wanted)}"
assert sum(map(len, contents.values())) == len(packed), "a file is in two packages"
for name, files in contents.items():
    for file in files:
        home = next((home for pattern, home in HOME if re.match(pattern, file)), name)
        assert home == name, f"{file} is in {name}, not in {home}"

# Unpacked above each other they work: the command finds its libraries.
for name in archives:
    shutil.copytree(work / name, work / "root", symlinks=True, dirs_exist_ok=True)
shown = subprocess.run([work / "root/usr/bin/qltypes", "--version"], check=True, capture_output=True, text=True,
                       env={key: value for key, value in os.environ.items() if key != "LD_LIBRARY_PATH"}).stdout
assert version in shown, shown
