# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What stands before the command of a test that is not run again while its inputs are what they were when it passed:
# this, PMX_UNCHANGED_STAMPS/<test>, the inputs, and --. Files and programs of the command are inputs, too.
set(PMX_UNCHANGED ${Python3_EXECUTABLE} -I -S ${PROJECT_SOURCE_DIR}/tests/common/unchanged.py)
set(PMX_UNCHANGED_STAMPS ${PROJECT_BINARY_DIR}/unchanged)
# What whoever runs scenarios reads.
set(PMX_SITUATIONS ${PROJECT_SOURCE_DIR}/boards ${PROJECT_SOURCE_DIR}/scenarios ${PROJECT_BINARY_DIR}/share)
