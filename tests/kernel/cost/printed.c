// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The console of a port that prints where it is called, at level 0. */
#include <linux/printk.h>

#include "u_os.h"

#define PRINT_AT_ONCE()             \
    do                              \
    {                               \
        va_list values;             \
                                    \
        va_start(values, szFormat); \
        vprintk(szFormat, values);  \
        va_end(values);             \
    }                               \
    while (0)

void PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...)
{
    if (i4Level == 0)
        PRINT_AT_ONCE();
}

void Printf(const CHAR* szFormat, ...)
{
    PRINT_AT_ONCE();
}

void UTIL_Printf(const CHAR* szFormat, ...)
{
    PRINT_AT_ONCE();
}
