// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Stands in for the kernel's header: what a module says of itself stands in a section that its loader reads. */
#pragma once

#define MODULE_LICENSE(License) \
    static const char module_license[] __attribute__((used, section(".modinfo"))) = "license=" License
