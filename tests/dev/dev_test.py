#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""./dev works on the tree it stands in, whatever the surroundings: links, odd names, copies, other runs and users."""

import fcntl
import os
import shutil
import signal
import subprocess
import sys
import unittest

sys.dont_write_bytecode = True

from trees import NOBODY, TreeTest  # noqa: E402

ODD = "a 'b' $c `d` (e) ü~!%@{},:=+^& -"   # what else there is, CMake makes no path of
AS_NOBODY = ("setpriv", f"--reuid={NOBODY}", f"--regid={NOBODY}", "--clear-groups")
takes_two_users = unittest.skipIf(os.geteuid() != 0, "takes two users")


class Place(TreeTest):
    def runs_in(self, tree, **how):
        self.expect(0, f"ran in {tree}: run --trace-format summary {tree}/scenarios/first-look.pmx\n", "run", **how)

    def test_from_any_folder(self):
        (self.tree / "docs").mkdir()
        self.runs_in(self.tree)
        self.runs_in(self.tree, cwd="/")
        self.runs_in(self.tree, cwd=self.tree, script="./dev")
        self.runs_in(self.tree, cwd=self.tree / "docs", script="../dev")
        self.runs_in(self.tree, cwd=self.tree, before=("bash",), script="dev")

    def test_where_folders_are_looked_for_does_not_matter(self):
        (self.tree / "tree").mkdir()
        for path in (".", str(self.tree), "/"):
            self.runs_in(self.tree, script="tree/dev", CDPATH=path)

    def test_a_link_means_the_tree_that_it_leads_to(self):
        foreign = self.space / "foreign"
        (foreign / "build").mkdir(parents=True)
        (foreign / "build" / "kept").touch()
        (foreign / "dev").symlink_to(self.tree / "dev")
        (foreign / "again").symlink_to("dev")
        for script in (foreign / "dev", foreign / "again"):
            self.runs_in(self.tree, script=script)
            self.expect(0, "", "clean", script=script)
            self.assertFalse((self.tree / "build").exists())
        self.assertEqual(["again", "build", "dev"], sorted(os.listdir(foreign)))
        self.assertTrue((foreign / "build" / "kept").exists())

    def test_a_script_without_its_tree_does_nothing(self):
        alone = self.space / "alone"
        (alone / "build").mkdir(parents=True)
        shutil.copy2(self.tree / "dev", alone)
        for verb in ("clean", "run"):
            self.expect(1, "it has no packages.txt", verb, script=alone / "dev")
        self.assertTrue((alone / "build").exists())

    def test_odd_names(self):
        tree = self.make_tree(ODD)
        self.runs_in(tree, script=tree / "dev")
        self.runs_in(tree, script=f"{ODD}/dev")
        self.runs_in(tree, before=("bash", "--"), script="-dev/dev", cwd=self.link_named("-dev", tree))
        self.assertNotIn("made for", self.dev("run", script=tree / "dev")[2])
        self.expect(0, "", "clean", script=tree / "dev")
        self.assertFalse((tree / "build").exists())

    def test_names_in_which_nothing_can_be_built_are_refused(self):
        for character in '"\\;#<>|*?[]\t\n':
            with self.subTest(character):
                tree = self.make_tree(f"odd {character} name")
                self.expect(1, f"CMake cannot build in {tree}, for the {character} in that name", "run",
                            script=tree / "dev")
                self.expect(0, "", "clean", script=tree / "dev")
                self.assertFalse((tree / "build").exists())
        self.assertEqual([], self.calls("cmake"))

    def test_names_in_which_all_is_built_every_time_are_told(self):
        for character in "'&^`$":
            tree = self.make_tree(f"odd {character} name")
            self.expect(0, f"for the {character} in {tree}: it compiles every time", "run", script=tree / "dev")
        self.assertNotIn("every time", self.dev("run")[2])

    def link_named(self, name, tree):
        (self.space / name).symlink_to(tree)
        return self.space

    def test_a_copied_or_moved_tree_is_built_afresh(self):
        self.runs_in(self.tree)
        copy = self.space / "copy"
        shutil.copytree(self.tree, copy, symlinks=True)
        _, _, text = self.dev("run", script=copy / "dev")
        self.assertIn(f"build/release was made for {self.tree}, in {self.tree}/build/release: starting afresh", text)
        self.assertEqual(f"tree {copy}\n", (copy / "build/release/build.ninja").read_text(encoding="utf-8"))
        self.runs_in(copy, script=copy / "dev")
        moved = self.space / "moved"
        self.tree.rename(moved)
        (moved / "build/release/left-over").touch()
        self.runs_in(moved, script=moved / "dev")
        self.assertFalse((moved / "build/release/left-over").exists())

    def test_what_is_configured_stays(self):
        self.runs_in(self.tree)
        self.runs_in(self.tree)
        link = self.space / "link"
        link.symlink_to(self.tree)
        self.runs_in(self.tree, script=link / "dev")
        self.assertEqual(1, len(self.calls("cmake --preset")))

    def test_a_folder_copied_within_the_tree_is_made_afresh(self):
        self.dev("build", "release")
        shutil.copytree(self.tree / "build/release", self.tree / "build/debug")
        self.expect(0, "starting afresh", "build", "debug")

    def test_a_folder_made_of_another_tree_is_made_afresh(self):
        self.dev("build")
        cache = self.tree / "build/release/CMakeCache.txt"
        cache.write_text(cache.read_text("utf-8").replace(f"DIRECTORY:INTERNAL={self.tree}", "DIRECTORY:INTERNAL=/x"),
                         encoding="utf-8")
        self.expect(0, "build/release was made for /x, in", "build")

    def test_a_folder_that_leads_out_of_the_tree_is_refused(self):
        outside = self.space / "outside"
        outside.mkdir()
        for name in ("build", ".cache"):
            with self.subTest(name):
                link = self.tree / name
                link.symlink_to(outside)
                self.expect(1, f"leads out of this tree, to {outside}", "run")
                self.assertEqual([], os.listdir(outside))
                link.unlink()
        (self.tree / "build/release").mkdir(parents=True, exist_ok=True)
        shutil.rmtree(self.tree / "build/release")
        (self.tree / "build/release").symlink_to(outside)
        (outside / "CMakeCache.txt").touch()
        self.expect(1, "leads out of this tree", "run")
        self.expect(0, "", "clean")
        self.assertTrue((outside / "CMakeCache.txt").exists())
        self.assertFalse((self.tree / "build").exists())
        (self.tree / "build").symlink_to(outside)
        self.expect(0, "", "clean")
        self.assertTrue((outside / "CMakeCache.txt").exists())


class Caches(TreeTest):
    def test_the_cache_is_the_trees_and_stays(self):
        self.expect(0, f"cache {self.tree}/.cache/ccache", "run")
        self.expect(0, "", "clean")
        self.assertTrue((self.tree / ".cache/ccache").is_dir())

    def test_another_place_for_it(self):
        self.expect(0, f"cache {self.space}/my cache/ccache", "run", PMX_CACHE="my cache")
        self.assertFalse((self.tree / ".cache").exists())

    def test_the_kernel_is_kept_there_too(self):
        made = f"{self.tree}/build/kernel {self.tree}/build/release/pmxboard {self.tree}/build/arm-bare/kernel/pmx_if.o"
        self.expect(0, f"kernel {self.tree}/.cache/kernel {made}\n", "kernel")
        self.expect(0, f"kernel {self.space}/kept/kernel {made}\n", "kernel", PMX_CACHE="kept", CCACHE_DIR="/elsewhere")
        self.expect(0, "", "clean")
        self.assertTrue((self.tree / ".cache/kernel").is_dir())
        self.expect(2, "kernel does not take: x", "kernel", "x")

    def test_each_way_of_the_kernel_has_its_program(self):
        for option, program in (("--cost", "cost_kernel"), ("--all", "every_kernel"), ("--debug", "debug_kernel")):
            self.expect(0, f"{program} {self.tree}/.cache/kernel {self.tree}/build/kernel ", "kernel", option)
            self.expect(2, f"kernel {option} does not take: x", "kernel", option, "x")

    def test_the_kernels_that_watch_do_so_for_some_minutes(self):
        self.expect(0, "/arm-bare/kernel/pmx_if.o 60\n", "kernel", "--debug", "60")
        for words in (("--debug", "0"), ("--debug", "99999"), ("--debug", "60", "1"), ("--all", "60"), ("60",)):
            self.expect(2, "does not take: ", "kernel", *words)

    def test_the_proof_is_kept_there_too(self):
        self.expect(0, f"prove {self.tree}/.cache/prove {self.tree}/build/prove\n", "prove")
        self.expect(0, f"prove {self.space}/kept/prove {self.tree}/build/prove --faults PMX_Init\n",
                    "prove", "--faults", "PMX_Init", PMX_CACHE="kept")
        self.expect(0, f"prove {self.tree}/.cache/prove {self.tree}/build/prove --same-as HEAD~1\n",
                    "prove", "--same-as", "HEAD~1")
        self.expect(0, "", "clean")
        self.assertTrue((self.tree / ".cache/prove").is_dir())

    def test_verdicts_on_mutants_are_kept_there_too(self):
        made = f"{self.tree}/build/mutate/planted"
        self.expect(0, f"mutate {self.tree}/.cache/mutate {made} 100\n", "mutate", "100")
        self.assertEqual(["cmake --build --preset mutate --target mutate_tests"], self.calls("cmake --build"))
        self.expect(0, f"mutate {self.space}/kept/mutate {made} --show x\n", "mutate", "--show", "x", PMX_CACHE="kept")
        self.expect(0, "", "clean")
        self.assertTrue((self.tree / ".cache/mutate").is_dir())

    def test_the_users_own_is_used(self):
        self.expect(0, "cache /elsewhere", "run", CCACHE_DIR="/elsewhere")
        self.expect(0, "cache none", "run", CCACHE_CONFIGPATH="/elsewhere/ccache.conf")
        self.assertFalse((self.tree / ".cache").exists())

    def test_a_place_that_cannot_be_used(self):
        self.expect(1, "/dev/null/ccache cannot be made: Not a directory", "run", PMX_CACHE="/dev/null")

    def test_a_home_is_not_needed(self):
        for home in ("/nowhere", "/dev/null", ""):
            self.expect(0, "ran in", "run", HOME=home)
        self.expect(0, "ran in", "run", before=("env", "--unset=HOME"))


class Others(TreeTest):
    def test_two_at_once_build_one_after_the_other(self):
        runs = [self.start("run", SLOW_BUILD="0.4", SLOW_CONFIGURE="0.2") for _ in range(3)]
        texts = [run.communicate(timeout=30)[0] for run in runs]
        self.assertEqual([0, 0, 0], [run.returncode for run in runs], texts)
        self.assertNotIn("cmake met another one", self.calls())
        self.assertEqual(1, len(self.calls("cmake --preset")))
        self.assertEqual(2, "".join(texts).count("dev: waiting for another run that is using build/release\n"), texts)

    def test_two_folders_are_built_at_once(self):
        gate = self.space / "gate"
        runs = [self.start("build", preset, GATE=str(gate)) for preset in ("release", "debug")]
        self.wait_for("cmake --build", 2)
        gate.touch()
        texts = [run.communicate(timeout=30)[0] for run in runs]
        self.assertEqual([0, 0], [run.returncode for run in runs], texts)
        self.assertNotIn("waiting for another run that is using", "".join(texts))

    def test_a_lock_that_was_cleaned_away_is_none(self):
        lock = self.tree / "build/release.lock"
        lock.parent.mkdir()
        with lock.open("w", encoding="utf-8") as file:
            fcntl.flock(file, fcntl.LOCK_EX)
            run = self.start("build")
            line = run.stdout.readline()
            while "waiting for another run that is using build/release" not in line:
                self.assertTrue(line, "did not wait")
                line = run.stdout.readline()
            shutil.rmtree(lock.parent)
        run.communicate(timeout=30)
        self.assertEqual(0, run.returncode)
        self.assertTrue(lock.exists())

    def test_cleaning_waits_and_whoever_waited_starts_anew(self):
        first = self.start("run", SLOW_BUILD="0.6")
        self.wait_for("cmake --build")
        others = [self.start("clean"), self.start("run")]
        texts = [run.communicate(timeout=30)[0] for run in (first, *others)]
        self.assertEqual([0, 0, 0], [run.returncode for run in (first, *others)], texts)
        self.assertNotIn("cmake met another one", self.calls())
        self.expect(0, "ran in", "run")

    def test_a_killed_run_blocks_nobody(self):
        run = self.start("run", SLOW_BUILD="30")
        self.wait_for("cmake --build")
        os.killpg(run.pid, signal.SIGKILL)
        run.communicate(timeout=30)
        shutil.rmtree(self.tree / "build/release/building", ignore_errors=True)  # it may not have come that far
        self.assertNotIn("waiting", self.expect(0, "ran in", "run")[2])

    def test_what_a_killed_run_left_at_work_is_waited_for(self):
        run = self.start("run", SLOW_BUILD="1")
        self.wait_for("cmake --build")
        run.kill()
        self.expect(0, "waiting for another run", "run")
        self.assertNotIn("cmake met another one", self.calls())
        run.communicate(timeout=30)

    def test_interrupted(self):
        for slow in ("SLOW_CONFIGURE", "SLOW_BUILD"):
            with self.subTest(slow):
                shutil.rmtree(self.tree / "build", ignore_errors=True)
                (self.stubs / "calls").write_text("", encoding="utf-8")
                run = self.start("run", **{slow: "30"})
                self.wait_for("cmake works")
                os.killpg(run.pid, signal.SIGINT)
                text = run.communicate(timeout=30)[0]
                self.assertEqual(-signal.SIGINT, run.returncode, text)   # a shell calls that 130
                self.assertNotIn("failed", text)
                for left in self.tree.glob("build/*/building"):
                    left.rmdir()
                self.expect(0, f"ran in {self.tree}", "run")
                self.assertEqual(f"tree {self.tree}\n", (self.tree / "build/release/build.ninja").read_text("utf-8"))

    def test_a_shell_calls_an_interrupted_run_130(self):
        for more in ({}, {"CATCHES": "1"}):
            with self.subTest(more):
                (self.stubs / "calls").write_text("", encoding="utf-8")
                asking = subprocess.Popen(["bash", "-c", 'trap : INT; "$0" run; echo "ended with $?"',
                                           self.tree / "dev"], text=True, stdout=subprocess.PIPE,
                                          stderr=subprocess.DEVNULL, start_new_session=True,
                                          env=self.environment(SLOW_BUILD="30", **more))
                self.wait_for("cmake works")
                os.killpg(asking.pid, signal.SIGINT)
                self.assertEqual("ended with 130\n", asking.communicate(timeout=30)[0])

    def test_a_half_configured_folder_is_not_used(self):
        (self.tree / "build/release").mkdir(parents=True)
        for left in ("CMakeCache.txt", "build.ninja"):
            (self.tree / "build/release" / left).touch()
            self.expect(0, "configuring build/release", "run")
            (self.tree / "build/release" / left).unlink()
            self.expect(0, "configuring build/release", "run")
            shutil.rmtree(self.tree / "build/release")
            (self.tree / "build/release").mkdir()


class Rights(TreeTest):
    @takes_two_users
    def test_a_tree_that_may_only_be_read(self):
        self.expect(1, f"{self.tree}/build cannot be made: Permission denied", "run", before=AS_NOBODY)
        read_only = ("unshare", "--mount", "sh", "-c",
                     'mount --bind "$0" "$0" && mount -o remount,bind,ro "$0" && exec "$0/dev" "$@"')
        self.expect(1, f"{self.tree}/build cannot be made: Read-only file system", "run", script=self.tree,
                    before=read_only)
        self.expect(0, "usage: ./dev", "help", script=self.tree, before=read_only)
        self.assertEqual([], self.calls("cmake"))
        self.dev("run")
        count = len(self.calls())
        self.expect(1, f"{self.tree}/build, which belongs to root, cannot be written by root: Read-only file system",
                    "run", script=self.tree, before=read_only)
        self.expect(1, "Read-only file system", "clean", script=self.tree, before=read_only)
        self.assertEqual([], self.calls("cmake")[count:])

    @takes_two_users
    def test_what_another_user_built(self):
        self.dev("run")
        count = len(self.calls("cmake"))
        for verb in ("run", "clean"):
            self.expect(1, f"{self.tree}/build, which belongs to root, cannot be written by nobody: Permission denied",
                        verb, before=AS_NOBODY)
        (self.tree / "build").chmod(0o777)
        self.expect(1, "release.lock cannot be written by nobody: Permission denied", "run", before=AS_NOBODY)
        (self.tree / "build/release.lock").chmod(0o666)
        self.tree.chmod(0o777)
        self.expect(1, f"{self.tree}/build/release, which belongs to root, cannot be written", "run",
                    before=AS_NOBODY, PMX_CACHE=str(self.tree / "own"))
        self.assertEqual(count, len(self.calls("cmake")))

    def test_failures_are_failures(self):
        self.expect(1, "no compiler\ndev: configuring failed", "run", BREAK_CONFIGURE="1")
        self.expect(1, "dev: the build failed", "run", BREAK_BUILD="1")
        with open("/dev/full", "w", encoding="utf-8") as full:
            result = subprocess.run([self.tree / "dev", "help"], stdout=full, stderr=subprocess.PIPE, check=False,
                                    text=True, env=self.environment())
        self.assertEqual(1, result.returncode)
        self.assertIn("No space left on device", result.stderr)


class Usage(TreeTest):
    def test_errors_of_usage_end_with_2_and_do_nothing(self):
        (self.tree / "build").mkdir()
        for arguments, message in ((("cleam",), "no such verb: cleam"),
                                   (("build", "relase"), "no such preset: relase"),
                                   (("build", "release", "debug"), "build release does not take: debug"),
                                   (("clean", "release"), "clean does not take: release"),
                                   (("coverage", "x"), "coverage does not take: x"),
                                   (("docs", "x"), "docs does not take: x"),
                                   (("format", "a b", "c"), "format does not take: a b c"),
                                   (("lint", "--al"), "lint does not take: --al"),
                                   (("compare",), "compare: which revision?")):
            with self.subTest(arguments):
                self.expect(2, message, *arguments)
        self.assertEqual([], self.calls())
        self.assertTrue((self.tree / "build").exists())

    def test_words_go_on_as_they_are(self):
        self.expect(0, "run a b $c * --quiet\n", "run", "a b", "$c", "*", "--quiet")
        self.expect(0, "", "test", "-R", "a b|c", PMX_AGAIN="")
        self.assertEqual(["ctest --preset debug --label-exclude ^emulated$ -R a b|c"], self.calls("ctest"))
        self.assertEqual(["again false"], self.calls("again"))
        self.expect(0, "", "test", "--again", "-R", "x", PMX_AGAIN="")
        self.assertEqual("ctest --preset debug --label-exclude ^emulated$ -R x", self.calls("ctest")[1])
        self.assertEqual(["again false", "again true"], self.calls("again"))

    def test_the_target_s_tests_are_the_others(self):
        self.expect(0, "", "target", "-R", "a b|c")
        self.assertEqual(["ctest --preset debug --label-regex ^emulated$ -R a b|c"], self.calls("ctest"))
        self.assertEqual(["cmake --build --preset arm-linux"], self.calls("cmake --build --preset arm-linux"))

    def test_a_test_needs_no_more_of_the_target_than_the_object(self):
        self.dev("test")
        self.assertEqual(["cmake --build --preset arm-linux --target pmx_objects"],
                         self.calls("cmake --build --preset arm-linux"))

    def test_a_long_life_needs_its_programs_and_no_more(self):
        made = f"{self.tree}/build/release/soak {self.tree}/build/arm-linux/soak_emulated"
        self.expect(0, f"soak {made} 1000\n", "soak", "1000")
        built = [f"cmake --build --preset {preset} --target soak" for preset in ("release", "arm-linux")]
        self.assertEqual(built, self.calls("cmake --build"))

    def test_a_repository_of_the_surroundings_is_not_ours(self):
        self.dev("test", GIT_DIR="/elsewhere/.git")
        self.assertEqual(["repository none"], self.calls("repository"))

    def test_what_builds_is_called_in_the_tree_alone(self):
        self.dev("test")
        built = [line.split()[2] for line in self.calls("cmake --preset")]
        self.assertEqual(["debug", "release", "arm-bare", "arm-linux"], built)
        self.assertEqual(["CMakeLists.txt", "CMakePresets.json", "build", "dev", "packages.txt", "tests", "tools"],
                         sorted(set(os.listdir(self.tree)) - {".cache"}))
        self.assertEqual(["stubs", "tree"], sorted(os.listdir(self.space)))


if __name__ == "__main__":
    unittest.main()
