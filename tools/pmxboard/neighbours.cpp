#include "drv_av_d.h"
#include "drv_osd.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "tools/pmxboard/operation.h"
#include "u_os.h"

namespace pmxboard
{
namespace
{

#define NEIGHBOUR(function, ...) operation<function>(#function, { __VA_ARGS__ })

const std::vector<Operation> table = {
    NEIGHBOUR(x_thread_delay, "u4DelayMs"),
    NEIGHBOUR(x_reg_write32, "u4Address", "u4Value"),

    NEIGHBOUR(PMX_HalSetMode, "ucPmxId", "ucMode"),
    NEIGHBOUR(PMX_HalSetScalerMode, "ucMode"),
    NEIGHBOUR(PMX_HalReset, "ucPmxId"),
    NEIGHBOUR(PMX_HalScalerReset, "ucPmxId"),
    NEIGHBOUR(PMX_HalSetTvType, "ucPmxId", "ucTvType"),
    NEIGHBOUR(PMX_HalClockSet, "u4ClockId", "u4On"),
    NEIGHBOUR(PMX_HalSetBg, "ucPmxId", "u4BgColor"),
    NEIGHBOUR(PMX_HalInitPlaneOrder, "ucPmxId"),
    NEIGHBOUR(vPmxMixPlane, "ucPmxId", "ucPlane"),
    NEIGHBOUR(vPmxNotMixPlane, "ucPmxId", "ucPlane"),
    NEIGHBOUR(PMX_HalSwapPlane1_2, "ucPmxId", "u4Swap"),
    NEIGHBOUR(PMX_HalSwapPlane3_4, "ucPmxId", "u4Swap"),
    NEIGHBOUR(PMX_HalSwapPlane6_7, "ucPmxId", "u4Swap"),
    NEIGHBOUR(PMX_HalSwapPlane4_7, "ucPmxId", "u4Swap"),
    NEIGHBOUR(PMX_HalSwapPlane1_3, "ucPmxId", "u4Swap"),
    NEIGHBOUR(PMX_HalSwapPlane5_8, "ucPmxId", "u4Swap"),
    NEIGHBOUR(PMX_HalSelectVdoutCconv, "ucPmxId", "ucSelect"),
    NEIGHBOUR(PMX_HalSelectScalerCconv, "ucPmxId", "ucSelect"),
    NEIGHBOUR(PMX_HalSetCC_A, "ucPmxId", "ucEnable", "ucDirection"),
    NEIGHBOUR(PMX_HalSetScaler709601, "ucPmxId", "ucEnable", "ucDirection"),
    NEIGHBOUR(PMX_HalSetActiveZone, "ucPmxId", "ucMode"),
    NEIGHBOUR(PMX_HalSetCBWidth, "ucPmxId", "u1Width"),
    NEIGHBOUR(PMX_HalEnableCB, "ucPmxId"),
    NEIGHBOUR(PMX_HalDisableCB, "ucPmxId"),
    NEIGHBOUR(PMX_HalEnableMute, "ucPmxId"),
    NEIGHBOUR(PMX_HalDisableMute, "ucPmxId"),
    NEIGHBOUR(PMX_HalSetDelay, "ucVdoId", "ucADJ_F", "u2HDelay", "u2VDelay"),
    NEIGHBOUR(PMX_HalSetBrightness, "ucPmxId", "ucBrightness"),
    NEIGHBOUR(PMX_HalSetContrast, "ucPmxId", "ucContrast"),
    NEIGHBOUR(PMX_HalSetDigitalOut, "ucPmxId", "ucEnable", "ucProprietaryMode", "ucDigitalBit"),
    NEIGHBOUR(PMX_HalSetDigitalOutRgb, "ucPmxId", "ucDigitalRgb"),
    NEIGHBOUR(PMX_HalSetDigitalOutPhase, "ucPmxId", "u4Phase"),
    NEIGHBOUR(PMX_HalSetDigitalOutDrv, "u4Drving"),
    NEIGHBOUR(PMX_VsyncInit),
    NEIGHBOUR(PMX_VsyncStop),
    NEIGHBOUR(PMX_VsyncEnable),
    NEIGHBOUR(PMX_VsyncDisable),

    NEIGHBOUR(TVE_SetEnable, "u4Tve", "fgEnable"),
    NEIGHBOUR(TVE_SetMuteCtrol, "fgFmtChange", "ucCavFmt", "ucCvbsFmt", "fgHD", "fgOSD5"),
    NEIGHBOUR(TVE_SetBlackScreen, "u4Tve", "fgOn"),
    NEIGHBOUR(TVE_SetBrightness, "ucValue"),
    NEIGHBOUR(TVE_SetContrast, "ucValue"),
    NEIGHBOUR(TVE_SetHue, "ucValue"),
    NEIGHBOUR(TVE_SetSaturation, "ucValue"),
    NEIGHBOUR(TVE_SetSharpness, "ucValue"),
    NEIGHBOUR(TVE_SetBlackLvl, "ucCAVEn", "ucCVBSEn"),
    NEIGHBOUR(TVE_CVBSSetup_En, "fgEnable"),
    NEIGHBOUR(TVE_CVBSPal60_En, "fgEnable"),
    NEIGHBOUR(TVE_Identify_Mediatype, "ucMediaType"),
    NEIGHBOUR(TVE_SetAspectRatio, "eAspect"),

    NEIGHBOUR(VDP_SetTvFormat, "ucMode", "fgChanged"),
    NEIGHBOUR(VDP_GlobalOutputChange),
    NEIGHBOUR(VDP_VsyncSendCmd, "u4VdpIdx", "u4Cmd"),
    NEIGHBOUR(VDP_SetClearVideo, "ucVdpId", "ucY", "ucU", "ucV"),
    NEIGHBOUR(VDP_EnableCC, "fgEnable"),

    NEIGHBOUR(OSD_BASE_SetDisplayMode, "ucMode"),
    NEIGHBOUR(OSD_BASE_SetFlag_PMXChangeResDone),
    NEIGHBOUR(OSDSetColorSpace, "ucColorSpace"),
    NEIGHBOUR(OSD_RNG_Set_Xvycc_En, "fgEnable"),
    NEIGHBOUR(DCM_SetVideoPlaneDelay, "i4Delay1", "i4Delay2"),

    NEIGHBOUR(vPostChgRes, "ucMode"),
    NEIGHBOUR(vPostChgInputCS, "eColorSpace"),
    NEIGHBOUR(vSendAvdNotifyScomResChgOK),
    NEIGHBOUR(vSetCcirOutBeforeMixer, "fgBeforeMixer"),
};

} // namespace

const std::vector<Operation>& neighbours()
{
    return table;
}

} // namespace pmxboard
