// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Included in front of each source of the layer when it is compiled with its reasons for this tool: every reason is
 *  told with the place that gives it. */
#ifndef PMXBOARD_PLACE_H
#define PMXBOARD_PLACE_H

#include "pmx_reason.h"

extern "C" void pmx_twin_reason(PMX_REASON_T eReason, UINT32 u4A, UINT32 u4B, const CHAR* szFile, INT32 i4Line,
                                const CHAR* szFunction);

#define vPmxReason(eReason, u4A, u4B) pmx_twin_reason(eReason, u4A, u4B, __FILE__, __LINE__, __func__)

#endif
