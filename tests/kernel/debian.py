# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Debian's own kernels, their headers and a shell for them, and the source of an own one, unpacked into a cache folder.
Nothing is installed: apt gets a state of its own, in which the foreign architecture is known, and asks the package
sources of this machine."""

import fcntl
import pathlib
import re
import shutil
import subprocess

import machines

ARCHITECTURES = ("amd64", "armhf")
SOURCES = pathlib.Path("/etc/apt/sources.list")
USABLE = "usable"  # a file that is written last: the place, what is there, and what was wanted


class Unavailable(Exception):
    """What is needed is neither there nor to be had."""


class Apt:
    def __init__(self, folder):
        for name in ("state/lists/partial", "cache/archives/partial"):
            (folder / name).mkdir(parents=True, exist_ok=True)
        (folder / "state/status").touch()
        self._folder = folder
        self.host = subprocess.run(["dpkg", "--print-architecture"], check=True, capture_output=True,
                                   text=True).stdout.strip()
        own = {"Dir::State": folder / "state", "Dir::State::status": folder / "state/status",
               "Dir::Cache": folder / "cache", "APT::Architecture": self.host, "APT::Sandbox::User": "root"}
        self._options = [f"-o{name}={value}" for name, value in own.items()]
        self._options += [f"-oAPT::Architectures::={name}" for name in dict.fromkeys((self.host, *ARCHITECTURES))]

    def _run(self, program, *arguments, **how):
        return subprocess.run([program, *self._options, *arguments], capture_output=True, text=True, check=False, **how)

    def update(self):
        """An index that is out of step makes this fail; whether what is wanted is there is seen later."""
        self._run("apt-get", "-q", "update")

    def prefer_backports(self):
        """What goes into the machine's release from the next one, beside what its own sources name, goes first."""
        listed = self._run("apt-get", "indextargets", "--format", "$(REPO_URI) $(RELEASE) $(ORIGIN)",
                           "Created-By: Packages", "Component: main").stdout
        place = backports_of(listed)
        if not place:
            raise Unavailable("no package source of this machine is a release of Debian")
        own = SOURCES.read_text(encoding="utf-8") if SOURCES.exists() else ""
        sources = self._folder / "sources.list"
        sources.write_text(f"{own}\ndeb {place[0]} {place[1]} main\n", encoding="utf-8")
        self._options.append(f"-oDir::Etc::SourceList={sources}")
        self.update()
        self._options.append(f"-oAPT::Default-Release={place[1]}")

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
            raise Unavailable(f"the kernel's packages could not be downloaded: {done.stderr.strip()[-300:]}")


def backports_of(listed):
    """(place, suite) of the backports to the first release of Debian among lines of place, suite and origin."""
    for line in listed.splitlines():
        place, suite, origin = line.split(" ", 2)
        if origin == "Debian" and "-" not in suite:
            return place, f"{suite}-backports"
    return None


def _unpack(archive, folder, *members):
    with subprocess.Popen(["dpkg-deb", "--fsys-tarfile", archive], stdout=subprocess.PIPE) as unpacked:
        subprocess.run(["tar", "x", "-C", folder, *members], stdin=unpacked.stdout, check=True)
    if unpacked.returncode != 0:
        raise Unavailable(f"{archive} cannot be unpacked")


def _empty(folder):
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir()
    return folder


def _fetch(folder, machine, modules, newest):
    apt = Apt(folder / "apt")
    apt.update()
    if newest:
        apt.prefer_backports()
    kind = machine.architecture
    image = apt.depends(f"linux-image-{machine.flavour}:{kind}", on=r"linux-image-[\w.+-]+")
    version, release = apt.version(f"{image}:{kind}"), image.removeprefix("linux-image-")
    headers, common = f"linux-headers-{release}", f"linux-headers-{release.removesuffix('-' + machine.flavour)}-common"
    archives, unpacked = _empty(folder / "archives"), _empty(folder / "unpacked")
    programs = apt.depends(f"{headers}:{kind}", on=r"linux-kbuild-[\w.+-]+")
    apt.download([f"{image}:{kind}={version}", f"{headers}:{kind}={apt.version(f'{headers}:{kind}')}",
                  f"{common}={apt.version(common)}", f"{programs}:{apt.host}={apt.version(f'{programs}:{apt.host}')}",
                  f"busybox-static:{kind}"], archives)
    wanted = [f"./lib/modules/{release}/kernel/{module}" for module in modules]
    for archive in sorted(archives.iterdir()):
        _unpack(archive, unpacked, *(["./boot", *wanted] if archive.name.startswith("linux-image-") else []))
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


def _held(folder):
    """The folder is this run's until what is given here is closed: the first fetches, the others wait. The lock falls
    with the process."""
    folder.mkdir(parents=True, exist_ok=True)
    lock = (folder / "lock").open("w", encoding="utf-8")
    fcntl.flock(lock, fcntl.LOCK_EX)
    return lock


def kept(folder, wanted, fetch):
    """What the folder has, fetched if it is not there whole, or was fetched for another place or another wish."""
    folder = pathlib.Path(folder).resolve()
    with _held(folder):
        usable = folder / USABLE
        if usable.exists():
            place, found, *wish = usable.read_text(encoding="utf-8").splitlines()
            if place == str(folder) and wish == [wanted]:
                return folder, found
            usable.unlink()
        found = fetch(folder)
        usable.write_text(f"{folder}\n{found}\n{wanted}\n", encoding="utf-8")
        return folder, found


def kernel(folder, machine=machines.ARM, newest=False):
    """Debian's kernel for the machine: the stable one, or that of the backports."""
    modules = machine.modules if newest else (*machine.modules, *machine.peers)
    wanted = " ".join([machine.flavour, *["newest"] * newest, *modules])
    folder, release = kept(folder, wanted, lambda place: _fetch(place, machine, modules, newest))
    return Kernel(folder, release, machine)


def _fetch_source(folder):
    apt = Apt(folder / "apt")
    apt.update()
    package = apt.depends("linux-source", on=r"linux-source-[\w.]+")
    version = apt.version(package)
    archives, unpacked = _empty(folder / "archives"), _empty(folder / "unpacked")
    apt.download([f"{package}={version}"], archives)
    for archive in archives.iterdir():
        _unpack(archive, archives, f"./usr/src/{package}.tar.xz")
    subprocess.run(["tar", "xJf", archives / f"usr/src/{package}.tar.xz", "-C", unpacked, "--strip-components=1"],
                   check=True)
    shutil.rmtree(archives)
    return version


def source(folder):
    """(folder, version) of the source of Debian's kernel."""
    folder, version = kept(folder, "source", _fetch_source)
    return folder / "unpacked", version
