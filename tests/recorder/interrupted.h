// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What the recorder is compiled with for a compiler that is not GNU's: atomic operations of the test's own. Each of
 * them is a moment at which another context may enter the layer. */
#ifndef PMX_TESTS_INTERRUPTED_H
#define PMX_TESTS_INTERRUPTED_H

#include "x_typedef.h"

UINT32 u4InterruptedAdd(UINT32* pu4Word, UINT32 u4Number);
UINT32 u4InterruptedLoad(const UINT32* pu4Word);
UINT32 u4InterruptedLook(const UINT32* pu4Word);

#define PMX_RECORDER_ADD(pu4Word, u4Number) u4InterruptedAdd(pu4Word, u4Number)
#define PMX_RECORDER_LOAD(pu4Word) u4InterruptedLoad(pu4Word)
#define PMX_RECORDER_PUBLISH(pu4Word, u4Value) (*(volatile UINT32*)(pu4Word) = (u4Value))
#define PMX_RECORDER_PUBLISHED(pu4Word) u4InterruptedLook(pu4Word)

#endif
