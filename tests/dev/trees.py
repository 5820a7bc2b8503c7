# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Small trees around the project's ./dev, and programs that stand in for those that build and install."""

import os
import pathlib
import shutil
import subprocess
import tempfile
import time
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
NOBODY = 65534
KERNEL_PROGRAMS = ("run", "cost_kernel", "debug_kernel", "every_kernel")

# Each notes its call. The cmake notes as well when two builds of one folder meet, and when it has come to its long
# work: a shell that is interrupted while another child is about to end well goes on behind it.
PROGRAMS = {
    "cmake": r"""
case "$1" in
--preset)
    mkdir -p "build/$2"
    printf '%s\n' "CMAKE_HOME_DIRECTORY:INTERNAL=$PWD" "CMAKE_CACHEFILE_DIR:INTERNAL=$PWD/build/$2" \
        >"build/$2/CMakeCache.txt"
    [ -z "${BREAK_CONFIGURE:-}" ] || { echo "no compiler"; exit 1; }
    takes "${SLOW_CONFIGURE:-}"
    echo "tree $PWD" >"build/$2/build.ninja"
    ;;
--build)
    folder="build/$3"
    mkdir "$folder/building" || note "cmake met another one"
    echo "[1/1] building, cache ${CCACHE_DIR:-none}"
    [ -z "${CATCHES:-}" ] || trap 'rmdir "$folder/building"; exit 1' INT
    while [ -n "${GATE:-}" ] && [ ! -e "$GATE" ]; do sleep 0.02; done
    takes "${SLOW_BUILD:-}"
    [ -z "${BREAK_BUILD:-}" ] || { rmdir "$folder/building"; exit 1; }
    printf '#!/bin/bash\nprintf "%%s\\n" "ran in "%q": $*"\n' "$PWD" >"$folder/pmxboard"
    chmod +x "$folder/pmxboard"
    rmdir "$folder/building"
    ;;
esac
""",
    "dpkg-query": r"""
[ -z "${BREAK_DPKG:-}" ] || exit 2
shift 2
answer=0
for package
do
    if grep -qx "$package" "$STUBS/installed"; then echo "$package installed"; else answer=1; fi
done
exit "$answer"
""",
    "apt-get": r"""
[ "$1" != install ] || sleep "${SLOW_INSTALL:-0}"
[ -z "${BREAK_APT:-}" ] || { echo "E: no network" >&2; exit 100; }
for word
do
    case "$word" in install | -* | DPkg::*) ;; *) [ "$1" != install ] || echo "$word" >>"$STUBS/installed" ;; esac
done
""",
    "sudo": 'exec "$@"\n',
    "ctest": 'note "repository ${GIT_DIR:-none}"; note "again ${PMX_AGAIN:-false}"\n',
    "doxygen": "",
}

START = """#!/bin/bash
note() { printf '%s\\n' "$*" >>"$STUBS/calls"; }
takes() { [ -z "$1" ] || { note "$(basename "$0") works"; sleep "$1"; }; }
note "$(basename "$0") $*"
"""


class TreeTest(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.space = pathlib.Path(directory.name).resolve()
        self.space.chmod(0o755)
        self.stubs = self.space / "stubs"
        self.stubs.mkdir()
        for name, text in PROGRAMS.items():
            (self.stubs / name).write_text(START + text, encoding="utf-8")
            (self.stubs / name).chmod(0o755)
        for name in ("calls", "installed"):
            (self.stubs / name).touch()
            (self.stubs / name).chmod(0o666)
        self.tree = self.make_tree("tree")

    def make_tree(self, name):
        tree = self.space / name
        tree.mkdir(parents=True)
        for file in ("dev", "packages.txt"):
            shutil.copy2(ROOT / file, tree)
        (tree / "CMakeLists.txt").write_text("cmake_minimum_required(VERSION 3.25)\n", encoding="utf-8")
        (tree / "CMakePresets.json").write_text("{}\n", encoding="utf-8")
        for name in KERNEL_PROGRAMS:
            self.make_program(tree / f"tests/kernel/{name}.py", name.replace("run", "kernel"))
        for name in ("tests/prove", "tests/mutate", "tools/soak"):
            program = name.split("/")[1]
            self.make_program(tree / f"{name}/{program}.py", program)
        return tree

    @staticmethod
    def make_program(path, says):
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(f'#!/bin/bash\necho "{says} $*"\n', encoding="utf-8")
        path.chmod(0o755)

    def environment(self, **more):
        kept = {name: value for name, value in os.environ.items() if name not in ("CCACHE_DIR", "CCACHE_CONFIGPATH",
                                                                                   "PMX_CACHE", "CDPATH")}
        path = f"{self.stubs}:{os.environ['PATH']}"
        return kept | {"PATH": path, "STUBS": str(self.stubs), "LC_ALL": "C.UTF-8"} | more

    def dev(self, *arguments, script=None, cwd=None, before=(), **more):
        """How ./dev ended: (code, standard output, diagnostics)."""
        result = subprocess.run([*before, script or self.tree / "dev", *arguments], cwd=cwd or self.space, check=False,
                                capture_output=True, text=True, env=self.environment(**more), timeout=60)
        return result.returncode, result.stdout, result.stderr

    def start(self, *arguments, **more):
        return subprocess.Popen([self.tree / "dev", *arguments], cwd=self.space, stdout=subprocess.PIPE, text=True,
                                stderr=subprocess.STDOUT, env=self.environment(**more), start_new_session=True)

    def wait_for(self, call, times=1):
        until = time.monotonic() + 60
        while len(self.calls(call)) < times:
            self.assertLess(time.monotonic(), until)
            time.sleep(0.02)

    def calls(self, program=""):
        lines = (self.stubs / "calls").read_text(encoding="utf-8").splitlines()
        return [line for line in lines if line.startswith(program)]

    def expect(self, code, message, *arguments, **more):
        found = self.dev(*arguments, **more)
        self.assertEqual(code, found[0], found)
        self.assertIn(message, found[1] + found[2])
        return found

    def installed(self):
        return set((self.stubs / "installed").read_text(encoding="utf-8").split())
