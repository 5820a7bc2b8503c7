# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Running compilers and other programs."""

import concurrent.futures
import pathlib
import shutil
import subprocess


class ToolError(Exception):
    """A program that is needed failed, or is not there."""


def run(*command, **options):
    """The standard output of a program."""
    command = [str(word) for word in command]
    try:
        done = subprocess.run(command, capture_output=True, text=True, check=False, **options)
    except FileNotFoundError:
        raise ToolError(f"{command[0]} is not installed: ./dev setup") from None
    if done.returncode != 0:
        raise ToolError(f"{' '.join(command[:3])} ... failed ({done.returncode}):\n{done.stderr}")
    return done.stdout


def run_binary(*command):
    """The same, as bytes."""
    done = subprocess.run([str(word) for word in command], capture_output=True, check=False)
    if done.returncode != 0:
        raise ToolError(f"{command[0]} failed ({done.returncode}):\n{done.stderr.decode(errors='replace')}")
    return done.stdout


def compiler(name):
    """A compiler, behind the compiler cache where there is one."""
    return ([shutil.which("ccache")] if shutil.which("ccache") else []) + [name]


def version(name):
    """What a compiler calls itself: its package's name and version, and the number alone for comparing."""
    return run(name, "--version").splitlines()[0]


def write(path, text):
    """Write a file unless it holds that already."""
    path = pathlib.Path(path)
    path.parent.mkdir(parents=True, exist_ok=True)
    if not path.exists() or path.read_text(encoding="utf-8") != text:
        path.write_text(text, encoding="utf-8")
    return path


def in_parallel(function, *columns):
    """Call a function with each row of the columns, two at a time."""
    with concurrent.futures.ThreadPoolExecutor(2) as pool:
        return list(pool.map(function, *columns))
