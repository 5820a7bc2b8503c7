// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Private to the mixer layer: its one record, its tables and the helpers that its files share. Nothing outside this
 *  folder includes it but the tests of the tables and the record view. */
#ifndef PMX_IF_H
#define PMX_IF_H

#include "drv_av_d.h"
#include "drv_if_pmx.h"
#include "drv_if_vdp.h"
#include "pmx_why.h"
#include "x_typedef.h"

#define PMX_PORT_NUM 8  /* input ports */
#define PMX_PLANE_NUM 8 /* mixer planes */

#define PMX_PORT_VDP_MAIN 0   /* main video */
#define PMX_PORT_VDP_SUB 1    /* second video, and the background that takes its place */
#define PMX_PORT_OSD_FIRST 2u /* OSD planes, to the last port */

/* The mixer planes with graphics that wait while the display part switches; the eighth is never touched. */
#define PMX_OSD_PLANE_FIRST DRV_PMX_PLANE_3
#define PMX_OSD_PLANE_LAST DRV_PMX_PLANE_7

#define PMX_VDP_COMMANDED_NUM 3 /* video planes that take commands, although two reach the mixer */

/* What goes with the stacking order: which occasion it is. */
#define PMX_PLANE_ORDER_AT_RESET 3
#define PMX_PLANE_ORDER_WANTED 8

extern "C" void* memcpy(void* pvDest, const void* pvSource, size_t zSize); /* the kernel's */
extern "C" void* memset(void* pvDest, int iValue, size_t zSize);

#define COUNT_OF(Table) (sizeof(Table) / sizeof((Table)[0]))

/* State of one input port. */
typedef struct
{
    UINT16 u2CompType; /* whoever feeds the port, a PMX_COMP_TYPE_ value */
    UINT16 u2CompId;
    BOOL fgConnected;
    BOOL fgEnabled; /* its source says that it delivers pictures */
    DRV_GFX_COLOR_MODE_T eInputColorMode;
    DRV_PMX_COLOR_SPACE_T eSrcColorSpace;
    UINT32 u4SrcWidth;  /* pixels; never filled, like the height: a size decides the colour space and is not kept */
    UINT32 u4SrcHeight; /* lines */
    UCHAR ucLumaKey;    /* given with a video source */
} PMX_PORT_INFO_T;

/* All that one mixer is set to and knows. The order of the fields is an interface: memory dumps are read by it. */
typedef struct
{
    UCHAR ucEnable;     /* master enable, as given */
    UCHAR ucMode;       /* a PMX_RESOLUTION_MODE_T value */
    UCHAR ucTvType;     /* a PMX_TV_TYPE_ value, others as given */
    UCHAR ucVfreq;      /* Hz */
    UCHAR ucDigitalOut; /* parallel digital port on */
    UCHAR u4Phase;      /* digital clock phase: 8 bits in spite of its prefix */
    UCHAR ucProprietaryMode;
    UCHAR ucDigitalBit; /* bus width in bits */
    UCHAR ucDigitalRgb; /* a PLA_MXR_DIGITAL_OUTPUT_FMT_T value */
    UCHAR ucCAVBlackLv;
    UCHAR ucCVBSBlackLv;
    UCHAR ucGamma;      /* 0 off, 1 to 4 curve, others as given */
    UCHAR ucBrightness; /* analogue adjustments, 128 = neutral */
    UCHAR ucContrast;
    UCHAR ucHue;
    UCHAR ucSaturation;
    UCHAR ucCBEnable;                   /* colour bar, as given */
    UCHAR ucMuteEnable;                 /* output mute, as given */
    UINT32 u4AspectRatio;               /* an ASPECT_RATIO_T value */
    UINT32 u4BgColor;                   /* 0x00YYUUVV */
    UINT32 u4Capability;                /* below PMX_CAP_BIT_GAMMA groups of modes, from there on features */
    UCHAR aucPlaneOrder[PMX_PLANE_NUM]; /* plane id at each position of the stack */
    UCHAR ucSharpness;
    IVdp* piVdp1; /* never filled: a video plane's table is fetched anew for every call */
    void* pvTag1;
    IVdp* piVdp2;
    void* pvTag2;
    PMX_PORT_INFO_T arPortInfo[PMX_PORT_NUM];
    DRV_PMX_COLOR_SPACE_T eMasterColorSpace; /* what the mixer mixes in */
    PMX_RESOLUTION_T arOutputConf[PMX_OUTPUT_NUM];
    BOOL fgAspNext;          /* u4AspNext waits for the next mode change */
    UINT32 u4AspNext;        /* an ASPECT_RATIO_T value */
    BOOL fgSetModeCalled;    /* some mode has been set since the last reset */
    UCHAR ucCavYcInputDelay; /* nothing here fills the delays and levels */
    UCHAR ucCavYcOutputDelay;
    UCHAR ucCvbsYcInputDelay;
    UCHAR ucCvbsYcOutputDelay;
    UCHAR ucCavSyncLvl;
    UCHAR ucCvbsSyncLvl;
    UCHAR ucCvbsBurstLvl;
    UCHAR ucCavYLvl;
    UCHAR ucCvbsYLvl;
    BOOL fgDigestEnable;             /* the digest view is shown, with u4DigestAsp */
    UINT32 u4DigestAsp;              /* an ASPECT_RATIO_T value */
    DRV_EXT_CHIP_USAGE_T rDrvExtScl; /* as PMX_SetModeEx last got it */
    UINT32 u4PlaneOrder;             /* arbitrary plane order: 4 bits a plane, plane 0 lowest */
    BOOL fgForceMode;
    UINT8 fgOSD5; /* fifth-OSD mode as PMX_SetModeEx last got it */
} PMX_CONF_T;

/* Bit numbers of features in the capability word, for fgPmxHasCap; those below are the modes'. */
#define PMX_CAP_BIT_GAMMA 20
#define PMX_CAP_BIT_BRIGHTNESS 21
#define PMX_CAP_BIT_CONTRAST 22
#define PMX_CAP_BIT_HUE 23
#define PMX_CAP_BIT_SATURATION 24
#define PMX_CAP_BIT_DIGITAL_OUT 25
#define PMX_CAP_BIT_SHARPNESS 27
#define PMX_CAP_BIT_BLACK_LEVEL 30

/* Capability bit of a mode's row, where it is not a bit number: the two largest that its field holds. */
#define PMX_CAP_ALWAYS 0x3E /* admitted whatever the capability word says */
#define PMX_CAP_NEVER 0x3F

/* Colour group of a mode: which standard its outputs carry. */
#define PMX_COLOUR_NONE 0 /* converters are left alone */
#define PMX_COLOUR_SD 1   /* BT.601 */
#define PMX_COLOUR_HD 2   /* BT.709 */

/* Flags of a mode. */
#define PMX_MODE_PLL_60 0x01      /* video PLL runs the 60 Hz family's word */
#define PMX_MODE_BOOT_60 0x02     /* may come from the boot loader, 60 Hz TV type */
#define PMX_MODE_BOOT_50 0x04     /* may come from the boot loader, 50 Hz TV type */
#define PMX_MODE_PROGRESSIVE 0x08 /* reported as progressive */
#define PMX_MODE_HD_OUT 0x10      /* reported as an HD output */
#define PMX_MODE_TVE_HD 0x20      /* an HD format for the TV encoders and for plane delays */

/* Everything that is decided from the resolution mode; ordered so that there are no gaps. */
typedef struct
{
    UINT8 u1Mode;       /* PMX_RESOLUTION_MODE_T: the row's own number */
    UINT8 u1CapBit : 6; /* a bit number, PMX_CAP_ALWAYS or PMX_CAP_NEVER */
    UINT8 u1Colour : 2; /* PMX_COLOUR_… */
    UINT16 u2Width;
    UINT16 u2Height;
    UINT8 u1Flags;   /* PMX_MODE_… */
    UINT8 u1CBWidth; /* colour-bar width in the hardware's unit */
} PMX_MODE_ROW_T;
static_assert(sizeof(PMX_MODE_ROW_T) == 8);

#define PMX_MODE_ROW_NUM (RES_3D_1080P24HZ_TB + 1)
#define PMX_GAMMA_CURVE_NUM 4
#define PMX_GAMMA_POINT_NUM 9

extern PMX_CONF_T _arPmxConf[1];           /* only mixer 0 exists */
extern const PMX_CONF_T _arPmxConfDefault; /* what every reset loads */
extern INT32 bComp0OnTop;                  /* first video on top: 1, as given; outlives a reset */
extern const UCHAR aucGammaCurve[PMX_GAMMA_CURVE_NUM][PMX_GAMMA_POINT_NUM];
extern const PMX_MODE_ROW_T _arPmxModeRow[PMX_MODE_ROW_NUM + 1]; /* the last row: every number without one */

/* The one record, whatever mixer id an operation was given. */
static inline PMX_CONF_T* prPmxConf(void)
{
    return &_arPmxConf[0];
}

/* Where the handshake stands. The timer's context shares it and neighbours read it, without a lock: each access is one
 * load or store of the field's width, where it is written. What is volatile no compiler merges, moves or repeats. */
static inline volatile PMX_DISPLAY_PART_STATUS_T* prPmxStatus(void)
{
    return &_arPmxDispPartStatus;
}

/* The row of a mode number; never leaves the table. */
static inline const PMX_MODE_ROW_T* prPmxModeRow(UINT32 u4Mode)
{
    return &_arPmxModeRow[u4Mode < PMX_MODE_ROW_NUM ? u4Mode : PMX_MODE_ROW_NUM];
}

/* Whether a mode is an HD format for the TV encoders and for plane delays. */
static inline bool fgPmxTveHd(UINT32 u4Mode)
{
    return (prPmxModeRow(u4Mode)->u1Flags & PMX_MODE_TVE_HD) != 0;
}

/* The printable name of a mode number; null for a number without one. */
static inline const CHAR* szPmxModeName(UINT32 u4Mode)
{
    return u4Mode < RES_MODE_NUM ? szResStr[u4Mode] : nullptr;
}

/* Whether the capability word has a bit, 0 to 31: a mode's or a feature's. */
static inline bool fgPmxHasCap(UINT32 u4CapBit)
{
    return ((prPmxConf()->u4Capability >> u4CapBit) & 1) != 0;
}

/* The port of a video plane, by the low 8 bits of its id: 2 and 3 share that of 1. PMX_PORT_NUM when there is none. */
static inline UINT32 u4PmxVdpPort(UINT16 u2VdpId)
{
    UCHAR ucVdpId = (UCHAR)u2VdpId;
    if (ucVdpId > 3)
        return PMX_WHY(NO_PORT, PMX_PORT_NUM, PMX_COMP_TYPE_VDP, u2VdpId);
    return ucVdpId == 0 ? PMX_PORT_VDP_MAIN : PMX_PORT_VDP_SUB;
}

/* The port of an OSD plane, by the low 8 bits of its id; PMX_PORT_NUM when there is no such plane. */
static inline UINT32 u4PmxOsdPort(UINT16 u2OsdId)
{
    UCHAR ucOsdId = (UCHAR)u2OsdId;
    return ucOsdId > 5 ? PMX_WHY(NO_PORT, PMX_PORT_NUM, PMX_COMP_TYPE_OSD, u2OsdId) : PMX_PORT_OSD_FIRST + ucOsdId;
}

/* The mixer id that an IPMX tag carries. */
static inline UCHAR ucPmxIdOfTag(void* pvTag)
{
    return (UCHAR)(size_t)pvTag;
}

/* Log a text that comes out of a table or an argument, and takes the values given. Between literals PMX_IsLog itself
 * chooses, for the compiler checks those. */
#define PMX_IS_LOG_TEXT(i4Level, szText, ...)                                                    \
    do                                                                                           \
    {                                                                                            \
        _Pragma("GCC diagnostic push") _Pragma("GCC diagnostic ignored \"-Wformat-nonliteral\"") \
            _Pragma("GCC diagnostic ignored \"-Wformat-security\"")                              \
                PMX_IsLog(i4Level, szText __VA_OPT__(, ) __VA_ARGS__);                           \
        _Pragma("GCC diagnostic pop")                                                            \
    }                                                                                            \
    while (0)

/* Take MutexPMX, waiting for ever, or give it back: around connecting and disconnecting a port, and around calls into
 * the video planes. A failure is asserted and the caller goes on. Never nested. */
void vPmxLock(void);
void vPmxUnlock(void);

/* Program switch, mode, width and colour format of the digital port from the record, whether the mixer is on or not.
 * The phase is the caller's. */
void vPmxProgramDigitalOut(void);

/* Answer a getter: store the value where the caller wants it, who hands the pointer over as second argument, and return
 * 1; return 0, and store nothing, for a mixer id other than 0 or a null pointer. */
UINT32 u4PmxGiveByte(UCHAR ucPmxId, UCHAR ucValue, UCHAR* pucValue);
UINT32 u4PmxGiveWord(UCHAR ucPmxId, UINT32 u4Value, UINT32* pu4Value);
/* The same, but 0 as well when the capability word lacks the bit. */
UINT32 u4PmxGiveFeatureByte(UCHAR ucPmxId, UINT32 u4CapBit, UCHAR ucValue, UCHAR* pucValue);

/* Set the TV type of a mode change, NTSC or else PAL. A refusal is asserted and the change goes on. */
void vPmxChooseTvType(bool fgNtsc);

/* What follows when a new format has been programmed: the video planes, HDMI and the OSD driver learn of it. The record
 * is the one that the PLL and digital-port commands carried. */
void vPmxFinishModeChange(PMX_SET_HDMI_RES_PARAMETER_T* prResData);

/* Hand the stacking order to the hardware: PMX_PLANE_ORDER_AT_RESET or PMX_PLANE_ORDER_WANTED. */
void vPmxProgramPlaneOrder(UINT32 u4Number);

#endif
