// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Changes the mode again and again, with the recorder around the layer and no system under it: what the recorder
 * executes is counted. The neighbouring drivers are the stand-ins of the port to Linux, which answer as the virtual
 * board does by default. */
#include "drv_pmx.h"
#include "pmx_recorder.h"

void* memcpy(void* pvDest, const void* pvSource, size_t zSize);
void* memset(void* pvDest, int iValue, size_t zSize);
void vChangeBegins(void);
void vChangeEnds(void);
void vMain(void);

typedef struct
{
    UINT32 au4Word[4];
} BLOCK_T;

/* Four words at a time, as a kernel's copies. */
void* memcpy(void* pvDest, const void* pvSource, size_t zSize)
{
    UCHAR* pucTo = pvDest;
    const UCHAR* pucFrom = pvSource;
    const BOOL fgWords = (((size_t)pucTo | (size_t)pucFrom) & 3) == 0;
    for (; fgWords && zSize >= sizeof(BLOCK_T); zSize -= sizeof(BLOCK_T))
    {
        *(BLOCK_T*)(void*)pucTo = *(const BLOCK_T*)(const void*)pucFrom;
        pucTo += sizeof(BLOCK_T);
        pucFrom += sizeof(BLOCK_T);
    }
    for (; fgWords && zSize >= 4; zSize -= 4, pucTo += 4, pucFrom += 4)
        *(UINT32*)(void*)pucTo = *(const UINT32*)(const void*)pucFrom;
    for (; zSize != 0; --zSize)
        *pucTo++ = *pucFrom++;
    return pvDest;
}

void* memset(void* pvDest, int iValue, size_t zSize)
{
    UCHAR* pucTo = pvDest;
    for (; zSize != 0; --zSize)
        *pucTo++ = (UCHAR)iValue;
    return pvDest;
}

static UINT32 u4Now;

static UINT32 u4Time(void)
{
    return ++u4Now;
}

static UINT32 u4Thread(void)
{
    return 0;
}

/* What a change is, the program that counts is told by these two. */
__attribute__((noinline)) void vChangeBegins(void)
{
    __asm__ volatile("");
}

__attribute__((noinline)) void vChangeEnds(void)
{
    __asm__ volatile("");
}

/* Every output has another format than before, and the parallel port goes with them. */
static void vChange(UINT32 u4Change)
{
    static const PMX_RESOLUTION_MODE_T aeMode[2][PMX_OUTPUT_NUM] = { { 0, RES_1080P60HZ, RES_480P, RES_480I },
                                                                     { 0, RES_1080P24HZ, RES_576P, RES_576I } };
    PMX_RESOLUTION_T arOutputs[PMX_OUTPUT_NUM];
    UINT32 i;
    memset(arOutputs, 0, sizeof arOutputs);
    for (i = 1; i < PMX_OUTPUT_NUM; ++i)
    {
        arOutputs[i].fgOutputEnable = TRUE;
        arOutputs[i].eResMode = aeMode[u4Change % 2][i];
    }
    /* The display part holds graphics back, as a rule. Without that operation the change itself may be what comes first
     * when a snapshot is due. */
    if (u4Change % 3 != 0)
        PMX_SetFormatChangeFlag(TRUE);
    vChangeBegins();
    PMX_SetModeEx(0, arOutputs, u4Change % 2 == 0 ? 60 : 24, DRV_NON_EXT_CHIP, (UINT8)(u4Change % 2));
    vChangeEnds();
}

void vMain(void)
{
    static UINT32 au4Memory[PMX_RECORDER_MEMORY(65536) / 4];
    const PMX_RECORDER_SETUP_T rSetup = { au4Memory, sizeof au4Memory, u4Time, u4Thread, 1000, FALSE };
    UINT32 i;
    if (fgPmxRecorderStart(&rSetup) == FALSE)
        return;
    PMX_Init();
    for (i = 0; i < CHANGES; ++i)
        vChange(i);
}

/* There is no library: this is where the program begins, and that is how it asks the system for its end. */
__asm__(".globl _start\n.arm\n_start: bl vMain\n mov r0, #0\n mov r7, #1\n svc 0\n");
