#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What each verb of ./dev installs, and what it makes of a list that it cannot use."""

import os
import subprocess
import sys
import unittest

sys.dont_write_bytecode = True

from trees import NOBODY, ROOT, TreeTest  # noqa: E402

LISTED = """# all
[scripts]
python3 # why
[build]
cmake
[libraries]
libx-dev
[host]
g++
[second]
clang
[bare]
gcc-bare
[linux]
g++-linux   # why
[test]
gcovr
[coverage]
clang-19
[kernel]
qemu
[own]
flex
[drawing]
graphviz
"""


class Packages(TreeTest):
    def setUp(self):
        super().setUp()
        self.list = self.tree / "packages.txt"
        self.list.write_text(LISTED, encoding="utf-8")

    def test_a_verb_installs_what_it_needs_and_no_more(self):
        for arguments, needed in ((("build", "arm-bare"), "python3 cmake gcc-bare"),
                                  (("build", "arm-linux"), "python3 cmake libx-dev g++-linux"),
                                  (("run",), "python3 cmake libx-dev g++"),
                                  (("kernel",), "python3 cmake libx-dev g++ g++-linux gcc-bare qemu"),
                                  (("kernel", "--cost"), "python3 cmake libx-dev g++ g++-linux gcc-bare qemu"),
                                  (("kernel", "--debug"), "python3 cmake libx-dev g++ g++-linux gcc-bare qemu flex"),
                                  (("kernel", "--all"), "python3 cmake libx-dev g++ g++-linux gcc-bare qemu flex"),
                                  (("soak",), "python3 cmake libx-dev g++ g++-linux"),
                                  (("prove",), "python3 gcc-bare clang"),
                                  (("mutate",), "python3 cmake libx-dev g++ g++-linux clang gcc-bare gcovr clang-19"),
                                  (("docs",), ""),
                                  (("clean",), ""),
                                  (("help",), ""),
                                  (("setup", "test", "scripts"), "gcovr python3")):
            with self.subTest(arguments):
                (self.stubs / "installed").write_text("", encoding="utf-8")
                self.expect(0, "", *arguments)
                self.assertEqual(set(needed.split()), self.installed())

    def test_what_counts_conditions_is_installed_where_it_can_be(self):
        self.expect(0, "installing with apt-get: clang-19\n", "setup", "coverage")
        others = "python3 cmake libx-dev g++ clang gcc-bare g++-linux gcovr"
        (self.stubs / "installed").write_text("\n".join(others.split()) + "\n", encoding="utf-8")
        self.expect(0, "could not be installed\ndev: going on without them", "build", "debug", BREAK_APT="1")
        self.expect(0, "installing with apt-get: clang-19\n", "build", "debug")
        self.assertEqual({*others.split(), "clang-19"}, self.installed())

    def test_setup_installs_all_and_what_is_there_not_again(self):
        (self.stubs / "installed").write_text("cmake\n", encoding="utf-8")
        self.expect(0, "installing with apt-get", "setup")
        self.assertEqual({line for line in LISTED.replace("#", "\n#").split() if line[0].islower()} - {"all", "why"},
                         self.installed())
        self.assertNotIn(" cmake", self.calls("apt-get install")[0])
        count = len(self.calls("apt-get"))
        self.assertEqual((0, "", ""), self.dev("setup"))
        self.assertEqual(count, len(self.calls("apt-get")))

    def test_two_at_once_install_once(self):
        runs = [self.start("setup", SLOW_INSTALL="1") for _ in range(2)]
        texts = [run.communicate(timeout=30)[0] for run in runs]
        self.assertEqual([0, 0], [run.returncode for run in runs], texts)
        self.assertEqual(1, len(self.calls("apt-get install")))
        self.assertIn("waiting for another run that is installing packages", "".join(texts))

    def test_lists_that_cannot_be_used(self):
        for text, message in (("[odd]\nx1\n", "packages.txt:1: no verb knows a group [odd]"),
                              ("# c\n\ncmake\n", "packages.txt:3: cmake stands in no group"),
                              ("[build]\ncmake ninja\n", "packages.txt:2: this is no package's name: cmake ninja"),
                              ("[build]\n-y\n", "packages.txt:2: this is no package's name: -y")):
            with self.subTest(message):
                self.list.write_text(text, encoding="utf-8")
                self.expect(1, message, "setup")
                self.assertEqual([], self.calls("apt-get"))

    @unittest.skipIf(os.geteuid() != 0, "takes two users")
    def test_a_list_that_cannot_be_read(self):
        self.list.chmod(0o600)
        other = ("setpriv", f"--reuid={NOBODY}", f"--regid={NOBODY}", "--clear-groups")
        self.expect(1, f"{self.list} cannot be read: Permission denied", "setup", before=other)

    def test_a_group_that_is_none(self):
        self.expect(2, "packages.txt has no group tests (there are: scripts build", "setup", "tests")

    def test_failures_of_the_package_programs_are_failures(self):
        self.expect(1, "the packages could not be installed", "run", BREAK_APT="1")
        self.expect(1, "dpkg-query cannot tell which packages are installed (it ended with 2)", "run", BREAK_DPKG="1")
        self.assertEqual([], self.calls("cmake"))

    def test_an_installing_run_that_was_killed_blocks_nobody(self):
        run = self.start("setup", SLOW_INSTALL="1")
        self.wait_for("apt-get install")
        run.kill()
        self.expect(0, "installing with apt-get", "setup")
        run.communicate(timeout=30)


class OurList(TreeTest):
    def test_the_projects_own_list_is_whole(self):
        self.expect(0, "", "setup")
        names = {line.partition("#")[0].strip() for line in (ROOT / "packages.txt").read_text("utf-8").splitlines()}
        self.assertEqual({name for name in names if name and not name.startswith("[")}, self.installed())

    def test_every_package_has_its_reason(self):
        for line in (ROOT / "packages.txt").read_text(encoding="utf-8").splitlines():
            self.assertRegex(line, r"^(\[\w+\]|#.*|\S+ +# \S.*|)$")

    @unittest.skipUnless(subprocess.run(["which", "dpkg-query"], capture_output=True, check=False).returncode == 0,
                         "asks Debian's own program")
    def test_debians_own_program_is_understood(self):
        (self.stubs / "dpkg-query").unlink()
        self.expect(0, "", "setup", "scripts", "build", "host")
        self.assertNotIn("g++", self.installed())
        (self.tree / "packages.txt").write_text("[host]\ng++\nno-such-package-anywhere\n", encoding="utf-8")
        self.expect(0, "installing with apt-get: no-such-package-anywhere\n", "setup")


if __name__ == "__main__":
    unittest.main()
