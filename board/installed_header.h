// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Leaves in a program where the headers lie that it was compiled with: the installation's boards are looked up from
 *  there, wherever it was unpacked, and without a path in the library. */
#ifndef BOARD_INSTALLED_HEADER_H
#define BOARD_INSTALLED_HEADER_H

#ifdef __cplusplus
extern "C" {
#endif

/** This file's own path. Each source that includes it has it, and the linker keeps one; a program without has none. */
extern const char board_installed_header[] __attribute__((weak));

#ifndef PMX_SOURCE_DIR /* the project's own files lie in no installation */
const char board_installed_header[] = __FILE__;
#endif

#ifdef __cplusplus
}
#endif

#endif
