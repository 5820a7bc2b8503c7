// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Mixer hardware layer: what the mixer layer asks of the plane mixer, its scaler, colour converters, digital port and
 *  vertical-sync handling. No function here fails unless it says so. Called on threads; those that the timer's context
 *  reaches as well say so. The only mixer is 0; where the mixer layer hands an id on as it
 *  was given (swap of planes 1 and 2 and its query, plane mixing, plane selectors, active zone), another id must do no
 *  harm. */
#ifndef PMX_HAL_H
#define PMX_HAL_H

#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Program the mixer for a resolution mode.
 *  @param ucPmxId  mixer id
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value */
void PMX_HalSetMode(UCHAR ucPmxId, UCHAR ucMode);

/** Program the scaler for a resolution mode.
 *  @param ucMode  a PMX_RESOLUTION_MODE_T value */
void PMX_HalSetScalerMode(UCHAR ucMode);

/** Restart the mixer with its current set-up.
 *  @param ucPmxId  mixer id */
void PMX_HalReset(UCHAR ucPmxId);

/** Restart the scaler with its current set-up.
 *  @param ucPmxId  mixer id */
void PMX_HalScalerReset(UCHAR ucPmxId);

/** Select the TV type.
 *  @param ucPmxId   mixer id
 *  @param ucTvType  a PMX_TV_TYPE_ value: 0 60 Hz systems, 3 50 Hz systems; any other may come and must do no harm */
void PMX_HalSetTvType(UCHAR ucPmxId, UCHAR ucTvType);

/** Switch a clock of the mixer. Power management calls it too, on suspend and resume.
 *  @param u4ClockId  0 or 2
 *  @param u4On       1 on, 0 off */
void PMX_HalClockSet(UINT32 u4ClockId, UINT32 u4On);

/** Set the background colour.
 *  @param ucPmxId    mixer id
 *  @param u4BgColor  0x00YYUUVV */
void PMX_HalSetBg(UCHAR ucPmxId, UINT32 u4BgColor);

/** Program the stacking order.
 *  @param     ucPmxId        mixer id
 *  @param     u4Number       3 at reset, 8 for an order that was asked for
 *  @param[in] pu4PlaneOrder  [8] eight plane ids, position 0 first; a plane may be named twice, and any 32-bit word may
 *                            come and must do no harm */
void PMX_HalPlaneOrder(UCHAR ucPmxId, UINT32 u4Number, const UINT32* pu4PlaneOrder);

/** Put the plane selectors into their initial state.
 *  @param ucPmxId  mixer id */
void PMX_HalInitPlaneOrder(UCHAR ucPmxId);

/** Program the eight plane selectors.
 *  The layer below guarantees that on success it has written all eight delays.
 *  @param      ucPmxId      mixer id
 *  @param[in]  pu1PlnSel    [8] eight source numbers 0 to 7, plane 0 first
 *  @param[out] pi4PlnDelay  [8] receives eight delays of the new arrangement, plane 0 first, in the hardware's unit
 *  @return 0; anything else when the order is refused */
INT32 PMX_HalSetPlaneOrder(UCHAR ucPmxId, const UINT8* pu1PlnSel, INT32* pi4PlnDelay);

/** Read the eight plane selectors.
 *  @param      ucPmxId    mixer id
 *  @param[out] pu1PlnSel  [8] receives eight source numbers, plane 0 first
 *  @return 0; anything else when they cannot be read */
INT32 PMX_HalGetPlaneOrder(UCHAR ucPmxId, UINT8* pu1PlnSel);

/** Put a plane into the mix. Called in the timer's context too.
 *  @param ucPmxId  mixer id
 *  @param ucPlane  plane 0 to 7, a DRV_PMX_PLANE_T value */
void vPmxMixPlane(UCHAR ucPmxId, UCHAR ucPlane);

/** Take a plane out of the mix.
 *  @param ucPmxId  mixer id
 *  @param ucPlane  plane 0 to 7, a DRV_PMX_PLANE_T value */
void vPmxNotMixPlane(UCHAR ucPmxId, UCHAR ucPlane);

/** Ask whether a plane is in the mix.
 *  @param ucPmxId  mixer id
 *  @param ucPlane  plane 0 to 7, a DRV_PMX_PLANE_T value
 *  @return TRUE or FALSE */
BOOL fgPmxHalMixPlane(UCHAR ucPmxId, UCHAR ucPlane);

/** Swap planes 1 and 2, and with them the two video planes, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane1_2(UCHAR ucPmxId, UINT32 u4Swap);

/** Swap planes 3 and 4, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane3_4(UCHAR ucPmxId, UINT32 u4Swap);

/** Swap planes 6 and 7, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane6_7(UCHAR ucPmxId, UINT32 u4Swap);

/** Swap planes 4 and 7, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane4_7(UCHAR ucPmxId, UINT32 u4Swap);

/** Swap planes 1 and 3, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane1_3(UCHAR ucPmxId, UINT32 u4Swap);

/** Swap planes 5 and 8, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane5_8(UCHAR ucPmxId, UINT32 u4Swap);

/** Ask whether the two video planes have traded mixer planes 1 and 2.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane1_2(UCHAR ucPmxId);

/** Ask whether planes 3 and 4 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane3_4(UCHAR ucPmxId);

/** Ask whether planes 6 and 7 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane6_7(UCHAR ucPmxId);

/** Ask whether planes 4 and 7 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane4_7(UCHAR ucPmxId);

/** Ask whether planes 1 and 3 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane1_3(UCHAR ucPmxId);

/** Ask whether planes 5 and 8 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane5_8(UCHAR ucPmxId);

/** Select the colour converter of the video-out path.
 *  @param ucPmxId   mixer id
 *  @param ucSelect  selector, always 1 */
void PMX_HalSelectVdoutCconv(UCHAR ucPmxId, UCHAR ucSelect);

/** Select the colour converter of the scaler's path.
 *  @param ucPmxId   mixer id
 *  @param ucSelect  selector, always 0 */
void PMX_HalSelectScalerCconv(UCHAR ucPmxId, UCHAR ucSelect);

/** Set converter CC_A behind the mixer.
 *  @param ucPmxId      mixer id
 *  @param ucEnable     1 on, 0 off
 *  @param ucDirection  1 BT.709 to BT.601, 0 BT.601 to BT.709 */
void PMX_HalSetCC_A(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucDirection);

/** Set the scaler's colour converter.
 *  @param ucPmxId      mixer id
 *  @param ucEnable     1 on, 0 off
 *  @param ucDirection  1 BT.709 to BT.601; 0 when off */
void PMX_HalSetScaler709601(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucDirection);

/** Fit the active zone to a resolution mode.
 *  @param ucPmxId  mixer id
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm */
void PMX_HalSetActiveZone(UCHAR ucPmxId, UCHAR ucMode);

/** Set the width of the colour bars.
 *  @param ucPmxId  mixer id
 *  @param u1Width  width in the hardware's unit */
void PMX_HalSetCBWidth(UCHAR ucPmxId, UINT8 u1Width);

/** Show the colour bars.
 *  @param ucPmxId  mixer id */
void PMX_HalEnableCB(UCHAR ucPmxId);

/** Stop showing the colour bars.
 *  @param ucPmxId  mixer id */
void PMX_HalDisableCB(UCHAR ucPmxId);

/** Mute the mixer's output.
 *  @param ucPmxId  mixer id */
void PMX_HalEnableMute(UCHAR ucPmxId);

/** Release the mute.
 *  @param ucPmxId  mixer id */
void PMX_HalDisableMute(UCHAR ucPmxId);

/** Set a video path's delay.
 *  @param ucVdoId   video path
 *  @param ucADJ_F   field adjustment
 *  @param u2HDelay  horizontal delay in the hardware's unit
 *  @param u2VDelay  vertical delay in the hardware's unit */
void PMX_HalSetDelay(UCHAR ucVdoId, UCHAR ucADJ_F, UINT16 u2HDelay, UINT16 u2VDelay);

/** Set the mixer's brightness.
 *  @param ucPmxId       mixer id
 *  @param ucBrightness  128 = neutral */
void PMX_HalSetBrightness(UCHAR ucPmxId, UCHAR ucBrightness);

/** Set the mixer's contrast.
 *  @param ucPmxId     mixer id
 *  @param ucContrast  128 = neutral */
void PMX_HalSetContrast(UCHAR ucPmxId, UCHAR ucContrast);

/** Set the gamma curve.
 *  @param     ucPmxId   mixer id
 *  @param     ucEnable  1 on, 0 off
 *  @param[in] pucCurve  [9] nine output levels at equally spaced inputs from 0 to 255; null when off */
void PMX_HalSetGamma(UCHAR ucPmxId, UCHAR ucEnable, const UCHAR* pucCurve);

/** Set the parallel digital port.
 *  @param ucPmxId            mixer id
 *  @param ucEnable           0 off, anything else on
 *  @param ucProprietaryMode  vendor mode code
 *  @param ucDigitalBit       bus width in bits */
void PMX_HalSetDigitalOut(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucProprietaryMode, UCHAR ucDigitalBit);

/** Set the digital picture's colour format.
 *  @param ucPmxId       mixer id
 *  @param ucDigitalRgb  a PLA_MXR_DIGITAL_OUTPUT_FMT_T value; any other value may come and must do no harm */
void PMX_HalSetDigitalOutRgb(UCHAR ucPmxId, UCHAR ucDigitalRgb);

/** Set the digital port's clock phase.
 *  @param ucPmxId  mixer id
 *  @param u4Phase  phase in the hardware's unit */
void PMX_HalSetDigitalOutPhase(UCHAR ucPmxId, UINT32 u4Phase);

/** Set the digital port's pad drive strength.
 *  @param u4Drving  strength in the hardware's unit */
void PMX_HalSetDigitalOutDrv(UINT32 u4Drving);

/** Set up vertical-sync handling. */
void PMX_VsyncInit(void);

/** Tear vertical-sync handling down. */
void PMX_VsyncStop(void);

/** Start vertical-sync interrupts. */
void PMX_VsyncEnable(void);

/** Stop vertical-sync interrupts. */
void PMX_VsyncDisable(void);

#ifdef __cplusplus
}
#endif

#endif
