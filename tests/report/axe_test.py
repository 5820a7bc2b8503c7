#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Has axe-core look at the report's page in a browser, wide in light and narrow in dark, with everything folded and
unfolded: whoever listens to a page, or uses no mouse, gets at all of it. npm fetches axe-core, and takes none but the
one whose hash package-lock.json has.

usage: axe_test.py TOOL      Ends with 77 where axe-core is not to be had.
"""

import pathlib
import shutil
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True

import browser as browsers  # noqa: E402
import pages  # noqa: E402

PINNED = pathlib.Path(__file__).resolve().parent / "axe"
SKIPPED = 77
PATIENCE_S = 200  # on a machine that does other things, too
LOOK = """const done = arguments[arguments.length - 1];
const told = (one) => [one.id, one.help, one.nodes.length, one.nodes[0].html];
axe.run({ resultTypes: ["violations"] }).then((found) => done(found.violations.map(told)));
"""
STATES = {
    "folded": "",
    "unfolded": "for (const one of document.querySelectorAll('details')) one.open = true;",
    "filtered": "const field = document.getElementById('filter'); field.value = 'LOG';"
                "field.dispatchEvent(new Event('input'));",
    "side by side": "const other = document.getElementById('other'); other.value = 1;"
                    "other.dispatchEvent(new Event('change'));",
    "enlarged": "document.querySelector('#step-5 .picture').click();",
}


class Unavailable(Exception):
    """axe-core is not to be had here."""


def axe(folder):
    """The script: npm keeps it, and holds it against the hash, each time."""
    if shutil.which("npm") is None:
        raise Unavailable("there is no npm")
    for name in ("package.json", "package-lock.json"):
        shutil.copy(PINNED / name, folder)
    found = subprocess.run(["npm", "ci", "--ignore-scripts", "--no-audit", "--no-fund", "--prefer-offline"], cwd=folder,
                           capture_output=True, text=True, check=False, timeout=120)
    if "EINTEGRITY" in found.stderr:
        sys.exit(f"axe-core is not the one that is pinned: {found.stderr}")
    if found.returncode != 0:
        raise Unavailable(f"npm cannot fetch it: {found.stderr.strip()[-300:]}")
    return (folder / "node_modules/axe-core/axe.min.js").read_text(encoding="utf-8")


def findings(browser, script, page, prepare):
    browser.open(page)
    browser.run(prepare)
    browser.run(script)
    return browser.driver.execute_async_script(LOOK)


def looked_at(browser, script, page):
    """(state, its findings) of each state, in either scheme and at either width: colours do not hang on the width."""
    for width, scheme in ((browsers.WIDE, browsers.LIGHT), (browsers.NARROW, browsers.DARK)):
        for name, prepare in STATES.items():
            browser.look(width, scheme)
            yield f"{name}, {scheme}, {width} pixels", findings(browser, script, page, prepare)


def main():
    tool = pathlib.Path(sys.argv[1]).resolve()
    try:
        with tempfile.TemporaryDirectory() as folder:
            script = axe(pathlib.Path(folder))
    except (Unavailable, subprocess.TimeoutExpired) as reason:
        print(f"SKIPPED: no axe-core: {reason}")
        return SKIPPED
    wrong = 0
    with pages.folder() as place, browsers.started() as browser:
        browser.driver.set_script_timeout(PATIENCE_S)
        written = pages.Pages(tool, place)
        bad = written.folder / "bad.html"
        bad.write_text('<!DOCTYPE html><title>bad</title><img src="data:,">', encoding="utf-8")
        if not findings(browser, script, bad, ""):
            sys.exit("axe-core finds nothing wrong with a picture that has no text")
        shows = written.scenario("shows.pmx", pages.REFUSED.read_text(encoding="utf-8") + "status\nstatus graphics\n")
        page = written.write(shows, pages.NEVER)
        for state, found in looked_at(browser, script, page):
            print(f"{state}: {len(found)} findings")
            for finding in found:
                wrong += 1
                print("   ", *finding)
    return 1 if wrong else 0


if __name__ == "__main__":
    sys.exit(main())
