// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Another module, which links against the six exported functions by name. */
#include <linux/module.h>

#include "drv_pmx.h"

static int __init user_begin(void)
{
    UCHAR mode = 0;

    if (PMX_GetMode(0, &mode) != 1)
        return -ENODEV;
    i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 1);
    PMX_OsdEnabled(0, 1, 720, 480, DRV_GFX_COLOR_MODE_RGB);
    PMX_OsdDisabled(0, 1);
    i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 1);
    pr_info("pmx_user: mode %u, ready %u\n", mode, fgPMX_DisplayModeReady());
    return 0;
}

static void __exit user_end(void)
{
}

module_init(user_begin);
module_exit(user_end);
MODULE_DESCRIPTION("a neighbour of the display plane mixer");
MODULE_LICENSE("Dual MIT/GPL");
