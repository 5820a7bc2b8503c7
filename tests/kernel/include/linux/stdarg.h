// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Stands in for the kernel's header: what the stack's headers take from it. */
#pragma once

typedef __builtin_va_list va_list;
