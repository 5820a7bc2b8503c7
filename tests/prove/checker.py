# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The bounded model checker CBMC, out of the next release of Debian, unpacked into a cache folder with the C library
that it was built for, and run by that library's own loader: nothing of the machine is changed."""

import pathlib
import platform
import shutil
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[1] / "common"))

from packages import Apt, Unavailable, emptied, kept, unpack  # noqa: E402, F401

# The checker, and what its programs are linked with; unpacked, never installed, so that packages.txt lacks them.
PACKAGES = ("cbmc", "minisat", "libc6", "libstdc++6", "libgcc-s1", "zlib1g")


PROGRAMS = ("usr/lib64/ld-linux-x86-64.so.2", "usr/bin/cbmc", "usr/bin/goto-cc")
KNOWN = "6."  # what its options mean, and how it says what it found


def lacks(folder):
    """What is needed and is not there."""
    return [name for name in PROGRAMS if not (folder / "unpacked" / name).exists()]


def hold_known(version):
    if not version.startswith(KNOWN):
        raise Unavailable(f"the checker's version is {version or 'unknown'}, and {KNOWN}x is what is understood")


def _fetch(folder):
    if platform.machine() != "x86_64":
        raise Unavailable(f"the checker's loader is known for x86-64 alone, not for {platform.machine()}")
    apt = Apt(folder / "apt")
    apt.update()
    apt.prefer_next_release()
    version = " ".join(apt.version(name) for name in PACKAGES)
    hold_known(version)
    archives, unpacked = emptied(folder / "archives"), emptied(folder / "unpacked")
    apt.download([f"{name}={apt.version(name)}" for name in PACKAGES], archives)
    for archive in sorted(archives.iterdir()):
        unpack(archive, unpacked)
    shutil.rmtree(archives)
    return version


class Checker:
    """The unpacked programs."""

    def __init__(self, cache):
        # Where somebody cleaned up, one of those who wait for the folder fetches, and the others find it whole.
        folder, self.version = kept(cache, " ".join(PACKAGES), _fetch, lambda place: not lacks(place))
        if lacks(folder):
            raise Unavailable(f"the checker that was fetched has no {' and no '.join(lacks(folder))}")
        hold_known(self.version)
        root = folder / "unpacked"
        libraries = [root / "usr/lib/x86_64-linux-gnu", root / "usr/lib"]
        loader = root / PROGRAMS[0]
        self._start = [loader, "--library-path", ":".join(map(str, libraries))]
        self._programs = root / "usr/bin"

    def run(self, program, *arguments, **how):
        return subprocess.run([*self._start, self._programs / program, *arguments], capture_output=True, text=True,
                              check=False, **how)
