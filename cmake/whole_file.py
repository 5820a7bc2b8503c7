# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a file whole or not at all: what a script renews in the tree is somebody's work, and a full disk, a kill or
Ctrl-C leaves it as it was."""

import os
import pathlib
import tempfile


def write(path, text):
    """Replace the file, or make it; behind a link, what that leads to. Its mode stays."""
    path = pathlib.Path(path).resolve()
    mode = path.stat().st_mode & 0o7777 if path.exists() else None
    handle, beside = tempfile.mkstemp(dir=path.parent, prefix=f".{path.name}-")
    try:
        with os.fdopen(handle, "w", encoding="utf-8", newline="") as file:
            file.write(text)
            file.flush()
            os.fsync(handle)
        os.chmod(beside, mode if mode is not None else 0o666 & ~_mask())
        os.replace(beside, path)
    except BaseException:
        os.unlink(beside)
        raise


def _mask():
    mask = os.umask(0)
    os.umask(mask)
    return mask
