# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Debian's own kernels, their headers and a shell for them, and the source of an own one, unpacked into a cache folder.
Nothing is installed: apt gets a state of its own, in which the foreign architecture is known, and asks the package
sources of this machine."""

import pathlib
import shutil
import subprocess
import sys

import machines

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[1] / "common"))

from packages import Apt, Unavailable, emptied, kept, unpack  # noqa: E402, F401

ARCHITECTURES = ("amd64", "armhf")


def _fetch(folder, machine, modules, newest):
    apt = Apt(folder / "apt", ARCHITECTURES)
    apt.update()
    if newest:
        apt.prefer_backports()
    kind = machine.architecture
    image = apt.depends(f"linux-image-{machine.flavour}:{kind}", on=r"linux-image-[\w.+-]+")
    version, release = apt.version(f"{image}:{kind}"), image.removeprefix("linux-image-")
    headers, common = f"linux-headers-{release}", f"linux-headers-{release.removesuffix('-' + machine.flavour)}-common"
    archives, unpacked = emptied(folder / "archives"), emptied(folder / "unpacked")
    programs = apt.depends(f"{headers}:{kind}", on=r"linux-kbuild-[\w.+-]+")
    apt.download([f"{image}:{kind}={version}", f"{headers}:{kind}={apt.version(f'{headers}:{kind}')}",
                  f"{common}={apt.version(common)}", f"{programs}:{apt.host}={apt.version(f'{programs}:{apt.host}')}",
                  f"busybox-static:{kind}"], archives)
    wanted = [f"./lib/modules/{release}/kernel/{module}" for module in modules]
    for archive in sorted(archives.iterdir()):
        unpack(archive, unpacked, *(["./boot", *wanted] if archive.name.startswith("linux-image-") else []))
    shutil.rmtree(archives)
    # The headers' makefile is one line, which names the installed place of the common ones.
    source = unpacked / "usr/src"
    (source / headers / "Makefile").write_text(f"include {source / common}/Makefile\n", encoding="utf-8")
    return release


class Kernel:
    """What was unpacked."""

    ships = True

    def __init__(self, folder, release, machine):
        self.release, self.machine = release, machine
        self.image = folder / f"unpacked/boot/vmlinuz-{release}"
        self.headers = folder / f"unpacked/usr/src/linux-headers-{release}"
        self.busybox = folder / "unpacked/bin/busybox"
        self._modules = folder / f"unpacked/lib/modules/{release}/kernel"

    def module(self, name):
        return self._modules / name


def kernel(folder, machine=machines.ARM, newest=False):
    """Debian's kernel for the machine: the stable one, or that of the backports."""
    modules = machine.modules if newest else (*machine.modules, *machine.peers)
    wanted = " ".join([machine.flavour, *["newest"] * newest, *modules])
    folder, release = kept(folder, wanted, lambda place: _fetch(place, machine, modules, newest))
    return Kernel(folder, release, machine)


def _fetch_source(folder):
    apt = Apt(folder / "apt", ARCHITECTURES)
    apt.update()
    package = apt.depends("linux-source", on=r"linux-source-[\w.]+")
    version = apt.version(package)
    archives, unpacked = emptied(folder / "archives"), emptied(folder / "unpacked")
    apt.download([f"{package}={version}"], archives)
    for archive in archives.iterdir():
        unpack(archive, archives, f"./usr/src/{package}.tar.xz")
    subprocess.run(["tar", "xJf", archives / f"usr/src/{package}.tar.xz", "-C", unpacked, "--strip-components=1"],
                   check=True)
    shutil.rmtree(archives)
    return version


def source(folder):
    """(folder, version) of the source of Debian's kernel."""
    folder, version = kept(folder, "source", _fetch_source)
    return folder / "unpacked", version
