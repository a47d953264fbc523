"""A project with the library as a subdirectory configures, compiles, links and runs.

usage: subdirectory_test.py PROJECT WORK_DIR BUILD_DIR QLTYPES_SOURCE COMPILER VERSION

Compiling the whole library once more would take minutes and show nothing new. So the client's own sources are compiled
by the project's rules, the libraries of BUILD_DIR are put where the project's rules would put theirs, and the project's
own link command is run on them.
"""

import pathlib
import shutil
import subprocess
import sys

project, work, build, source = (pathlib.Path(argument) for argument in sys.argv[1:5])
compiler, version = sys.argv[5:]


def run(*command):
    return subprocess.run([str(part) for part in command], cwd=work, check=True, stdout=subprocess.PIPE, text=True).stdout


shutil.rmtree(work, ignore_errors=True)
work.mkdir(parents=True)
configure = ("cmake", "-G", "Ninja", project, f"-DQLTYPES_SOURCE={source}", f"-DCMAKE_CXX_COMPILER={compiler}",
             "-DCMAKE_BUILD_TYPE=Debug")
run(*configure, "-B", "static", "-DFETCHED=ON")  # what a parent gets that does not say otherwise
assert (work / "static/_deps/qltypes-build").is_dir(), "a fetched library is not part of the build"
run(*configure, "-DBUILD_SHARED_LIBS=ON")

commands = run("ninja", "-t", "commands", "consumer").splitlines()
assert any("part.cpp" in command for command in commands), "the client's sources are not part of the build"
warnings = [command for command in commands if "-Werror" in command]
assert not warnings, f"the developer's flags reach a parent project: {warnings[0]}"

for library in ("qlplatform", "qltypes"):
    (work / "qltypes" / library).mkdir(parents=True, exist_ok=True)
    for file in (build / library).glob("*.so*"):
        shutil.copy2(file, work / "qltypes" / library, follow_symlinks=False)
targets = [line.split(":")[0] for line in run("ninja", "-t", "targets", "all").splitlines()]
run("ninja", *[target for target in targets if target.startswith("CMakeFiles/") and target.endswith(".cpp.o")])
for command in commands:
    if "-o consumer " in command or " qc libpart.a " in command:
        subprocess.run(command, cwd=work, shell=True, check=True)
run(work / "consumer", version)
