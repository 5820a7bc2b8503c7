# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Verdicts in the format of kernel tests."""


class Ktap:
    """Verdicts, one a line, as kernel tests tell them."""

    def __init__(self):
        self.number, self.failures, self.skipped = 0, 0, 0
        print("KTAP version 1", flush=True)

    def verdict(self, name, wrong=()):
        self.number += 1
        self.failures += bool(wrong)
        for line in wrong:
            print(f"# {line}")
        print(f"{'not ok' if wrong else 'ok'} {self.number} {name}", flush=True)

    def skip(self, name, reason):
        self.number += 1
        self.skipped += 1
        print(f"ok {self.number} {name} # SKIP {reason}", flush=True)

    def end(self):
        print(f"1..{self.number}")
