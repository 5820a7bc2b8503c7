// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Formatted print and status report. Field engineers know the report line by line: labels, blanks and omissions are
 * kept as they are, the misleading ones too. */
#include "drv_pmx.h"
#include "pmx_if.h"
#include "u_os.h"

#define PRINT_BUFFER_SIZE 512

void PMX_Printf(INT32 level, const char* format_string, ...)
{
    if (level < 0 || level > 31 || (PMX_debug_level & (1u << level)) == 0)
    {
        PMX_NOTE(PRINT_LEVEL, level, PMX_debug_level);
        return;
    }

    CHAR szBuffer[PRINT_BUFFER_SIZE];
    va_list rArgs;
    va_start(rArgs, format_string);
    x_vsnprintf(szBuffer, sizeof szBuffer, format_string, rArgs);
    va_end(rArgs);

    // The text is the format once more: a caller writes %%%% for a percent sign, and what it prints would change if
    // this were mended.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-security"
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
    UTIL_Printf(szBuffer);
#pragma GCC diagnostic pop
}

/* What the report prints for each value; a value behind the end of its list has no line. */

static constexpr const CHAR* COLOUR_SPACE_NAMES[] = { "DRV_PMX_CS_YCBCR_601", "DRV_PMX_CS_YCBCR_709",
                                                      "DRV_PMX_CS_RGB" };

static constexpr const CHAR* COLOUR_MODE_NAMES[] = { "DRV_GFX_COLOR_MODE_YCBCR", "DRV_GFX_COLOR_MODE_RGB" };

/* DRV_RX_BYPASS_TX has no line. */
static constexpr const CHAR* EXT_CHIP_NAMES[] = { "DRV_NON_EXT_CHIP", "DRV_EXT_SCL_EXT_TX", "DRV_EXT_SCL_INT_TX" };

/* The report's list of modes is older than the modes: up to 38 it is szResStr, then RES_2D_640x480HZ is missing, and
 * after the panel come the two entries that ended the enumeration then. */
#define REPORT_RES_LATE RES_2D_640x480HZ
static constexpr const CHAR* RES_LATE_NAMES[] = { "RES_PANEL_AUO_B089AW01", "RES_MODE_NUM", "RES_AUTO" };

/* The lines of the digital port's set-up, from value to value with other blanks at their ends. */
#define CCIR_LINE(szField, szEnd) "[PMX]PMX(%d,) _arPmxConf[%d].arOutputConf[%d].eCcirDrvInfo." szField "(%s)" szEnd

typedef struct
{
    const CHAR* szName;
    const CHAR* szInput;  // the line that shows the value as the port's input
    const CHAR* szOutput; // and as its output
} CCIR_TEXT_T;

// clang-format off
static constexpr CCIR_TEXT_T CCIR_FORMAT_TEXTS[] = {
    { "CCIR_NON_USED",    CCIR_LINE("eDgiFmt", " \n "), CCIR_LINE("eDgoFmt", " \n ") },
    { "CCIR_YCMIX_8BIT",  CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgoFmt", "  \n") },
    { "CCIR_YCMIX_10BIT", CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgoFmt", "  \n") },
    { "CCIR_YCMIX_12BIT", CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgiFmt", "  \n") }, // labelled as the input twice
    { "CCIR_YC422_16BIT", CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgoFmt", "  \n") },
    { "CCIR_YC422_20BIT", CCIR_LINE("eDgiFmt", " \n"),  CCIR_LINE("eDgoFmt", "  \n") },
    { "CCIR_YC422_24BIT", CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgoFmt", " \n ") },
    { "CCIR_YC444_24BIT", CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgoFmt", " \n ") },
    { "CCIR_YC444_30BIT", CCIR_LINE("eDgiFmt", "  \n"), CCIR_LINE("eDgoFmt", "  \n") },
    { "CCIR_YC444_36BIT", CCIR_LINE("eDgiFmt", " \n "), CCIR_LINE("eDgoFmt", "  \n") },
};

static constexpr CCIR_TEXT_T CCIR_MODE_TEXTS[] = {
    { "CCIR_INVALID",  CCIR_LINE("eDgiMode", " \n "), CCIR_LINE("eDgoMode", " \n ") },
    { "CCIR_601_MODE", CCIR_LINE("eDgiMode", "  \n"), CCIR_LINE("eDgoMode", " \n ") },
    { "CCIR_656_MODE", CCIR_LINE("eDgiMode", "  \n"), CCIR_LINE("eDgoMode", "  \n") },
};
// clang-format on

/* The texts of a value; null for one behind the end of its list. */
static const CCIR_TEXT_T* prCcirText(const CCIR_TEXT_T* prTexts, UINT32 u4TextNum, UINT32 u4Value)
{
    return u4Value < u4TextNum ? &prTexts[u4Value] : nullptr;
}

static void vReportRecord(const PMX_CONF_T* prConf)
{
    PMX_IsLog(0, "Mode(%d) CS(%d)\n", prConf->ucMode, (INT32)prConf->eMasterColorSpace);
    // E shows the bus width, not the master enable, which the report leaves out.
    PMX_IsLog(0,
              "[PMX] PMX(%d) E(%d ), Mode(%d) TVTP(%d ), FQ(%d ), DitalOut(%d ), u4Phase(%d ), PMode(%d ), "
              "DBit(%d ),\n",
              0, prConf->ucDigitalBit, prConf->ucMode, prConf->ucTvType, prConf->ucVfreq, prConf->ucDigitalOut,
              prConf->u4Phase, prConf->ucProprietaryMode, prConf->ucDigitalBit);
    PMX_IsLog(0,
              "[PMX] PMX(%d)  DRGB(%d ), CAVBlackLv(%d ), CVBSBlackLv(%d ), G(%d) Bright(%d ), Contrast(%d ), "
              "Hue(%d ),Saturation(%d ),\n",
              0, prConf->ucDigitalRgb, prConf->ucCAVBlackLv, prConf->ucCVBSBlackLv, prConf->ucGamma,
              prConf->ucBrightness, prConf->ucContrast, prConf->ucHue, prConf->ucSaturation);
    PMX_IsLog(0, "[PMX] PMX(%d) CBE(%d ), MuteE(%d ), AS(%d ), BgC(%d ), Cap(%d ), Sharp(%d ), fgAspNext(%d ),\n", 0,
              prConf->ucCBEnable, prConf->ucMuteEnable, (INT32)prConf->u4AspectRatio, (INT32)prConf->u4BgColor,
              (INT32)prConf->u4Capability, prConf->ucSharpness, prConf->fgAspNext);
    PMX_IsLog(0,
              "[PMX] PMX(%d ),  AspN(%d ), fgSMCal(%d ), CAVIdel(%d ), CAVOdel(%d ), CvbsIdel(%d ), CvbsOdel(%d ), "
              "CavScL(%d ), CvbsScL(%d ), \n",
              0, (INT32)prConf->u4AspNext, prConf->fgSetModeCalled, prConf->ucCavYcInputDelay,
              prConf->ucCavYcOutputDelay, prConf->ucCvbsYcInputDelay, prConf->ucCvbsYcOutputDelay, prConf->ucCavSyncLvl,
              prConf->ucCvbsSyncLvl);
    PMX_IsLog(0,
              "[PMX] PMX(%d ), CvbsBurstLvl(%d ), CavYLvl(%d ), CvbsYLvl(%d ), fgDigestEnable(%d ), DigestAsp(%d ), "
              "fgForceMode(%d ), \n",
              0, prConf->ucCvbsBurstLvl, prConf->ucCavYLvl, prConf->ucCvbsYLvl, prConf->fgDigestEnable,
              (INT32)prConf->u4DigestAsp, prConf->fgForceMode);
    PMX_IsLog(0, "[PMX] PMX(%d ), u4PlaneOrder(0x%8x ), \n", 0, prConf->u4PlaneOrder);
    PMX_IsLog(0, "[PMX] PMX(%d ), fgOSD5(%d ), \n", 0, prConf->fgOSD5);
    for (INT32 i = 0; i < PMX_PLANE_NUM; i++)
        PMX_IsLog(0, "[PMX] PMX(%d ), plane %d's order is %d \n", 0, i, prConf->aucPlaneOrder[i]);
    if (prConf->eMasterColorSpace < COUNT_OF(COLOUR_SPACE_NAMES))
        PMX_IsLog(0, "[PMX] PMX(%d ), eMasterColorSpace(%s)\n", 0, COLOUR_SPACE_NAMES[prConf->eMasterColorSpace]);
}

static void vReportPort(INT32 i, const PMX_PORT_INFO_T* prPort)
{
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d], arPortInfo[%d]'s CompT(%d ), CompId(%d ),  Connected(%d ) \n", 0, 0,
              i, prPort->u2CompType, prPort->u2CompId, prPort->fgConnected);
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d], arPortInfo[%d]'s fgE(%d ), SrcW(%d ),u4SrcH(%d ), LumaK(%d,) \n", 0,
              0, i, prPort->fgEnabled, (INT32)prPort->u4SrcWidth, (INT32)prPort->u4SrcHeight, prPort->ucLumaKey);
    if (prPort->eInputColorMode < COUNT_OF(COLOUR_MODE_NAMES))
        PMX_IsLog(0, "[PMX] PMX(%d ),_arPmxConf[%d].arPortInfo[%d].eInputColorMode(%s)\n", 0, 0, i,
                  COLOUR_MODE_NAMES[prPort->eInputColorMode]);
    // Labelled as the master's, it is the source's colour space.
    if (prPort->eSrcColorSpace < COUNT_OF(COLOUR_SPACE_NAMES))
        PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arPortInfo[%d].eMasterColorSpace(%s)\n", 0, 0, i,
                  COLOUR_SPACE_NAMES[prPort->eSrcColorSpace]);
}

static const CHAR* szReportedRes(UINT32 u4ResMode)
{
    if (u4ResMode < REPORT_RES_LATE)
        return szResStr[u4ResMode];
    UINT32 u4Late = u4ResMode - REPORT_RES_LATE;
    return u4Late < COUNT_OF(RES_LATE_NAMES) ? RES_LATE_NAMES[u4Late] : nullptr;
}

static void vReportOutput(INT32 i, const PMX_RESOLUTION_T* prOutput)
{
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d].fgOutputEnable(%d)\n", 0, 0, i,
              prOutput->fgOutputEnable);
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d].u4VFreq(%d)\n", 0, 0, i, (INT32)prOutput->u4VFreq);
    const CHAR* szRes = szReportedRes(prOutput->eResMode);
    if (szRes != nullptr)
        PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d].eResMode(%s)\n", 0, 0, i, szRes);

    const CCIR_DRV_INFO_T* prCcir = &prOutput->eCcirDrvInfo;
    const CCIR_TEXT_T* prText = prCcirText(CCIR_FORMAT_TEXTS, COUNT_OF(CCIR_FORMAT_TEXTS), prCcir->eDgiFmt);
    if (prText != nullptr)
        PMX_IS_LOG_TEXT(0, prText->szInput, 0, 0, i, prText->szName);
    prText = prCcirText(CCIR_MODE_TEXTS, COUNT_OF(CCIR_MODE_TEXTS), prCcir->eDgiMode);
    if (prText != nullptr)
        PMX_IS_LOG_TEXT(0, prText->szInput, 0, 0, i, prText->szName);
    prText = prCcirText(CCIR_FORMAT_TEXTS, COUNT_OF(CCIR_FORMAT_TEXTS), prCcir->eDgoFmt);
    if (prText != nullptr)
        PMX_IS_LOG_TEXT(0, prText->szOutput, 0, 0, i, prText->szName);
    prText = prCcirText(CCIR_MODE_TEXTS, COUNT_OF(CCIR_MODE_TEXTS), prCcir->eDgoMode);
    if (prText != nullptr)
        PMX_IS_LOG_TEXT(0, prText->szOutput, 0, 0, i, prText->szName);
}

void PMX_QueryStatus(void)
{
    const PMX_CONF_T* prConf = prPmxConf();

    vReportRecord(prConf);
    for (INT32 i = 0; i < PMX_PORT_NUM; i++)
        vReportPort(i, &prConf->arPortInfo[i]);
    if (prConf->rDrvExtScl < COUNT_OF(EXT_CHIP_NAMES))
        PMX_IsLog(0, "[PMX] PMX(%d) _arPmxConf.rDrvExtSc(%s) \n", 0, EXT_CHIP_NAMES[prConf->rDrvExtScl]);
    for (UINT32 i = PMX_OUTPUT_CCIR; i < PMX_OUTPUT_NUM; i++)
        vReportOutput((INT32)i, &prConf->arOutputConf[i]);
}
