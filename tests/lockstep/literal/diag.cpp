// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Formatted print and status report. */
#include "tests/lockstep/literal/literal.h"

#pragma GCC diagnostic ignored "-Wformat-security"
#pragma GCC diagnostic ignored "-Wformat-nonliteral"

void PMX_Printf(INT32 level, const char* format_string, ...)
{
    if (level < 0 || level > 31)
        return;
    if ((PMX_debug_level & (1u << level)) == 0)
        return;
    CHAR buffer[512];
    va_list arguments;
    va_start(arguments, format_string);
    x_vsnprintf(buffer, 512, format_string, arguments);
    va_end(arguments);
    UTIL_Printf(buffer);
}

static const CHAR* space_name(UINT32 space)
{
    return space == 0   ? "DRV_PMX_CS_YCBCR_601"
           : space == 1 ? "DRV_PMX_CS_YCBCR_709"
           : space == 2 ? "DRV_PMX_CS_RGB"
                        : nullptr;
}

static void report_port(int i)
{
    PMX_PORT_INFO_T& port = conf.arPortInfo[i];
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d], arPortInfo[%d]'s CompT(%d ), CompId(%d ),  Connected(%d ) \n", 0, 0,
              i, port.u2CompType, port.u2CompId, port.fgConnected);
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d], arPortInfo[%d]'s fgE(%d ), SrcW(%d ),u4SrcH(%d ), LumaK(%d,) \n", 0,
              0, i, port.fgEnabled, static_cast<int>(port.u4SrcWidth), static_cast<int>(port.u4SrcHeight),
              port.ucLumaKey);
    const UINT32 mode = port.eInputColorMode;
    if (mode == 0)
        PMX_IsLog(0, "[PMX] PMX(%d ),_arPmxConf[%d].arPortInfo[%d].eInputColorMode(%s)\n", 0, 0, i,
                  "DRV_GFX_COLOR_MODE_YCBCR");
    if (mode == 1)
        PMX_IsLog(0, "[PMX] PMX(%d ),_arPmxConf[%d].arPortInfo[%d].eInputColorMode(%s)\n", 0, 0, i,
                  "DRV_GFX_COLOR_MODE_RGB");
    const UINT32 space = port.eSrcColorSpace;
    if (space_name(space) != nullptr)
        PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arPortInfo[%d].eMasterColorSpace(%s)\n", 0, 0, i,
                  space_name(space));
}

/* The lines of the digital port, with the blanks that go with each value. */

#define LINE(field, end) "[PMX]PMX(%d,) _arPmxConf[%d].arOutputConf[%d].eCcirDrvInfo." field "(%s)" end
static const CHAR* const F1 = LINE("eDgiFmt", " \n ");
static const CHAR* const F2 = LINE("eDgiFmt", "  \n");
static const CHAR* const F3 = LINE("eDgiFmt", " \n");
static const CHAR* const G1 = LINE("eDgoFmt", " \n ");
static const CHAR* const G2 = LINE("eDgoFmt", "  \n");
static const CHAR* const M1 = LINE("eDgiMode", " \n ");
static const CHAR* const M2 = LINE("eDgiMode", "  \n");
static const CHAR* const N1 = LINE("eDgoMode", " \n ");
static const CHAR* const N2 = LINE("eDgoMode", "  \n");

static void report_input_format(int i, UINT32 value)
{
    switch (value)
    {
    case 0: PMX_IsLog(0, F1, 0, 0, i, "CCIR_NON_USED"); break;
    case 1: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YCMIX_8BIT"); break;
    case 2: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YCMIX_10BIT"); break;
    case 3: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YCMIX_12BIT"); break;
    case 4: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YC422_16BIT"); break;
    case 5: PMX_IsLog(0, F3, 0, 0, i, "CCIR_YC422_20BIT"); break;
    case 6: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YC422_24BIT"); break;
    case 7: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YC444_24BIT"); break;
    case 8: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YC444_30BIT"); break;
    case 9: PMX_IsLog(0, F1, 0, 0, i, "CCIR_YC444_36BIT"); break;
    default: break;
    }
}

static void report_output_format(int i, UINT32 value)
{
    switch (value)
    {
    case 0: PMX_IsLog(0, G1, 0, 0, i, "CCIR_NON_USED"); break;
    case 1: PMX_IsLog(0, G2, 0, 0, i, "CCIR_YCMIX_8BIT"); break;
    case 2: PMX_IsLog(0, G2, 0, 0, i, "CCIR_YCMIX_10BIT"); break;
    case 3: PMX_IsLog(0, F2, 0, 0, i, "CCIR_YCMIX_12BIT"); break; // labelled as the input's
    case 4: PMX_IsLog(0, G2, 0, 0, i, "CCIR_YC422_16BIT"); break;
    case 5: PMX_IsLog(0, G2, 0, 0, i, "CCIR_YC422_20BIT"); break;
    case 6: PMX_IsLog(0, G1, 0, 0, i, "CCIR_YC422_24BIT"); break;
    case 7: PMX_IsLog(0, G1, 0, 0, i, "CCIR_YC444_24BIT"); break;
    case 8: PMX_IsLog(0, G2, 0, 0, i, "CCIR_YC444_30BIT"); break;
    case 9: PMX_IsLog(0, G2, 0, 0, i, "CCIR_YC444_36BIT"); break;
    default: break;
    }
}

static void report_input_mode(int i, UINT32 value)
{
    switch (value)
    {
    case 0: PMX_IsLog(0, M1, 0, 0, i, "CCIR_INVALID"); break;
    case 1: PMX_IsLog(0, M2, 0, 0, i, "CCIR_601_MODE"); break;
    case 2: PMX_IsLog(0, M2, 0, 0, i, "CCIR_656_MODE"); break;
    default: break;
    }
}

static void report_output_mode(int i, UINT32 value)
{
    switch (value)
    {
    case 0: PMX_IsLog(0, N1, 0, 0, i, "CCIR_INVALID"); break;
    case 1: PMX_IsLog(0, N1, 0, 0, i, "CCIR_601_MODE"); break;
    case 2: PMX_IsLog(0, N2, 0, 0, i, "CCIR_656_MODE"); break;
    default: break;
    }
}

static void report_output(int i)
{
    PMX_RESOLUTION_T& output = conf.arOutputConf[i];
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d].fgOutputEnable(%d)\n", 0, 0, i,
              output.fgOutputEnable);
    PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d].u4VFreq(%d)\n", 0, 0, i,
              static_cast<int>(output.u4VFreq));
    // The report's own list is one entry behind from 39 on, and stops at 41.
    const UINT32 mode = output.eResMode;
    const CHAR* const name = mode <= 38   ? name_of(mode)
                             : mode == 39 ? "RES_PANEL_AUO_B089AW01"
                             : mode == 40 ? "RES_MODE_NUM"
                             : mode == 41 ? "RES_AUTO"
                                          : nullptr;
    if (name != nullptr)
        PMX_IsLog(0, "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d].eResMode(%s)\n", 0, 0, i, name);
    report_input_format(i, output.eCcirDrvInfo.eDgiFmt);
    report_input_mode(i, output.eCcirDrvInfo.eDgiMode);
    report_output_format(i, output.eCcirDrvInfo.eDgoFmt);
    report_output_mode(i, output.eCcirDrvInfo.eDgoMode);
}

static void report_single_fields()
{
    PMX_IsLog(0, "Mode(%d) CS(%d)\n", conf.ucMode, static_cast<int>(conf.eMasterColorSpace));
    PMX_IsLog(0,
              "[PMX] PMX(%d) E(%d ), Mode(%d) TVTP(%d ), FQ(%d ), DitalOut(%d ), u4Phase(%d ), PMode(%d ), DBit(%d "
              "),\n",
              0, conf.ucDigitalBit, conf.ucMode, conf.ucTvType, conf.ucVfreq, conf.ucDigitalOut, conf.u4Phase,
              conf.ucProprietaryMode, conf.ucDigitalBit);
    PMX_IsLog(0,
              "[PMX] PMX(%d)  DRGB(%d ), CAVBlackLv(%d ), CVBSBlackLv(%d ), G(%d) Bright(%d ), Contrast(%d ), Hue(%d "
              "),Saturation(%d ),\n",
              0, conf.ucDigitalRgb, conf.ucCAVBlackLv, conf.ucCVBSBlackLv, conf.ucGamma, conf.ucBrightness,
              conf.ucContrast, conf.ucHue, conf.ucSaturation);
    PMX_IsLog(0, "[PMX] PMX(%d) CBE(%d ), MuteE(%d ), AS(%d ), BgC(%d ), Cap(%d ), Sharp(%d ), fgAspNext(%d ),\n", 0,
              conf.ucCBEnable, conf.ucMuteEnable, static_cast<int>(conf.u4AspectRatio),
              static_cast<int>(conf.u4BgColor), static_cast<int>(conf.u4Capability), conf.ucSharpness, conf.fgAspNext);
    PMX_IsLog(0,
              "[PMX] PMX(%d ),  AspN(%d ), fgSMCal(%d ), CAVIdel(%d ), CAVOdel(%d ), CvbsIdel(%d ), CvbsOdel(%d ), "
              "CavScL(%d ), CvbsScL(%d ), \n",
              0, static_cast<int>(conf.u4AspNext), conf.fgSetModeCalled, conf.ucCavYcInputDelay,
              conf.ucCavYcOutputDelay, conf.ucCvbsYcInputDelay, conf.ucCvbsYcOutputDelay, conf.ucCavSyncLvl,
              conf.ucCvbsSyncLvl);
    PMX_IsLog(0,
              "[PMX] PMX(%d ), CvbsBurstLvl(%d ), CavYLvl(%d ), CvbsYLvl(%d ), fgDigestEnable(%d ), DigestAsp(%d ), "
              "fgForceMode(%d ), \n",
              0, conf.ucCvbsBurstLvl, conf.ucCavYLvl, conf.ucCvbsYLvl, conf.fgDigestEnable,
              static_cast<int>(conf.u4DigestAsp), conf.fgForceMode);
    PMX_IsLog(0, "[PMX] PMX(%d ), u4PlaneOrder(0x%8x ), \n", 0, conf.u4PlaneOrder);
    PMX_IsLog(0, "[PMX] PMX(%d ), fgOSD5(%d ), \n", 0, conf.fgOSD5);
}

void PMX_QueryStatus(void)
{
    report_single_fields();
    for (int i = 0; i < 8; ++i)
        PMX_IsLog(0, "[PMX] PMX(%d ), plane %d's order is %d \n", 0, i, conf.aucPlaneOrder[i]);
    const UINT32 space = conf.eMasterColorSpace;
    if (space_name(space) != nullptr)
        PMX_IsLog(0, "[PMX] PMX(%d ), eMasterColorSpace(%s)\n", 0, space_name(space));
    for (int i = 0; i < 8; ++i)
        report_port(i);
    const UINT32 usage = conf.rDrvExtScl;
    if (usage == 0)
        PMX_IsLog(0, "[PMX] PMX(%d) _arPmxConf.rDrvExtSc(%s) \n", 0, "DRV_NON_EXT_CHIP");
    if (usage == 1)
        PMX_IsLog(0, "[PMX] PMX(%d) _arPmxConf.rDrvExtSc(%s) \n", 0, "DRV_EXT_SCL_EXT_TX");
    if (usage == 2)
        PMX_IsLog(0, "[PMX] PMX(%d) _arPmxConf.rDrvExtSc(%s) \n", 0, "DRV_EXT_SCL_INT_TX");
    for (int i = 0; i < 4; ++i)
        report_output(i);
}
