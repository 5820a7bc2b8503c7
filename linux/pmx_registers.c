// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Registers of the chip's I/O space. A product names the physical address at which they lie; without it a page of
 * memory stands for them, so that the module loads on any machine. */
#include <linux/gfp.h>
#include <linux/io.h>
#include <linux/module.h>

#include "pmx_port.h"
#include "u_os.h"

#define REGISTERS 0xFD000000u /* as the layer addresses them */
#define REGISTERS_SIZE PAGE_SIZE

static ulong registers_at;
module_param(registers_at, ulong, 0444);
MODULE_PARM_DESC(registers_at, "physical address of the chip's registers; 0: a page of memory stands for them");

static void __iomem* registers;

int pmx_registers_begin(void)
{
    registers = registers_at ? ioremap(registers_at, REGISTERS_SIZE) : (void __iomem*)get_zeroed_page(GFP_KERNEL);
    return registers ? 0 : -ENOMEM;
}

void pmx_registers_end(void)
{
    if (registers_at)
        iounmap(registers);
    else
        free_page((unsigned long)registers);
}

static bool is_register(UINT32 address)
{
    return address - REGISTERS < REGISTERS_SIZE && address % 4 == 0;
}

UINT32 x_reg_read32(UINT32 u4Address)
{
    return is_register(u4Address) ? readl(registers + (u4Address - REGISTERS)) : 0;
}

void x_reg_write32(UINT32 u4Address, UINT32 u4Value)
{
    if (is_register(u4Address))
        writel(u4Value, registers + (u4Address - REGISTERS));
}
