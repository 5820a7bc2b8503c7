// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The mixer as the rest of the stack sees it: resolution modes, colour and plane enumerations, output records,
 *  the IPMX interface table and the objects that the mixer layer exports. */
#ifndef DRV_IF_PMX_H
#define DRV_IF_PMX_H

#include "u_os.h"
#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Marks what the mixer layer offers to the stack; everything else of it stays inside the module. */
#define PMX_API __attribute__((visibility("default")))

/** Output resolution mode; fits 8 bits. 2D modes are named after formats of CEA-861, 3D structures (frame packing, TB =
 *  top-and-bottom, SBS_HALF = side-by-side half) after HDMI 1.4. What the mixer makes of a mode (size, scan type, HD or
 *  not) is asked from the mixer, not read off the name. */
typedef DRV_ENUM(PMX_RESOLUTION_MODE_T)
{
    RES_480I = 0,
    RES_576I = 1,
    RES_480P = 2,
    RES_576P = 3,
    RES_480P_1440 = 4,
    RES_576P_1440 = 5,
    RES_480P_2880 = 6,
    RES_576P_2880 = 7,
    RES_720P60HZ = 8,
    RES_720P50HZ = 9,
    RES_1080I60HZ = 10,
    RES_1080I50HZ = 11,
    RES_1080P60HZ = 12,
    RES_1080P50HZ = 13,
    RES_1080P30HZ = 14,
    RES_1080P25HZ = 15,
    RES_480I_2880 = 16,
    RES_576I_2880 = 17,
    RES_1080P24HZ = 18,
    RES_1080P23_976HZ = 19,
    RES_1080P29_97HZ = 20,
    RES_3D_1080P23HZ = 21,
    RES_3D_1080P24HZ = 22,
    RES_3D_720P60HZ = 23,
    RES_3D_720P50HZ = 24,
    RES_3D_720P30HZ = 25,
    RES_3D_720P25HZ = 26,
    RES_3D_576P50HZ = 27,
    RES_3D_480P60HZ = 28,
    RES_3D_1080I60HZ = 29,
    RES_3D_1080I50HZ = 30,
    RES_3D_1080I30HZ = 31,
    RES_3D_1080I25HZ = 32,
    RES_3D_576I25HZ = 33,
    RES_3D_480I30HZ = 34,
    RES_3D_576I50HZ = 35,
    RES_3D_480I60HZ = 36,
    RES_2D_480I60HZ = 37,
    RES_2D_576I50HZ = 38,
    RES_2D_640x480HZ = 39,
    RES_PANEL_AUO_B089AW01 = 40,
    RES_3D_720P60HZ_TB = 41,
    RES_3D_720P50HZ_TB = 42,
    RES_3D_1080I60HZ_SBS_HALF = 43,
    RES_3D_1080I50HZ_SBS_HALF = 44,
    RES_3D_1080P23HZ_TB = 45,
    RES_3D_1080P24HZ_TB = 46,
    RES_4K2K23976HZ = 47,
    RES_4K2K24HZ = 48,
    RES_2160P = 49,
    RES_2160P_4096 = 50,
    RES_MODE_NUM = 51, /**< number of modes */
    RES_AUTO = 52
} PMX_RESOLUTION_MODE_T;

/** Digital port mode (ITU-R BT.601 with separate syncs, BT.656 with embedded syncs). */
typedef DRV_ENUM(CCIR_IN_OUT_MODE_T)
{
    CCIR_INVALID = 0,
    CCIR_601_MODE = 1,
    CCIR_656_MODE = 2
} CCIR_IN_OUT_MODE_T;

/** Digital port sample format: luma and chroma multiplexed, 4:2:2 or 4:4:4, and the bus width in bits. */
typedef DRV_ENUM(CCIR_IN_OUT_FORMAT_T)
{
    CCIR_NON_USED = 0,
    CCIR_YCMIX_8BIT = 1,
    CCIR_YCMIX_10BIT = 2,
    CCIR_YCMIX_12BIT = 3,
    CCIR_YC422_16BIT = 4,
    CCIR_YC422_20BIT = 5,
    CCIR_YC422_24BIT = 6,
    CCIR_YC444_24BIT = 7,
    CCIR_YC444_30BIT = 8,
    CCIR_YC444_36BIT = 9
} CCIR_IN_OUT_FORMAT_T;

/** Colour mode of a source plane's pixels. */
typedef DRV_ENUM(DRV_GFX_COLOR_MODE_T)
{
    DRV_GFX_COLOR_MODE_YCBCR = 0,
    DRV_GFX_COLOR_MODE_RGB = 1
} DRV_GFX_COLOR_MODE_T;

/** Colour space: of what a source delivers, and of the mixing itself (ITU-R BT.601, BT.709). */
typedef DRV_ENUM(DRV_PMX_COLOR_SPACE_T)
{
    DRV_PMX_CS_YCBCR_601 = 0,
    DRV_PMX_CS_YCBCR_709 = 1,
    DRV_PMX_CS_RGB = 2
} DRV_PMX_COLOR_SPACE_T;

/** Mixer plane: names count from 1, values from 0. */
typedef DRV_ENUM(DRV_PMX_PLANE_T)
{
    DRV_PMX_PLANE_1 = 0,
    DRV_PMX_PLANE_2 = 1,
    DRV_PMX_PLANE_3 = 2,
    DRV_PMX_PLANE_4 = 3,
    DRV_PMX_PLANE_5 = 4,
    DRV_PMX_PLANE_6 = 5,
    DRV_PMX_PLANE_7 = 6,
    DRV_PMX_PLANE_8 = 7
} DRV_PMX_PLANE_T;

/** Index of an output. */
DRV_ENUM_UNNAMED
{
    PMX_OUTPUT_CCIR = 0, /**< parallel digital video port */
    PMX_OUTPUT_HDMI = 1,
    PMX_OUTPUT_CAV = 2,  /**< component analogue */
    PMX_OUTPUT_CVBS = 3, /**< composite */
    PMX_OUTPUT_NUM = 4
};

/** How an external scaler or transmitter chip is used. */
typedef DRV_ENUM(DRV_EXT_CHIP_USAGE_T)
{
    DRV_NON_EXT_CHIP = 0,
    DRV_EXT_SCL_EXT_TX = 1,
    DRV_EXT_SCL_INT_TX = 2,
    DRV_RX_BYPASS_TX = 3
} DRV_EXT_CHIP_USAGE_T;

DRV_STATIC_ASSERT(sizeof(PMX_RESOLUTION_MODE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(CCIR_IN_OUT_MODE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(CCIR_IN_OUT_FORMAT_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(DRV_GFX_COLOR_MODE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(DRV_PMX_COLOR_SPACE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(DRV_PMX_PLANE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(DRV_EXT_CHIP_USAGE_T) == 4, "enumerations are 32 bits wide");

/** Set-up of the digital port for one output. */
typedef struct
{
    CCIR_IN_OUT_MODE_T eDgoMode;  /**< output mode */
    CCIR_IN_OUT_FORMAT_T eDgoFmt; /**< output format */
    CCIR_IN_OUT_MODE_T eDgiMode;  /**< input mode */
    CCIR_IN_OUT_FORMAT_T eDgiFmt; /**< input format */
} CCIR_DRV_INFO_T;

/** Configuration of one output. */
typedef struct
{
    BOOL fgOutputEnable;            /**< the output is on */
    PMX_RESOLUTION_MODE_T eResMode; /**< its resolution mode */
    UINT32 u4VFreq;                 /**< fields or frames a second */
    CCIR_DRV_INFO_T eCcirDrvInfo;   /**< set-up of the digital port; looked at for PMX_OUTPUT_CCIR alone */
} PMX_RESOLUTION_T;

/** Where the handshake with the display part stands. */
typedef struct
{
    HANDLE_T hPMXTimer;         /**< the display timer, made by PMX_Init */
    BOOL fgPmxFormatChangeFlag; /**< raised and lowered by the display part: it changes the output's format */
    BOOL fgPmxEnabeOsdFlag;     /**< OSD planes wait for their return to the mix; kept spelt so */
    BOOL fgTimerAlreadySet;     /**< per-output mode setting armed the timer, which has not expired */
} PMX_DISPLAY_PART_STATUS_T;

/** Component types at the interface manager and of the components that feed the mixer. */
#define PMX_COMP_TYPE_VDP 0x41 /**< a plane of the video plane driver */
#define PMX_COMP_TYPE_PMX 66   /**< the mixer itself, id 0 */
#define PMX_COMP_TYPE_OSD 0xB0 /**< a plane of the OSD driver */

/** The mixer's own table at the interface manager (IID_IPMX). Each function takes first the tag that came with the
 *  table: the mixer's component id carried in the pointer. It returns what the PMX_ function of the same task in
 *  drv_pmx.h returns; the four source events are inert and return 1. */
typedef struct
{
    INT32 (*pi4SetMode)(void* pvTag, UCHAR ucMode, UCHAR ucVFreq, BOOL fgOSD5); /**< as i4PmxSetMode */
    INT32 (*pi4GetMode)(void* pvTag, UCHAR* pucMode);                           /**< as i4PmxGetMode */
    INT32 (*pi4GetOutSize)(void* pvTag, UINT32* pu4Width, UINT32* pu4Height);   /**< as i4PmxGetOutSize */
    INT32 (*pi4GetAspectRatio)(void* pvTag, UINT32* pu4AspectRatio);            /**< as i4PmxGetAspectRatio */
    INT32 (*pi4DisableVideoPlane)(void* pvTag, UCHAR ucVdpId);                  /**< as i4PmxDisableVideoPlane */
    INT32 (*pi4EnableVideoPlane)(void* pvTag, UCHAR ucVdpId);                   /**< as i4PmxEnableVideoPlane */
    /** as i4PmxOsdEnabled */
    INT32 (*pi4OsdEnabled)(void* pvTag, INT32 i4SrcWidth, INT32 i4SrcHeight, DRV_GFX_COLOR_MODE_T eSrcColorSpace);
    INT32 (*pi4OsdDisabled)(void* pvTag);                                     /**< as i4PmxOsdDisabled */
    INT32 (*pi4VdpEnabled)(void* pvTag, INT32 i4SrcWidth, INT32 i4SrcHeight); /**< as i4PmxVdpEnabled */
    INT32 (*pi4VdpDisabled)(void* pvTag);                                     /**< as i4PmxVdpDisabled */
    INT32 (*pi4VdpGetPlanePosition)(void* pvTag, UCHAR ucVdpHwId);            /**< as i4PmxGetPlanePosition */
} IPMX;

/** Printable names of the resolution modes; null for one that has none, as the 4K modes. RES_2D_640x480HZ is printed
 *  without its HZ: the text is part of the console interface. */
extern PMX_API const CHAR* const szResStr[RES_MODE_NUM];

/** The interface table that is registered under IID_IPMX. */
extern PMX_API const IPMX _rPMXIF;

/** Suspend and resume of the mixer. */
extern PMX_API const PM_OPERATIONS_T pmx_pm_ops;

/** Mutex over port connection and over informing the video planes; 0 before start-up and after shut-down. Only
 *  i4PMX_Uninit keeps the handle of a mutex that it could not delete. */
extern PMX_API HANDLE_T MutexPMX;

/** 1 between start-up and stop or shut-down. */
extern PMX_API UCHAR _PmxInitiated;

/** 1 from load until the first per-output mode setting that is not refused; until then a reset leaves scaler mode and
 *  TV-encoder picture settings alone. */
extern PMX_API BOOL _fgBootUp;

/** Test switch: while set, per-output mode setting does not tell the OSD driver the display mode. Written by testers
 *  only. */
extern PMX_API BOOL _PmxTestOsd;

/** 2D smoothing was asked for; for other drivers to read. */
extern PMX_API BOOL _fg2DCap;

/** Bit n admits PMX_Printf output of level n. Written by debuggers only. */
extern PMX_API UINT32 PMX_debug_level;

/** The handshake with the display part. */
extern PMX_API PMX_DISPLAY_PART_STATUS_T _arPmxDispPartStatus;

#ifdef __cplusplus
}
#endif

#endif
