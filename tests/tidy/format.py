#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Names the C and C++ files that are not in the house style, with what would change; with --fix, rewrites them.

clang-format does not know that DRV_ENUM(NAME) { … } is an enumeration. It is shown one.

usage: format.py [--fix]
"""

import difflib
import os
import pathlib
import re
import subprocess
import sys
from concurrent.futures import ThreadPoolExecutor

# Behind this folder, which has a module contracts as well.
sys.path.append(str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402
from tidy import CODE, files  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
MOST_LINES = 20  # of one file's differences
MOST_FILES = 40  # that one process looks at: starting one takes longer than a small file


def with_enumerations(text):
    text = re.sub(r"\bDRV_ENUM\((\w+)\)(?=\s*\{)", r"enum DRV_ENUM_\1_", text)
    return re.sub(r"\bDRV_ENUM_UNNAMED(?=\s*\{)", "enum DRV_ENUM__", text)


def with_macros(text):
    text = re.sub(r"\benum DRV_ENUM__(?=\s*\{)", "DRV_ENUM_UNNAMED", text)
    return re.sub(r"\benum DRV_ENUM_(\w+)_(?=\s*\{)", r"DRV_ENUM(\1)", text)


def formatted(path, text):
    result = subprocess.run(["clang-format", "--style=file", f"--assume-filename={path}"], check=True,
                            input=with_enumerations(text), capture_output=True, text=True, encoding="utf-8")
    return with_macros(result.stdout)


def suspects(paths):
    """Those of the files that are not in the house style; for files that are shown as they are, many at once."""
    result = subprocess.run(["clang-format", "--style=file", "--dry-run", *paths], check=True, capture_output=True,
                            text=True, encoding="utf-8")
    return {pathlib.Path(name) for name in re.findall(r"^(.+?):\d+:\d+: warning: ", result.stderr, re.M)}


def differing_files(paths):
    """(path, text, text in the house style) of those whose texts differ."""
    texts = {path: path.read_text(encoding="utf-8") for path in paths}
    plain = [path for path, text in texts.items() if with_enumerations(text) == text]
    batches = [plain[begin:begin + MOST_FILES] for begin in range(0, len(plain), MOST_FILES)]
    with ThreadPoolExecutor(max_workers=os.cpu_count()) as pool:
        suspect = set().union(*pool.map(suspects, batches)) | (set(texts) - set(plain))
        looked_at = [path for path in paths if path in suspect]
        after = list(pool.map(formatted, looked_at, [texts[path] for path in looked_at]))
    return [(path, texts[path], new) for path, new in zip(looked_at, after) if texts[path] != new]


def main():
    paths = [path for path in files(ROOT) if path.suffix in CODE]
    differing = differing_files(paths)
    for path, old, new in differing:
        name = path.relative_to(ROOT).as_posix()
        if "--fix" in sys.argv[1:]:
            whole_file.write(path, new)
            print(f"{name}: rewritten")
            continue
        lines = list(difflib.unified_diff(old.splitlines(), new.splitlines(), name, "formatted", "", "", 0, ""))
        print("\n".join(lines[:MOST_LINES] + ["…"] * (len(lines) > MOST_LINES)))
    print(f"format: {len(paths)} files, {len(differing)} not in the house style")
    return 1 if differing and "--fix" not in sys.argv[1:] else 0


if __name__ == "__main__":
    sys.exit(main())
