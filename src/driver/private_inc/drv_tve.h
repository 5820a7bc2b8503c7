// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  TV encoder driver. Encoder 0 (TVE_1) drives component, encoder 1 (TVE_2) composite. Called on threads that may
 *  sleep. */
#ifndef DRV_TVE_H
#define DRV_TVE_H

#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

#define TVE_1 0
#define TVE_2 1
#define TVE_SET_OK 1

/** Widescreen signalling of the analogue outputs. */
typedef DRV_ENUM(TVE_ASPECT_RATIO_T)
{
    ASPECT_RATIO_4_3 = 0,
    ASPECT_RATIO_16_9_FULL_FORMAT = 1
} TVE_ASPECT_RATIO_T;

DRV_STATIC_ASSERT(sizeof(TVE_ASPECT_RATIO_T) == 4, "enumerations are 32 bits wide");

/** Set an encoder's format.
 *  @param u4Tve        TVE_1 or TVE_2
 *  @param ucMainFmt    the mixer's mode, a PMX_RESOLUTION_MODE_T value
 *  @param ucVFreq      vertical frequency in Hz
 *  @param ucTargetFmt  the output's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @param fgEnable     the output is on
 *  @param fgHD         the mixer's format is an HD one
 *  @param fgOSD5       routing of the fifth OSD plane: 0, 1 or 2; any other value may come and must do no harm
 *  @return TVE_SET_OK, anything else is a failure */
UINT32 TVE_SetFmtEx(UINT32 u4Tve, UCHAR ucMainFmt, UCHAR ucVFreq, UCHAR ucTargetFmt, BOOL fgEnable, BOOL fgHD,
                    UINT8 fgOSD5);

/** Switch an encoder on or off.
 *  @param u4Tve     TVE_1 or TVE_2
 *  @param fgEnable  on */
void TVE_SetEnable(UINT32 u4Tve, BOOL fgEnable);

/** Announce a per-output mode setting; called on every one, before the formats.
 *  @param fgFmtChange  the mixer's format changes
 *  @param ucCavFmt     component's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @param ucCvbsFmt    composite's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @param fgHD         the mixer's format is an HD one
 *  @param fgOSD5       routing of the fifth OSD plane: 0, 1 or 2; any other value may come and must do no harm */
void TVE_SetMuteCtrol(BOOL fgFmtChange, UCHAR ucCavFmt, UCHAR ucCvbsFmt, BOOL fgHD, UINT8 fgOSD5);

/** Blank an encoder's picture across a format change.
 *  @param u4Tve  TVE_1 or TVE_2
 *  @param fgOn   the driver's own switch; the mixer hands over 0 when it begins to change the format */
void TVE_SetBlackScreen(UINT32 u4Tve, BOOL fgOn);

/** Set brightness of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetBrightness(UCHAR ucValue);

/** Set contrast of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetContrast(UCHAR ucValue);

/** Set hue of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetHue(UCHAR ucValue);

/** Set saturation of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetSaturation(UCHAR ucValue);

/** Set sharpness of the analogue outputs.
 *  @param ucValue  the driver's unit; 0 after a reset */
void TVE_SetSharpness(UCHAR ucValue);

/** Set the black level (set-up) of the analogue outputs.
 *  @param ucCAVEn   component's switch
 *  @param ucCVBSEn  composite's switch */
void TVE_SetBlackLvl(UCHAR ucCAVEn, UCHAR ucCVBSEn);

/** Switch composite's set-up on or off.
 *  @param fgEnable  on */
void TVE_CVBSSetup_En(BOOL fgEnable);

/** Switch composite's PAL-60 on or off.
 *  @param fgEnable  on */
void TVE_CVBSPal60_En(BOOL fgEnable);

/** Tell the encoders the kind of medium that plays.
 *  @param ucMediaType  the middleware's code */
void TVE_Identify_Mediatype(UCHAR ucMediaType);

/** Set the widescreen signalling.
 *  @param eAspect  the aspect to signal */
void TVE_SetAspectRatio(TVE_ASPECT_RATIO_T eAspect);

#ifdef __cplusplus
}
#endif

#endif
