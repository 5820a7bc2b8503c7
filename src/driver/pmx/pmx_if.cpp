// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The module's state and tables, and the answers of its getters. Whatever is decided from the resolution mode stands in
 * the mode table and nowhere else. */
#include "pmx_if.h"

#include "drv_pmx.h"

/* State */

constinit PMX_CONF_T _arPmxConf[1] = {};
constinit INT32 bComp0OnTop = 0;

constinit PMX_DISPLAY_PART_STATUS_T _arPmxDispPartStatus = {};
constinit HANDLE_T MutexPMX = 0;
constinit UCHAR _PmxInitiated = 0;
constinit BOOL _fgBootUp = TRUE;
constinit BOOL _PmxTestOsd = FALSE;
constinit BOOL _fg2DCap = FALSE;
constinit UINT32 PMX_debug_level = 0;

/* Answers */

UINT32 u4PmxGiveByte(UCHAR ucPmxId, UCHAR ucValue, UCHAR* pucValue)
{
    if (ucPmxId != 0 || pucValue == nullptr)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(NULL_POINTER, 0, 2));

    *pucValue = ucValue;
    return 1;
}

UINT32 u4PmxGiveWord(UCHAR ucPmxId, UINT32 u4Value, UINT32* pu4Value)
{
    if (ucPmxId != 0 || pu4Value == nullptr)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(NULL_POINTER, 0, 2));

    *pu4Value = u4Value;
    return 1;
}

UINT32 u4PmxGiveFeatureByte(UCHAR ucPmxId, UINT32 u4CapBit, UCHAR ucValue, UCHAR* pucValue)
{
    return fgPmxHasCap(u4CapBit) ? u4PmxGiveByte(ucPmxId, ucValue, pucValue)
                                 : PMX_WHY(FEATURE_BIT, 0, u4CapBit, prPmxConf()->u4Capability);
}

/* Default record */

static constexpr PMX_PORT_INFO_T VIDEO_PORT = { .u2CompType = 0,
                                                .u2CompId = 0,
                                                .fgConnected = FALSE,
                                                .fgEnabled = FALSE,
                                                .eInputColorMode = DRV_GFX_COLOR_MODE_YCBCR,
                                                .eSrcColorSpace = DRV_PMX_CS_YCBCR_709,
                                                .u4SrcWidth = 0,
                                                .u4SrcHeight = 0,
                                                .ucLumaKey = 0 };

static constexpr PMX_PORT_INFO_T OSD_PORT = { .u2CompType = 0,
                                              .u2CompId = 0,
                                              .fgConnected = FALSE,
                                              .fgEnabled = FALSE,
                                              .eInputColorMode = DRV_GFX_COLOR_MODE_RGB,
                                              .eSrcColorSpace = DRV_PMX_CS_YCBCR_709,
                                              .u4SrcWidth = 0,
                                              .u4SrcHeight = 0,
                                              .ucLumaKey = 0 };

static constexpr PMX_RESOLUTION_T OUTPUT_1080P = {
    .fgOutputEnable = TRUE, .eResMode = RES_1080P60HZ, .u4VFreq = 60, .eCcirDrvInfo = {}
};

static constexpr PMX_RESOLUTION_T OUTPUT_480I = {
    .fgOutputEnable = TRUE, .eResMode = RES_480I, .u4VFreq = 60, .eCcirDrvInfo = {}
};

/* ucMode and the outputs' modes differ: the boot resolution replaces ucMode at once, while the outputs are what a
 * per-output mode setting is compared with. */
constexpr PMX_CONF_T _arPmxConfDefault = {
    .ucEnable = 0,
    .ucMode = RES_1080I60HZ,
    .ucTvType = PMX_TV_TYPE_NTSC,
    .ucVfreq = 60,
    .ucDigitalOut = 1,
    .u4Phase = 2,
    .ucProprietaryMode = 0,
    .ucDigitalBit = 24,
    .ucDigitalRgb = 0,
    .ucCAVBlackLv = 0,
    .ucCVBSBlackLv = 0,
    .ucGamma = 0,
    .ucBrightness = 128,
    .ucContrast = 128,
    .ucHue = 128,
    .ucSaturation = 128,
    .ucCBEnable = 0,
    .ucMuteEnable = 0,
    .u4AspectRatio = 3,
    .u4BgColor = 0x108080,      // black
    .u4Capability = 0x7FFBFFFF, // all but bits 18 and 31
    .aucPlaneOrder = { 4, 3, 1, 0, 2, 5, 6, 7 },
    .ucSharpness = 0,
    .piVdp1 = nullptr,
    .pvTag1 = nullptr,
    .piVdp2 = nullptr,
    .pvTag2 = nullptr,
    .arPortInfo = { VIDEO_PORT, VIDEO_PORT, OSD_PORT, OSD_PORT, OSD_PORT, OSD_PORT, OSD_PORT, OSD_PORT },
    .eMasterColorSpace = DRV_PMX_CS_YCBCR_709,
    .arOutputConf = { OUTPUT_1080P, OUTPUT_1080P, OUTPUT_1080P, OUTPUT_480I },
    .fgAspNext = FALSE,
    .u4AspNext = 3,
    .fgSetModeCalled = FALSE,
    .ucCavYcInputDelay = 0,
    .ucCavYcOutputDelay = 0,
    .ucCvbsYcInputDelay = 0,
    .ucCvbsYcOutputDelay = 0,
    .ucCavSyncLvl = 0,
    .ucCvbsSyncLvl = 0,
    .ucCvbsBurstLvl = 0,
    .ucCavYLvl = 0,
    .ucCvbsYLvl = 0,
    .fgDigestEnable = FALSE,
    .u4DigestAsp = 0,
    .rDrvExtScl = DRV_NON_EXT_CHIP,
    .u4PlaneOrder = 0x76543210, // each plane fed by the source of its number
    .fgForceMode = FALSE,
    .fgOSD5 = 0,
};

/* Mode table */

static constexpr UINT8 PLL60 = PMX_MODE_PLL_60;
static constexpr UINT8 BOOT60 = PMX_MODE_BOOT_60;
static constexpr UINT8 BOOT50 = PMX_MODE_BOOT_50;
static constexpr UINT8 PROGR = PMX_MODE_PROGRESSIVE;
static constexpr UINT8 HDOUT = PMX_MODE_HD_OUT;
static constexpr UINT8 TVEHD = PMX_MODE_TVE_HD;
static constexpr UINT8 SD = PMX_COLOUR_SD;
static constexpr UINT8 HD = PMX_COLOUR_HD;
static constexpr UINT8 NONE = PMX_COLOUR_NONE;
static constexpr UINT8 ALWAYS = PMX_CAP_ALWAYS;
static constexpr UINT8 NEVER = PMX_CAP_NEVER;

/* Cells that look odd are meant so:
 * - the 60 Hz PLL word serves 30, 29.97 and 23.976 Hz too, but not 24 Hz;
 * - 2D 23.976 and 29.97 Hz and the top-and-bottom modes do not count as progressive;
 * - 29.97 Hz is an HD output, but no HD format for the TV encoders;
 * - RES_2D_576I50HZ has the unknown row's facts: refused, sized 1080, its converters left alone;
 * - the panel is an HD output that is converted like an SD one;
 * - RES_3D_1080P23HZ_TB hangs on the bit of 29.97 Hz, not on that of 23.976 Hz. */
// clang-format off
constexpr PMX_MODE_ROW_T _arPmxModeRow[PMX_MODE_ROW_NUM + 1] = {
    // mode                    cap     colour width height  flags                                          bar
    { RES_480I,                  0,      SD,    720,  480,  PLL60 | BOOT60,                                 22 },
    { RES_576I,                  1,      SD,    720,  576,          BOOT50,                                 22 },
    { RES_480P,                  2,      SD,    720,  480,  PLL60 | BOOT60 | PROGR,                         22 },
    { RES_576P,                  3,      SD,    720,  576,          BOOT50 | PROGR,                         22 },
    { RES_480P_1440,             ALWAYS, SD,    720,  480,  PLL60          | PROGR,                         30 },
    { RES_576P_1440,             ALWAYS, SD,    720,  576,                   PROGR,                         30 },
    { RES_480P_2880,             ALWAYS, SD,    720,  480,  PLL60          | PROGR,                         30 },
    { RES_576P_2880,             ALWAYS, SD,    720,  576,                   PROGR,                         30 },
    { RES_720P60HZ,              4,      HD,   1280,  720,  PLL60 | BOOT60 | PROGR | HDOUT | TVEHD,         20 },
    { RES_720P50HZ,              5,      HD,   1280,  720,          BOOT50 | PROGR | HDOUT | TVEHD,         20 },
    { RES_1080I60HZ,             6,      HD,   1920, 1080,  PLL60 | BOOT60         | HDOUT | TVEHD,         30 },
    { RES_1080I50HZ,             7,      HD,   1920, 1080,          BOOT50         | HDOUT | TVEHD,         30 },
    { RES_1080P60HZ,             8,      HD,   1920, 1080,  PLL60 | BOOT60 | PROGR | HDOUT | TVEHD,         30 },
    { RES_1080P50HZ,             9,      HD,   1920, 1080,          BOOT50 | PROGR | HDOUT | TVEHD,         30 },
    { RES_1080P30HZ,             10,     HD,   1920, 1080,  PLL60          | PROGR | HDOUT | TVEHD,         30 },
    { RES_1080P25HZ,             11,     HD,   1920, 1080,                   PROGR | HDOUT | TVEHD,         30 },
    { RES_480I_2880,             ALWAYS, SD,    720,  480,  PLL60,                                          30 },
    { RES_576I_2880,             ALWAYS, SD,    720,  576,  0,                                              30 },
    { RES_1080P24HZ,             12,     HD,   1920, 1080,                   PROGR | HDOUT | TVEHD,         30 },
    { RES_1080P23_976HZ,         13,     HD,   1920, 1080,  PLL60                  | HDOUT | TVEHD,         30 },
    { RES_1080P29_97HZ,          14,     HD,   1920, 1080,  PLL60                  | HDOUT,                 30 },
    { RES_3D_1080P23HZ,          15,     HD,   1920, 1080,  PLL60          | PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_1080P24HZ,          15,     HD,   1920, 1080,                   PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_720P60HZ,           15,     HD,   1280,  720,  PLL60          | PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_720P50HZ,           15,     HD,   1280,  720,                   PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_720P30HZ,           15,     HD,   1280,  720,  PLL60          | PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_720P25HZ,           15,     HD,   1280,  720,                   PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_576P50HZ,           15,     SD,    720,  576,                   PROGR,                         30 },
    { RES_3D_480P60HZ,           15,     SD,    720,  480,  PLL60          | PROGR,                         30 },
    { RES_3D_1080I60HZ,          15,     HD,   1920, 1080,  PLL60                  | HDOUT | TVEHD,         30 },
    { RES_3D_1080I50HZ,          15,     HD,   1920, 1080,                           HDOUT | TVEHD,         30 },
    { RES_3D_1080I30HZ,          15,     HD,   1920, 1080,  PLL60                  | HDOUT | TVEHD,         30 },
    { RES_3D_1080I25HZ,          15,     HD,   1920, 1080,                           HDOUT | TVEHD,         30 },
    { RES_3D_576I25HZ,           15,     SD,    720,  576,  0,                                              30 },
    { RES_3D_480I30HZ,           15,     SD,    720,  480,  PLL60,                                          30 },
    { RES_3D_576I50HZ,           15,     SD,    720,  576,  0,                                              30 },
    { RES_3D_480I60HZ,           15,     SD,    720,  480,  PLL60,                                          30 },
    { RES_2D_480I60HZ,           0,      SD,    720,  480,  PLL60,                                          30 },
    { RES_2D_576I50HZ,           NEVER,  NONE, 1920, 1080,                           HDOUT,                 30 },
    { RES_2D_640x480HZ,          16,     SD,    640,  480,  PLL60          | PROGR,                         30 },
    { RES_PANEL_AUO_B089AW01,    ALWAYS, SD,   1024,  600,  PLL60          | PROGR | HDOUT | TVEHD,         30 },
    { RES_3D_720P60HZ_TB,        4,      HD,   1280,  720,  PLL60                  | HDOUT | TVEHD,         30 },
    { RES_3D_720P50HZ_TB,        5,      HD,   1280,  720,                           HDOUT | TVEHD,         30 },
    { RES_3D_1080I60HZ_SBS_HALF, 6,      HD,   1920, 1080,  PLL60                  | HDOUT | TVEHD,         30 },
    { RES_3D_1080I50HZ_SBS_HALF, 7,      HD,   1920, 1080,                           HDOUT | TVEHD,         30 },
    { RES_3D_1080P23HZ_TB,       14,     HD,   1920, 1080,  PLL60                  | HDOUT | TVEHD,         30 },
    { RES_3D_1080P24HZ_TB,       12,     HD,   1920, 1080,                           HDOUT | TVEHD,         30 },
    // unknown: the 4K modes, RES_MODE_NUM, RES_AUTO and every other number
    { PMX_MODE_ROW_NUM,          NEVER,  NONE, 1920, 1080,                           HDOUT,                 30 },
};
// clang-format on

static consteval bool fgEveryRowIsItsMode()
{
    for (UINT32 i = 0; i <= PMX_MODE_ROW_NUM; i++)
    {
        if (_arPmxModeRow[i].u1Mode != i || _arPmxModeRow[i].u1Colour > PMX_COLOUR_HD)
            return false;
    }
    return true;
}
static_assert(fgEveryRowIsItsMode());

/* Names */

/* Sized for every mode; the 4K modes have no name and are printed as a null string. */
constexpr const CHAR* const szResStr[RES_MODE_NUM] = {
    "RES_480I",
    "RES_576I",
    "RES_480P",
    "RES_576P",
    "RES_480P_1440",
    "RES_576P_1440",
    "RES_480P_2880",
    "RES_576P_2880",
    "RES_720P60HZ",
    "RES_720P50HZ",
    "RES_1080I60HZ",
    "RES_1080I50HZ",
    "RES_1080P60HZ",
    "RES_1080P50HZ",
    "RES_1080P30HZ",
    "RES_1080P25HZ",
    "RES_480I_2880",
    "RES_576I_2880",
    "RES_1080P24HZ",
    "RES_1080P23_976HZ",
    "RES_1080P29_97HZ",
    "RES_3D_1080P23HZ",
    "RES_3D_1080P24HZ",
    "RES_3D_720P60HZ",
    "RES_3D_720P50HZ",
    "RES_3D_720P30HZ",
    "RES_3D_720P25HZ",
    "RES_3D_576P50HZ",
    "RES_3D_480P60HZ",
    "RES_3D_1080I60HZ",
    "RES_3D_1080I50HZ",
    "RES_3D_1080I30HZ",
    "RES_3D_1080I25HZ",
    "RES_3D_576I25HZ",
    "RES_3D_480I30HZ",
    "RES_3D_576I50HZ",
    "RES_3D_480I60HZ",
    "RES_2D_480I60HZ",
    "RES_2D_576I50HZ",
    "RES_2D_640x480", // without HZ: part of the console interface
    "RES_PANEL_AUO_B089AW01",
    "RES_3D_720P60HZ_TB",
    "RES_3D_720P50HZ_TB",
    "RES_3D_1080I60HZ_SBS_HALF",
    "RES_3D_1080I50HZ_SBS_HALF",
    "RES_3D_1080P23HZ_TB",
    "RES_3D_1080P24HZ_TB",
    nullptr, // RES_4K2K23976HZ
    nullptr, // RES_4K2K24HZ
    nullptr, // RES_2160P
    nullptr, // RES_2160P_4096
};

/* Gamma: output levels at nine equally spaced inputs from 0 to 255 */

constexpr UCHAR aucGammaCurve[PMX_GAMMA_CURVE_NUM][PMX_GAMMA_POINT_NUM] = {
    { 0, 99, 136, 163, 186, 206, 224, 240, 255 },
    { 0, 121, 155, 180, 199, 216, 230, 243, 255 },
    { 0, 85, 125, 155, 180, 202, 221, 239, 255 },
    { 0, 100, 137, 164, 187, 206, 224, 240, 255 },
};

/* Tables of functions */

constexpr IPMX _rPMXIF = {
    .pi4SetMode = i4PmxSetMode,
    .pi4GetMode = i4PmxGetMode,
    .pi4GetOutSize = i4PmxGetOutSize,
    .pi4GetAspectRatio = i4PmxGetAspectRatio,
    .pi4DisableVideoPlane = i4PmxDisableVideoPlane,
    .pi4EnableVideoPlane = i4PmxEnableVideoPlane,
    .pi4OsdEnabled = i4PmxOsdEnabled,
    .pi4OsdDisabled = i4PmxOsdDisabled,
    .pi4VdpEnabled = i4PmxVdpEnabled,
    .pi4VdpDisabled = i4PmxVdpDisabled,
    .pi4VdpGetPlanePosition = i4PmxGetPlanePosition,
};

constexpr PM_OPERATIONS_T pmx_pm_ops = { .suspend = i4PMX_Suspend, .resume = i4PMX_Resume };
