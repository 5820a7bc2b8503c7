// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>

#include "tools/pmxboard/decode/texts.h"

namespace pmxboard::decode
{
namespace
{

using namespace rules;

constexpr bool problem = true;
constexpr int print = level_plain;

// Who comes to a text of another operation.
#define FROM_START "PMX_Reset,PMX_Init"
#define FROM_MODE_EX "PMX_SetModeEx"
#define FROM_SOURCES "PMX_VdpEnabled,PMX_OsdEnabled,PMX_OsdDisabled"
#define DECIDE "PMX_DecideMasterColorSpace,PMX_VdpEnabled,PMX_OsdDisabled"
#define INFORM "PMX_InformVdpColorSpace,PMX_DecideMasterColorSpace," FROM_SOURCES
#define COLOUR "PMX_ColorSpaceSetup,PMX_SetModeEx,PMX_SetMode,i4PmxSetMode,PMX_DecideMasterColorSpace," FROM_SOURCES
#define REGISTER "i4PmxRegisterIM,i4PmxUnregisterIM,PMX_Init,PMX_Uninit,i4PMX_Uninit"
#define FLAG "PMX_SetFormatChangeFlag,PMX_SetModeEx,_PMX_TmrIsr"
#define OSD_FLAG "PMX_SetOsdEnableFlag,PMX_SetFormatChangeFlag,PMX_SetOsdEnable,PMX_SetModeEx,_PMX_TmrIsr"
#define OSD_BACK "PMX_SetOsdEnable,PMX_SetFormatChangeFlag,PMX_SetModeEx,_PMX_TmrIsr"
#define PORTS "i4Pmx_Connect,i4Pmx_Disconnect"
#define LOCKED PORTS ",PMX_InformVdpColorSpace,PMX_DecideMasterColorSpace," FROM_SOURCES
#define SET_MODE "PMX_SetMode,i4PmxSetMode"
#define ARB "PMX_SetArbPlaneOrder"
#define CCIR_INFO "[PMX]PMX(%d,) _arPmxConf[%d].arOutputConf[%d].eCcirDrvInfo."
#define OUTPUT_CONF "[PMX] PMX(%d ), _arPmxConf[%d].arOutputConf[%d]."

constexpr Text refused(std::string_view format, std::string_view operations)
{
    constexpr std::string_view values = "bSetTVE,ucValue";
    return { 8, format, values, operations, "the capability word refuses", "", goes_on, problem };
}

constexpr Text swap(std::string_view format, std::string_view tale)
{
    return { 8, format, "", "PMX_SetSwapEnable", "swapped, or swapped back", tale, opens };
}

constexpr Text report(std::string_view format, std::string_view values, std::string_view step)
{
    return { 0, format, values, "PMX_QueryStatus", step, "", rules::report };
}

constexpr Text assertion(std::string_view expression, std::string_view file, std::string_view operations,
                         std::string_view step, std::string_view tale)
{
    return { level_assertion, expression, "file,line", operations, step, tale, rules::assertion, problem, file };
}

#define SOURCE_FILE(name, operations)                                                             \
    {                                                                                             \
        level_file, "src/driver/pmx/" name, "file,line", operations, "an assertion of this file", \
            "an assertion of " name, rules::assertion, problem, name                              \
    }

// clang-format off
constexpr Text rows[] = {
    // Start-up, shut-down
    { 1, "PMX_Init\n", "", "PMX_Init", "start-up begins, or the layer has been started already", "start-up", opens },
    { print, "TESTPMX: Get pard ID:%d.\n", "i4_id", "PMX_GetHDMIDefaultRes," FROM_START,
      "the boot partition is looked up", "boot mode looked up in partition {i4_id}", heads },
    { print, "TESTPMX: Get Test Data :%d, 0x%8x.\n", "ucMode,u4TestData", "PMX_GetHDMIDefaultRes," FROM_START,
      "what the boot loader left there", "the boot loader left {ucMode}" },
    { print, "[PMX]_arPmxConf[ucPmxId].ucMode=%d\n", "ucMode", FROM_START,
      "the boot loader's mode, before it is judged", "the reset starts from {ucMode}" },
    { 0, "[PMX] create a timer \n", "", "PMX_Init", "the display timer exists", "display timer created", starts },
    { 1, "PMX_Uninit\n", "", "PMX_Uninit", "shut-down begins", "shut-down", opens },
    { 1, "i4PMX_Uninit u4Case %d\n", "u4Case", "i4PMX_Uninit", "shut-down with a result begins",
      "shut-down, case {u4Case}", opens },
    { 1, "i4PMX_Uninit return %d\n", "i4Ret", "i4PMX_Uninit", "its result", "result {i4Ret}" },
    { 1, "PMX_Stop\n", "", "PMX_Stop", "light stop", "stopped: mutex, timer and registrations stay", opens },
    { 9, "Fail to register IID_IPMX of PMX Comp %d\n", "u2CompId", REGISTER,
      "the interface manager refused; the text is the same for withdrawing",
      "the interface table of component {u2CompId} was neither registered nor withdrawn", goes_on, problem },
    // Modes
    { 9, "SetMode, %s\n", "eResMode", SET_MODE, "the request", "one mode on all outputs: {eResMode}", opens },
    { 0, "SetModeEx\n", "", FROM_MODE_EX, "the request begins", "", mode_ex },
    { 9, "CCIR(%d, %s)\n", "fgOutputEnable,eResMode", FROM_MODE_EX, "the request's digital port", "digital port",
      output },
    { 9, "HDMI(%d, %s)\n", "fgOutputEnable,eResMode", FROM_MODE_EX, "the request's HDMI output", "HDMI", output },
    { 9, "CAV (%d, %s)\n", "fgOutputEnable,eResMode", FROM_MODE_EX, "the request's component output", "component",
      output },
    { 9, "CVBS(%d, %s)\n", "fgOutputEnable,eResMode", FROM_MODE_EX, "the request's composite output", "composite",
      output },
    { 9, "CCIR(%d, %d, %d, %d)\n", "eDgoMode,eDgoFmt,eDgiMode,eDgiFmt", FROM_MODE_EX,
      "the request's set-up of the digital port",
      "digital port set to {eDgoMode} {eDgoFmt}, its input to {eDgiMode} {eDgiFmt}", digital_port },
    { 9, "OSD5(%d)\n", "fgOSD5", FROM_MODE_EX, "the request's fifth OSD plane", "", fifth_osd },
    { 0, "[PMX] Warning: Disable All output, set fmt as %d.\n", "ucMode", FROM_MODE_EX,
      "no output is on: HDMI's mode becomes the mixer's format", "", goes_on, problem },
    { 0, "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n", "", FROM_MODE_EX,
      "the capability word refuses the format: nothing is set, and nobody is waited for",
      "refused by the capability word; nothing was set, and the display part's flag is lowered, not set", no_wait,
      problem },
    { 9, "HD Exist(%d)\n", "fgHDExist", FROM_MODE_EX, "whether the mixer's format is an HD format of the TV encoders",
      "" },
    { 1, "PMX Start to set OSD Display mode:%d.\n", "ucMode", FROM_MODE_EX,
      "the format really changes: the OSD driver is told", "" },
    { 1, "PMX Finished to set OSD Display mode.\n", "", FROM_MODE_EX, "the OSD driver has it", "" },
    { 9, "Adjust PMX_ColorSpaceSetup call sequence.\n", "", FROM_MODE_EX,
      "mixer and scaler have the mode, colours follow", "" },
    { 0, "[PMX] fgHdmiExist:%d, Not wait display part...\n", "fgHdmiExist", FROM_MODE_EX, "nobody to wait for",
      "no wait for the display part: HDMI was sent no new resolution", no_wait },
    { 0, "[PMX] VDP_SetClearVideo & Not Mix OSD..\n", "", FROM_MODE_EX,
      "the display part's flag is up: graphics leave the mix", "", held_back },
    // Handshake
    { 0, "Display Format Change :%d.\n", "fgPmxFormatChangeFlag", FLAG, "the display part's flag is set to this", "",
      flag },
    { 0, "Set Osd Enable :%d.\n", "fgPmxEnabeOsdFlag", OSD_FLAG, "graphics wait for their return, or no longer", "",
      osd_flag },
    { 0, "PMX_SetOsdEnable.\n", "", OSD_BACK, "graphics return to the mix if they wait for it", "", osd_back },
    { 0, "PMX timeout.\n", "", "_PMX_TmrIsr", "the display timer has run out", "", timed_out, problem },
    { 0, "Display Format Change Timer Set.\n", "", "PMX_SetFormatChangeTimer,PMX_SetModeEx", "the display timer starts",
      "the display timer is set", timer_set },
    { 9, "[PMX] fgPMX_DisplayModeReady is %d.\n", "fgPmxFormatChangeFlag", "fgPMX_DisplayModeReady,PMX_SetModeEx",
      "the flag, whose opposite is the answer: 1 is not ready", "", ready },
    // Colour conversions
    { 9, "Mode(%d), eMixerOutCS(%d)\n", "ucMode,eColorSpace", COLOUR, "colour conversions are set up for this output",
      "colours for {ucMode} from {eColorSpace}", heads },
    { 9, "CC_A disable\n", "", COLOUR, "the mixer's converter", "converter A off" },
    { 9, "CC_A enable, 709->601\n", "", COLOUR, "the mixer's converter", "converter A BT.709 to BT.601" },
    { 9, "CC_A enable, 601->709\n", "", COLOUR, "the mixer's converter", "converter A BT.601 to BT.709" },
    { 8, "Scaler CC disable, don't care\n", "", COLOUR, "the scaler's converter", "scaler's converter off (not used)" },
    { 8, "Scaler CC disable\n", "", COLOUR, "the scaler's converter", "scaler's converter off" },
    { 8, "Scaler CC enable, 709->601\n", "", COLOUR, "the scaler's converter", "scaler's converter BT.709 to BT.601" },
    { 5, "Invalid Color Space Id\n", "", COLOUR, "the mixer is never set up for this colour space",
      "", goes_on, problem },
    // Ports and sources
    { 8, "COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d\n", "u2CompType,u2CompId", "u4PmxCompId2LocalId," PORTS,
      "no port for this type of component", "", goes_on, problem },
    { 8, "Tp,Id=%d,%d\n", "u2CompType,u2CompId", PORTS, "which component", "source {u2CompType} {u2CompId}", opens },
    { 8, "Comp(%d) connect\n", "port", "i4Pmx_Connect", "its port; 8 is none", "connects to {port}" },
    { 8, "Comp(%d) disconnect\n", "port", "i4Pmx_Disconnect", "its port; 8 is none", "leaves {port}" },
    { 8, "VDP_%d Enabled\n", "ucVdpId", "PMX_VdpEnabled", "a video plane delivers pictures",
      "video plane {ucVdpId} starts", opens },
    { 8, "Turn on OSD full range conversion\n", "", "PMX_VdpEnabled", "the background wants graphics in full range",
      "full-range conversion of graphics on" },
    { 8, "Turn off OSD full range conversion since SUB video enable. \n", "", "PMX_VdpEnabled",
      "the second video does not", "full-range conversion of graphics off" },
    { 8, "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\n", "ucVdpId", "PMX_VdpEnabled", "what the size means",
      "its pictures are BT.709" },
    { 8, "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\n", "ucVdpId", "PMX_VdpEnabled", "what the size means",
      "its pictures are BT.601" },
    { 8, "VDP_%d's (JPG(BACKGROUND) is force to 601.\n", "ucVdpId", "PMX_VdpEnabled",
      "still pictures are BT.601 at any size", "taken as BT.601, as still pictures are" },
    { 8, "VDP_%d Disabled\n", "ucVdpId", "PMX_VdpDisabled", "a video plane has stopped", "video plane {ucVdpId} stops",
      opens },
    { 8, "Turn off OSD full range conversion\n", "", "PMX_VdpDisabled", "the background has gone",
      "full-range conversion of graphics off" },
    { 8, "OSD_%d Enabled\n", "ucOsdId", "PMX_OsdEnabled", "an OSD plane delivers pictures",
      "OSD plane {ucOsdId} starts", opens },
    { 8, "OSD_%d's Src Color Space = DRV_PMX_CS_RGB\n", "ucOsdId", "PMX_OsdEnabled", "its colour space",
      "its pictures are RGB" },
    { 8, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\n", "ucOsdId", "PMX_OsdEnabled",
      "its colour space, which becomes the master's", "its pictures are BT.709" },
    { 8, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\n", "ucOsdId", "PMX_OsdEnabled",
      "its colour space, which becomes the master's", "its pictures are BT.601" },
    { 8, "OSD_%d Disabled\n", "ucOsdId", "PMX_OsdDisabled", "an OSD plane has stopped", "OSD plane {ucOsdId} stops",
      opens },
    { 8, "[PMX] VDP_COMP_1 enabled and Color Space is %d.\n", "eColorSpace", DECIDE,
      "a candidate for the master colour space", "" },
    { 8, "[PMX] VDP_COMP_2 enabled and Color Space is %d.\n", "eColorSpace", DECIDE, "a candidate that overrules", "" },
    { 8, "[PMX] Gfx enabled and Color Space is %d.\n", "eColorSpace", DECIDE, "a candidate that overrules", "" },
    { 8, "[PMX] Master Color Space change from %d to %d.\n", "eColorSpace,eNewColorSpace", DECIDE, "the decision", "" },
    { 8, "Inform Vdp CS(%d)\n", "eColorSpace", INFORM, "a connected video plane is told",
      "a video plane is to be told {eColorSpace}" },
    { 5, "Query VDP Interface Fail!\n", "", INFORM, "its interface table was not found",
      "that video plane was passed over", goes_on, problem },
    // Plane order, swaps, colour bar, mute
    { print, "[PMX%d] Set PlaneOrder = [0x%8x]\n", "ucPmxId,u4PlaneOrder", ARB, "the order asked for",
      "plane order 0x{u4PlaneOrder} asked for", opens },
    { print, "[PMX]offset[%d]=%d\n", "i,i4Nominal", ARB, "a plane's nominal offset", "" },
    { print, "[PMX]u1PlnSel[%d]=%d\n", "i,u1PlnSel", ARB, "a plane's source", "" },
    { 9, "Plane[%d] and Plane[%d] connect to the same input source!\n", "i,j", ARB, "the order is refused",
      "refused", goes_on, problem },
    { 8, "Set Video Plane dealy: %d,%d.\n", "i4Delay0,i4Delay1", ARB, "delays that the hardware reports",
      "video planes' delays {i4Delay0}, {i4Delay1}" },
    { 8, "Set OSD Plane delay: %d,%d,%d,%d,%d.\n", "i4Delay2,i4Delay3,i4Delay4,i4Delay5,i4Delay6", ARB,
      "delays that the hardware reports",
      "OSD planes' delays {i4Delay2}, {i4Delay3}, {i4Delay4}, {i4Delay5}, {i4Delay6}" },
    { 0, "Plane %d ofst is %ld, delay is %ld\n", "i,i4Nominal,i4Delay", ARB, "a plane's compensation", "" },
    { 9, "[PMX%d] Start to Get PlaneOrder.\n", "ucPmxId", "PMX_GetArbPlaneOrder", "the order is read",
      "plane order read", opens },
    { 8, "Warning: PlaneOrder HW = [0x%8x], but SW = [0x%8x].\n", "u4Hardware,u4PlaneOrder", "PMX_GetArbPlaneOrder",
      "hardware and record differ", "the hardware has 0x{u4Hardware}, the record 0x{u4PlaneOrder}", goes_on, problem },
    { 9, "Get PlaneOrder = 0x[%8x],[%d][%d][%d][%d][%d][%d][%d][%d].\n",
      "u4Hardware,u1PlnSel0,u1PlnSel1,u1PlnSel2,u1PlnSel3,u1PlnSel4,u1PlnSel5,u1PlnSel6,u1PlnSel7",
      "PMX_GetArbPlaneOrder", "the hardware's order", "the hardware has 0x{u4Hardware}" },
    { 5, "Invalid VDP Id\n", "", "PMX_VdpGetPlanePosition,i4PmxGetPlanePosition", "neither of the two video planes",
      "", goes_on, problem },
    swap("Plane 1_2 Swap\n", "planes 1 and 2 swapped, or swapped back"),
    swap("Plane 3_4 Swap\n", "planes 3 and 4 swapped, or swapped back"),
    swap("Plane 6_7 Swap\n", "planes 6 and 7 swapped, or swapped back"),
    swap("Plane 4_7 Swap\n", "planes 4 and 7 swapped, or swapped back"),
    swap("Plane 1_3 Swap\n", "planes 1 and 3 swapped, or swapped back"),
    swap("Plane 5_8 Swap\n", "planes 5 and 8 swapped, or swapped back"),
    { 8, "ColorBar Enable\n", "", "PMX_SetCBEnable", "the bar appears", "colour bar on", opens },
    { 8, "Temporarily Turn Off Plane Swap 1_2\n", "", "PMX_SetCBEnable", "the bar is drawn for unswapped planes",
      "planes 1 and 2 swapped back while it is shown" },
    { 8, "ColorBar Disable\n", "", "PMX_SetCBEnable", "the bar goes", "colour bar off", opens },
    { 8, "Resume Plane Swap 1_2\n", "", "PMX_SetCBEnable", "as before the bar", "planes 1 and 2 swapped again" },
    { 8, "Mute Enable\n", "", "PMX_SetMuteEnable", "the picture goes", "mute on", opens },
    { 8, "Mute Disable ColorBar\n", "", "PMX_SetMuteEnable", "the bar goes with it", "colour bar hidden" },
    { 8, "Mute Disable\n", "", "PMX_SetMuteEnable", "the picture comes back", "mute off", opens },
    { 8, "Mute Enable ColorBar\n", "", "PMX_SetMuteEnable", "the bar comes back first", "colour bar shown again" },
    // Picture
    { 8, "[PMX] Seting Brightness: %d,%d.\n", "bSetTVE,ucValue", "PMX_SetBrightness,d_PMX_SetBrightness",
      "target and value", "brightness {ucValue} for {bSetTVE}", opens },
    refused("[PMX] Seting Brightness fail: %d,%d.\n", "PMX_SetBrightness,d_PMX_SetBrightness"),
    { 8, "[PMX] Seting Contrast: %d,%d.\n", "bSetTVE,ucValue", "PMX_SetContrast,d_PMX_SetContrast", "target and value",
      "contrast {ucValue} for {bSetTVE}", opens },
    refused("[PMX] Seting Contrast fail: %d,%d.\n", "PMX_SetContrast,d_PMX_SetContrast"),
    { 8, "[PMX] Seting Hue: %d,%d.\n", "bSetTVE,ucValue", "PMX_SetHue,d_PMX_SetHue", "target and value",
      "hue {ucValue} for {bSetTVE}", opens },
    refused("[PMX] Seting Hue fail: %d,%d.\n", "PMX_SetHue,d_PMX_SetHue"),
    { 8, "[PMX] Seting Saturation: %d,%d.\n", "bSetTVE,ucValue", "PMX_SetSaturation,d_PMX_SetSaturation",
      "target and value", "saturation {ucValue} for {bSetTVE}", opens },
    refused("[PMX] Seting Saturation fail: %d,%d.\n", "PMX_SetSaturation,d_PMX_SetSaturation"),
    { 8, "[PMX] Seting Sharpness: %d,%d.\n", "bSetTVE,ucValue", "PMX_SetSharpness,d_PMX_SetSharpness",
      "target and value", "sharpness {ucValue} for {bSetTVE}", opens },
    refused("[PMX] Seting Sharpness fail: %d,%d.\n", "PMX_SetSharpness,d_PMX_SetSharpness"),
    { 8, "TVE Set Black Lv, CAV(%d), CVBS(%d)\n", "ucCAVEn,ucCVBSEn", "PMX_SetBlackLv", "set",
      "black level: component {ucCAVEn}, composite {ucCVBSEn}", opens },
    { 8, "TVE Get Black Lv, CAV(%d), CVBS(%d)\n", "ucCAVEn,ucCVBSEn", "PMX_GetBlackLv", "read",
      "black level read: component {ucCAVEn}, composite {ucCVBSEn}", opens },
    { 8, "SetCVBSSetup = %d \n", "fgEnable", "PMX_SetCVBSSetup", "set", "composite set-up level {fgEnable}", opens },
    { 8, "TVE_CVBSPal60_En = %d \n", "fgEnable", "PMX_SetCVBSPal60", "set", "PAL 60 on composite {fgEnable}", opens },
    // Aspect ratio
    { 9, "PMX_ID(%d), Aspect Ratio(%d)\n", "ucPmxId,u4AspectRatio", "PMX_SetAspectRatio", "asked for",
      "aspect ratio {u4AspectRatio}", opens },
    { 9, "VDP_GlobalOutputChange\n", "", "PMX_SetAspectRatio", "HDMI took it, the video planes are told",
      "taken by HDMI" },
    { 9, "[EX] PMX_ID(%d), Aspect Ratio(%d), Apply On Next(%d)\n", "ucPmxId,u4AspectRatio,fgApplyOnNext",
      "PMX_SetAspectRatioEx", "asked for, now or at the next mode change",
      "aspect ratio {u4AspectRatio} {fgApplyOnNext}", opens },
    { 9, "[EX] VDP_GlobalOutputChange\n", "", "PMX_SetAspectRatioEx", "HDMI took it, the video planes are told",
      "taken by HDMI" },
    { 0, "[EX] PMX_ID(%d), Digest Aspect Ratio(%d), Digest mode enable(%d)\n", "ucPmxId,u4AspectRatio,fgDigestEnable",
      "PMX_SetDigestAspectRatioEx", "digest view entered or left",
      "digest view {fgDigestEnable}, ratio {u4AspectRatio}", opens },
    { 0, "[EX] TveAsp = %d Hdmi(par = %d,afd = %d)\n", "TveAsp,Hdmi_par,Hdmi_afd", "PMX_SetDigestAspectRatioEx",
      "signalled on the analogue outputs; HDMI's values are shown, not sent",
      "signalled on the analogue outputs alone" },
    // Status report
    report("Mode(%d) CS(%d)\n", "ucMode,eColorSpace", "the report begins"),
    report("[PMX] PMX(%d) E(%d ), Mode(%d) TVTP(%d ), FQ(%d ), DitalOut(%d ), u4Phase(%d ), PMode(%d ), DBit(%d ),\n",
      "ucPmxId,E,ucMode,ucTvType,ucVfreq,ucDigitalOut,u4Phase,ucProprietaryMode,ucDigitalBit",
      "mode and digital port; E is the bus width"),
    report("[PMX] PMX(%d)  DRGB(%d ), CAVBlackLv(%d ), CVBSBlackLv(%d ), G(%d) Bright(%d ), Contrast(%d ), "
      "Hue(%d ),Saturation(%d ),\n",
      "ucPmxId,ucDigitalRgb,ucCAVBlackLv,ucCVBSBlackLv,ucGamma,ucBrightness,ucContrast,ucHue,ucSaturation", "picture"),
    report("[PMX] PMX(%d) CBE(%d ), MuteE(%d ), AS(%d ), BgC(%d ), Cap(%d ), Sharp(%d ), fgAspNext(%d ),\n",
      "ucPmxId,ucCBEnable,ucMuteEnable,u4AspectRatio,u4BgColor,u4Capability,ucSharpness,fgAspNext",
      "bar, mute, ratio, background, capability"),
    report("[PMX] PMX(%d ),  AspN(%d ), fgSMCal(%d ), CAVIdel(%d ), CAVOdel(%d ), CvbsIdel(%d ), CvbsOdel(%d ), "
      "CavScL(%d ), CvbsScL(%d ), \n",
      "ucPmxId,u4AspNext,fgSetModeCalled,ucCavYcInputDelay,ucCavYcOutputDelay,ucCvbsYcInputDelay,"
      "ucCvbsYcOutputDelay,ucCavSyncLvl,ucCvbsSyncLvl", "ratio that waits, delays, levels"),
    report("[PMX] PMX(%d ), CvbsBurstLvl(%d ), CavYLvl(%d ), CvbsYLvl(%d ), fgDigestEnable(%d ), DigestAsp(%d ), "
      "fgForceMode(%d ), \n", "ucPmxId,ucCvbsBurstLvl,ucCavYLvl,ucCvbsYLvl,fgDigestEnable,u4DigestAsp,fgForceMode",
      "levels, digest view, force mode"),
    report("[PMX] PMX(%d ), u4PlaneOrder(0x%8x ), \n", "ucPmxId,u4PlaneOrder", "packed plane order"),
    report("[PMX] PMX(%d ), fgOSD5(%d ), \n", "ucPmxId,fgOSD5", "fifth OSD plane"),
    report("[PMX] PMX(%d ), plane %d's order is %d \n", "ucPmxId,i,aucPlaneOrder", "who stands at a position"),
    report("[PMX] PMX(%d ), eMasterColorSpace(%s)\n", "ucPmxId,eMasterColorSpace", "master colour space"),
    report("[PMX] PMX(%d ), _arPmxConf[%d], arPortInfo[%d]'s CompT(%d ), CompId(%d ),  Connected(%d ) \n",
      "ucPmxId,conf,i,u2CompType,u2CompId,fgConnected", "who is connected to a port"),
    report("[PMX] PMX(%d ), _arPmxConf[%d], arPortInfo[%d]'s fgE(%d ), SrcW(%d ),u4SrcH(%d ), LumaK(%d,) \n",
      "ucPmxId,conf,i,fgEnabled,u4SrcWidth,u4SrcHeight,ucLumaKey", "what a port's source delivers"),
    report("[PMX] PMX(%d ),_arPmxConf[%d].arPortInfo[%d].eInputColorMode(%s)\n", "ucPmxId,conf,i,eInputColorMode",
      "a source's colour mode"),
    report("[PMX] PMX(%d ), _arPmxConf[%d].arPortInfo[%d].eMasterColorSpace(%s)\n", "ucPmxId,conf,i,eSrcColorSpace",
      "a source's colour space, labelled as the master's"),
    report("[PMX] PMX(%d) _arPmxConf.rDrvExtSc(%s) \n", "ucPmxId,rDrvExtScl", "external chip"),
    report(OUTPUT_CONF "fgOutputEnable(%d)\n", "ucPmxId,conf,i,fgOutputEnable", "whether an output is on"),
    report(OUTPUT_CONF "u4VFreq(%d)\n", "ucPmxId,conf,i,u4VFreq", "an output's frequency"),
    report(OUTPUT_CONF "eResMode(%s)\n", "ucPmxId,conf,i,eReportedMode",
      "an output's mode; from 39 on the names are one off"),
    report(CCIR_INFO "eDgiFmt(%s) \n ", "ucPmxId,conf,i,eDgiFmt",
      "digital port's input format; or its output format, when that is 12 bits"),
    report(CCIR_INFO "eDgiFmt(%s)  \n", "ucPmxId,conf,i,eDgiFmt",
      "digital port's input format; or its output format, when that is 12 bits"),
    report(CCIR_INFO "eDgiFmt(%s) \n", "ucPmxId,conf,i,eDgiFmt",
      "digital port's input format; or its output format, when that is 12 bits"),
    report(CCIR_INFO "eDgiMode(%s) \n ", "ucPmxId,conf,i,eDgiMode", "digital port's input mode"),
    report(CCIR_INFO "eDgiMode(%s)  \n", "ucPmxId,conf,i,eDgiMode", "digital port's input mode"),
    report(CCIR_INFO "eDgoFmt(%s) \n ", "ucPmxId,conf,i,eDgoFmt", "digital port's output format"),
    report(CCIR_INFO "eDgoFmt(%s)  \n", "ucPmxId,conf,i,eDgoFmt", "digital port's output format"),
    report(CCIR_INFO "eDgoMode(%s) \n ", "ucPmxId,conf,i,eDgoMode", "digital port's output mode"),
    report(CCIR_INFO "eDgoMode(%s)  \n", "ucPmxId,conf,i,eDgoMode", "digital port's output mode"),
    // Assertions, with the source files that report them
    assertion("i4Ret == OSR_OK", "pmx_lifecycle.cpp", "PMX_Init", "the mutex cannot be created", "no mutex"),
    assertion("x_timer_create(&_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "pmx_lifecycle.cpp", "PMX_Init",
      "the display timer cannot be created", "no display timer"),
    assertion("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "pmx_lifecycle.cpp", "PMX_Uninit,i4PMX_Uninit",
      "the display timer cannot be deleted", "the display timer was not deleted"),
    assertion("x_sema_delete (MutexPMX) == OSR_OK", "pmx_lifecycle.cpp", "PMX_Uninit", "the mutex cannot be deleted",
      "the mutex was not deleted"),
    assertion("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_NTSC) == PMX_SET_OK", "pmx_mode.cpp",
      "PMX_SetMode,i4PmxSetMode,PMX_SetModeEx", "the TV type is refused", "TV type NTSC was refused"),
    assertion("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_PAL) == PMX_SET_OK", "pmx_mode.cpp",
      "PMX_SetMode,i4PmxSetMode,PMX_SetModeEx", "the TV type is refused", "TV type PAL was refused"),
    assertion("TVE_SetFmtEx(TVE_1, ucFmtMode, ucVFreq, rCAV.eResMode, rCAV.fgOutputEnable, fgHDExist, fgOSD5) == "
      "TVE_SET_OK", "pmx_mode_ex.cpp", FROM_MODE_EX, "the TV encoder refuses component's format",
      "the TV encoder refused component's format"),
    assertion("TVE_SetFmtEx(TVE_2, ucFmtMode, ucVFreq, rCVBS.eResMode, rCVBS.fgOutputEnable, fgHDExist, fgOSD5) == "
      "TVE_SET_OK", "pmx_mode_ex.cpp", FROM_MODE_EX, "the TV encoder refuses composite's format",
      "the TV encoder refused composite's format"),
    assertion("x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK", "pmx_handshake.cpp",
      "PMX_SetFormatChangeTimer,PMX_SetModeEx", "the display timer cannot be stopped",
      "the display timer could not be stopped"),
    assertion("x_timer_start(_arPmxDispPartStatus.hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, "
      "NULL)==OSR_OK",
      "pmx_handshake.cpp", "PMX_SetFormatChangeTimer,PMX_SetModeEx", "the display timer cannot be started",
      "the display timer could not be started: only the display part ends the wait"),
    assertion("x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) == OSR_OK", "pmx_port.cpp", LOCKED,
      "the mutex cannot be taken", "went on without the mutex"),
    assertion("x_sema_unlock(MutexPMX) == OSR_OK", "pmx_port.cpp", LOCKED, "the mutex cannot be given back",
      "the mutex was not given back"),
    assertion("0", "pmx_colour.cpp", COLOUR, "a colour space that the mixer is never set up for",
      "invalid colour space: the converters keep what they had"),
    assertion("0", "pmx_source.cpp", INFORM, "a video plane's interface table was not found",
      "a video plane has no interface table and was passed over"),
    assertion("0", "pmx_plane_order.cpp", "PMX_VdpGetPlanePosition,i4PmxGetPlanePosition",
      "neither of the two video planes", "asked where an unknown video plane sits"),
    SOURCE_FILE("pmx_lifecycle.cpp", "PMX_Init,PMX_Uninit,i4PMX_Uninit"),
    SOURCE_FILE("pmx_mode.cpp", SET_MODE "," FROM_MODE_EX),
    SOURCE_FILE("pmx_mode_ex.cpp", FROM_MODE_EX),
    SOURCE_FILE("pmx_handshake.cpp", "PMX_SetFormatChangeTimer,PMX_SetModeEx"),
    SOURCE_FILE("pmx_port.cpp", LOCKED),
    SOURCE_FILE("pmx_source.cpp", INFORM),
    SOURCE_FILE("pmx_colour.cpp", COLOUR),
    SOURCE_FILE("pmx_plane_order.cpp", "PMX_VdpGetPlanePosition,i4PmxGetPlanePosition"),
};
// clang-format on

} // namespace

std::span<const Text> texts()
{
    return rows;
}

bool has(std::string_view list, std::string_view item)
{
    while (!list.empty())
    {
        const std::string_view first = list.substr(0, list.find(','));
        if (board::tokens::trim(first) == item)
            return true;
        list.remove_prefix(std::min(first.size() + 1, list.size()));
    }
    return false;
}

} // namespace pmxboard::decode
