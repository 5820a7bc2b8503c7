#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds every file to say its licence in its first line, but those that .reuse/dep5 excepts. With --fix, writes the
line where it is missing.

usage: lines.py [--fix] [ROOT]
"""

import fnmatch
import pathlib
import re
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402

TAG = "SPDX-License-" + "Identifier:"  # apart, so that nobody takes this for a licence of its own
LICENCE = f"{TAG} MIT OR GPL-2.0-only"
COMMENTS = {".c": "// {}", ".cpp": "// {}", ".h": "// {}", ".h.in": "// {}", ".s.in": "/* {} */", ".pc.in": "# {}",
            ".cmake.in": "# {}", ".md": "<!-- {} -->", ".html": "<!-- {} -->", ".css": "/* {} */", ".js": "// {}",
            ".pml": "/* {} */"}
HASH = {".bash", ".clang-format", ".clang-tidy", ".cmake", ".fragment", ".gitignore", ".pmx", ".py", ".sh", ".supp",
        ".toml", ".txt", "Doxyfile", "Kbuild", "dev", "run"}
LICENCES = ("LICENSE", "LICENSES/*")


def files(root):
    """What the repository has, with what is new and not ignored."""
    listed = subprocess.run(["git", "-C", root, "ls-files", "--cached", "--others", "--exclude-standard", "-z"],
                            capture_output=True, text=True, check=True).stdout
    return sorted({name for name in listed.split("\0") if name and (root / name).is_file()})


def excepted(root):
    """The patterns of the paragraphs that name files; the first one is for all the rest."""
    text = (root / ".reuse/dep5").read_text(encoding="utf-8")
    patterns = [pattern for listed in re.findall(r"^Files:((?:.*\n)(?: .*\n)*)", text, re.M)
                for pattern in listed.split()]
    return [*LICENCES, *(pattern for pattern in patterns if pattern != "*")]


def line_for(name):
    """The line that a file begins with; nothing where it is not known how comments look there."""
    base = pathlib.PurePath(name).name
    for suffix, comment in COMMENTS.items():
        if base.endswith(suffix):
            return comment.format(LICENCE)
    return f"# {LICENCE}" if base in HASH or pathlib.PurePath(base).suffix in HASH else None


def with_line(text, line):
    """The text with the line, behind what tells a system how to run the file."""
    first, newline, rest = text.partition("\n")
    if first.startswith("#!"):
        return f"{first}{newline}{line}\n{rest}"
    return f"{line}\n{text}"


def has_line(text, line):
    return line in text.split("\n", 2)[:2]


def complaints(root, fix=False):
    patterns = excepted(root)
    for name in files(root):
        if any(fnmatch.fnmatch(name, pattern) for pattern in patterns):
            continue
        line = line_for(name)
        if line is None:
            yield (f"{name}: unknown kind of file: give it a comment in tests/licence/lines.py, or except it in "
                   ".reuse/dep5")
            continue
        text = (root / name).read_text(encoding="utf-8")
        if has_line(text, line):
            continue
        if fix:
            whole_file.write(root / name, with_line(text, line))
        else:
            yield f"{name}:1: does not say its licence: {line}   (tests/licence/lines.py --fix writes it)"


def main():
    arguments = [word for word in sys.argv[1:] if word != "--fix"]
    root = pathlib.Path(arguments[0] if arguments else ".").resolve()
    found = list(complaints(root, "--fix" in sys.argv[1:]))
    print("\n".join(found + [f"licence lines: {len(found)} complaints"]))
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
