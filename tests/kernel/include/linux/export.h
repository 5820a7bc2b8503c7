// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Stands in for the kernel's header: an exported symbol leaves its name in the object. */
#pragma once

#define EXPORT_SYMBOL(Symbol) void* const exported_##Symbol = (void*)&Symbol
