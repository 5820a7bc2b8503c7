# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Small kernels of our own, made from Debian's source and from fragments of a configuration: what no kernel that ships
looks for, and what none of them is. A kernel is made once for its source, fragments and compiler."""

import hashlib
import os
import pathlib
import re
import shutil
import subprocess

import debian
import machines

FRAGMENTS = pathlib.Path(__file__).resolve().parent / "own"
BASE = {machines.ARM: ("common", "arm"), machines.PC: ("common", "x86_64")}
SETTING = re.compile(r"^(CONFIG_\w+)=(.+)$", re.M)


class Broken(Exception):
    """The kernel cannot be made."""


class Kernel:
    """What was made; nothing that the port needs is a module of it."""

    ships = False

    def __init__(self, folder, release, machine, busybox):
        self.release, self.machine, self.busybox = release, machine, busybox
        self.image = folder / machine.image
        self.headers = folder


def fragments(machine, names):
    """The text of what a kernel is made from."""
    return "".join((FRAGMENTS / f"{name}.fragment").read_text(encoding="utf-8") for name in (*BASE[machine], *names))


def refused(wanted, configured):
    """Settings that the kernel's own rules did not take."""
    found = dict(SETTING.findall(configured))
    return [f"{name}={value}" for name, value in SETTING.findall(wanted) if found.get(name, "n") != value]


def _make(source, folder, machine, *words):
    compiler = f"{machine.cross}gcc"
    if shutil.which("ccache"):
        compiler = f"ccache {compiler}"
    command = ["nice", "-n", "5", "make", "-s", f"-j{os.cpu_count()}", "-C", source, f"O={folder}",
               f"ARCH={machine.arch}", f"CROSS_COMPILE={machine.cross}", f"CC={compiler}", *words]
    made = subprocess.run(command, capture_output=True, text=True, check=False)
    if made.returncode != 0:
        raise Broken(f"make {' '.join(words)} ended with {made.returncode}:\n{(made.stdout + made.stderr)[-3000:]}")
    return made.stdout


def _build(source, folder, machine, wanted):
    """The kernel's release."""
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    (folder / "wanted").write_text(wanted, encoding="utf-8")
    _make(source, folder, machine, "allnoconfig")
    subprocess.run([source / "scripts/kconfig/merge_config.sh", "-m", "-O", folder, folder / ".config",
                    folder / "wanted"], cwd=source, check=True, capture_output=True)
    _make(source, folder, machine, "olddefconfig")
    lacks = refused(wanted, (folder / ".config").read_text(encoding="utf-8"))
    if lacks:
        raise Broken(f"this kernel cannot have {', '.join(lacks)}")
    _make(source, folder, machine, pathlib.PurePath(machine.image).name, "modules")
    return _make(source, folder, machine, "kernelrelease").strip()


def _compiler(machine):
    return subprocess.run([f"{machine.cross}gcc", "--version"], check=True, capture_output=True,
                          text=True).stdout.splitlines()[0]


def kernel(cache, machine, name, shipped):
    """The kernel of that name, with the shell of the one that ships."""
    source, version = debian.source(cache / "source")
    wanted = fragments(machine, [name])
    wish = hashlib.sha256(f"{version}\n{wanted}\n{_compiler(machine)}".encode()).hexdigest()
    folder, release = debian.kept(cache / f"own-{name}", wish,
                                  lambda place: _build(source, place / "made", machine, wanted))
    return Kernel(folder / "made", release, machine, shipped.busybox)
