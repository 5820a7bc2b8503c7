// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What other kernel modules link against by name, and under which licence the layer is; everybody else in the stack is
 * linked with the layer. Compiled by the kernel's build beside pmx_if.o. */
#include <linux/export.h>
#include <linux/module.h>

#include "drv_pmx.h"

EXPORT_SYMBOL(PMX_GetMode);
EXPORT_SYMBOL(fgPMX_DisplayModeReady);
EXPORT_SYMBOL(i4Pmx_Connect);
EXPORT_SYMBOL(i4Pmx_Disconnect);
EXPORT_SYMBOL(PMX_OsdEnabled);
EXPORT_SYMBOL(PMX_OsdDisabled);

MODULE_LICENSE("Dual MIT/GPL");
