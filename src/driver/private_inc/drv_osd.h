// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  OSD driver and display control: what the mixer tells them. Called on threads that may sleep. */
#ifndef DRV_OSD_H
#define DRV_OSD_H

#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Tell the OSD driver the display mode; called before mixer and scaler are programmed, and by one-mode setting for an
 *  unchanged mode too.
 *  @param ucMode  a PMX_RESOLUTION_MODE_T value */
void OSD_BASE_SetDisplayMode(UCHAR ucMode);

/** Tell the OSD driver that a mode setting has come to its end. */
void OSD_BASE_SetFlag_PMXChangeResDone(void);

/** Tell the OSD driver the mixer's colour space.
 *  @param ucColorSpace  a DRV_PMX_COLOR_SPACE_T value */
void OSDSetColorSpace(UCHAR ucColorSpace);

/** Enable full-range conversion of OSD pixels, or disable it.
 *  @param fgEnable  on */
void OSD_RNG_Set_Xvycc_En(BOOL fgEnable);

/** Set the position offsets of the OSD planes.
 *  @param[in] pi4Offset  [5] five offsets in the hardware's unit, negative ones included; the driver must not keep the
 *                        pointer
 *  @return the driver's result, which the mixer ignores */
INT32 _i4OSD_SetPosOffset(INT32* pi4Offset);

/** Show the fifth OSD plane on component and composite, or on neither.
 *  @param fgOn        1 show, 0 do not
 *  @param ucCvbsMode  composite's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @return the driver's result, which the mixer ignores */
INT32 _i4Osd5Out(BOOL fgOn, UCHAR ucCvbsMode);

/** Show the fifth OSD plane on composite alone.
 *  @param fgOn        1 show
 *  @param ucCvbsMode  composite's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @return the driver's result, which the mixer ignores */
INT32 _i4Osd5Out_CVBSOnly(BOOL fgOn, UCHAR ucCvbsMode);

/** Set the delays of the two video planes in display control.
 *  @param i4Delay1  first video plane's delay in the hardware's unit, may be negative
 *  @param i4Delay2  second video plane's delay in the hardware's unit, may be negative */
void DCM_SetVideoPlaneDelay(INT32 i4Delay1, INT32 i4Delay2);

#ifdef __cplusplus
}
#endif

#endif
