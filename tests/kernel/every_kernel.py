#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the port of linux/ in every kind of kernel: Debian's ARM kernel as run.py does, one in Thumb-2, the newest that
the package sources offer, and Debian's kernel for PCs, in which the layer is a 64-bit one and the kernel's build looks
at its code. Every scenario is held against the virtual board in each, in virtual time. Prints KTAP; ends with 1 when
something differs, and with 77 when no kernel is to be had.

usage: every_kernel.py CACHE MADE PMXBOARD OBJECT
"""

import sys

sys.dont_write_bytecode = True

import debian  # noqa: E402
import machines  # noqa: E402
import own  # noqa: E402
import run  # noqa: E402


def thumb2(cache):
    return own.kernel(cache, machines.ARM, "thumb2", debian.kernel(cache))


def newest(cache):
    return debian.kernel(cache / "newest", newest=True)


def pc(cache):
    return debian.kernel(cache / "amd64", machines.PC)


KERNELS = {"thumb2": thumb2, "newest": newest, "amd64": pc}


def compare_in(ktap, name, kernel, made, commands, expected):
    built = run.module(kernel, made / name)
    ktap.verdict(f"{name}: pmx.ko built by the build of {kernel.release}")
    archive = run.image(kernel, built, commands, made)
    run.compare(ktap, f"{name}:", expected, run.boot(kernel, archive, made / f"{name}.log", *run.VIRTUAL_TIME))


def compare_others(ktap, cache, made, program):
    commands, expected = run.prepared(ktap, program)
    for name, kernel in KERNELS.items():
        try:
            compare_in(ktap, name, kernel(cache), made, commands, expected)
        except debian.Unavailable as reason:
            ktap.skip(name, str(reason).replace("\n", " "))
        except (own.Broken, run.Failed) as reason:
            ktap.verdict(name, str(reason).splitlines())


def compare_every(ktap, cache, made, program, shipped):
    run.compare_all(ktap, cache, made, program, shipped)
    compare_others(ktap, cache, made, program)


if __name__ == "__main__":
    sys.exit(run.carried_out(compare_every, sys.argv[1:]))
