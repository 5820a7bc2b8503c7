// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A small middleware: boots the mixer, connects a video plane and a graphics plane, sets the four outputs, changes the
 * aspect ratio and shows the status, against the layer and the virtual board.
 *
 * usage: middleware [BOARD] */
#include <stdio.h>

#include "board/board_c.h"
#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_pmx.h"
#include "x_vid_dec.h"

/* The video plane driver's part: a table, so that the mixer can tell the plane its colour space. */

static UINT32 u4Ignored(void* pvTag)
{
    (void)pvTag;
    return 0;
}

static UINT32 u4SetColorMode(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    printf("video plane %u: the mixer works in %s\n", (unsigned)(size_t)pvTag,
           eColorSpace == DRV_PMX_CS_YCBCR_709 ? "BT.709" : "BT.601");
    return 0;
}

static const IVdp VideoPlane = { u4Ignored, u4Ignored, u4Ignored,      u4Ignored, u4Ignored, u4Ignored,
                                 u4Ignored, u4Ignored, u4SetColorMode, u4Ignored, u4Ignored };

static int iConnectSources(void)
{
    if (i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 0, IID_IVdp, &VideoPlane, (void*)0) < 0)
        return -1;
    if (i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0) != PMX_PORT_DONE)
        return -1;
    if (i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 2) != PMX_PORT_DONE)
        return -1;
    if (PMX_VdpEnabled(0, 0, 720, 576, 0) != 1) /* a disc in standard definition */
        return -1;
    return PMX_OsdEnabled(0, 2, 1280, 720, DRV_GFX_COLOR_MODE_RGB) == 1 ? 0 : -1; /* and its menu */
}

static int iSetOutputs(void)
{
    PMX_RESOLUTION_T arOutputs[PMX_OUTPUT_NUM] = { 0 };
    UINT32 u4Width = 0;
    UINT32 u4Height = 0;

    arOutputs[PMX_OUTPUT_CCIR].eResMode = RES_1080I60HZ; /* the digital port stays off */
    arOutputs[PMX_OUTPUT_HDMI].fgOutputEnable = TRUE;
    arOutputs[PMX_OUTPUT_HDMI].eResMode = RES_1080I60HZ;
    arOutputs[PMX_OUTPUT_CAV].fgOutputEnable = TRUE;
    arOutputs[PMX_OUTPUT_CAV].eResMode = RES_1080I60HZ;
    arOutputs[PMX_OUTPUT_CVBS].fgOutputEnable = TRUE;
    arOutputs[PMX_OUTPUT_CVBS].eResMode = RES_480I;
    if (PMX_SetModeEx(0, arOutputs, 60, DRV_NON_EXT_CHIP, 0) != PMX_SET_OK)
        return -1;
    if (PMX_SetEnable(0, 1) != 1 || PMX_GetOutSize(0, &u4Width, &u4Height) != 1)
        return -1;
    printf("picture: %u x %u\n", u4Width, u4Height);
    return 0;
}

static int iChangeAspect(void)
{
    UINT32 u4AspectRatio = 0;

    if (PMX_SetAspectRatio(0, ASP_4_3) != 1 || PMX_GetAspectRatio(0, &u4AspectRatio) != 1)
        return -1;
    printf("aspect ratio: code %u\n", u4AspectRatio);
    return 0;
}

int main(int iCount, char** pszArguments)
{
    if (board_c_power_on(iCount > 1 ? pszArguments[1] : "default") != 0)
        return 2;

    PMX_Init();
    if (iConnectSources() != 0 || iSetOutputs() != 0 || iChangeAspect() != 0)
    {
        fprintf(stderr, "the mixer refused\n");
        return 1;
    }
    board_c_advance(10000); /* nobody holds graphics back: the display part is at rest */

    board_c_show_console(1);
    PMX_QueryStatus();
    printf("\n"); /* the report's last line end has a blank behind it */
    board_c_show_console(0);

    PMX_Uninit();
    printf("done, %u broken invariants\n", board_c_asserts());
    return board_c_asserts() == 0 ? 0 : 1;
}
