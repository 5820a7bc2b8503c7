#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a project elsewhere does with an installation: finds it, builds the examples and programs of its own, runs them.
The installation has been moved since it was made, and the tree that it was made from cannot be seen.

usage: check_use.py CMAKE BUILD_DIRECTORY VERSION
       check_use.py --here CMAKE PREFIX VERSION     this installation, with what can be seen

Ends with 77 when all is well as far as it could be looked at, but the system did not let the tree be hidden.
"""

import os
import pathlib
import re
import shlex
import shutil
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True
sys.path.append(str(pathlib.Path(__file__).resolve().parents[1] / "examples"))

import check_middleware  # noqa: E402

SKIPPED = 77
HERE = pathlib.Path(__file__).resolve().parent
INSTALLED_AS = "usr/made/here"
# What lets somebody mount: being root, or being it in a name space of one's own.
MAY_MOUNT = (["unshare", "--mount"], ["unshare", "--mount", "--map-root-user"])

PROJECT = """cmake_minimum_required(VERSION 3.25)
project(user LANGUAGES {languages})
find_package(pmx {wanted} CONFIG REQUIRED {more})
add_executable(user {source})
target_link_libraries(user PRIVATE {targets})
"""
OWN_TEST = """#include <cstdio>
#include "board/board.h"
#include "drv_pmx.h"
int main()
{
    board::power_on(board::load_description("default"));
    PMX_Init();
    for (const board::TraceEntry& entry : board::trace::entries())
        std::puts(entry.brief().c_str());
}
"""
NO_BOARD = """#include "board/board_c.h"
int main(void)
{
    return board_c_power_on("nobody") == -1 ? 0 : 1;
}
"""
OWN_PORT = """#include "port_skeleton.c"
int main(void)
{
    PMX_Init();
    return 0;
}
"""


def run(*command, expected=0, **options):
    """What a command prints."""
    done = subprocess.run(list(map(str, command)), capture_output=True, text=True, check=False, **options)
    printed = done.stdout + done.stderr
    if (done.returncode == 0) != (expected == 0):
        sys.exit(f"{' '.join(map(str, command))}\nexit code {done.returncode}\n{printed}")
    return printed


def demand(what, text, place):
    if what not in text:
        sys.exit(f"{place}: not told: {what}\n{text}")


class User:
    """Somebody with a folder of his own and an installation."""

    def __init__(self, cmake, prefix, version, folder):
        self.cmake, self.prefix, self.version, self.folder = cmake, prefix, version, folder
        self.options = ["-G", "Ninja", f"-DCMAKE_PREFIX_PATH={prefix}", "-DCMAKE_C_FLAGS=-Wall -Wextra -Werror"]
        self.environment = {**os.environ, "PKG_CONFIG_PATH": str(prefix / "lib/pkgconfig")}

    def written(self, name, files):
        place = self.folder / name
        place.mkdir()
        for file, text in files.items():
            (place / file).write_text(text, encoding="utf-8")
        return place

    def project(self, name, languages, source, text, wanted="1", more="", targets="pmx::layer pmx::board"):
        lists = PROJECT.format(languages=languages, wanted=wanted, more=more, source=source, targets=targets)
        return self.written(name, {"CMakeLists.txt": lists, source: text})

    def configured(self, source, expected=0):
        return run(self.cmake, *self.options, "-S", source, "-B", self.folder / "build" / source.name,
                   expected=expected)

    def built(self, source):
        self.configured(source)
        run(self.cmake, "--build", self.folder / "build" / source.name)
        return self.folder / "build" / source.name

    def compiled(self, compiler, source, package, *more):
        """By the compiler alone, with what pkg-config says."""
        flags = run("pkg-config", "--cflags", "--libs", package, env=self.environment).split()
        program = source.with_suffix("")
        run(*shlex.split(compiler), source, *more, "-o", program, *flags)
        return program


def examples(user):
    place = user.built(user.prefix / "share/pmx/examples")
    check_middleware.check([place / "middleware"])
    run("ctest", "--test-dir", place, "--no-tests=error")


def own_projects(user):
    cpp = user.built(user.project("default_cpp", "CXX", "test.cpp", OWN_TEST))
    demand("PMX_HalSetMode(0, RES_1080P60HZ)", run(cpp / "user"), "C++ as a compiler takes it by default")
    both = user.built(user.project("c_and_cpp", "C CXX", "test.c", NO_BOARD))
    demand("no such board: nobody; there are: ", run(both / "user"), "a board that does not exist")
    own = user.project("port", "C", "port.c", OWN_PORT, more="COMPONENTS layer", targets="pmx::layer")
    shutil.copy(user.prefix / "share/pmx/examples/port_skeleton.c", own)
    run(user.built(own) / "user")


def refused(user):
    major = int(user.version.partition(".")[0])
    for wanted in (str(major + 1), f"{major}.999"):
        place = user.project(f"version_{wanted}", "C", "test.c", NO_BOARD, wanted=wanted)
        demand(f'compatible with requested version "{wanted}"', " ".join(user.configured(place, 1).split()), wanted)
    place = user.project("component", "C", "test.c", NO_BOARD, more="COMPONENTS layer sound")
    demand("pmx has no component sound", " ".join(user.configured(place, 1).split()), "a component")
    old = user.written("old_cpp", {"test.cpp": OWN_TEST})
    printed = run("c++", "-std=c++17", "-fsyntax-only", f"-I{user.prefix}/include/pmx", old / "test.cpp", expected=1)
    demand("compile with -std=c++20", printed, "C++17")


def compiler_alone(user):
    place = user.written("alone", {"test.cpp": OWN_TEST, "port.c": OWN_PORT})
    for name in ("middleware.c", "middleware_test.c", "port_skeleton.c"):
        shutil.copy(user.prefix / "share/pmx/examples" / name, place)
    check_middleware.check([user.compiled("cc", place / "middleware.c", "pmx-board")])
    run(user.compiled("cc", place / "middleware_test.c", "pmx-board"))
    run(user.compiled("c++ -std=c++20", place / "test.cpp", "pmx-board"))
    run(user.compiled("cc", place / "port.c", "pmx"))
    demand(user.version, run("pkg-config", "--modversion", "pmx-board", env=user.environment), "pkg-config")


# "…, in `player.c`:" and what stands in the block below it.
FILE = re.compile(r"`([\w.]+)`[^`\n]*(?:\n[^`\n]+)*:\n\n```(?:c|cmake)\n(.*?)^```$", re.DOTALL | re.MULTILINE)
COMMANDS = re.compile(r"^```shell\n(.*?)^```$", re.DOTALL | re.MULTILINE)


def guide(user):
    """The guide's files, and its commands one after the other."""
    text = (user.prefix / "share/doc/pmx/testing.md").read_text(encoding="utf-8")
    files = dict(FILE.findall(text))
    commands = COMMANDS.findall(text)
    if len(files) != text.count("```c\n") + text.count("```cmake\n") or len(commands) < 4:
        sys.exit(f"testing.md: not every file has a name: {', '.join(files)}; {len(commands)} blocks of commands")
    run("bash", "-euo", "pipefail", "-c", "".join(commands), cwd=user.written("guide", files),
        env={**os.environ, "PMX": str(user.prefix)})


def programs(user):
    """Platform functions of a program's own, all of a driver's and a single one; and a board without power."""
    defined = run("nm", "--defined-only", user.prefix / "lib/pmx/libpmx_board.a")
    for option in (user.prefix / "lib/pmx/recorded_calls.txt").read_text(encoding="utf-8").split():
        demand(f" W {option.partition('=')[2]}\n", defined, "functions that give way")
    place = user.built(HERE / "programs")
    saved = user.folder / "own driver.json"
    run(place / "whole_driver", saved)
    for reader in (("status",), ("status", "--json"), ("state",), ("state", "--json")):
        demand("TVE_SetFmtEx", run(user.prefix / "bin/pmxboard", *reader, saved), " ".join(reader))
    for program in ("one_function", "no_power"):
        run(place / program)


def use(cmake, prefix, version):
    with tempfile.TemporaryDirectory() as folder:
        user = User(cmake, pathlib.Path(prefix), version, pathlib.Path(folder))
        for part in (examples, own_projects, refused, compiler_alone, programs, guide):
            part(user)


def hiding(root):
    """The command under which a folder cannot be seen; none when the system permits none."""
    mount = ["sh", "-c", 'mount -t tmpfs none "$0" && exec "$@"', str(root)]
    for way in MAY_MOUNT:
        if shutil.which(way[0]) and subprocess.run([*way, *mount, "test", "!", "-e", str(root / "CMakeLists.txt")],
                                                   capture_output=True, check=False, cwd="/").returncode == 0:
            return [*way, *mount]
    return []


def install_and_use(cmake, build, version):
    root = HERE.parents[1]
    with tempfile.TemporaryDirectory() as directory:
        folder = pathlib.Path(directory)
        run(cmake, "--install", build, "--prefix", f"/{INSTALLED_AS}",
            env={**os.environ, "DESTDIR": str(folder / "staged")})
        (folder / "staged" / INSTALLED_AS).rename(folder / "unpacked")
        (folder / "checks").mkdir()
        for check in (HERE / "check_use.py", root / "tests/examples/check_middleware.py"):
            shutil.copy(check, folder / "checks")
        shutil.copytree(HERE / "programs", folder / "checks/programs")
        hidden = hiding(root)
        done = subprocess.run([*hidden, sys.executable, str(folder / "checks/check_use.py"), "--here", cmake,
                               str(folder / "unpacked"), version], check=False, cwd=folder)
    if done.returncode == 0 and not hidden:
        print("the tree could be seen: this system lets nobody mount over it")
        return SKIPPED
    return done.returncode


def main():
    if sys.argv[1] == "--here":
        use(*sys.argv[2:])
        return 0
    return install_and_use(*sys.argv[1:])


if __name__ == "__main__":
    sys.exit(main())
