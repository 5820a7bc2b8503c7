#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What is measured in a kernel is a figure only when it was measured whole, twice, and alike."""

import re
import sys
import unittest

sys.dont_write_bytecode = True

import cost_kernel  # noqa: E402
import empty  # noqa: E402


class Cost(unittest.TestCase):
    CONSOLE = ["ROUND 1", *(f"COST {key} 1000008 1000" for key in cost_kernel.FIGURES.values())] * 2

    def test_two_rounds_that_tell_the_same(self):
        told = cost_kernel.rounds(self.CONSOLE)
        self.assertEqual([dict.fromkeys(cost_kernel.FIGURES, 1000)] * 2, told)
        self.assertEqual([], cost_kernel.complaints(told))

    def test_what_differs_or_is_missing(self):
        for console, complaint in (([*self.CONSOLE[:-1], "COST bochs mode 20 20"], "bochs: 1000, and then 0"),
                                   (self.CONSOLE[:-1], "round 2: bochs was not measured"),
                                   (self.CONSOLE[:7], "1 rounds of 2"), ([], "0 rounds of 2")):
            self.assertEqual([complaint], cost_kernel.complaints(cost_kernel.rounds(console)))

    def test_steps_of_the_clock_do_not_count(self):
        for took in (1074488, 1074496, 1074504, 1074512):
            self.assertEqual(1075, cost_kernel.instructions(took, 1000))
        self.assertEqual([1074, 1076], [cost_kernel.instructions(took, 1000) for took in (1074008, 1075504)])
        self.assertEqual({18540}, {cost_kernel.instructions(took, 20) for took in (370832, 370848)})

    def test_every_platform_function_has_an_empty_body(self):
        code = empty.code()
        names = [function.name for header in empty.PLATFORM_HEADERS
                 for function in empty.functions(empty.ROOT / header)]
        for name in names:
            self.assertEqual(1, len(re.findall(rf"^__attribute__\(\(weak\)\) .*\b{name}\(", code, re.M)), name)


if __name__ == "__main__":
    unittest.main()
