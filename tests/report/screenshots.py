#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Takes the pictures of the report's page that the documents show: wide and light, narrow and dark.

usage: screenshots.py TOOL FOLDER
"""

import pathlib
import sys

sys.dont_write_bytecode = True

import browser as browsers  # noqa: E402
import pages  # noqa: E402

HIGH = 880
CHANGE = "choose(3, false);"  # the step that takes graphics out of the picture
RETURN = "choose(6, true); part('step-7').scrollIntoView();"  # the one that brings them back


def main():
    tool, folder = (pathlib.Path(argument).resolve() for argument in sys.argv[1:])
    with pages.folder() as place, browsers.started() as browser:
        written = pages.Pages(tool, place)
        for name, scenario, width, scheme, prepare in (
                ("report-wide", pages.NEVER, browsers.WIDE, browsers.LIGHT, CHANGE),
                ("report-narrow", pages.FIRST_LOOK, browsers.NARROW, browsers.DARK, RETURN)):
            browser.look(width, scheme, HIGH)
            browser.open(written.write(scenario.relative_to(pages.ROOT)))
            browser.run(prepare)
            browser.driver.save_screenshot(str(folder / f"{name}.png"))


if __name__ == "__main__":
    main()
