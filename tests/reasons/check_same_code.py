#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds that reasons cost the product nothing: each source of the layer is compiled as it stands, and without the
reasons that it gives; the two objects are equal byte for byte.

usage: check_same_code.py SOURCE_DIRECTORY COMPILER FLAG...
"""

import concurrent.futures
import os
import pathlib
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True

import expand  # noqa: E402

# Lines are compared, columns are not, nor the checksums of sources, which the newer form of debugging records carries.
NO_PLACES = ["-gno-column-info", "-gdwarf-4"]


def compiled(command, folder, source):
    """The object of a source; both copies go by one name."""
    done = subprocess.run([*command, *NO_PLACES, f"-ffile-prefix-map={folder}=.", "-I", folder, "-c", folder / source,
                           "-o", folder / (source + ".o")], cwd=folder, capture_output=True, text=True, check=False)
    if done.returncode != 0:
        raise SystemExit(f"{source}: {done.stderr}")
    return (folder / (source + ".o")).read_bytes()


def check(command, source, scratch):
    """A complaint about one source, or nothing; and how many reasons it gives."""
    folders = [scratch / name for name in ("as_it_stands", "without")]
    given = len(list(expand.places((folders[0] / source).read_text(encoding="utf-8"))))
    if given > 0 and (folders[0] / source).read_bytes() == (folders[1] / source).read_bytes():
        return f"{source}: nothing was taken out", given
    objects = [compiled(command, folder, source) for folder in folders]
    return None if objects[0] == objects[1] else f"{source}: the reasons change what is compiled", given


def main(sources, *command):
    sources = pathlib.Path(sources)
    with tempfile.TemporaryDirectory() as scratch:
        scratch = pathlib.Path(scratch)
        for name in ("as_it_stands", "without"):
            (scratch / name).mkdir()
        for path in [*sources.glob("*.cpp"), *sources.glob("*.h")]:
            text = path.read_text(encoding="utf-8")
            (scratch / "as_it_stands" / path.name).write_text(text, encoding="utf-8")
            stripped = text if path.name == "pmx_why.h" else expand.without_reasons(text)
            if stripped.count("\n") != text.count("\n"):
                raise SystemExit(f"{path.name}: {text.count(chr(10))} lines became {stripped.count(chr(10))}")
            (scratch / "without" / path.name).write_text(stripped, encoding="utf-8")
        names = sorted(path.name for path in sources.glob("*.cpp"))
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
            results = list(pool.map(lambda name: check(command, name, scratch), names))
    complaints = [complaint for complaint, _ in results if complaint]
    given = sum(number for _, number in results)
    if given == 0:
        complaints.append("no source gives a reason")
    for complaint in complaints:
        print(complaint)
    print(f"{len(names)} sources, {given} reasons: {len(complaints)} differ")
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
