#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a check reads is told from its trace: what it does not name is complained of, and what it made itself is not."""

import os
import pathlib
import subprocess
import sys
import tempfile
import unittest
import unittest.mock

sys.dont_write_bytecode = True

import inputs  # noqa: E402

TRACED = subprocess.run(["strace", "-f", "-qq", "-o", "/dev/null", "true"], check=False, capture_output=True).returncode


def found(*lines):
    looked = inputs.Looked("/tree")
    for call in inputs.calls_of(lines):
        looked.take(*call)
    return looked.found


class Trace(unittest.TestCase):
    def test_how_something_was_looked_at(self):
        self.assertEqual({"/tree/a": "read", "/tree/b": "looked up", "/tree/c": "looked up", "/tree/d": "listed",
                          "/tree/e": "read", "/tree/g\nä": "looked up", "/tree/h": "read"}, found(
            '1 openat(AT_FDCWD</tree>, "a", O_RDONLY|O_CLOEXEC) = 3</tree/a>',
            '1 newfstatat(AT_FDCWD</tree>, "a", {st_mode=S_IFREG|0644, st_size=1, ...}, 0) = 0',
            '1 newfstatat(3</tree/a>, "", {st_mode=S_IFREG|0644, st_size=1, ...}, AT_EMPTY_PATH) = 0',
            '1 openat(AT_FDCWD</tree>, "x/../b", O_RDONLY) = -1 ENOENT (No such file or directory)',
            '1 access("c", R_OK) = 0',
            '1 openat(AT_FDCWD</tree>, "d", O_RDONLY|O_DIRECTORY) = 3</tree/d>',
            '1 getdents64(3</tree/d>, 0x1 /* 2 entries */, 32768) = 48',
            '1 execve("./e", ["e", "/tree/f"], 0x7ffc /* 3 vars */) = 0',
            r'1 readlink("g\n\303\244", 0x7ffc, 100) = -1 EINVAL (Invalid argument)',
            '1 openat(3</tree/d>, "../h", O_RDWR|O_CREAT, 0666) = 4</tree/h>'))

    def test_what_it_made_is_its_own(self):
        self.assertEqual({"/tree/old": "looked up"}, found(
            '1 mkdir("made", 0777) = 0',
            '1 openat(AT_FDCWD</tree>, "made/one", O_RDONLY) = 3</tree/made/one>',
            '1 openat(AT_FDCWD</tree>, "two", O_WRONLY|O_CREAT|O_TRUNC, 0666) = 3</tree/two>',
            '1 openat(AT_FDCWD</tree>, "two", O_RDONLY) = 3</tree/two>',
            '1 rename("old", "new") = 0',
            '1 newfstatat(AT_FDCWD</tree>, "new", 0x7ffc, 0) = 0',
            '1 symlink("elsewhere", "link") = 0',
            '1 truncate("other", 0) = 0'))

    def test_what_it_removed_is_its_own_again(self):
        self.assertEqual({"/tree/read": "read", "/tree/kept": "listed"}, found(
            '1 openat(AT_FDCWD</tree>, "kept", O_RDONLY|O_DIRECTORY) = 3</tree/kept>',
            '1 getdents64(3</tree/kept>, 0x1 /* 3 entries */, 32768) = 72',
            '1 newfstatat(AT_FDCWD</tree>, "kept/old", {st_mode=S_IFREG|0644, st_size=1, ...}, 0) = 0',
            '1 unlinkat(3</tree/kept>, "old", 0) = 0',
            '1 openat(AT_FDCWD</tree>, "kept/old", O_RDWR|O_CREAT, 0666) = 4</tree/kept/old>',
            '1 openat(AT_FDCWD</tree>, "read", O_RDONLY) = 4</tree/read>',
            '1 unlink("read") = 0'))

    def test_what_it_could_not_make_is_not(self):
        self.assertEqual({"/tree/there/one": "read", "/tree/two": "read"}, found(
            '1 mkdir("there", 0777) = -1 EEXIST (File exists)',
            '1 openat(AT_FDCWD</tree>, "there/one", O_RDONLY) = 3</tree/there/one>',
            '1 openat(AT_FDCWD</tree>, "two", O_RDONLY) = 3</tree/two>',
            '1 openat(AT_FDCWD</tree>, "two", O_WRONLY|O_CREAT|O_TRUNC, 0666) = 3</tree/two>'))

    def test_each_process_has_its_folder(self):
        self.assertEqual({"/tree": "looked up", "/tree/sub/a": "looked up", "/other/b": "looked up",
                          "/tree/c": "looked up"}, {"/tree": "looked up", **found(
            '1 clone(child_stack=NULL, flags=SIGCHLD <unfinished ...>',
            '2 chdir("sub") = 0',
            '2 access("a", F_OK) = 0',
            '1 <... clone resumed>, child_tidptr=0x7f) = 2',
            '2 vfork( <unfinished ...>',
            '3 fchdir(5</other>) = 0',
            '3 access("b", F_OK <unfinished ...>',
            '1 access("c", F_OK) = 0',
            '3 <... access resumed>) = -1 ENOENT (No such file or directory)')})


class Named(unittest.TestCase):
    def complaints(self, looked, *named):
        return list(inputs.not_named({f"{inputs.ROOT}/{path}": how for path, how in looked.items()},
                                     [f"{inputs.ROOT}/{path}" for path in named], inputs.ROOT))

    def test_what_lies_below_is_named(self):
        self.assertEqual([], self.complaints({"docs/proof.md": "read", "docs": "listed", "dev": "read",
                                              "docs/gone": "looked up"}, "docs", "dev"))

    def test_folders_may_be_looked_up_and_no_more(self):
        self.assertEqual([], self.complaints({"docs": "looked up", "tests/common": "looked up", "": "looked up"}))
        self.assertEqual([(f"{inputs.ROOT}/docs", "listed")],
                         self.complaints({"docs": "listed", "": "listed"}, "docs/proof.md"))

    def test_what_is_not_there_is_told_by_the_names_where_it_would_be(self):
        looked = {"tests/gone": "looked up", "gone": "looked up", "gone/more": "looked up", ".gone": "looked up"}
        self.assertEqual([(f"{inputs.ROOT}/.gone", "looked up"), (f"{inputs.ROOT}/tests/gone", "looked up")],
                         self.complaints(looked))

    def test_a_similar_name_is_another_one(self):
        self.assertEqual([(f"{inputs.ROOT}/docs.txt", "read")], self.complaints({"docs.txt": "read"}, "docs"))

    def test_the_system_s_own_is_known(self):
        self.assertEqual([], list(inputs.not_named({"/usr/bin/ld": "read", "/proc/self/maps": "read"}, [], "/")))


@unittest.skipIf(TRACED, "nothing can be traced here")
class Whole(unittest.TestCase):
    def complaints(self, script, *named):
        with tempfile.TemporaryDirectory() as folder:
            place = pathlib.Path(os.path.realpath(folder))
            (place / "one").write_text("", encoding="utf-8")
            (place / "more").mkdir()
            check = inputs.Check({"name": "x", "properties": [{"name": "WORKING_DIRECTORY", "value": str(place)}],
                                  "command": ["python", "/x/unchanged.py", "stamp",
                                              *(str(place / name) for name in named), "--", "/bin/sh", "-c", script]})
            with unittest.mock.patch.object(inputs, "WATCHED", [str(place)]):
                return [text.replace(f"{place}/", "") for text in check.complaints(str(place / "trace"))]

    def test_a_check_that_names_all(self):
        self.assertEqual([], self.complaints("cat one; (cd more; cat ../one; ls); echo 1 >two; cat two", "one", "more"))

    def test_a_check_that_does_not(self):
        self.assertEqual(["more was listed, and is not named", "one was read, and is not named"],
                         self.complaints("cat one; cd more; cat ../one; ls"))

    def test_a_check_that_fails(self):
        self.assertEqual(["ended with 3:\nno\n"], self.complaints("echo no; exit 3"))


if __name__ == "__main__":
    unittest.main()
