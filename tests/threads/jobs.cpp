// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The threads of a stack that is busy: each calls what its component calls on a product, and nothing that the layer's
 * contracts forbid: one thread alone changes modes. */
#include "jobs.h"

#include "drv_pmx.h"
#include "stand_ins.h"
#include "x_vid_dec.h"

namespace
{

struct Component
{
    UINT16 type;
    UINT16 id;
};

constexpr Component first_half[] = {
    { PMX_COMP_TYPE_VDP, 0 }, { PMX_COMP_TYPE_OSD, 0 }, { PMX_COMP_TYPE_OSD, 1 }, { PMX_COMP_TYPE_OSD, 2 }
};
constexpr Component second_half[] = {
    { PMX_COMP_TYPE_VDP, 1 }, { PMX_COMP_TYPE_OSD, 3 }, { PMX_COMP_TYPE_OSD, 4 }, { PMX_COMP_TYPE_OSD, 5 }
};
constexpr Component on_second_port[] = { { PMX_COMP_TYPE_VDP, 2 }, { PMX_COMP_TYPE_VDP, 3 } };

void expect(bool holds, const char* what)
{
    if (!holds)
        stand_ins::breach(what);
}

void connect(const Component& component)
{
    expect(i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, component.type, component.id) == PMX_PORT_DONE, "i4Pmx_Connect failed");
}

/* One after the other goes and comes back. */
void reconnect(std::span<const Component> components, unsigned step)
{
    const Component& component = components[step / 2 % components.size()];
    if (step % 2 != 0)
        connect(component);
    else
        expect(i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, component.type, component.id) == PMX_PORT_DONE,
               "i4Pmx_Disconnect failed");
}

void framework_first_half(unsigned step)
{
    reconnect(first_half, step);
}

void framework_second_half(unsigned step)
{
    reconnect(second_half, step);
}

void framework_second_port(unsigned step)
{
    reconnect(on_second_port, step);
}

void video_driver(unsigned step)
{
    UINT32 value = 0;
    UINT32 height = 0;
    UCHAR mode = 0;
    switch (step % 10)
    {
    case 0: PMX_VdpEnabled(0, 0, 1920, 1080, 0); break;
    case 1: PMX_VdpEnabled(0, 1, 720, 576, 1); break;
    case 2: _rPMXIF.pi4GetAspectRatio(nullptr, &value); break;
    case 3: _rPMXIF.pi4VdpGetPlanePosition(nullptr, 1); break;
    case 4: PMX_VdpDisabled(0, 1); break;
    case 5: PMX_VdpEnabled(0, 0, 720, 480, 0); break;
    case 6: PMX_VdpEnabled(0, 2, 1920, 1080, 0); break;
    case 7: _rPMXIF.pi4GetMode(nullptr, &mode); break;
    case 8: _rPMXIF.pi4GetOutSize(nullptr, &value, &height); break;
    default: PMX_VdpDisabled(0, 2); break;
    }
}

void graphics_driver(unsigned step)
{
    UCHAR plane = static_cast<UCHAR>(step / 4 % 6);
    switch (step % 4)
    {
    case 0: PMX_OsdEnabled(0, plane, 1280, 720, DRV_GFX_COLOR_MODE_YCBCR); break;
    case 1: PMX_OsdEnabled(0, plane, 720, 576, DRV_GFX_COLOR_MODE_YCBCR); break;
    case 2: PMX_OsdDisabled(0, plane); break;
    default: PMX_OsdEnabled(0, plane, 1280, 720, DRV_GFX_COLOR_MODE_RGB); break;
    }
}

void inform(unsigned)
{
    PMX_InformVdpColorSpace(0);
}

void display_part(unsigned step)
{
    switch (step % 4)
    {
    case 0: PMX_SetFormatChangeFlag(TRUE); break;
    case 1: fgPMX_DisplayModeReady(); break;
    case 2: PMX_SetFormatChangeFlag(FALSE); break;
    default: PMX_SetOsdEnable(); break;
    }
}

/* Every second call is an expiry for certain, unless a mode change stops the timer in between. */
void timer(unsigned step)
{
    if (!stand_ins::expire_timer() || step % 2 != 0)
        PMX_SetFormatChangeTimer(10000);
}

void report(unsigned)
{
    PMX_QueryStatus();
}

void mode_queries(unsigned step)
{
    UINT32 value = 0;
    UINT32 height = 0;
    UCHAR mode = 0;
    switch (step % 6)
    {
    case 0: PMX_GetMode(0, &mode); break;
    case 1: PMX_GetOutSize(0, &value, &height); break;
    case 2: PMX_ProgressiveOut(0); break;
    case 3: fgPmxFmtHDOutput(0); break;
    case 4: PMX_GetTvType(0, &mode); break;
    default: PMX_GetAspectRatio(0, &value); break;
    }
}

void set_outputs(PMX_RESOLUTION_MODE_T mode, UCHAR frequency)
{
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM] = {};
    for (PMX_RESOLUTION_T& output : outputs)
    {
        output.fgOutputEnable = TRUE;
        output.eResMode = mode;
    }
    outputs[PMX_OUTPUT_CVBS].eResMode = RES_480I;
    expect(PMX_SetModeEx(0, outputs, frequency, DRV_NON_EXT_CHIP, 0) == PMX_SET_OK, "PMX_SetModeEx failed");
}

void middleware(unsigned step)
{
    UCHAR on = step / 8 % 2;
    switch (step % 8)
    {
    case 0: set_outputs(RES_1080P60HZ, 60); break;
    case 1: PMX_SetAspectRatio(0, on ? ASP_16_9 : ASP_4_3); break;
    case 2: set_outputs(RES_1080P60HZ, 60); break; // the same format once more
    case 3: PMX_SetBrightness(0, on ? 128 : 160, 1); break;
    case 4: PMX_SetMode(0, on ? RES_720P50HZ : RES_480P, on ? 50 : 60, 0); break;
    case 5: PMX_SetArbPlaneOrder(0, on ? 0x76543210 : 0x67543210); break;
    case 6: PMX_SetCBEnable(0, on); break;
    default: PMX_SetMuteEnable(0, on); break;
    }
}

void power_management(unsigned step)
{
    expect((step % 2 == 0 ? pmx_pm_ops.suspend(nullptr) : pmx_pm_ops.resume(nullptr)) == 0, "suspend or resume failed");
}

constexpr Job all_jobs[] = {
    { "framework: first half", 14, framework_first_half },
    { "framework: second half", 14, framework_second_half },
    { "framework: second port", 12, framework_second_port },
    { "video driver", 14, video_driver },
    { "graphics driver", 14, graphics_driver },
    { "inform", 10, inform },
    { "display part", 6, display_part },
    { "timer", 6, timer },
    { "mode queries", 4, mode_queries },
    { "middleware", 4, middleware },
    { "report", 1, report },
    { "power management", 1, power_management },
};

constexpr unsigned sum_of_percents()
{
    unsigned sum = 0;
    for (const Job& job : all_jobs)
        sum += job.percent;
    return sum;
}
static_assert(sum_of_percents() == 100);

} // namespace

std::span<const Job> jobs()
{
    return all_jobs;
}

void connect_all()
{
    for (std::span<const Component> components : { std::span(first_half), std::span(second_half) })
    {
        for (const Component& component : components)
            connect(component);
    }
}
