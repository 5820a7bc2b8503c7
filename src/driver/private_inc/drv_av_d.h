// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  HDMI/AV driver: commands and queries of the mixer, and the records that go with them. */
#ifndef DRV_AV_D_H
#define DRV_AV_D_H

#include "drv_if_pmx.h"
#include "x_avd.h"
#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Commands of fgPmxDrvSetAvd; in brackets the type that their parameter points to. Missing numbers are not the
 *  mixer's. Of the commands 17 to 31 the first byte in memory is the value, and no more is read. */
typedef DRV_ENUM(PMX_AVD_COMMAND_T)
{
    PMX_CHG_HDMI_COLOR_SPACE = 0,        /**< [UINT8] a HDMI_COLOR_SPACE_T value */
    PMX_CHG_HDMI_VIDEO_ASPECT_RATIO = 1, /**< [UINT32] an ASPECT_RATIO_T value or any other; may be refused */
    PMX_SET_UI_TV_SYSTEM = 2,            /**< [PMX_SET_TV_SYS_PARAMETER_T] */
    PMX_SET_HDMI_BRIGHTNESS = 4,         /**< [UINT8] */
    PMX_SET_HDMI_CONTRAST = 5,           /**< [UINT8] */
    PMX_SET_HDMI_HUE = 6,                /**< [UINT8] */
    PMX_SET_HDMI_SATURATION = 7,         /**< [UINT8] */
    PMX_CHG_DEEP_COLOR_BIT = 8,          /**< [UINT8] may be refused */
    PMX_SET_VIDEO_PLL = 9,               /**< [PMX_SET_HDMI_RES_PARAMETER_T] */
    PMX_SET_HDMI_RES_CHG = 10,           /**< [PMX_SET_HDMI_RES_PARAMETER_T] */
    PMX_CHG_UI_RES_AUTO = 13,            /**< [BOOL] FALSE or anything else */
    PMX_SET_HDMI_SHARPNESS = 15,         /**< [UINT8] */
    PMX_SET_CCIR_RES_CHG = 16,           /**< [PMX_SET_HDMI_RES_PARAMETER_T] */
    PMX_SET_EXT_SHARPNESS = 17,          /**< [UINT8] */
    PMX_SET_EXT_BRIGHTNESS = 18,         /**< [UINT8] */
    PMX_SET_EXT_CONTRAST = 19,           /**< [UINT8] */
    PMX_SET_EXT_SATURATION = 20,         /**< [UINT8] */
    PMX_SET_EXT_COLOR_SPACE = 21,        /**< [UINT8] */
    PMX_SET_EXT_Y_C_DELAY = 22,          /**< [UINT8] */
    PMX_SET_EXT_CUE_CORRECT = 23,        /**< [UINT8] */
    PMX_SET_EXT_BORDER_LEVEL = 24,       /**< [UINT8] */
    PMX_SET_EXT_DEINTERLACE_MODE = 25,   /**< [UINT8] */
    PMX_SET_EXT_NOISE_REDUCTION = 26,    /**< [UINT8] */
    PMX_SET_EXT_EDGE_ENHANCEMENT = 27,   /**< [UINT8] */
    PMX_SET_EXT_DETAIL_ENHANCEMENT = 28, /**< [UINT8] */
    PMX_SET_EXT_ZOOM_IMAGE = 29,         /**< [UINT8] */
    PMX_SET_EXT_GAMMA = 30,              /**< [UINT8] */
    PMX_SET_EXT_DEEP_COLOR = 31          /**< [UINT8] */
} PMX_AVD_COMMAND_T;

/** Queries of fgPmxDrvGetAvdInfo; in brackets the type that their parameter points to. */
typedef DRV_ENUM(PMX_AVD_QUERY_T)
{
    PMX_GET_VALID_RES_AND_VFREQ = 1 /**< [PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T] */
} PMX_AVD_QUERY_T;

DRV_STATIC_ASSERT(sizeof(PMX_AVD_COMMAND_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(PMX_AVD_QUERY_T) == 4, "enumerations are 32 bits wide");

/** What goes with the commands for resolution, PLL and digital port. One-mode setting leaves eCcirDrvInfo,
 *  fgOsdMsg and fgCCIROutEnable 0. Per-output mode setting checks the mixer's format alone: in the fields of HDMI, of
 *  the external chip, of the port's set-up and of the fifth OSD plane any other value may come, which must do no
 *  harm. */
typedef struct
{
    UINT8 u1ScaleMode;
    UINT8 ucHdmiOutDisplayResolution; /**< what HDMI shows, a PMX_RESOLUTION_MODE_T value */
    UINT8 ucFmtOutResolution;         /**< the mixer's format, a PMX_RESOLUTION_MODE_T value */
    UINT8 ucCCIROutResolution;        /**< what the digital port carries, a PMX_RESOLUTION_MODE_T value */
    UINT8 ucHdmiOutMode;              /**< a DRV_EXT_CHIP_USAGE_T value */
    CCIR_DRV_INFO_T eCcirDrvInfo;     /**< the digital port's set-up */
    BOOL fgOsdMsg;                    /**< the fifth OSD plane's mode: 0, 1 or 2 */
    UINT8 ucCCIROutMode;              /**< 1 from one-mode setting, 0 from per-output mode setting */
    BOOL fgCCIROutEnable;
    BOOL fgHdmiOutEnable;
    UINT16 u2_Vfreq; /**< not filled by the mixer: 0 */
} PMX_SET_HDMI_RES_PARAMETER_T;

/** TV system command. */
typedef struct
{
    UINT16 u2_Vfreq;   /**< vertical frequency in Hz */
    BOOL fgAutoEnable; /**< the sink decides, not the user */
} PMX_SET_TV_SYS_PARAMETER_T;

/** Valid-resolution query. */
typedef struct
{
    UINT32 u4ResCheck;       /**< in: resolution to check, a PMX_RESOLUTION_MODE_T value */
    UINT16 u2VsyncFreq;      /**< in: frequency to check, in Hz */
    UINT32 u4ValidAutoRes;   /**< out: the PMX_RESOLUTION_MODE_T value that the driver would choose */
    UINT16 u2ValidAutoVfreq; /**< out: frequency that the driver would choose, in Hz */
} PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T;

/** Command the driver. It takes a copy of what it needs before it returns.
 *  @param     u4Command    a PMX_AVD_COMMAND_T value
 *  @param[in] pvParameter  [by u4Command] the command's parameter
 *  @param     u4Length     always 1; the driver's own convention
 *  @return FALSE when it refuses
 *  @context a thread that may sleep */
BOOL fgPmxDrvSetAvd(UINT32 u4Command, void* pvParameter, UINT32 u4Length);

/** Query the driver.
 *  @param         u4Query      a PMX_AVD_QUERY_T value
 *  @param[in,out] pvParameter  [by u4Query] the query's record; the driver fills its outputs when it answers TRUE
 *  @return FALSE when it has no answer
 *  @context a thread that may sleep */
BOOL fgPmxDrvGetAvdInfo(UINT32 u4Query, void* pvParameter);

/** Ask whether a sink is plugged in.
 *  @return 1 when it is
 *  @context a thread that may sleep */
INT32 i4GetHotPlugStatus(void);

/** Ask whether a hot-plug event wants the HDMI resolution sent again.
 *  @return TRUE or FALSE
 *  @context a thread that may sleep */
BOOL fgIsHotPlugChgRes(void);

/** Tell the driver that the mixer runs a new format.
 *  @param ucMode  a PMX_RESOLUTION_MODE_T value
 *  @context a thread that may sleep */
void vPostChgRes(UCHAR ucMode);

/** Report a new master colour space.
 *  @param eColorSpace  the colour space
 *  @context a thread that may sleep */
void vPostChgInputCS(DRV_PMX_COLOR_SPACE_T eColorSpace);

/** Tell the driver that a mode setting ended without an HDMI change.
 *  @context a thread that may sleep */
void vSendAvdNotifyScomResChgOK(void);

/** Select where the digital port takes its picture.
 *  @param fgBeforeMixer  0 behind the mixer, anything else before it
 *  @context a thread that may sleep */
void vSetCcirOutBeforeMixer(BOOL fgBeforeMixer);

#ifdef __cplusplus
}
#endif

#endif
