#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Which files lint.py looks at, in small repositories of its own, and that it reads the build's commands right."""

import os
import pathlib
import subprocess
import sys
import tempfile
import unittest
import unittest.mock

sys.dont_write_bytecode = True

import lint  # noqa: E402


class Extent(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.root = pathlib.Path(directory.name).resolve() / "a tree"
        self.root.mkdir()
        self.sources = {self.root / f"{name}.cpp": {self.root / f"{name}.cpp", self.root / "all.h"} for name in "abc"}
        self.sources[self.root / "b.cpp"].add(self.root / "b.h")
        for name in ("a.cpp", "b.cpp", "c.cpp", "all.h", "b.h", ".clang-tidy"):
            (self.root / name).write_text("old\n", encoding="utf-8")

    def git(self, *arguments):
        subprocess.run(["git", "-C", self.root, "-c", "user.name=n", "-c", "user.email=e", *arguments], check=True,
                       capture_output=True, env=os.environ | {"GIT_CONFIG_GLOBAL": os.devnull})

    def repository(self):
        """One with a main line at the only commit."""
        self.git("init", "--initial-branch=main")
        self.git("add", ".")
        self.git("commit", "--message=first")
        self.git("update-ref", "refs/remotes/origin/main", "HEAD")

    def change(self, *names):
        for name in names:
            (self.root / name).write_text("new\n", encoding="utf-8")

    def looked_at(self):
        with unittest.mock.patch.object(lint, "RULES", [self.root / ".clang-tidy"]):
            found, why = lint.to_look_at(self.sources, self.root)
        return "".join(sorted(source.stem for source in found)), why

    def expect(self, names, why):
        found, told = self.looked_at()
        self.assertEqual(names, found, told)
        self.assertIn(why, told)

    def test_no_change_concerns_no_file(self):
        self.repository()
        self.expect("", "0 of 3 files, which differ from origin/main (")

    def test_a_changed_source(self):
        self.repository()
        self.change("a.cpp")
        self.expect("a", "1 of 3 files")

    def test_staged_and_committed_changes_are_changes(self):
        self.repository()
        self.change("a.cpp")
        self.git("add", ".")
        self.expect("a", "1 of 3 files")
        self.git("commit", "--message=second")
        self.change("c.cpp")
        self.expect("ac", "2 of 3 files")

    def test_a_new_source(self):
        self.repository()
        self.sources[self.root / "ü $.cpp"] = {self.root / "ü $.cpp"}
        self.change("ü $.cpp")
        self.expect("ü $", "1 of 4 files")

    def test_a_changed_header_concerns_whoever_includes_it(self):
        self.repository()
        self.change("b.h")
        self.expect("b", "1 of 3 files")
        self.change("all.h")
        self.expect("abc", "3 of 3 files")

    def test_a_source_of_which_the_build_noted_nothing_may_include_anything(self):
        self.repository()
        self.sources[self.root / "c.cpp"] = set()
        self.expect("c", "1 of 3 files")

    def test_changed_rules_concern_every_file(self):
        self.repository()
        self.change(".clang-tidy")
        self.expect("abc", "all 3 files, since the rules differ from origin/main (")

    def test_what_the_main_line_did_meanwhile_is_no_change(self):
        self.repository()
        self.git("checkout", "-b", "work")
        self.change("a.cpp")
        self.git("commit", "--all", "--message=mine")
        self.git("checkout", "main")
        self.change("b.cpp")
        self.git("commit", "--all", "--message=theirs")
        self.git("update-ref", "refs/remotes/origin/main", "HEAD")
        self.git("checkout", "work")
        self.expect("a", "1 of 3 files")

    def test_the_upstream_stands_in_for_a_main_line_of_another_name(self):
        self.repository()
        self.git("update-ref", "-d", "refs/remotes/origin/main")
        self.git("checkout", "-b", "work", "--track", "main")
        self.change("a.cpp")
        self.expect("a", "which differ from main (")

    def test_without_a_main_line_every_file(self):
        self.repository()
        self.git("update-ref", "-d", "refs/remotes/origin/main")
        self.expect("abc", "all 3 files, since there is no main line to compare with")

    def test_without_a_common_revision_every_file(self):
        self.repository()
        self.git("checkout", "--orphan", "other")
        self.git("commit", "--message=unrelated")
        self.expect("abc", "all 3 files, since git merge-base ended with 1")

    def test_without_a_repository_every_file(self):
        self.expect("abc", "all 3 files, since not a git repository")

    def test_a_tree_inside_somebodys_repository_is_none(self):
        self.repository()
        self.root /= "inner"
        self.root.mkdir()
        self.expect("abc", "all 3 files, since the tree is no repository")

    def test_without_git_every_file(self):
        self.repository()
        with unittest.mock.patch.dict(os.environ, {"PATH": "/nowhere"}):
            self.expect("abc", "all 3 files, since git is not installed")

    def test_another_repository_in_the_surroundings_is_not_asked(self):
        self.repository()
        self.change("a.cpp")
        with unittest.mock.patch.dict(os.environ, {"GIT_DIR": "/nowhere", "GIT_INDEX_FILE": "/nowhere/index"}):
            self.expect("a", "1 of 3 files")


class Commands(unittest.TestCase):
    def test_a_source_of_a_batch_is_looked_at_alone_wherever_the_tree_lies(self):
        command = {"command": 'c++ "-DA=\\"b c\\"" -Wno-shadow -include other.h -o b.o -c \'/a tree/unity_0.cxx\'',
                   "file": "/a tree/a.cpp", "given": "/a tree/unity_0.cxx"}
        self.assertEqual(["c++", '-DA="b c"', "-include", "other.h", "-o", "b.o", "-c", "/a tree/a.cpp"],
                         lint.arguments_of(command))


class Notes(unittest.TestCase):
    def test_a_note_that_was_cut_short_says_nothing(self):
        with tempfile.TemporaryDirectory() as directory:
            file = pathlib.Path(directory) / "passed.json"
            self.assertEqual({}, lint.passed_before(file))
            file.write_text('{"a.cpp": "12', encoding="utf-8")
            self.assertEqual({}, lint.passed_before(file))
            lint.write_whole(file, '{"a.cpp": "12"}')
            self.assertEqual({"a.cpp": "12"}, lint.passed_before(file))
            self.assertEqual([file], list(file.parent.iterdir()))


if __name__ == "__main__":
    unittest.main()
