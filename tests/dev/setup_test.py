"""setup.sh installs exactly what is missing, and says clearly what it cannot install.

The package tools are replaced by scripts in a folder that is the whole PATH, which note how they were called.
"""

import os
import pathlib
import shutil
import subprocess
import tempfile
import unittest

SETUP = pathlib.Path(__file__).resolve().parents[2] / "tools/dev/setup.sh"
NEEDED = ("bash", "dirname", "sed", "grep", "env")


class Setup(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)
        self.bin = self.folder / "bin"
        self.bin.mkdir()
        for name in NEEDED:
            os.symlink(shutil.which(name), self.bin / name)
        self.calls = self.folder / "calls"
        self.calls.touch()
        self.list = self.folder / "list.txt"
        self.list.write_text("# a comment\ng++\ncmake   # for the build\n\nlibnothing-dev\n")

    def script(self, name, body):
        path = self.bin / name
        path.write_text(f"#!/bin/sh\n{body}\n")
        path.chmod(0o755)

    def noted(self, name):
        self.script(name, f'echo "{name} $*" >>"{self.calls}"')

    def installed(self, *packages):
        lines = "".join(f"installed {package}\\n" for package in packages)
        self.script("dpkg-query", f"printf 'config-files libnothing-dev\\n{lines}'")

    def user(self, number):
        self.script("id", f"echo {number}")

    def run_setup(self):
        result = subprocess.run([shutil.which("bash"), SETUP, self.list], env={"PATH": str(self.bin)},
                                capture_output=True, text=True)
        return result.returncode, result.stderr.strip(), self.calls.read_text().splitlines()

    def test_nothing_is_missing(self):
        self.installed("g++", "cmake", "libnothing-dev")
        self.noted("apt-get")
        self.assertEqual(self.run_setup(), (0, "", []))

    def test_only_what_is_missing_is_installed(self):
        self.installed("g++")
        self.noted("apt-get")
        self.user(0)
        code, complaint, calls = self.run_setup()
        self.assertEqual((code, complaint), (0, ""))
        self.assertEqual(calls[0].split()[:2], ["apt-get", "update"])
        self.assertEqual(calls[1].split()[:2], ["apt-get", "install"])
        self.assertEqual(calls[1].split()[-2:], ["cmake", "libnothing-dev"])
        self.assertEqual(len(calls), 2)

    def test_other_users_install_through_sudo(self):
        self.installed("g++", "cmake")
        self.noted("apt-get")
        self.noted("sudo")
        self.user(1000)
        code, _, calls = self.run_setup()
        self.assertEqual(code, 0)
        self.assertEqual([call.split()[0] for call in calls], ["sudo", "sudo"])

    def test_other_users_without_sudo(self):
        self.installed("g++", "cmake")
        self.noted("apt-get")
        self.user(1000)
        code, complaint, calls = self.run_setup()
        self.assertEqual((code, calls), (1, []))
        self.assertIn("libnothing-dev", complaint)
        self.assertEqual(len(complaint.splitlines()), 1)

    def test_a_failed_installation_ends_the_setup(self):
        self.installed("g++", "cmake")
        self.script("apt-get", "exit 100")
        self.user(0)
        self.assertNotEqual(self.run_setup()[0], 0)

    def test_without_apt_what_is_missing_is_named(self):
        self.script("c++", "exit 0")
        code, complaint, calls = self.run_setup()
        self.assertEqual((code, calls), (1, []))
        self.assertEqual(len(complaint.splitlines()), 1)
        self.assertTrue(complaint.endswith("packages give: cmake libnothing-dev"), complaint)


if __name__ == "__main__":
    unittest.main()
