// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A test of a middleware: it starts the mixer, shows a menu in 1080i, and looks at what the layer asks for. */
#include <stdio.h>

#include "board/board_c.h"
#include "drv_pmx.h"
#include "x_vid_dec.h"

static int iFailed;

static void vMust(int iResult, int iLine)
{
    if (iResult != 0 && ++iFailed)
        fprintf(stderr, "that was line %d\n", iLine); /* the board has told why */
}
#define MUST(what) vMust((what), __LINE__)

static UINT32 u4Show1080i(void) /* what the middleware does */
{
    PMX_RESOLUTION_T arOutputs[PMX_OUTPUT_NUM] = { 0 };

    arOutputs[PMX_OUTPUT_HDMI].fgOutputEnable = TRUE;
    arOutputs[PMX_OUTPUT_HDMI].eResMode = RES_1080I60HZ;
    return PMX_SetModeEx(0, arOutputs, 60, DRV_NON_EXT_CHIP, 0);
}

int main(void)
{
    MUST(board_c_power_on("default"));
    MUST(board_c_do("display-part answer 3s")); /* the TV takes three seconds to switch */
    PMX_Init();
    MUST(board_c_do("source osd0 start 1280x720 rgb"));

    MUST(board_c_forget());
    MUST(u4Show1080i() != PMX_SET_OK);
    MUST(board_c_expect("call PMX_HalSetMode(0, RES_1080I60HZ)"));
    MUST(board_c_expect(
        "call fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, {ucHdmiOutDisplayResolution=RES_1080I60HZ, ...}, *) = 1"));
    MUST(board_c_expect("state mixer.mixed[2] 0")); /* graphics wait meanwhile */
    MUST(board_c_advance(3000));
    MUST(board_c_expect("call vPmxMixPlane(0, DRV_PMX_PLANE_3)"));
    MUST(board_c_expect("after about 3s"));

    MUST(board_c_do("fault fgPmxDrvSetAvd 0 always")); /* the HDMI driver refuses everything */
    MUST(PMX_SetAspectRatio(0, ASP_4_3) == 1);
    MUST(board_c_expect("call fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ASP_4_3, *) = 0"));
    MUST(board_c_expect("asserts 0"));
    MUST(board_c_finish());
    if (iFailed)
        board_c_print_entries();
    return iFailed != 0;
}
