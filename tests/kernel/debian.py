# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Debian's own ARM kernel, its headers and a shell for it, unpacked into a cache folder. Nothing is installed: apt gets
a state of its own, in which the foreign architecture is known, and asks the package sources of this machine."""

import fcntl
import pathlib
import re
import shutil
import subprocess

IMAGE = "linux-image-armmp:armhf"
ARCHITECTURES = ("amd64", "armhf")
USABLE = "usable"  # a file that is written last, with the kernel's release


class Unavailable(Exception):
    """What is needed is neither there nor to be had."""


class Apt:
    def __init__(self, folder):
        for name in ("state/lists/partial", "cache/archives/partial"):
            (folder / name).mkdir(parents=True, exist_ok=True)
        (folder / "state/status").touch()
        host = subprocess.run(["dpkg", "--print-architecture"], check=True, capture_output=True, text=True).stdout
        own = {"Dir::State": folder / "state", "Dir::State::status": folder / "state/status",
               "Dir::Cache": folder / "cache", "APT::Architecture": host.strip(), "APT::Sandbox::User": "root"}
        self._options = [f"-o{name}={value}" for name, value in own.items()]
        self._options += [f"-oAPT::Architectures::={name}" for name in dict.fromkeys((host.strip(), *ARCHITECTURES))]

    def _run(self, program, *arguments, **how):
        return subprocess.run([program, *self._options, *arguments], capture_output=True, text=True, check=False, **how)

    def update(self):
        """An index that is out of step makes this fail; whether what is wanted is there is seen later."""
        self._run("apt-get", "-q", "update")

    def depends(self, package):
        found = re.search(r"Depends: ([\w.+-]+)", self._run("apt-cache", "depends", package).stdout)
        if not found:
            raise Unavailable(f"no package source of this machine has {package}")
        return found[1]

    def version(self, package):
        found = re.search(r"^Version: (.*)$", self._run("apt-cache", "show", package).stdout, re.M)
        if not found:
            raise Unavailable(f"no package source of this machine has {package}")
        return found[1]

    def download(self, packages, folder):
        done = self._run("apt-get", "-q", "download", *packages, cwd=folder)
        if done.returncode != 0:
            raise Unavailable(f"the kernel's packages could not be downloaded: {done.stderr.strip()[-300:]}")


def _unpack(archive, folder, *members):
    with subprocess.Popen(["dpkg-deb", "--fsys-tarfile", archive], stdout=subprocess.PIPE) as unpacked:
        subprocess.run(["tar", "x", "-C", folder, *members], stdin=unpacked.stdout, check=True)
    if unpacked.returncode != 0:
        raise Unavailable(f"{archive} cannot be unpacked")


def _fetch(folder):
    apt = Apt(folder / "apt")
    apt.update()
    image = apt.depends(IMAGE)
    version, release = apt.version(f"{image}:armhf"), image.removeprefix("linux-image-")
    common, series = release.removesuffix("-armmp"), re.match(r"\d+\.\d+", release)[0]
    archives, unpacked = folder / "archives", folder / "unpacked"
    shutil.rmtree(archives, ignore_errors=True)
    shutil.rmtree(unpacked, ignore_errors=True)
    archives.mkdir()
    unpacked.mkdir()
    apt.download([f"{image}:armhf={version}", f"linux-headers-{release}:armhf={version}",
                  f"linux-headers-{common}-common={version}", f"linux-kbuild-{series}:{ARCHITECTURES[0]}={version}",
                  "busybox-static:armhf"], archives)
    for archive in sorted(archives.iterdir()):
        _unpack(archive, unpacked, *(["./boot"] if archive.name.startswith("linux-image-") else []))
    shutil.rmtree(archives)
    # The headers' makefile is one line, which names the installed place of the common ones.
    source = unpacked / "usr/src"
    (source / f"linux-headers-{release}" / "Makefile").write_text(
        f"include {source}/linux-headers-{common}-common/Makefile\n", encoding="utf-8")
    return release


class Kernel:
    """What was unpacked."""

    def __init__(self, folder, release):
        self.release = release
        self.image = folder / f"unpacked/boot/vmlinuz-{release}"
        self.headers = folder / f"unpacked/usr/src/linux-headers-{release}"
        self.busybox = folder / "unpacked/bin/busybox"


def kernel(folder):
    """The kernel in that folder, fetched if it is not there whole, or was fetched for another place."""
    folder = pathlib.Path(folder).resolve()
    folder.mkdir(parents=True, exist_ok=True)
    # Several trees may share a cache: the first fetches, the others wait. The lock falls with the process.
    lock = (folder / "lock").open("w", encoding="utf-8")
    fcntl.flock(lock, fcntl.LOCK_EX)
    with lock:
        return _kept(folder)


def _kept(folder):
    usable = folder / USABLE
    if usable.exists():
        place, release = usable.read_text(encoding="utf-8").splitlines()
        if place == str(folder):
            return Kernel(folder, release)
        usable.unlink()
    release = _fetch(folder)
    usable.write_text(f"{folder}\n{release}\n", encoding="utf-8")
    return Kernel(folder, release)
