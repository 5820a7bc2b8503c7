// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the tests of per-output mode setting share: requests that read as a middleware would say them, and expected
 *  lines that many traces have in common. */
#pragma once

#include <string>
#include <string_view>

#include "tests/support/layer_fixture.h"

namespace mode_ex
{

inline PMX_RESOLUTION_T output(BOOL enable, UINT32 mode)
{
    PMX_RESOLUTION_T output{};
    output.fgOutputEnable = enable;
    output.eResMode = static_cast<PMX_RESOLUTION_MODE_T>(mode);
    return output;
}

inline PMX_RESOLUTION_T on(UINT32 mode)
{
    return output(TRUE, mode);
}

inline PMX_RESOLUTION_T off(UINT32 mode)
{
    return output(FALSE, mode);
}

/** The arguments of PMX_SetModeEx; unless told otherwise: what the record holds after a reset. */
struct Request
{
    PMX_RESOLUTION_T digital_port = on(RES_1080P60HZ);
    PMX_RESOLUTION_T hdmi = on(RES_1080P60HZ);
    PMX_RESOLUTION_T component = on(RES_1080P60HZ);
    PMX_RESOLUTION_T composite = on(RES_480I);
    UCHAR frequency = 60;
    DRV_EXT_CHIP_USAGE_T chip = DRV_NON_EXT_CHIP;
    UINT8 osd5 = 0;
};

inline UINT32 set_mode(const Request& request)
{
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM];
    outputs[PMX_OUTPUT_CCIR] = request.digital_port;
    outputs[PMX_OUTPUT_HDMI] = request.hdmi;
    outputs[PMX_OUTPUT_CAV] = request.component;
    outputs[PMX_OUTPUT_CVBS] = request.composite;
    return PMX_SetModeEx(0, outputs, request.frequency, request.chip, request.osd5);
}

/** What the HDMI/AV driver is told of a request; the digital port's set-up is all zero. */
struct Sent
{
    unsigned hdmi_mode = 0; ///< as it is shown: 8 bits
    unsigned format = 0;
    unsigned chip = 0;
    unsigned osd5 = 0;
    unsigned digital_port_on = 1;
    unsigned hdmi_on = 1;
    std::string digital_port_setup = "{eDgoMode=0, eDgoFmt=0, eDgiMode=0, eDgiFmt=0}";
};

inline std::string avd(const char* command, const Sent& sent)
{
    const std::string format = std::to_string(sent.format);
    return std::string("fgPmxDrvSetAvd(") + command +
           ", {u1ScaleMode=0, ucHdmiOutDisplayResolution=" + std::to_string(sent.hdmi_mode) +
           ", ucFmtOutResolution=" + format + ", ucCCIROutResolution=" + format +
           ", ucHdmiOutMode=" + std::to_string(sent.chip) + ", eCcirDrvInfo=" + sent.digital_port_setup +
           ", fgOsdMsg=" + std::to_string(sent.osd5) +
           ", ucCCIROutMode=0, fgCCIROutEnable=" + std::to_string(sent.digital_port_on) +
           ", fgHdmiOutEnable=" + std::to_string(sent.hdmi_on) + ", u2_Vfreq=0}, 1)\n";
}

inline std::string pll_and_port(const Sent& sent)
{
    return avd("PMX_SET_VIDEO_PLL", sent) + avd("PMX_SET_CCIR_RES_CHG", sent);
}

inline std::string hdmi_change(const Sent& sent)
{
    return avd("PMX_SET_HDMI_RES_CHG", sent);
}

/** What lowering the flag does while the video plane driver waits for nothing. */
inline constexpr const char* lowered = R"(
    LOG0 "Display Format Change :0.\n"
    LOG0 "Set Osd Enable :1.\n"
    fgVdpIsWaitforSyncCtrl() = 0
    LOG0 "PMX_SetOsdEnable.\n"
    vPmxMixPlane(0, 2)
    vPmxMixPlane(0, 3)
    vPmxMixPlane(0, 4)
    vPmxMixPlane(0, 5)
    vPmxMixPlane(0, 6)
    LOG0 "Set Osd Enable :0.\n"
)";

/** Nothing is sent to HDMI, so nobody is waited for. */
inline const std::string not_waiting = std::string("LOG0 \"[PMX] fgHdmiExist:0, Not wait display part...\\n\"\n") +
                                       lowered + "LOG9 \"[PMX] fgPMX_DisplayModeReady is 0.\\n\"\n";

/** Graphics are held back, with the display timer at hand. */
inline constexpr const char* held_back = R"(
    LOG9 "[PMX] fgPMX_DisplayModeReady is 1.\n"
    LOG0 "[PMX] VDP_SetClearVideo & Not Mix OSD..\n"
    VDP_SetClearVideo(0, 0, 0x80, 0x80)
    vPmxNotMixPlane(0, 2)
    vPmxNotMixPlane(0, 3)
    vPmxNotMixPlane(0, 4)
    vPmxNotMixPlane(0, 5)
    vPmxNotMixPlane(0, 6)
    LOG0 "Display Format Change Timer Set.\n"
    x_timer_stop(2) = 0
    x_timer_start(2, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0
)";

/** Started, and these modes set: the next request is compared with this one. */
class Test : public LayerTest
{
protected:
    static void running(const Request& request = {})
    {
        started();
        EXPECT_EQ(1u, set_mode(request));
        board::trace::clear();
    }
};

} // namespace mode_ex
