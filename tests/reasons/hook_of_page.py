#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Takes the hook out of the page that shows it.

usage: hook_of_page.py PAGE OUTPUT
"""

import pathlib
import re
import sys


def main(page, output):
    found = re.findall(r"^```c\n(.*?)^```\n", pathlib.Path(page).read_text(encoding="utf-8"), re.DOTALL | re.MULTILINE)
    if len(found) != 1:
        raise SystemExit(f"{page}: {len(found)} pieces of C, not the hook alone")
    pathlib.Path(output).write_text(found[0], encoding="utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
