#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The page of claims is refused where it tells less, or more, than was counted."""

import copy
import json
import pathlib
import shutil
import subprocess
import sys
import tempfile
import tomllib
import unittest

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parent))

import claims  # noqa: E402

ONE = {"area": "Layer", "name": "It works", "way": "measured", "command": "./dev run", "says": "{run.calls} calls",
       "assumes": "{boards} boards", "leaves": "nights"}
HAND = {"what": "Long", "command": "./dev long", "date": "2026-11-22", "revision": "abcdef0",
        "of": {"src": claims.tree(claims.ROOT / "src")[:7]}, "result": "nothing"}
ALL = {"introduction": "One", "claim": [ONE], "by_hand": [HAND], "not_covered": ["the sea"]}
KNOWN = {"run.calls": 1234, "boards": 2}


def page(change=None, known=None):
    told = copy.deepcopy(ALL)
    if change is not None:
        change(told)
    return "\n".join(claims.page(told, KNOWN if known is None else known))


class Page(unittest.TestCase):
    def refused(self, message, change=None, known=None):
        with self.assertRaisesRegex(claims.Wrong, message):
            page(change, known)

    def test_it_tells_everything(self):
        text = page()
        for part in ("## Layer", "### It works", "**Measured**, `./dev run`. 1,234 calls",
                     "Takes for granted: 2 boards", "Leaves open: nights",
                     "| Long | `./dev long` | 2026-11-22 | abcdef0 | `src/` | the same | nothing |", "- the sea"):
            self.assertIn(part, text)

    def test_a_figure_that_nobody_counts(self):
        self.refused(r"nobody counts \{run.calls\}", known={"boards": 2})

    def test_a_figure_that_is_told_nowhere(self):
        self.refused("counted and told nowhere: run.more", known=KNOWN | {"run.more": 1})

    def test_a_claim_that_leaves_something_out(self):
        for key in ONE:
            with self.subTest(key):
                self.refused(".", lambda told, key=key: told["claim"][0].pop(key))
                self.refused("is empty|no such way", lambda told, key=key: told["claim"][0].update({key: " "}))

    def test_a_way_that_there_is_not(self):
        self.refused("no such way: believed", lambda told: told["claim"][0].update(way="believed"))

    def test_a_run_by_hand_without_its_day(self):
        self.refused("no date and revision", lambda told: told["by_hand"][0].update(date="lately"))
        self.refused("no date and revision", lambda told: told["by_hand"][0].update(revision="the last"))
        self.refused("git rev-parse abcdef0:src", lambda told: told["by_hand"][0].update(of={"src": "mine"}))
        self.refused("there is no source/", lambda told: told["by_hand"][0].update(of={"source": "0000000"}))
        self.refused("of is empty", lambda told: told["by_hand"][0].update(of={}))

    def test_a_run_by_hand_of_another_layer(self):
        def change(told):
            told["by_hand"][0]["of"] |= {"linux": "0000000", "board": "0000000"}

        self.assertIn("| abcdef0 | `src/`, `linux/`, `board/` | **changed**: `linux/`, `board/` | nothing |",
                      page(change))

    def test_what_git_says_of_a_folder(self):
        with tempfile.TemporaryDirectory() as place:
            folder = pathlib.Path(place)
            for name in ("a/one", "a/two", "a.b", "ab"):  # git sorts a folder as if its name ended with a slash
                (folder / name).parent.mkdir(exist_ok=True)
                (folder / name).write_text(name, encoding="utf-8")
            (folder / "a/two").chmod(0o755)
            git = ["git", "-C", folder, "-c", "core.autocrlf=false"]
            subprocess.run([*git, "init", "-q"], check=True)
            subprocess.run([*git, "add", "a", "a.b", "ab"], check=True)
            said = subprocess.run([*git, "write-tree"], check=True, capture_output=True, text=True).stdout.strip()
            shutil.rmtree(folder / ".git")
            self.assertEqual(said, claims.tree(folder))

    def test_what_each_run_by_hand_is_of(self):
        git = ["git", "-C", claims.ROOT, "rev-parse", "--verify", "--quiet"]
        for entry in tomllib.loads(claims.CLAIMS.read_text(encoding="utf-8"))["by_hand"]:
            for folder, then in entry["of"].items():
                with self.subTest(entry["what"], folder=folder):
                    said = subprocess.run([*git, f"{entry['revision']}:{folder}"], check=False, capture_output=True,
                                          text=True)
                    if said.returncode != 0:
                        self.skipTest("this copy has no such revision")
                    self.assertTrue(said.stdout.startswith(then), said.stdout)


class Seen(unittest.TestCase):
    def test_what_ran_is_held_against_the_page(self):
        with tempfile.TemporaryDirectory() as folder:
            path = pathlib.Path(folder)
            (path / "run.json").write_text(json.dumps({"calls": 7}), encoding="utf-8")
            (path / "same.json").write_text(json.dumps({"calls": 8}), encoding="utf-8")
            told = dict(claims.hold({"run": {"calls": 8}, "same": {"calls": 8}, "other": {"calls": 8}}, path))
        self.assertEqual([False, True, False, False], list(told.values()))
        self.assertIn("SKIPPED: other did not run", told)

    def test_the_tree_is_counted(self):
        self.assertEqual([], [name for name, figure in claims.in_the_tree().items() if figure < 5])


if __name__ == "__main__":
    unittest.main()
