// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What the tests see of their own TV encoder driver. */
#ifndef OWN_ENCODER_H
#define OWN_ENCODER_H

#include "drv_tve.h"

#ifdef __cplusplus
extern "C" {
#endif

extern unsigned uFormatsSet;     /* calls of TVE_SetFmtEx that came here */
extern UCHAR aucTargetFormat[2]; /* what they set */
extern UINT32 u4SetFormatAnswer; /* what they answer */
extern unsigned uBlackScreensHandedOn;

#ifdef __cplusplus
}
#endif

#endif
