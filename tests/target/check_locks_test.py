#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_locks.py call graphs and headers that are at odds, and some that agree."""

import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_locks  # noqa: E402

ORDER = "Nobody calls PMX_A or PMX_B with a lock that pu4SetColorMode takes: they take MutexPMX.\n"
GRAPH = [("PMX_A", "vLock"), ("PMX_B", "x.cpp:vHelp"), ("x.cpp:vHelp", "vLock"), ("vLock", "x_sema_lock"),
         ("PMX_C", "PMX_Log")]


def header(a="takes MutexPMX", b="outside MutexPMX", c="any thread", order=ORDER):
    return f"/** @file\n *  {order} */\n" + "".join(
        f"/** Do.\n *  @context {context} */\nPMX_API void {name}(void);\n"
        for name, context in (("PMX_A", a), ("PMX_B", b), ("PMX_C", c)))


class CheckLocks(unittest.TestCase):
    def found(self, graph=GRAPH, offered=None, told=ORDER):
        with tempfile.TemporaryDirectory() as scratch:
            root = pathlib.Path(scratch)
            for path in check_locks.TOLD_IN:
                (root / path).parent.mkdir(parents=True, exist_ok=True)
                (root / path).write_text(told)
            (root / check_locks.LAYER_HEADER).write_text(offered or header())
            (root / "x.ci").write_text("".join(
                f'edge: {{ sourcename: "{source}" targetname: "{target}" label: "x.cpp:1:1" }}\n'
                for source, target in graph))
            return list(check_locks.complaints(root, root))

    def refused(self, text, **named):
        found = self.found(**named)
        self.assertTrue(any(text in line for line in found), f"{text!r} is not in {found}")

    def test_what_agrees_passes(self):
        self.assertEqual([], self.found())
        self.assertEqual([], self.found(told=ORDER.replace(" with a", "\n *  with a") + "PMX_C is free of it.\n"))

    def test_a_context_that_does_not_tell(self):
        self.refused("PMX_B can take MutexPMX, and its @context", offered=header(b="any thread"))
        self.refused("PMX_C cannot take MutexPMX, and its @context", offered=header(c="takes MutexPMX"))

    def test_a_new_way_to_the_lock(self):
        self.refused("PMX_C can take MutexPMX", graph=[*GRAPH, ("PMX_C", "PMX_A")])
        self.refused("docs/porting.md: no sentence names all", graph=[*GRAPH, ("PMX_C", "PMX_A")])

    def test_a_sentence_with_one_too_few_or_too_many(self):
        self.refused("docs/porting.md: no sentence names all that can take MutexPMX and nothing else; at odds: PMX_B",
                     told=ORDER.replace(" or PMX_B", ""))
        self.refused("at odds: PMX_C", told=ORDER.replace("PMX_B", "PMX_B or PMX_C"))
        self.refused("at odds: all", told="Nothing of it.\n")
        self.refused("drv_pmx.h: no sentence", offered=header(order="PMX_A and PMX_B take MutexPMX."))

    def test_no_call_graphs(self):
        self.refused("no operation there takes the mutex", graph=[])


if __name__ == "__main__":
    unittest.main()
