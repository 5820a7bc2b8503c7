# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Debian's packages, unpacked into a cache folder. Nothing is installed: apt gets a state of its own, in which foreign
architectures are known, and asks the package sources of this machine."""

import csv
import fcntl
import pathlib
import re
import shutil
import subprocess

SOURCES = pathlib.Path("/etc/apt/sources.list")
RELEASES = "usr/share/distro-info/debian.csv"  # of distro-info-data: Debian's releases, those to come too
USABLE = "usable"  # a file that is written last: the place, what is there, and what was wanted


class Unavailable(Exception):
    """What is needed is neither there nor to be had."""


class Apt:
    def __init__(self, folder, architectures=()):
        for name in ("state/lists/partial", "cache/archives/partial"):
            (folder / name).mkdir(parents=True, exist_ok=True)
        (folder / "state/status").touch()
        self._folder = folder
        self.host = subprocess.run(["dpkg", "--print-architecture"], check=True, capture_output=True,
                                   text=True).stdout.strip()
        own = {"Dir::State": folder / "state", "Dir::State::status": folder / "state/status",
               "Dir::Cache": folder / "cache", "APT::Architecture": self.host, "APT::Sandbox::User": "root"}
        self._options = [f"-o{name}={value}" for name, value in own.items()]
        self._options += [f"-oAPT::Architectures::={name}" for name in dict.fromkeys((self.host, *architectures))]

    def _run(self, program, *arguments, **how):
        return subprocess.run([program, *self._options, *arguments], capture_output=True, text=True, check=False, **how)

    def update(self):
        """An index that is out of step makes this fail; whether what is wanted is there is seen later."""
        self._run("apt-get", "-q", "update")

    def prefer_backports(self):
        """What goes into the machine's release from the next one, beside what its own sources name, goes first."""
        place, release = self._release()
        self._add(place, f"{release}-backports")

    def prefer_next_release(self):
        """What the release behind the machine's own has goes first."""
        place, release = self._release()
        archives, unpacked = emptied(self._folder / "archives"), emptied(self._folder / "unpacked")
        self.download(["distro-info-data"], archives)
        for archive in archives.iterdir():
            unpack(archive, unpacked, f"./{RELEASES}")
        following = release_after(release, (unpacked / RELEASES).read_text(encoding="utf-8").splitlines())
        if not following:
            raise Unavailable(f"no release of Debian is known to follow {release}")
        self._add(place, following)

    def _release(self):
        """(place, suite) of the machine's own release."""
        listed = self._run("apt-get", "indextargets", "--format", "$(REPO_URI) $(RELEASE) $(ORIGIN)",
                           "Created-By: Packages", "Component: main").stdout
        found = release_of(listed)
        if not found:
            raise Unavailable("no package source of this machine is a release of Debian")
        return found

    def _add(self, place, suite):
        own = SOURCES.read_text(encoding="utf-8") if SOURCES.exists() else ""
        sources = self._folder / "sources.list"
        sources.write_text(f"{own}\ndeb {place} {suite} main\n", encoding="utf-8")
        self._options.append(f"-oDir::Etc::SourceList={sources}")
        self.update()
        self._options.append(f"-oAPT::Default-Release={suite}")

    def depends(self, package, on=r"[\w.+-]+"):
        """The first package of such a name that the package needs."""
        found = re.search(rf"Depends: ({on})(?::\w+)?$", self._run("apt-cache", "depends", package).stdout, re.M)
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
            raise Unavailable(f"{' '.join(packages)}: could not be downloaded: {done.stderr.strip()[-300:]}")


def release_of(listed):
    """(place, suite) of the first release of Debian among lines of place, suite and origin."""
    for line in listed.splitlines():
        place, suite, origin = line.split(" ", 2)
        if origin == "Debian" and "-" not in suite:
            return place, suite
    return None


def release_after(release, lines):
    """The code name of the numbered release that follows; the lines are those of distro-info-data."""
    names = [row["series"] for row in csv.DictReader(lines) if row["version"]]
    at = names.index(release) if release in names else len(names)
    return names[at + 1] if at + 1 < len(names) else None


def unpack(archive, folder, *members):
    with subprocess.Popen(["dpkg-deb", "--fsys-tarfile", archive], stdout=subprocess.PIPE) as unpacked:
        taken = subprocess.run(["tar", "x", "-C", folder, *members], stdin=unpacked.stdout, check=False)
    if unpacked.returncode != 0 or taken.returncode != 0:
        raise Unavailable(f"{archive} cannot be unpacked")


def emptied(folder):
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir()
    return folder


def _held(folder):
    """The folder is this run's until what is given here is closed: the first fetches, the others wait. The lock falls
    with the process."""
    folder.mkdir(parents=True, exist_ok=True)
    lock = (folder / "lock").open("w", encoding="utf-8")
    fcntl.flock(lock, fcntl.LOCK_EX)
    return lock


def kept(folder, wanted, fetch, is_whole=lambda folder: True):
    """What the folder has, fetched if it is not there whole, or was fetched for another place or another wish."""
    folder = pathlib.Path(folder).resolve()
    with _held(folder):
        usable = folder / USABLE
        if usable.exists():
            place, found, *wish = [*usable.read_text(encoding="utf-8").splitlines(), "", ""]  # cut short: not usable
            if place == str(folder) and wish[:1] == [wanted] and is_whole(folder):
                return folder, found
            usable.unlink()
        found = fetch(folder)
        unfinished = folder / f"{USABLE}.unfinished"
        unfinished.write_text(f"{folder}\n{found}\n{wanted}\n", encoding="utf-8")
        unfinished.rename(usable)
        return folder, found
