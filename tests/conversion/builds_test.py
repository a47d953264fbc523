"""The conversions give the same results at -O0 and -O3, from g++ and from clang++, on every level of this processor.

usage: builds_test.py SOURCE_DIR BUILD_DIR INCLUDE_DIR...
"""

import concurrent.futures
import pathlib
import shutil
import subprocess
import sys

source, build, includes = pathlib.Path(sys.argv[1]), pathlib.Path(sys.argv[2]), sys.argv[3:]
matrix = source / "qltypes/conversion"
flagsOf = {"Level_avx2": ["-mavx2", "-mfma"], "Level_avx512": ["-mavx512f", "-mavx512bw", "-mavx512dq", "-mavx512vl", "-mprfchw"]}
sources = [source / "tests/conversion/results_of_all_cells.cpp"]
sources += [matrix / f"{name}.cpp" for name in ("BuiltInConversion", "Layout", "Levels", "OverflowPrediction")]
sources += sorted(matrix.glob("Level_*.cpp"))

compilers = [c for c in ("g++", "clang++") if shutil.which(c)]
assert compilers == ["g++", "clang++"], f"both compilers are needed, there is {compilers}"
kinds = [(compiler, level) for compiler in compilers for level in ("-O0", "-O3")]


def folderOf(kind):
    return build / "-".join(kind).replace("+", "p")


def compileOne(kind, file):
    command = [kind[0], kind[1], "-std=c++20", "-ffp-contract=off", "-w", f"-I{source}", *(f"-I{i}" for i in includes)]
    command += [*flagsOf.get(file.stem, []), "-c", file, "-o", folderOf(kind) / f"{file.stem}.o"]
    subprocess.run(command, check=True)


def resultsOf(kind):
    program = folderOf(kind) / "results"
    subprocess.run([kind[0], *sorted(folderOf(kind).glob("*.o")), "-o", program], check=True)
    return subprocess.run([program], check=True, capture_output=True, text=True).stdout.splitlines()


for kind in kinds:
    folderOf(kind).mkdir(parents=True, exist_ok=True)
with concurrent.futures.ThreadPoolExecutor(2) as pool:
    list(pool.map(lambda job: compileOne(*job), [(kind, file) for file in sources for kind in kinds]))
    results = list(pool.map(resultsOf, kinds))

assert len(results[0]) >= 158, f"only {len(results[0])} lines"
differing = 0
for kind, lines in zip(kinds[1:], results[1:]):
    assert len(lines) == len(results[0])
    for expected, line in zip(results[0], lines):
        if line != expected:
            differing += 1
            print(f"{' '.join(kinds[0])}: {expected}\n{' '.join(kind)}: {line}")
print(f"{len(results[0])} cells and levels, {len(kinds)} builds, {differing} differences")
sys.exit(differing != 0)
