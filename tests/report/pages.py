# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The pages that the tests look at, written by the tool."""

import json
import pathlib
import subprocess
import tempfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
SCENARIOS = ROOT / "scenarios"
NEVER, ANSWERS = SCENARIOS / "display-part-never-answers.pmx", SCENARIOS / "display-part-answers.pmx"
REFUSED = SCENARIOS / "refused-orders.pmx"
FIRST_LOOK = SCENARIOS / "first-look.pmx"
LONGEST = max(SCENARIOS.glob("*.pmx"), key=lambda path: len(path.read_text(encoding="utf-8").splitlines()))

DATA = '<script type="application/json" id="data">'


class Pages:
    def __init__(self, tool, folder):
        self.tool, self.folder = tool, pathlib.Path(folder)
        self.pages = {}

    def run(self, *arguments, stdin=""):
        return subprocess.run([self.tool, *map(str, arguments)], cwd=ROOT, capture_output=True, text=True,
                              check=False, input=stdin)

    def write(self, *arguments, code=0):
        """The page of these scenarios and options: one, however many look at it."""
        if arguments not in self.pages:
            page = self.folder / f"page-{len(self.pages)}.html"
            found = self.run("report", *arguments, "-o", page)
            if found.returncode != code:
                raise AssertionError(f"report of {arguments} ended with {found.returncode}: {found.stderr}")
            self.pages[arguments] = page
        return self.pages[arguments]

    def changed(self, page, change):
        """A page with other data: what `change` makes of them."""
        before, begin, rest = page.read_text(encoding="utf-8").partition(DATA)
        data, end, behind = rest.partition("</script>")
        other = page.with_name(f"changed-{page.name}")
        other.write_text(before + begin + json.dumps(change(json.loads(data))).replace("<", "\\u003c") + end + behind,
                         encoding="utf-8")
        return other

    def scenario(self, name, lines):
        path = self.folder / name
        path.write_text(lines, encoding="utf-8")
        return path


def folder():
    return tempfile.TemporaryDirectory(prefix="pmx-report-")


def commands(scenario):
    """The lines that a run carries out, as they are written."""
    lines = (line.strip() for line in scenario.read_text(encoding="utf-8").splitlines())
    return [line for line in lines if line and not line.startswith(("#", "expect "))]
