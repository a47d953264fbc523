"""The static libraries are built, installed under absolute folders, and linked by clients that ask CMake and pkg-config.

usage: static_test.py WORK_DIR BUILD_DIR SOURCE_DIR VERSION

Compiling the whole library once more would take minutes. A static build of its own is configured, with the settings of
BUILD_DIR; its compile commands must be those of BUILD_DIR, folder apart, so its objects are taken from there. Archives,
link, installation and clients are made by the static build's own rules.
"""

import pathlib
import re
import shutil
import subprocess
import sys

work, build, source = (pathlib.Path(argument).resolve() for argument in sys.argv[1:4])
version = sys.argv[4]
static, prefix = work / "build", work / "prefix"
library_folder = prefix / "lib/archives"
TAKEN_OVER = ("CMAKE_BUILD_TYPE", "CMAKE_CXX_COMPILER", "CMAKE_CXX_COMPILER_LAUNCHER", "CMAKE_CXX_FLAGS",
              "CMAKE_CXX_FLAGS_DEBUG", "CMAKE_CXX_FLAGS_RELEASE", "QLTYPES_WARNINGS")


def run(*command, **options):
    return subprocess.run([str(part) for part in command], check=True, stdout=subprocess.PIPE, text=True, **options).stdout


def settings():
    cache = (build / "CMakeCache.txt").read_text()
    return {name: value for name, value in re.findall(r"^(\w+):\w+=(.*)$", cache, re.MULTILINE) if name in TAKEN_OVER}


def commands_of(folder, *targets):
    """The commands of a build, with its folder written as BUILD."""
    return [line.replace(str(folder), "BUILD") for line in run("ninja", "-C", folder, "-t", "commands", *targets).splitlines()
            if not line.startswith("ninja: ")]


def build_static():
    """Configures, takes the objects over, and runs what else the build would run: archives and link."""
    run("cmake", "-G", "Ninja", "-S", source, "-B", static, "-DBUILD_SHARED_LIBS=OFF", "-DQLTYPES_BUILD_TESTS=OFF",
        f"-DCMAKE_INSTALL_PREFIX={prefix}", f"-DCMAKE_INSTALL_LIBDIR={library_folder}",
        *(f"-D{name}={value}" for name, value in settings().items()))
    shared = set(commands_of(build, "inspector"))
    for command in commands_of(static, "inspector"):
        compiled = re.search(r" -o (\S+\.o) -c ", command)
        if compiled:
            assert command in shared, f"compiled otherwise than for shared libraries: {command}"
            (static / compiled[1]).parent.mkdir(parents=True, exist_ok=True)
            shutil.copyfile(build / compiled[1], static / compiled[1])
        else:
            run("sh", "-c", command.replace("BUILD", str(static)), cwd=static)


def check_installation():
    run("cmake", "--install", static)
    shared = list(prefix.rglob("*.so*"))
    assert not shared, f"a static installation has shared libraries: {shared}"
    for archive in ("libqltypes.a", "libqlplatform.a"):
        assert (library_folder / archive).exists(), f"{archive} is not installed"
    # Nothing that only registers itself at start gets lost in an archive.
    for arguments in (["flags"], ["messages"], ["table"], ["layout", str(source / "examples/outer.json")]):
        shown = [run(command, *arguments) for command in (prefix / "bin/qltypes", build / "tools/qltypes/qltypes")]
        assert shown[0] == shown[1], f"qltypes {arguments[0]} says otherwise when linked statically"


def check_clients():
    """find_package, then the same object linked by what pkg-config tells."""
    client = work / "client"
    run("cmake", "-G", "Ninja", "-S", source / "tests/install/find_package", "-B", client, "-DCMAKE_BUILD_TYPE=Debug",
        f"-DCMAKE_CXX_COMPILER={settings()['CMAKE_CXX_COMPILER']}", f"-Dqltypes_DIR={library_folder}/cmake/qltypes")
    run("cmake", "--build", client)
    run(client / "consumer", version)

    flags = run("pkg-config", "--static", "--libs", "qltypes", env={"PKG_CONFIG_PATH": str(library_folder / "pkgconfig"),
                                                                  "PATH": "/usr/bin:/bin"}).split()
    run(settings()["CMAKE_CXX_COMPILER"], next(client.rglob("consumer.cpp.o")), "-o", work / "consumer", *flags)
    run(work / "consumer", version)

    # A library that is missing is told when the package is looked for.
    missing = subprocess.run(["cmake", "-S", source / "tests/install/find_package", "-B", client, "-UQLTYPES_FOUND_*",
                              "-DCMAKE_FIND_ROOT_PATH=/nowhere", "-DCMAKE_FIND_ROOT_PATH_MODE_LIBRARY=ONLY"],
                             capture_output=True, text=True, check=False)
    assert missing.returncode != 0 and re.search(r"need\s+libmd,\s+which\s+is\s+not", missing.stderr), missing.stderr


shutil.rmtree(work, ignore_errors=True)
work.mkdir(parents=True)
build_static()
check_installation()
check_clients()
