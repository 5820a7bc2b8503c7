// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What the files of this port tell each other. Each begins and ends with the module; what is not listed here needs
 * neither. */
#ifndef PMX_PORT_H
#define PMX_PORT_H

/* Console: at the end what is still put aside is printed. */
void pmx_console_begin(void);
void pmx_console_end(void);

/* Semaphores and timers: those that are left are deleted. */
void pmx_os_end(void);

/* Registers: mapped, and released. */
int pmx_registers_begin(void);
void pmx_registers_end(void);

/* Power management: a device that the kernel puts to sleep and wakes up. */
int pmx_power_begin(void);
void pmx_power_end(void);

/* The flight recorder, where the module is built with it. */
#ifdef PMX_HAS_RECORDER
void pmx_recorder_begin(void);
void pmx_recorder_end(void);
#else
static inline void pmx_recorder_begin(void)
{
}

static inline void pmx_recorder_end(void)
{
}
#endif

#endif
