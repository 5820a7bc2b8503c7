// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The module: brings the port up, starts the layer, and takes both down again. */
#include <linux/module.h>

#include "drv_pmx.h"
#include "pmx_port.h"

static bool start = true;
module_param(start, bool, 0444);
MODULE_PARM_DESC(start, "call PMX_Init when the module is loaded; else the framework does it");

static int __init pmx_begin(void)
{
    int result;

    pmx_console_begin();
    pmx_recorder_begin();
    result = pmx_registers_begin();
    if (result)
        goto no_registers;
    result = pmx_power_begin();
    if (result)
        goto no_power;
    if (start)
        PMX_Init();
    return 0;

no_power:
    pmx_registers_end();
no_registers:
    pmx_recorder_end();
    return result;
}

/* The layer first, for it calls everything else; then its timers, for an expiry prints and mixes planes; the console
 * last, for all of them print, but for the recorder, through which everything goes. */
static void __exit pmx_end(void)
{
    if (_PmxInitiated)
        PMX_Uninit();
    pmx_power_end();
    pmx_os_end();
    pmx_registers_end();
    pmx_console_end();
    pmx_recorder_end();
}

module_init(pmx_begin);
module_exit(pmx_end);
MODULE_DESCRIPTION("interface layer of the display plane mixer");
